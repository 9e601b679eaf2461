#include <gtest/gtest.h>

#include "model/CLyMultiGridDrawRectList.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "tests/model/ModelTestHelp.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

namespace {

struct ListFixture : ::testing::Test {
  ~ListFixture() override { list.clear(true); }
  void add(float l, float t, float r, float b) { list.addItem(new CLyFloatRectangle(l, t, r, b)); }
  CLyMultiGridDrawRectList list;
};

void expectRect(const CLyFloatRectangle& r, float x, float y, float w, float h) {
  EXPECT_FLOAT_EQ(r.x1, x);
  EXPECT_FLOAT_EQ(r.y1, y);
  EXPECT_FLOAT_EQ(r.x2, w);
  EXPECT_FLOAT_EQ(r.y2, h);
}

using DrawRectList = ListFixture;

TEST_F(DrawRectList, PixelRectanglesWithBorder) {
  list.setSize(1000, 800);
  list.setSpacingStep(5);
  add(0, 0, 0.5f, 1);
  add(0.5f, 0, 1, 1);
  expectRect(list.get(0), 40, 40, 440, 720);
  expectRect(list.get(1), 520, 40, 440, 720);
  list.setOffsetX(10);
  list.setOffsetY(20);
  expectRect(list.get(1), 530, 60, 440, 720);

  LogCapture capture;
  expectRect(list.get(3), 0, 0, 0, 0);
  EXPECT_TRUE(capture.contains("Invalid index[3]"));
  expectRect(list.get(-1), 0, 0, 0, 0);
  EXPECT_EQ(list.getItem(2), nullptr);
}

TEST_F(DrawRectList, SingleStepSpacingIsSlightlyShort) {
  list.setSize(1000, 1000);
  add(0.5f, 0, 1, 1);
  const int expected[] = {0, 3, 7, 11, 15, 20};
  for (int step = 0; step <= 5; ++step) {
    list.setSpacingStep(step);
    // A cell starting inside the collage begins m pixels after its edge.
    EXPECT_FLOAT_EQ(list.get(0).x1, 500.0f + static_cast<float>(expected[step])) << step;
    EXPECT_EQ(list.getSpacingStep(), step);
  }
  // A tiny cell never collapses below one pixel.
  list.clear(true);
  list.setSpacingStep(10);
  add(0.5f, 0.5f, 0.51f, 0.51f);
  EXPECT_FLOAT_EQ(list.get(0).x2, 1.0f);
  EXPECT_FLOAT_EQ(list.get(0).y2, 1.0f);
}

TEST_F(DrawRectList, StepsClampAndConvertFromPixels) {
  list.setSize(1000, 800);
  list.setSpacingStep(15);
  EXPECT_EQ(list.getSpacingStep(), 10);
  list.setSpacingStep(-1);
  EXPECT_EQ(list.getSpacingStep(), 0);
  EXPECT_FLOAT_EQ(list.getSpacing(), 0.0f);
  EXPECT_EQ(list.getSpacingStep(100), 10);
  EXPECT_EQ(list.getSpacingStep(8), 2);
  EXPECT_EQ(list.getSpacingStep(-30), 0);
  list.setRoundStep(3);
  EXPECT_EQ(list.getRoundStep(), 3);
  EXPECT_EQ(list.getRoundness(), 60);
  list.setRoundStep(99);
  EXPECT_EQ(list.getRoundStep(), 10);
  EXPECT_EQ(list.getRoundness(), 199);  // single precision: 10 x 0.02f x 1000 truncates to 199
  list.setRoundStep(-4);
  EXPECT_EQ(list.getRoundness(), 0);
  // No width yet: no division by zero.
  CLyMultiGridDrawRectList empty;
  EXPECT_EQ(empty.getSpacingStep(50), 0);
}

TEST_F(DrawRectList, IndexAtCellEdges) {
  list.setSize(1000, 800);
  list.setOffsetX(100);
  list.setOffsetY(50);
  add(0, 0, 0.5f, 1);
  add(0.5f, 0, 1, 1);
  EXPECT_EQ(list.getIndex(100, 50), 0);     // top-left corner belongs to the cell
  EXPECT_EQ(list.getIndex(599, 400), 0);    // just before the divider
  EXPECT_EQ(list.getIndex(600, 400), 1);    // the divider is the right cell's left edge
  EXPECT_EQ(list.getIndex(1099, 849), 1);   // last pixel
  EXPECT_EQ(list.getIndex(1100, 400), -1);  // right edge of the collage is outside
  EXPECT_EQ(list.getIndex(400, 850), -1);
  EXPECT_EQ(list.getIndex(99, 400), -1);
  // Later cells win where cells overlap.
  add(0.4f, 0, 0.6f, 1);
  EXPECT_EQ(list.getIndex(550, 400), 2);
}

TEST_F(DrawRectList, ItemsCopyAndLimits) {
  for (int i = 0; i < 6; ++i) add(0, 0, 1, 1);
  CLyFloatRectangle* extra = new CLyFloatRectangle(0, 0, 1, 1);
  EXPECT_FALSE(list.addItem(extra));
  delete extra;
  EXPECT_FALSE(list.addItem(nullptr));
  EXPECT_EQ(list.getCount(), 6);
  CLyMultiGridDrawRectList other;
  list.copyItems(&other);
  EXPECT_EQ(other.getCount(), 6);
  other.getItem(0)->x2 = 0.5f;
  EXPECT_FLOAT_EQ(list.getItem(0)->x2, 1.0f);
  other.clear(true);
  LogCapture capture;
  list.copyItems(nullptr);
  EXPECT_TRUE(capture.contains("Invalid list"));
  list.setStyleIndex(4);
  EXPECT_EQ(list.getStyleIndex(), 4);
}

TEST_F(DrawRectList, DragMovesTheDividerAndCallsTheRuleBelowTheLimit) {
  pictavo::test::fillList(list, 2, 0);
  const CLyGridImageInfo* left = pictavo::test::loadedCatalogue().getGridImageLayout(2, 0)->getImageInfo(0);
  list.updateItem(0, left, 0, CLyPoint(-100, 0));  // 0.1 to the left
  EXPECT_NEAR(list.getItem(0)->x2, 0.4f, 1e-6);
  EXPECT_NEAR(list.getItem(1)->x1, 0.4f, 1e-6);
  EXPECT_FLOAT_EQ(list.getItem(1)->x2, 1.0f);
  list.updateItem(0, left, 0, CLyPoint(-200, 0));  // to 0.2
  EXPECT_NEAR(list.getItem(0)->x2, 0.2f, 1e-6);
  // A step that would leave 0.1: the rule snaps the divider to 0.14.
  list.updateItem(0, left, 0, CLyPoint(-100, 0));
  EXPECT_FLOAT_EQ(list.getItem(0)->x2, 0.14f);
  EXPECT_FLOAT_EQ(list.getItem(1)->x1, 0.14f);
  // Already at the limit: nothing moves.
  list.updateItem(0, left, 0, CLyPoint(-50, 0));
  EXPECT_FLOAT_EQ(list.getItem(0)->x2, 0.14f);
  // The other way, from the right border.
  list.updateItem(0, left, 0, CLyPoint(900, 0));
  EXPECT_FLOAT_EQ(list.getItem(0)->x2, 0.86f);
  EXPECT_FLOAT_EQ(list.getItem(1)->x1, 0.86f);

  LogCapture capture;
  list.updateItem(0, left, 5, CLyPoint(10, 0));
  EXPECT_TRUE(capture.contains("Failed to get handler"));
  EXPECT_FLOAT_EQ(list.getItem(0)->x2, 0.86f);
}

TEST_F(DrawRectList, WithoutARuleADragNeverSqueezesACellBelowTheLimit) {
  pictavo::test::fillList(list, 2, 0);
  list.setStyleIndex(9);  // no rule for this index
  const CLyGridImageInfo* left = pictavo::test::loadedCatalogue().getGridImageLayout(2, 0)->getImageInfo(0);
  list.updateItem(0, left, 0, CLyPoint(-300, 0));
  EXPECT_NEAR(list.getItem(0)->x2, 0.2f, 1e-6);
  list.updateItem(0, left, 0, CLyPoint(-100, 0));
  EXPECT_NEAR(list.getItem(0)->x2, 0.2f, 1e-6);  // held, not 0.1
}

TEST_F(DrawRectList, CornerHandlerMovesBothAxesAndHoldsOnlyTheLimitedOne) {
  // Five photos, layout 1: the centre cell's first handler is its bottom-right corner.
  pictavo::test::fillList(list, 5, 1, 900, 900);
  const CLyGridImageInfo* centre = pictavo::test::loadedCatalogue().getGridImageLayout(5, 1)->getImageInfo(4);
  list.updateItem(4, centre, 0, CLyPoint(60, 90));
  EXPECT_NEAR(list.getItem(4)->x2, 2.0f / 3 + 60.0f / 900, 1e-5);
  EXPECT_NEAR(list.getItem(4)->y2, 2.0f / 3 + 0.1f, 1e-5);
  EXPECT_FLOAT_EQ(list.getItem(1)->x1, list.getItem(4)->x2);
  EXPECT_FLOAT_EQ(list.getItem(3)->y1, list.getItem(4)->y2);
  // Far right: the right cell stops at 0.14, the vertical part still applies.
  list.updateItem(4, centre, 0, CLyPoint(500, -30));
  EXPECT_FLOAT_EQ(list.getItem(4)->x2, 0.86f);
  EXPECT_NEAR(list.getItem(4)->y2, 2.0f / 3 + 0.1f - 30.0f / 900, 1e-5);
}

}  // namespace
