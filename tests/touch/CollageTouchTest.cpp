// The collage's touch interaction driven through the real path: fed evas
// input on a buffer-engine window, the gesture layer, the gesture control
// and the collage control, with the main loop running between events.

#include <Elementary.h>
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <memory>

#include "control/CLyFocusBox.h"
#include "control/CLyGesture.h"
#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridImpl.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "tests/support/TestSupport.h"
#include "tests/touch/CollageHost.h"

using pictavo::test::LogCapture;
using pictavo::test::runMainLoopUntil;
using pictavo::test::touch::CollageHost;
using pictavo::test::touch::HostOptions;

namespace {

bool anyGripVisible(CLyMultiGrid* grid) {
  CLyFocusBox* box = grid->getFocusBox();
  for (int i = 0; box && i < CLyFocusBox::kGripCount; ++i)
    if (box->getGrip(i) && evas_object_visible_get(box->getGrip(i))) return true;
  return false;
}

// The image object showing the collage canvas: the control's image member
// placed exactly on the collage area.
Evas_Object* findCanvasImage(CLyMultiGrid* grid) {
  const CLyRectangle* roi = grid->getCollageRect();
  if (!roi) return nullptr;
  Evas_Object* found = nullptr;
  Eina_List* members = evas_object_smart_members_get(grid->getEvasObj());
  Eina_List* l;
  void* data;
  EINA_LIST_FOREACH(members, l, data) {
    auto* o = static_cast<Evas_Object*>(data);
    int x = 0, y = 0, w = 0, h = 0;
    evas_object_geometry_get(o, &x, &y, &w, &h);
    const char* type = evas_object_type_get(o);
    if (!found && type && strcmp(type, "image") == 0 && x == roi->x && y == roi->y && w == roi->w &&
        h == roi->h)
      found = o;
  }
  eina_list_free(members);
  return found;
}

uint32_t canvasPixel(CLyMultiGrid* grid, Evas_Object* image, int x, int y) {
  (void)grid;
  int ix = 0, iy = 0;
  evas_object_geometry_get(image, &ix, &iy, nullptr, nullptr);
  int stride = evas_object_image_stride_get(image) / 4;
  auto* px = static_cast<uint32_t*>(evas_object_image_data_get(image, EINA_FALSE));
  uint32_t v = px[(y - iy) * stride + (x - ix)];
  evas_object_image_data_set(image, px);
  return v;
}

// ---------------------------------------------------------------- selection

TEST(CollageTouch, TapSelectsACellAndShowsItsFrameAndHandlers) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  EXPECT_EQ(-1, grid->getCurrentIndex());
  EXPECT_FALSE(anyGripVisible(grid));

  ASSERT_TRUE(host.select(0));
  EXPECT_EQ(1, host.selections);
  ASSERT_EQ(1u, host.mouseDowns.size());
  EXPECT_EQ(std::make_pair(0, false), host.mouseDowns[0]);
  EXPECT_TRUE(anyGripVisible(grid));
  const CLyFloatRectangle c = host.cell(0);
  const CLyRectangle& frame = grid->getFocusBox()->getBoxRect();
  EXPECT_EQ((int)std::floor(c.x1 + 0.01), frame.x);
  EXPECT_EQ((int)std::floor(c.x2 + 0.01), frame.w);
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, grid->getInteractionMode());

  // The other cell: selection moves.
  ASSERT_TRUE(host.select(1));
  EXPECT_EQ(2, host.selections);
  // A tap on the selected cell selects nothing new and raises no mouse-down.
  const size_t downs = host.mouseDowns.size();
  CLyPoint p = host.centre(1);
  host.tap(p.x, p.y);
  host.spin(0.1);
  EXPECT_EQ(2, host.selections);
  EXPECT_EQ(downs, host.mouseDowns.size());

  // A tap beside the collage reports the press on no cell and keeps the selection.
  host.tap(20, 20);
  host.spin(0.4);
  ASSERT_FALSE(host.mouseDowns.empty());
  EXPECT_EQ(std::make_pair(-1, false), host.mouseDowns.back());
  EXPECT_EQ(1, grid->getCurrentIndex());

  EXPECT_TRUE(grid->clearSelection());
  EXPECT_EQ(-1, grid->getCurrentIndex());
  EXPECT_FALSE(anyGripVisible(grid));
  EXPECT_FALSE(grid->clearSelection());
}

TEST(CollageTouch, TheFrameFollowsTheControlWhenItIsLaidOutAgain) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  ASSERT_TRUE(host.select(0));
  Evas_Object* boxImage = grid->getFocusBox()->getImageObject();
  ASSERT_NE(nullptr, boxImage);
  evas_object_resize(grid->getEvasObj(), 700, 1200);
  host.spin(0.05);
  int w = 0, h = 0;
  evas_object_geometry_get(boxImage, nullptr, nullptr, &w, &h);
  EXPECT_EQ(700, w);
  EXPECT_EQ(1200, h);
  EXPECT_TRUE(anyGripVisible(grid)) << "the frame of the selected cell is drawn again";
}

TEST(CollageTouch, ADoubleTapSelectsLikeATap) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  const CLyPoint p = host.centre(1);
  host.tap(p.x, p.y);
  host.tap(p.x, p.y);
  ASSERT_TRUE(runMainLoopUntil([&]() { return host.selections > 0; }, 2.0));
  host.spin(0.4);
  EXPECT_EQ(1, host.grid()->getCurrentIndex());
  EXPECT_EQ(1, host.selections) << "the second tap hits the selected cell";
}

TEST(CollageTouch, NoSurfacesMeansNoInteraction) {
  LogCapture log;
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyGestureInfo info;
  info.x = host.centre(0).x;
  info.y = host.centre(0).y;
  // A control whose photos are not drawn yet ignores touches.
  CLyMultiGridDrawRectList list;
  CLyMultiGridSrcItemList items;
  auto* bare = new CLyMultiGrid(&list, &items, 100, 100);
  bare->__processGestureEvent(LY_GESTURE_MOUSE_DOWN, LY_GESTURE_STATE_START, &info);
  EXPECT_TRUE(log.contains("Surfaces are not created yet"));
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, bare->getInteractionMode());
  bare->destroy();
  // A null info is refused, not read.
  host.grid()->__processGestureEvent(LY_GESTURE_MOUSE_DOWN, LY_GESTURE_STATE_START, nullptr);
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, host.grid()->getInteractionMode());
}

// ---------------------------------------------------------------- pan

TEST(CollageTouch, MoveWithinTheToleranceDoesNotPanBeyondItDoes) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  const CLyPoint p = host.centre(0);
  const CLyRectangle before = host.crop(0);

  host.down(p.x, p.y);
  host.spin(0.02);
  EXPECT_EQ(LY_MULTIGRID_MODE_PRESSED, grid->getInteractionMode());
  host.move(p.x + 4, p.y);
  host.move(p.x + 8, p.y);
  host.spin(0.02);
  EXPECT_EQ(LY_MULTIGRID_MODE_PRESSED, grid->getInteractionMode()) << "8 px stays a press";
  EXPECT_EQ(before, host.crop(0));
  EXPECT_TRUE(host.changes.empty());

  host.move(p.x + 11, p.y);
  host.spin(0.02);
  EXPECT_EQ(LY_MULTIGRID_MODE_PANNING, grid->getInteractionMode()) << "11 px pans";
  const CLyRectangle after = host.crop(0);
  EXPECT_LT(after.x, before.x) << "the photo follows the finger to the right";
  EXPECT_EQ(after.w - after.x, before.w - before.x) << "panning keeps the crop size";
  ASSERT_FALSE(host.changes.empty());
  EXPECT_TRUE(host.changes.back().first);

  host.move(p.x + 60, p.y + 30);
  host.spin(0.02);
  EXPECT_LT(host.crop(0).x, after.x);
  host.up(p.x + 60, p.y + 30);
  host.spin(0.05);
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, grid->getInteractionMode());
  EXPECT_EQ(-1, grid->getCurrentIndex()) << "a pan selects nothing";
}

TEST(CollageTouch, PanRedrawsOnlyTheTouchedCell) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  Evas_Object* canvasImage = findCanvasImage(host.grid());
  ASSERT_NE(nullptr, canvasImage);
  const CLyPoint p0 = host.centre(0), p1 = host.centre(1);
  const uint32_t other = canvasPixel(host.grid(), canvasImage, p1.x, p1.y);
  host.down(p0.x, p0.y);
  host.spin(0.02);
  host.move(p0.x + 40, p0.y + 40);
  host.spin(0.02);
  host.up(p0.x + 40, p0.y + 40);
  host.spin(0.02);
  EXPECT_EQ(other, canvasPixel(host.grid(), canvasImage, p1.x, p1.y));
}

// ---------------------------------------------------------------- pinch

TEST(CollageTouch, PinchWithBothFingersOnTheCellZooms) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  const CLyFloatRectangle c = host.cell(0);
  const int cx = (int)(c.x1 + c.x2 / 2), cy = (int)(c.y1 + c.y2 / 2);
  const CLyRectangle before = host.crop(0);
  host.down(cx - 40, cy);
  host.spin(0.02);
  host.multiDown(cx + 40, cy);
  host.spin(0.02);
  for (int d = 45; d <= 120; d += 5) {
    host.move(cx - d, cy);
    host.multiMove(cx + d, cy);
    host.spin(0.01);
  }
  host.multiUp(cx + 120, cy);
  host.up(cx - 120, cy);
  host.spin(0.05);
  const CLyRectangle after = host.crop(0);
  EXPECT_LT(after.w - after.x, before.w - before.x) << "fingers apart zoom in: a smaller crop";
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, host.grid()->getInteractionMode());
}

TEST(CollageTouch, PinchWhoseSecondFingerStartsOutsideTheCellDoesNothing) {
  LogCapture log;
  CollageHost host;
  ASSERT_TRUE(host.ok());
  const CLyPoint p0 = host.centre(0), p1 = host.centre(1);
  const CLyRectangle before0 = host.crop(0), before1 = host.crop(1);
  host.down(p0.x, p0.y);
  host.spin(0.02);
  host.multiDown(p1.x, p1.y);
  host.spin(0.02);
  for (int d = 5; d <= 80; d += 5) {
    host.move(p0.x - d, p0.y - d);
    host.multiMove(p1.x + d, p1.y + d);
    host.spin(0.01);
  }
  host.multiUp(p1.x + 80, p1.y + 80);
  host.up(p0.x - 80, p0.y - 80);
  host.spin(0.05);
  EXPECT_EQ(before0, host.crop(0));
  EXPECT_EQ(before1, host.crop(1));
  EXPECT_TRUE(log.contains("Different indexs"));
}

// ---------------------------------------------------------------- long press, drag and drop

TEST(CollageTouch, LongPressOnACellThatIsNotSelectedDoesNotLiftIt) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  const CLyPoint p = host.centre(0);
  host.down(p.x, p.y);
  host.spin(0.8);
  EXPECT_EQ(LY_MULTIGRID_MODE_PRESSED, host.grid()->getInteractionMode());
  host.up(p.x, p.y);
  host.spin(0.05);
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, host.grid()->getInteractionMode());
  EXPECT_TRUE(host.swaps.empty());
}

TEST(CollageTouch, LongPressOnTheSelectedCellLiftsItAndADropSwaps) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  ASSERT_TRUE(host.select(0));
  CLyMultiGridSrcItem* first = host.items()->get(0);
  CLyMultiGridSrcItem* second = host.items()->get(1);

  const CLyPoint p0 = host.centre(0), p1 = host.centre(1);
  host.down(p0.x, p0.y);
  ASSERT_TRUE(
      runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_DRAGGING; }, 3.0));
  // Drag over to the other cell.
  for (int i = 1; i <= 10; ++i) {
    host.move(p0.x + (p1.x - p0.x) * i / 10, p0.y + (p1.y - p0.y) * i / 10);
    host.spin(0.01);
  }
  host.up(p1.x, p1.y);
  EXPECT_EQ(LY_MULTIGRID_MODE_DROPPING, grid->getInteractionMode());
  ASSERT_EQ(1u, host.swaps.size());
  EXPECT_EQ(std::make_pair(0, 1), host.swaps[0]);
  EXPECT_EQ(second, host.items()->get(0));
  EXPECT_EQ(first, host.items()->get(1));

  // Taps during the fly-back are ignored.
  const int selections = host.selections;
  host.tap(p0.x, p0.y);
  EXPECT_EQ(LY_MULTIGRID_MODE_DROPPING, grid->getInteractionMode());
  ASSERT_TRUE(runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_IDLE; }, 3.0));
  host.spin(0.1);
  EXPECT_EQ(selections, host.selections);
  EXPECT_EQ(1, grid->getCurrentIndex()) << "the dropped photo's cell is selected";
  ASSERT_FALSE(host.changes.empty());
  // Both photos got crops with their new cells' proportions.
  for (int i = 0; i < 2; ++i) {
    const CLyRectangle crop = host.crop(i);
    const CLyFloatRectangle cell = host.cell(i);
    EXPECT_NEAR((double)(crop.w - crop.x) / (crop.h - crop.y), cell.x2 / cell.y2, 0.02) << i;
  }
}

TEST(CollageTouch, DroppingOnItsOwnCellSwapsNothing) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  ASSERT_TRUE(host.select(1));
  CLyMultiGridSrcItem* item = host.items()->get(1);
  const CLyPoint p = host.centre(1);
  host.down(p.x, p.y);
  ASSERT_TRUE(
      runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_DRAGGING; }, 3.0));
  host.move(p.x + 30, p.y + 30);
  host.spin(0.02);
  host.up(p.x + 30, p.y + 30);
  ASSERT_TRUE(runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_IDLE; }, 3.0));
  EXPECT_TRUE(host.swaps.empty());
  EXPECT_EQ(item, host.items()->get(1));
  EXPECT_EQ(1, grid->getCurrentIndex());
}

// ---------------------------------------------------------------- handler drag

TEST(CollageTouch, HandlerDragMovesTheDividerButNeverBelowTheMinimum) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  ASSERT_TRUE(host.select(0));
  CLyFocusBox* box = grid->getFocusBox();
  ASSERT_NE(nullptr, box);
  Evas_Object* grip = box->getGrip(0);
  ASSERT_TRUE(grip && evas_object_visible_get(grip));
  int gx = 0, gy = 0, gw = 0, gh = 0;
  evas_object_geometry_get(grip, &gx, &gy, &gw, &gh);
  const int x0 = gx + gw / 2, y0 = gy + gh / 2;
  const float before = host.list()->getItem(0)->x2;
  const int selections = host.selections;

  // Drag the divider far to the right in slow steps.
  host.down(x0, y0);
  host.spin(0.2);
  int x = x0;
  for (int i = 0; i < 14; ++i) {
    x += 60;
    host.move(x, y0);
    host.spin(0.16);
  }
  host.up(x, y0);
  host.spin(0.05);
  const float after = host.list()->getItem(0)->x2;
  EXPECT_GT(after, before);
  for (int i = 0; i < host.list()->getCount(); ++i) {
    const CLyFloatRectangle* r = host.list()->getItem(i);
    EXPECT_GE(r->x2 - r->x1, CLyMultiGridDrawRectList::kMinCellSize - 1e-4) << i;
    EXPECT_GE(r->y2 - r->y1, CLyMultiGridDrawRectList::kMinCellSize - 1e-4) << i;
  }
  EXPECT_EQ(0, grid->getCurrentIndex()) << "the handler drag keeps the selection";
  EXPECT_EQ(selections, host.selections);
  EXPECT_EQ(LY_MULTIGRID_MODE_IDLE, grid->getInteractionMode());
  ASSERT_FALSE(host.changes.empty());
  // The frame follows the cell.
  const CLyFloatRectangle c = host.cell(0);
  EXPECT_EQ((int)std::floor(c.x2 + 0.01), box->getBoxRect().w);

  // The next tap is an ordinary tap again.
  ASSERT_TRUE(host.select(1));
}

// ---------------------------------------------------------------- press effect

TEST(CollageTouch, PlaceholderTapAsksForAPicture) {
  HostOptions options;
  options.singleImage = true;
  options.photos = 2;
  options.placeholders = {1};
  CollageHost host(options);
  ASSERT_TRUE(host.ok());
  const CLyPoint p = host.centre(1);
  host.down(p.x, p.y);
  host.spin(0.05);
  ASSERT_EQ(1u, host.mouseDowns.size());
  EXPECT_EQ(std::make_pair(1, true), host.mouseDowns[0]);
  host.up(p.x, p.y);
  host.spin(0.05);
  EXPECT_EQ(1, host.addPictures);
  EXPECT_EQ(-1, host.grid()->getCurrentIndex());

  // Pressed and dragged off the placeholder: no request.
  host.down(p.x, p.y);
  host.spin(0.02);
  const CLyPoint q = host.centre(0);
  host.move(q.x, q.y);
  host.spin(0.02);
  host.up(q.x, q.y);
  host.spin(0.05);
  EXPECT_EQ(1, host.addPictures);
}

TEST(CollageTouch, SecondPressDropsTheFirstAndReleaseWithoutPressDrawsNothing) {
  HostOptions options;
  options.singleImage = true;
  options.photos = 3;
  options.placeholders = {0, 1, 2};
  CollageHost host(options);
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  Evas_Object* canvasImage = findCanvasImage(grid);
  ASSERT_NE(nullptr, canvasImage);
  const CLyPoint p0 = host.centre(0), p1 = host.centre(1), p2 = host.centre(2);
  // Away from the icon in the middle of each cell.
  auto probe = [&](int i) {
    const CLyFloatRectangle c = host.cell(i);
    return canvasPixel(grid, canvasImage, (int)(c.x1 + 12), (int)(c.y1 + c.y2 / 2));
  };
  const uint32_t black = probe(0);
  EXPECT_EQ(0xff000000u, black);

  auto send = [&](int type, const CLyPoint& p) {
    CLyGestureInfo info;
    info.x = p.x;
    info.y = p.y;
    grid->__processGestureEvent(type, LY_GESTURE_STATE_START, &info);
  };
  // A release over a placeholder that was never pressed: nothing drawn, no request.
  send(LY_GESTURE_MOUSE_UP, p2);
  EXPECT_EQ(black, probe(2));
  EXPECT_EQ(0, host.addPictures);

  send(LY_GESTURE_MOUSE_DOWN, p0);
  const uint32_t pressed = probe(0);
  EXPECT_NE(black, pressed) << "the pressed placeholder is tinted";
  send(LY_GESTURE_MOUSE_DOWN, p1);
  EXPECT_NE(black, probe(1));
  // Only the second effect is left: releasing restores cell 1, not cell 0.
  send(LY_GESTURE_MOUSE_UP, p1);
  EXPECT_EQ(black, probe(1));
  EXPECT_EQ(pressed, probe(0)) << "the first effect was dropped, not released";
  EXPECT_EQ(1, host.addPictures);
  send(LY_GESTURE_MOUSE_UP, p0);
  EXPECT_EQ(1, host.addPictures) << "no effect left to release";
}

TEST(CollageTouch, ClearingTheSelectionDuringADragStillDropsThePhoto) {
  CollageHost host;
  ASSERT_TRUE(host.ok());
  CLyMultiGrid* grid = host.grid();
  ASSERT_TRUE(host.select(0));
  const CLyPoint p0 = host.centre(0), p1 = host.centre(1);
  host.down(p0.x, p0.y);
  ASSERT_TRUE(
      runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_DRAGGING; }, 3.0));
  EXPECT_TRUE(grid->clearSelection());
  EXPECT_EQ(LY_MULTIGRID_MODE_DRAGGING, grid->getInteractionMode());
  for (int i = 1; i <= 5; ++i) {
    host.move(p0.x + (p1.x - p0.x) * i / 5, p0.y + (p1.y - p0.y) * i / 5);
    host.spin(0.01);
  }
  host.up(p1.x, p1.y);
  ASSERT_TRUE(runMainLoopUntil([&]() { return grid->getInteractionMode() == LY_MULTIGRID_MODE_IDLE; }, 3.0));
  ASSERT_EQ(1u, host.swaps.size());
  EXPECT_EQ(std::make_pair(0, 1), host.swaps[0]);
  // Both cells show photos again: nothing is left black.
  Evas_Object* canvasImage = findCanvasImage(grid);
  ASSERT_NE(nullptr, canvasImage);
  EXPECT_NE(0xff000000u, canvasPixel(grid, canvasImage, p0.x, p0.y));
  EXPECT_NE(0xff000000u, canvasPixel(grid, canvasImage, p1.x, p1.y));
}

}  // namespace
