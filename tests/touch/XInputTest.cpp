// The same gestures through a real X server: pointer input made by xdotool
// reaches the collage through ecore-x and evas. Runs only when asked for
// (PICTAVO_TOUCH_XDOTOOL=1) on an X11 engine, for example:
//   Xvfb :97 & DISPLAY=:97 ELM_ENGINE=software_x11 PICTAVO_TOUCH_XDOTOOL=1 test_touch
//   --gtest_filter='XInput*'

#include <Elementary.h>
#include <gtest/gtest.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridImpl.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "tests/support/TestSupport.h"
#include "tests/touch/CollageHost.h"

using pictavo::test::runMainLoopUntil;
using pictavo::test::touch::CollageHost;

namespace {

bool wanted() {
  const char* flag = getenv("PICTAVO_TOUCH_XDOTOOL");
  const char* engine = getenv("ELM_ENGINE");
  return flag && *flag == '1' && getenv("DISPLAY") && engine &&
         std::string(engine).find("x11") != std::string::npos;
}

class XPointer {
 public:
  explicit XPointer(Evas_Object* win) {
    Ecore_X_Window xwin = elm_win_xwindow_get(win);
    mWindow = std::to_string((unsigned long)xwin);
  }
  bool run(const std::string& args) const {
    const std::string cmd = "xdotool " + args + " >/dev/null 2>&1";
    return system(cmd.c_str()) == 0;
  }
  bool moveTo(int x, int y) const {
    return run("mousemove --sync --window " + mWindow + " " + std::to_string(x) + " " + std::to_string(y));
  }
  bool down() const { return run("mousedown 1"); }
  bool up() const { return run("mouseup 1"); }

 private:
  std::string mWindow;
};

TEST(XInput, TapPanAndLongPressSwapOnARealWindow) {
  if (!wanted()) GTEST_SKIP() << "set PICTAVO_TOUCH_XDOTOOL=1 with an X11 engine and a DISPLAY";
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  XPointer pointer(host.window());
  host.spin(0.5);  // mapped and drawn

  // Tap: selects cell 0.
  const CLyPoint p0 = host.centre(0), p1 = host.centre(1);
  ASSERT_TRUE(pointer.moveTo(p0.x, p0.y));
  host.spin(0.05);
  ASSERT_TRUE(pointer.down());
  host.spin(0.05);
  ASSERT_TRUE(pointer.up());
  ASSERT_TRUE(runMainLoopUntil([&]() { return grid->getCurrentIndex() == 0; }, 3.0));

  // Pan cell 1.
  const CLyRectangle before = host.crop(1);
  ASSERT_TRUE(pointer.moveTo(p1.x, p1.y));
  host.spin(0.05);
  ASSERT_TRUE(pointer.down());
  host.spin(0.05);
  for (int i = 1; i <= 6; ++i) {
    ASSERT_TRUE(pointer.moveTo(p1.x + i * 10, p1.y));
    host.spin(0.03);
  }
  EXPECT_EQ(LY_MULTIGRID_MODE_PANNING, grid->getInteractionMode());
  ASSERT_TRUE(pointer.up());
  host.spin(0.1);
  EXPECT_NE(before, host.crop(1));

  // Long press on the selected cell 0 and drop on cell 1.
  ASSERT_TRUE(pointer.moveTo(p0.x, p0.y));
  host.spin(0.05);
  ASSERT_TRUE(pointer.down());
  ASSERT_TRUE(
      runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_DRAGGING; }, 3.0));
  for (int i = 1; i <= 8; ++i) {
    ASSERT_TRUE(pointer.moveTo(p0.x + (p1.x - p0.x) * i / 8, p0.y + (p1.y - p0.y) * i / 8));
    host.spin(0.03);
  }
  ASSERT_TRUE(pointer.up());
  ASSERT_TRUE(runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_IDLE; }, 3.0));
  ASSERT_EQ(1u, host.swaps.size());
  EXPECT_EQ(std::make_pair(0, 1), host.swaps[0]);
  EXPECT_EQ(1, grid->getCurrentIndex());
}

}  // namespace
