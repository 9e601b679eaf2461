// Source items: initial crop, fitting a crop inside the bitmap, pan, pinch
// zoom within its limits, turns, and the list's select/move/swap rules.

#include <gtest/gtest.h>

#include "codec/BitmapFactory.h"
#include "common/CLyRectangle.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "tests/support/TestSupport.h"

namespace {
CLyMultiGridSrcItem* itemOf(int w, int h) {
  auto* item = new CLyMultiGridSrcItem();
  item->setBitmap(BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA), true);
  return item;
}

// The crop as "l,t,r,b".
std::string crop(const CLyMultiGridSrcItem& item) {
  const CLyRectangle* r = item.getSrcRect();
  if (!r) return "none";
  return std::to_string(r->x) + "," + std::to_string(r->y) + "," + std::to_string(r->w) + "," +
         std::to_string(r->h);
}

void setCrop(CLyMultiGridSrcItem& item, int l, int t, int r, int b) {
  item.setSrcRect(new CLyRectangle(l, t, r, b));
}
}  // namespace

TEST(SrcItem, ConstructionAndInitialCrop) {
  CLyMultiGridSrcItem plain;
  EXPECT_FALSE(plain.isFake());
  EXPECT_EQ(plain.getBitmap(), nullptr);
  EXPECT_EQ(plain.getSrcRect(), nullptr);
  CLyMultiGridSrcItem fake("/photos/a.jpg");
  EXPECT_TRUE(fake.isFake());
  EXPECT_EQ(fake.getPath(), "/photos/a.jpg");
  EXPECT_FALSE(fake.pan(10, 10));
  EXPECT_FALSE(fake.pinchZoom(0.1f));
  fake.rotate(1);  // no bitmap: nothing to turn, no crash

  std::unique_ptr<CLyMultiGridSrcItem> item(itemOf(4000, 3000));
  EXPECT_EQ(crop(*item), "1000,750,3000,2250");
  EXPECT_FLOAT_EQ(item->getScale(), 2.0f);
  EXPECT_EQ(item->getPixelCount(), 12000000);
  std::unique_ptr<CLyMultiGridSrcItem> odd(itemOf(7, 5));
  EXPECT_EQ(crop(*odd), "2,1,5,3");  // cw = 3, ch = 2
  // A new bitmap resets the crop; the old one is destroyed (ASan would see a leak or a double free).
  item->setBitmap(BitmapFactory::createBitmap(200, 100, 8), true);
  EXPECT_EQ(crop(*item), "50,25,150,75");
  item->release();
  EXPECT_EQ(item->getBitmap(), nullptr);
  EXPECT_EQ(item->getSrcRect(), nullptr);
}

TEST(SrcItem, CheckRectInOrg) {
  std::unique_ptr<CLyMultiGridSrcItem> item(itemOf(200, 200));
  auto fit = [&](int l, int t, int r, int b) {
    CLyRectangle rect(l, t, r, b);
    item->checkRectInOrg(&rect);
    return std::to_string(rect.x) + "," + std::to_string(rect.y) + "," + std::to_string(rect.w) + "," +
           std::to_string(rect.h);
  };
  EXPECT_EQ(fit(-10, 0, 90, 100), "0,0,100,100");
  EXPECT_EQ(fit(10, 10, 110, 110), "10,10,110,110");    // inside: unchanged
  EXPECT_EQ(fit(150, 20, 250, 120), "100,20,200,120");  // shifted left
  EXPECT_EQ(fit(0, 150, 100, 260), "0,90,100,200");     // shifted up
  EXPECT_EQ(fit(0, 0, 400, 200), "0,0,200,100");        // too wide: width 200, height in proportion
  EXPECT_EQ(fit(50, 0, 150, 400), "50,0,100,200");      // too high: height 200, width in proportion
  EXPECT_EQ(fit(0, -30, 100, 70), "0,0,100,70");        // top clipped without moving the bottom
  EXPECT_EQ(fit(190, 0, 210, 20), "180,0,200,20");      // overhanging: moved, not enlarged
  for (int l = -300; l <= 300; l += 37) {
    for (int t = -300; t <= 300; t += 41) {
      CLyRectangle rect(l, t, l + 120, t + 90);
      item->checkRectInOrg(&rect);
      ASSERT_GE(rect.x, 0);
      ASSERT_GE(rect.y, 0);
      ASSERT_LE(rect.w, 200);
      ASSERT_LE(rect.h, 200);
      ASSERT_EQ(rect.w - rect.x, 120);
    }
  }
}

TEST(SrcItem, PanFollowsTheFingerWithinTheBitmap) {
  std::unique_ptr<CLyMultiGridSrcItem> item(itemOf(4000, 3000));  // zoom 2
  EXPECT_TRUE(item->pan(100, 40));                                // moves 50, 20 bitmap pixels the other way
  EXPECT_EQ(crop(*item), "950,730,2950,2230");
  EXPECT_TRUE(item->pan(-100000, 0));
  EXPECT_EQ(crop(*item), "2000,730,4000,2230");  // pulled back to the right edge, same size
  EXPECT_FALSE(item->pan(-100, 0));              // nowhere further to go
  EXPECT_TRUE(item->pan(0, 100000));
  EXPECT_EQ(crop(*item), "2000,0,4000,1500");
  // At zoom 1 a movement is taken as it is.
  std::unique_ptr<CLyMultiGridSrcItem> whole(itemOf(400, 300));
  setCrop(*whole, 0, 0, 300, 300);
  EXPECT_TRUE(whole->pan(-7, 0));
  EXPECT_EQ(crop(*whole), "7,0,307,300");
}

TEST(SrcItem, PinchZoomWithinLimits) {
  std::unique_ptr<CLyMultiGridSrcItem> item(itemOf(3000, 3000));
  setCrop(*item, 1000, 1000, 2000, 2000);
  ASSERT_FLOAT_EQ(item->getScale(), 3.0f);
  EXPECT_FALSE(item->pinchZoom(0.1f));  // at the top: no further in
  setCrop(*item, 0, 0, 3000, 3000);
  ASSERT_FLOAT_EQ(item->getScale(), 1.0f);
  EXPECT_FALSE(item->pinchZoom(-0.1f));  // at the bottom: no further out

  EXPECT_TRUE(item->pinchZoom(0.1f));  // 300 in from each side
  EXPECT_EQ(crop(*item), "300,300,2700,2700");
  EXPECT_TRUE(item->pinchZoom(-0.05f));
  EXPECT_EQ(crop(*item), "180,180,2820,2820");
  // A big step past the limit stops exactly at it.
  EXPECT_TRUE(item->pinchZoom(0.45f));
  EXPECT_NEAR(item->getScale(), 3.0f, 0.01f);
  EXPECT_TRUE(item->pinchZoom(-2.0f));
  EXPECT_NEAR(item->getScale(), 1.0f, 0.01f);
  // Every sequence of steps keeps the zoom within 1..3 and the crop inside.
  std::unique_ptr<CLyMultiGridSrcItem> wide(itemOf(1600, 900));
  const float steps[] = {0.3f, 0.3f, 0.3f, -0.7f, 0.05f, 0.9f, -0.2f, -3.0f, 0.49f, 0.6f};
  for (float d : steps) {
    wide->pinchZoom(d);
    const CLyRectangle* r = wide->getSrcRect();
    ASSERT_GE(wide->getScale(), 0.99f) << d;
    ASSERT_LE(wide->getScale(), 3.01f) << d;
    ASSERT_GE(r->x, 0);
    ASSERT_GE(r->y, 0);
    ASSERT_LE(r->w, 1600);
    ASSERT_LE(r->h, 900);
  }
}

TEST(SrcItem, RotateTurnsBitmapAndCrop) {
  std::unique_ptr<CLyMultiGridSrcItem> item(itemOf(4000, 3000));
  setCrop(*item, 0, 0, 1000, 600);
  item->rotate(1);
  EXPECT_EQ(item->getWidth(), 3000);
  EXPECT_EQ(item->getHeight(), 4000);
  // Centre (500, 300) goes to (3000 - 300, 500); the crop keeps its size
  // and is moved back inside the turned bitmap.
  EXPECT_EQ(crop(*item), "2000,200,3000,800");
  item->rotate(3);
  EXPECT_EQ(item->getWidth(), 4000);
  item->rotate(2);
  EXPECT_EQ(item->getWidth(), 4000);
  const CLyRectangle* r = item->getSrcRect();
  EXPECT_LE(r->w, 4000);
  EXPECT_LE(r->h, 3000);
  const std::string before = crop(*item);
  item->rotate(0);
  EXPECT_EQ(crop(*item), before);
}

TEST(SrcItemList, SelectMoveSwapLargest) {
  CLyMultiGridSrcItemList list;
  EXPECT_EQ(list.indexOfLargest(), -1);
  EXPECT_EQ(list.get(0), nullptr);
  list.add(itemOf(4000, 3000));
  list.add(itemOf(3000, 4000));
  list.add(itemOf(800, 600));
  EXPECT_EQ(list.count(), 3);
  EXPECT_EQ(list.get(3), nullptr);
  EXPECT_EQ(list.get(-1), nullptr);
  EXPECT_EQ(list.indexOfLargest(), 0);  // the first of equals

  // Moves of 4 pixels or less are ignored; 5 pans.
  EXPECT_FALSE(list.move(0, 10, 10));  // nothing selected
  list.select(0);
  list.setLastPoint(100, 100);
  EXPECT_FALSE(list.move(0, 103, 103));
  EXPECT_EQ(crop(*list.get(0)), "1000,750,3000,2250");
  EXPECT_TRUE(list.move(0, 105, 105));
  EXPECT_NE(crop(*list.get(0)), "1000,750,3000,2250");
  int x = 0, y = 0;
  list.getLastPoint(x, y);
  EXPECT_EQ(x, 105);
  EXPECT_FALSE(list.move(1, 200, 200));  // not the selected item: selection dropped
  EXPECT_EQ(list.getSelected(), -1);
  list.resetMove();
  EXPECT_FALSE(list.isMoving());

  Bitmap* third = list.get(2)->getBitmap();
  EXPECT_FALSE(list.swap(0, 0));
  EXPECT_FALSE(list.swap(0, 3));
  EXPECT_TRUE(list.swap(0, 2));
  EXPECT_EQ(list.get(0)->getBitmap(), third);
  EXPECT_EQ(crop(*list.get(2)), "1000,750,3000,2250");  // crops reset

  EXPECT_FALSE(list.pinchZoom(7, 0.1f));
  list.select(1);
  EXPECT_TRUE(list.setBitmapOfSelected(BitmapFactory::createBitmap(10, 10, 8)));
  EXPECT_EQ(list.get(1)->getWidth(), 10);

  EXPECT_EQ(list.getDragSource(), -1);
  list.setDragSource(1);
  list.setDragTarget(2);
  EXPECT_EQ(list.getDragTarget(), 2);
  list.resetDrag();
  EXPECT_EQ(list.getDragSource(), -1);

  CLyMultiGridSrcItem* kept = list.get(0);
  EXPECT_TRUE(list.remove(0, false));
  EXPECT_EQ(list.count(), 2);
  delete kept;
  EXPECT_FALSE(list.remove(5, true));
  list.clear(true);
  EXPECT_EQ(list.count(), 0);
}
