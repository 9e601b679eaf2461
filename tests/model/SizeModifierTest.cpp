#include <gtest/gtest.h>

#include <typeinfo>

#include "model/size-modifier/CLySizeModifier.h"
#include "model/size-modifier/CLySizeModifierGrid2Style1.h"
#include "model/size-modifier/CLySizeModifierGrid5Style4.h"
#include "model/size-modifier/CLySizeModifierGrid5Style8.h"
#include "model/size-modifier/CLySizeModifierGrid6Style4.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "tests/model/ModelTestHelp.h"

namespace {

struct Cells {
  explicit Cells(std::initializer_list<CLyFloatRectangle> rects) : values(rects) {
    for (auto& r : values) pointers.push_back(&r);
  }
  std::vector<CLyFloatRectangle> values;
  std::vector<CLyFloatRectangle*> pointers;
};

const CLyGridHandlerInfo* handlerOf(int count, int layout, int cell, int h) {
  return pictavo::test::loadedCatalogue()
      .getGridImageLayout(count, layout)
      ->getImageInfo(cell)
      ->getHandlerInfo(h);
}

TEST(SizeModifier, FactoryPicksTheRuleOfTheLayout) {
  CLyPoint drag(0, 0);
  auto ruleOf = [&](int cells, int style) -> const std::type_info* {
    std::vector<CLyFloatRectangle> candidates(cells, CLyFloatRectangle(0, 0, 1, 1));
    std::vector<CLyFloatRectangle*> live;
    for (auto& c : candidates) live.push_back(&c);
    CLySizeModifier modifier(style, 0, 0, live, candidates, nullptr, &drag);
    return modifier.getRule() ? &typeid(*modifier.getRule()) : nullptr;
  };
  EXPECT_EQ(*ruleOf(2, 0), typeid(CLySizeModifierGrid2Style1));
  EXPECT_EQ(*ruleOf(3, 2), typeid(CLySizeModifierGrid5Style4));
  EXPECT_EQ(*ruleOf(4, 2), typeid(CLySizeModifierGrid5Style4));
  EXPECT_EQ(*ruleOf(5, 3), typeid(CLySizeModifierGrid5Style4));
  EXPECT_EQ(*ruleOf(3, 5), typeid(CLySizeModifierGrid5Style8));
  EXPECT_EQ(*ruleOf(4, 7), typeid(CLySizeModifierGrid5Style8));
  EXPECT_EQ(*ruleOf(5, 7), typeid(CLySizeModifierGrid5Style8));
  EXPECT_EQ(*ruleOf(6, 3), typeid(CLySizeModifierGrid6Style4));
  const int ranges[] = {2, 6, 9, 8, 7};
  for (int n = 2; n <= 6; ++n) {
    for (int s = 0; s < ranges[n - 2]; ++s) EXPECT_NE(ruleOf(n, s), nullptr) << n << " " << s;
    EXPECT_EQ(ruleOf(n, ranges[n - 2]), nullptr) << n;
    EXPECT_EQ(ruleOf(n, -1), nullptr) << n;
  }
  EXPECT_EQ(ruleOf(1, 0), nullptr);
  EXPECT_EQ(ruleOf(7, 0), nullptr);

  // Without a rule both operations decline.
  std::vector<CLyFloatRectangle> candidates(2, CLyFloatRectangle(0, 0, 1, 1));
  std::vector<CLyFloatRectangle*> live{&candidates[0], &candidates[1]};
  CLySizeModifier none(5, 0, 0, live, candidates, nullptr, &drag);
  EXPECT_FALSE(none.modifyX(-0.1f, 0.14f, 1, {1, 0}));
  EXPECT_FALSE(none.modifyY(-0.1f, 0.14f, 1, {1, 0}));
}

TEST(SizeModifier, TwoCellDividerSnapsToTheLimit) {
  const CLyGridHandlerInfo* handler = handlerOf(2, 0, 0, 0);
  Cells cells{{0, 0, 0.2f, 1}, {0.2f, 0, 1, 1}};
  std::vector<CLyFloatRectangle> candidates{{0, 0, 0.1f, 1}, {0.1f, 0, 1, 1}};
  CLyPoint drag(-100, 0);
  {
    CLySizeModifier modifier(0, 0, 0, cells.pointers, candidates, handler, &drag);
    EXPECT_TRUE(modifier.modifyX(-0.1f, 0.14f, 1, {1, 0}));
    EXPECT_FALSE(modifier.modifyY(-0.1f, 0.14f, 1, {1, 0}));
  }
  EXPECT_FLOAT_EQ(cells.values[0].x2, 0.14f);
  EXPECT_FLOAT_EQ(cells.values[1].x1, 0.14f);
  {
    // At the limit already: handled, nothing changes.
    CLySizeModifier modifier(0, 0, 0, cells.pointers, candidates, handler, &drag);
    EXPECT_TRUE(modifier.modifyX(-0.1f, 0.14f, 1, {1, 0}));
  }
  EXPECT_FLOAT_EQ(cells.values[0].x2, 0.14f);
  {
    // The squeezed side is not marked: the rule declines.
    CLySizeModifier modifier(0, 0, 0, cells.pointers, candidates, handler, &drag);
    EXPECT_FALSE(modifier.modifyX(-0.1f, 0.14f, 1, {0, 1}));
  }
}

TEST(SizeModifier, RowLeadingDividerPacksTheMarkedCells) {
  // Four cells in a row, focus 3, its left handler dragged 0.1 to the left with
  // cells 0 and 1 marked: f / k = 3 / 1.
  const CLyGridHandlerInfo* handler = handlerOf(4, 2, 3, 0);
  Cells cells{{0, 0, 0.2f, 1}, {0.2f, 0, 0.4f, 1}, {0.4f, 0, 0.7f, 1}, {0.7f, 0, 1, 1}};
  CLyFloatRectangle v;
  handler->getImageVariation(2, -0.1f, 0, &v);
  const float dw2 = v.x2;
  std::vector<CLyFloatRectangle> candidates(cells.values);
  CLyPoint drag(-100, 0);
  CLySizeModifier modifier(2, 3, 0, cells.pointers, candidates, handler, &drag);
  EXPECT_TRUE(modifier.modifyX(-0.1f, 0.14f, 2, {1, 1, 0, 0}));
  EXPECT_FLOAT_EQ(cells.values[0].x1, 0.0f);
  EXPECT_FLOAT_EQ(cells.values[0].x2, 0.14f);
  EXPECT_FLOAT_EQ(cells.values[1].x1, 0.14f);
  EXPECT_FLOAT_EQ(cells.values[1].x2, 0.28f);
  EXPECT_FLOAT_EQ(cells.values[2].x1, 0.28f);
  EXPECT_NEAR(cells.values[2].x2, 0.7f + 3 * dw2, 1e-6);
  EXPECT_FLOAT_EQ(cells.values[3].x1, cells.values[2].x2);

  // A long drag stops cell 2's right edge at 0.42, the limit after two packed cells.
  Cells again{{0, 0, 0.2f, 1}, {0.2f, 0, 0.4f, 1}, {0.4f, 0, 0.7f, 1}, {0.7f, 0, 1, 1}};
  CLySizeModifier longDrag(2, 3, 0, again.pointers, candidates, handler, &drag);
  EXPECT_TRUE(longDrag.modifyX(-0.6f, 0.14f, 2, {1, 1, 0, 0}));
  EXPECT_FLOAT_EQ(again.values[2].x2, 0.42f);
  EXPECT_FLOAT_EQ(again.values[3].x1, 0.42f);
}

TEST(SizeModifier, RowTrailingDividerPacksFromTheBorder) {
  const CLyGridHandlerInfo* handler = handlerOf(4, 2, 0, 0);
  Cells cells{{0, 0, 0.4f, 1}, {0.4f, 0, 0.6f, 1}, {0.6f, 0, 0.8f, 1}, {0.8f, 0, 1, 1}};
  std::vector<CLyFloatRectangle> candidates(cells.values);
  CLyPoint drag(500, 0);
  CLySizeModifier modifier(2, 0, 0, cells.pointers, candidates, handler, &drag);
  EXPECT_TRUE(modifier.modifyX(0.5f, 0.14f, 3, {0, 1, 1, 1}));
  EXPECT_FLOAT_EQ(cells.values[3].x1, 0.86f);
  EXPECT_FLOAT_EQ(cells.values[3].x2, 1.0f);
  EXPECT_FLOAT_EQ(cells.values[2].x2, 0.86f);
  EXPECT_FLOAT_EQ(cells.values[2].x1, 0.72f);
  EXPECT_FLOAT_EQ(cells.values[1].x1, 1.0f - 3 * 0.14f);
  EXPECT_FLOAT_EQ(cells.values[0].x2, cells.values[1].x1);
  // Packed already: handled without change.
  CLySizeModifier again(2, 0, 0, cells.pointers, candidates, handler, &drag);
  EXPECT_TRUE(again.modifyX(0.2f, 0.14f, 3, {0, 1, 1, 1}));
  EXPECT_FLOAT_EQ(cells.values[0].x2, 1.0f - 3 * 0.14f);
}

TEST(SizeModifier, RowTrailingDividerKeepsBoostedCellsAtTheLimit) {
  // Five in a row, focus 1, its right handler dragged 0.06: cell 3 is marked,
  // so cells 2 and 4 take 3 / 2 of their share. Capping cell 2 only against
  // the border would leave it 0.135 wide; it stops at 0.14 instead.
  const CLyGridHandlerInfo* handler = handlerOf(5, 3, 1, 1);
  Cells cells{
      {0, 0, 0.14f, 1}, {0.14f, 0, 0.29f, 1}, {0.29f, 0, 0.455f, 1}, {0.455f, 0, 0.6f, 1}, {0.6f, 0, 1, 1}};
  std::vector<CLyFloatRectangle> candidates(cells.values);
  CLyPoint drag(60, 0);
  CLySizeModifier modifier(3, 1, 1, cells.pointers, candidates, handler, &drag);
  EXPECT_TRUE(modifier.modifyX(0.06f, 0.14f, 1, {0, 0, 0, 1, 0}));
  EXPECT_NEAR(cells.values[4].x1, 0.63f, 1e-6);
  EXPECT_NEAR(cells.values[3].x1, 0.49f, 1e-6);
  EXPECT_NEAR(cells.values[2].x2 - cells.values[2].x1, 0.14f, 1e-6);
  EXPECT_FLOAT_EQ(cells.values[1].x2, cells.values[2].x1);
  EXPECT_FLOAT_EQ(cells.values[0].x2, 0.14f);
}

TEST(SizeModifier, ColumnRuleIsTheRowRuleOnTheVerticalAxis) {
  pictavo::test::loadedCatalogue();
  CLyMultiGridDrawRectList list;
  pictavo::test::fillList(list, 3, 5, 800, 1000);
  const CLyGridImageInfo* middle = pictavo::test::loadedCatalogue().getGridImageLayout(3, 5)->getImageInfo(1);
  list.updateItem(1, middle, 1, CLyPoint(0, 900));  // bottom divider far down
  EXPECT_FLOAT_EQ(list.getItem(2)->y1, 0.86f);
  EXPECT_FLOAT_EQ(list.getItem(1)->y2, 0.86f);
  list.updateItem(1, middle, 0, CLyPoint(0, -900));  // top divider far up
  EXPECT_FLOAT_EQ(list.getItem(0)->y2, 0.14f);
  EXPECT_FLOAT_EQ(list.getItem(1)->y1, 0.14f);
  list.updateItem(1, middle, 0, CLyPoint(300, 0));  // horizontal drags do nothing here
  EXPECT_FLOAT_EQ(list.getItem(1)->x1, 0.0f);
  EXPECT_FLOAT_EQ(list.getItem(1)->x2, 1.0f);
  list.clear(true);
}

TEST(SizeModifier, FocusPastTheTableDeclines) {
  const CLyGridHandlerInfo* handler = handlerOf(4, 1, 2, 0);
  Cells cells{{0, 0, 1, 0.5f}, {0, 0.5f, 0.2f, 1}, {0.2f, 0.5f, 0.6f, 1}, {0.6f, 0.5f, 1, 1}};
  std::vector<CLyFloatRectangle> candidates(cells.values);
  CLyPoint drag(-100, 0);
  CLySizeModifier modifier(1, 9, 0, cells.pointers, candidates, handler, &drag);
  EXPECT_FALSE(modifier.modifyX(-0.1f, 0.14f, 1, {0, 1, 0, 0}));
  EXPECT_FALSE(modifier.modifyY(-0.1f, 0.14f, 1, {0, 1, 0, 0}));
}

}  // namespace
