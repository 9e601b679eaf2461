#include "common/CLyAppData.h"

#include <Elementary.h>
#include <gtest/gtest.h>
#include <libintl.h>

#include <atomic>
#include <string>
#include <thread>
#include <vector>

#include "app-assist/WWindowController.h"
#include "platform/feedback.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

namespace {

class CLyAppDataTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    setenv("PICTAVO_NO_SOUND", "1", 1);
  }
  void TearDown() override { CLyAppData::destroyInstance(); }
};

}  // namespace

TEST_F(CLyAppDataTest, ScreenSizeFollowsTheWindowRotation) {
  auto* window = new app_assist::WWindowController("pictavo-test");
  ASSERT_TRUE(window->create());
  Evas_Object* win = window->getEvasObj();
  CLyAppData* data = CLyAppData::getInstance();
  data->setWindowController(window);
  EXPECT_EQ(data->getWindowController(), window);

  int sw = 0, sh = 0;
  elm_win_screen_size_get(win, nullptr, nullptr, &sw, &sh);
  int w = -1, h = -1;
  elm_win_rotation_set(win, 0);
  EXPECT_EQ(data->getWindowRotation(), 0);
  data->getScreenSize(&w, &h);
  EXPECT_EQ(w, sw);
  EXPECT_EQ(h, sh);
  elm_win_rotation_set(win, 90);
  EXPECT_EQ(data->getWindowRotation(), 90);
  data->getScreenSize(&w, &h);
  EXPECT_EQ(w, sh);
  EXPECT_EQ(h, sw);
  elm_win_rotation_set(win, 180);
  data->getScreenSize(&w, &h);
  EXPECT_EQ(w, sw);
  elm_win_rotation_set(win, 270);
  data->getScreenSize(&w, &h);
  EXPECT_EQ(w, sh);
  window->destroy();
  data->setWindowController(nullptr);
}

TEST_F(CLyAppDataTest, ScreenSizeRefusesNullOutputs) {
  LogCapture log;
  CLyAppData* data = CLyAppData::getInstance();
  int h = 5;
  data->getScreenSize(nullptr, &h);
  EXPECT_TRUE(log.contains("Invalid param w"));
  EXPECT_EQ(h, 5);
  int w = 7;
  data->getScreenSize(&w, nullptr);
  EXPECT_TRUE(log.contains("Invalid param h"));
  EXPECT_EQ(w, 7);
  // Without a window: zero, and logged.
  data->getScreenSize(&w, &h);
  EXPECT_EQ(w, 0);
  EXPECT_EQ(h, 0);
}

TEST_F(CLyAppDataTest, ColourAndFontTablesAreAddedOnce) {
  CLyAppData* data = CLyAppData::getInstance();
  data->setThemeExtension();
  data->setThemeExtension();
  Uxt_Theme_Color_Table* colors = data->getColorTable();
  ASSERT_NE(colors, nullptr);
  data->setColorTable();
  EXPECT_EQ(data->getColorTable(), colors);
  int r = -1;
  EXPECT_EQ(uxt_theme_get_color("AO013", &r, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NONE);
  EXPECT_GE(r, 0);
  Uxt_Theme_Font_Table* fonts = data->getFontTable();
  ASSERT_NE(fonts, nullptr);
  data->setFontTable();
  EXPECT_EQ(data->getFontTable(), fonts);
  // The theme extension is in the default theme's list.
  bool found = false;
  const Eina_List* l;
  void* item;
  EINA_LIST_FOREACH(elm_theme_extension_list_get(nullptr), l, item) {
    if (std::string(static_cast<const char*>(item)).find("LyTheme.edj") != std::string::npos) found = true;
  }
  EXPECT_TRUE(found);
  // The extension supplies the application layout desktop themes lack.
  Evas_Object* win = pictavo::test::createTestWindow(100, 100);
  Evas_Object* layout = elm_layout_add(win);
  EXPECT_TRUE(elm_layout_theme_set(layout, "layout", "application", "default"));
  evas_object_del(win);
  CLyAppData::destroyInstance();
  // Destroying the data takes the tables and the extension away.
  EXPECT_EQ(uxt_theme_get_color("AO013", &r, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                                nullptr, nullptr, nullptr, nullptr),
            UXT_THEME_ERROR_NOT_FOUND);
  found = false;
  EINA_LIST_FOREACH(elm_theme_extension_list_get(nullptr), l, item) {
    if (std::string(static_cast<const char*>(item)).find("LyTheme.edj") != std::string::npos) found = true;
  }
  EXPECT_FALSE(found);
}

TEST_F(CLyAppDataTest, RecreatedInstanceInitialisesFeedbackAgain) {
  while (feedback_is_initialized()) feedback_deinitialize();
  CLyAppData* first = CLyAppData::getInstance();
  EXPECT_TRUE(feedback_is_initialized());
  EXPECT_EQ(CLyAppData::getInstance(), first);
  CLyAppData::destroyInstance();
  EXPECT_FALSE(feedback_is_initialized());
  EXPECT_FALSE(CLyAppData::hasInstance());
  CLyAppData::getInstance();
  EXPECT_TRUE(feedback_is_initialized());
}

TEST_F(CLyAppDataTest, TextDomainIsBoundToTheResourceLocale) {
  CLyAppData::getInstance()->setTextDomain();
  const char* bound = bindtextdomain("pictavo", nullptr);
  ASSERT_NE(bound, nullptr);
  std::string dir = bound;
  EXPECT_EQ(dir.substr(dir.size() - 7), "/locale");
  EXPECT_EQ(dir.find("//"), std::string::npos);
}

TEST_F(CLyAppDataTest, LockSerialisesThreads) {
  CLyAppData* data = CLyAppData::getInstance();
  long counter = 0;
  std::atomic<int> inside{0};
  std::atomic<bool> overlap{false};
  auto work = [&] {
    for (int i = 0; i < 20000; ++i) {
      data->lock();
      if (inside.fetch_add(1) != 0) overlap = true;
      ++counter;
      inside.fetch_sub(1);
      data->unlock();
    }
  };
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t) threads.emplace_back(work);
  for (auto& thread : threads) thread.join();
  EXPECT_EQ(counter, 80000);
  EXPECT_FALSE(overlap);
}
