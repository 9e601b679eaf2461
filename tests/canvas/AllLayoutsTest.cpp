// Every layout of the catalogue at every offered ratio, through the save path
// the application and the render command share: each cell shows its own
// photo and the border shows the background colour.

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>

#include "app-assist/WWindowController.h"
#include "codec/BitmapFactory.h"
#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridSaver.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "model/style/CLyMultiGridStyleManager.h"
#include "tests/support/TestSupport.h"

namespace {

const uint32_t kColours[6] = {0xFFFF0000u, 0xFF00FF00u, 0xFF0000FFu, 0xFFFFFF00u, 0xFFFF00FFu, 0xFF00FFFFu};

Bitmap* solid(int w, int h, uint32_t argb) {
  Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
  auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int i = 0; i < w * h; i++) p[i] = argb;
  return b;
}

bool near(const Bitmap* b, int x, int y, uint32_t argb, int tol = 48) {
  const unsigned char* p = b->getPixels() + ((size_t)y * b->getWidth() + x) * 4;
  return std::abs(p[2] - (int)((argb >> 16) & 0xFF)) <= tol &&
         std::abs(p[1] - (int)((argb >> 8) & 0xFF)) <= tol && std::abs(p[0] - (int)(argb & 0xFF)) <= tol;
}

}  // namespace

TEST(AllLayoutsTest, EveryLayoutAndRatioSavesACorrectCollage) {
  pictavo::test::ensureElm();
  CLyMultiGridStyleManager& styles = CLyMultiGridStyleManager::getInstance();
  if (styles.getGridLayoutCount(2) == 0) {
    ASSERT_TRUE(styles.initialize());
  }
  auto* window = new app_assist::WWindowController("all-layouts");
  ASSERT_TRUE(window->precreate());
  Evas_Object* parent = window->getBaseLayout() ? window->getBaseLayout() : window->getEvasObj();
  pictavo::test::TempDir dir;
  const uint32_t background = 0xFF404040u;
  int checked = 0;
  for (int count = 2; count <= 6; count++) {
    const int layouts = styles.getGridLayoutCount(count);
    EXPECT_GT(layouts, 0) << count;
    for (int layout = 0; layout < layouts; layout++) {
      for (int ratio : {LY_RATIO_1_1, LY_RATIO_3_4, LY_RATIO_9_16}) {
        SCOPED_TRACE(testing::Message() << count << " photos, layout " << layout << ", ratio " << ratio);
        CLyMultiGridSrcItemList items;
        for (int i = 0; i < count; i++) {
          auto* item = new CLyMultiGridSrcItem();
          item->setBitmap(solid(i % 2 ? 300 : 400, i % 2 ? 400 : 300, kColours[i]), true);
          items.add(item);
        }
        float rects[6][4] = {};
        styles.getDrawRects(count, ratio, layout, rects);
        CLyMultiGridDrawRectList cells;
        for (int i = 0; i < count; i++)
          cells.addItem(new CLyFloatRectangle(rects[i][0], rects[i][1], rects[i][2], rects[i][3]));
        cells.setStyleIndex(layout);
        CLyMultiGridSaveRequest request;
        request.cells = &cells;
        request.items = &items;
        request.ratio = ratio;
        request.margin = 3;
        request.roundness = 2;
        request.background = CLyRectangle(0x40, 0x40, 0x40, 255);
        const std::string path = dir.file("c.jpg");
        int w = 0, h = 0;
        ASSERT_TRUE(CLyMultiGridSaver::save(window->getEvasObj(), parent, request, path, &w, &h));
        EXPECT_EQ(400, w);
        DecodeOptions o;
        ASSERT_EQ(1, BitmapFactory::parseImage(path, o));
        DecodeOptions d;
        d.colorFormat = BITMAP_FORMAT_BGRA;
        Bitmap* out = BitmapFactory::decodeFile(path, d, o.outWidth, o.outHeight, 0);
        ASSERT_NE(nullptr, out);
        EXPECT_EQ(w, out->getWidth());
        EXPECT_EQ(h, out->getHeight());
        // border: step 3 gives m = (int)(400 x 0.012) = 4, a band of 8 px
        EXPECT_TRUE(near(out, 2, h / 2, background));
        EXPECT_TRUE(near(out, w / 2, 2, background));
        EXPECT_TRUE(near(out, w - 3, h / 2, background));
        EXPECT_TRUE(near(out, w / 2, h - 3, background));
        for (int i = 0; i < count; i++) {
          const int cx = (int)((rects[i][0] + rects[i][2]) * 0.5f * w);
          const int cy = (int)((rects[i][1] + rects[i][3]) * 0.5f * h);
          EXPECT_TRUE(near(out, cx, cy, kColours[i])) << "cell " << i;
        }
        delete out;
        cells.clear(true);
        items.clear(true);
        checked++;
      }
    }
  }
  EXPECT_EQ(32 * 3, checked);
  window->destroy();
}
