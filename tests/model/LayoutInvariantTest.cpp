// Drives seeded random handler drags through every handler of every cell of
// every shipped layout and checks after each step that the cells still tile
// the collage, stay at least 0.14 wide and high, and keep their border edges.

#include <gtest/gtest.h>

#include <random>

#include "model/CLyMultiGridDrawRectList.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "tests/model/ModelTestHelp.h"

using namespace pictavo::test;

namespace {

CLyPoint randomDrag(std::mt19937& rng) {
  std::uniform_int_distribution<int> mode(0, 6), sign(0, 1), small(1, 20), large(60, 700), tiny(1, 3);
  auto s = [&] { return sign(rng) ? 1 : -1; };
  switch (mode(rng)) {
    case 0:
      return CLyPoint(s() * small(rng), 0);
    case 1:
      return CLyPoint(0, s() * small(rng));
    case 2:
      return CLyPoint(s() * small(rng), s() * small(rng));
    case 3:
      return CLyPoint(s() * large(rng), 0);
    case 4:
      return CLyPoint(0, s() * large(rng));
    case 5:
      return CLyPoint(s() * large(rng), s() * large(rng));
    default:
      return CLyPoint(s() * tiny(rng), s() * tiny(rng));
  }
}

struct Case {
  int count;
  int index;
};

class LayoutInvariants : public ::testing::TestWithParam<Case> {};

TEST_P(LayoutInvariants, RandomHandlerDragsKeepTheTiling) {
  const Case c = GetParam();
  CLyGridImageLayoutInfo* layout = loadedCatalogue().getGridImageLayout(c.count, c.index);
  ASSERT_NE(layout, nullptr);
  ASSERT_EQ(layout->getImageCount(), c.count);

  const int kSeeds = 40, kSteps = 150;
  for (int focus = 0; focus < c.count; ++focus) {
    const CLyGridImageInfo* info = layout->getImageInfo(focus);
    for (int h = 0; h < info->getHandlerCount(); ++h) {
      bool moved = false;
      for (int seed = 0; seed < kSeeds; ++seed) {
        std::mt19937 rng(static_cast<unsigned>(seed * 7919 + focus * 31 + h));
        CLyMultiGridDrawRectList list;
        const bool tall = seed % 3 == 2;
        fillList(list, c.count, c.index, tall ? 720 : 1000, tall ? 1280 : 800);
        const auto initial = snapshot(list);
        ASSERT_TRUE(checkInvariants(initial, initial).empty()) << describe(initial);
        for (int step = 0; step < kSteps; ++step) {
          const CLyPoint drag = randomDrag(rng);
          const auto before = snapshot(list);
          list.updateItem(focus, info, h, drag);
          const auto after = snapshot(list);
          const std::string fault = checkInvariants(after, initial);
          if (!fault.empty()) {
            ADD_FAILURE() << c.count << " photos, layout " << c.index << ", focus " << focus << ", handler "
                          << h << ", seed " << seed << ", step " << step << ", drag (" << drag.x << ", "
                          << drag.y << "): " << fault << "\n before:" << describe(before)
                          << "\n after: " << describe(after);
            return;
          }
          for (int i = 0; i < c.count; ++i) {
            if (std::fabs(after[i].x1 - initial[i].x1) > 1e-4 ||
                std::fabs(after[i].y1 - initial[i].y1) > 1e-4 ||
                std::fabs(after[i].x2 - initial[i].x2) > 1e-4 ||
                std::fabs(after[i].y2 - initial[i].y2) > 1e-4) {
              moved = true;
            }
          }
        }
        list.clear(true);
      }
      EXPECT_TRUE(moved) << "handler " << h << " of cell " << focus << " never moves anything";
    }
  }
}

std::vector<Case> allLayouts() {
  std::vector<Case> cases;
  for (int count = 2; count <= 6; ++count) {
    for (int index = 0; index < loadedCatalogue().getLayoutCount(count); ++index)
      cases.push_back({count, index});
  }
  return cases;
}

std::string caseName(const ::testing::TestParamInfo<Case>& info) {
  return "photos" + std::to_string(info.param.count) + "_layout" + std::to_string(info.param.index);
}

INSTANTIATE_TEST_SUITE_P(AllShippedLayouts, LayoutInvariants, ::testing::ValuesIn(allLayouts()), caseName);

TEST(LayoutInvariants, EveryCellHasAHandlerOnEachInnerEdge) {
  for (int count = 2; count <= 6; ++count) {
    ASSERT_GT(loadedCatalogue().getLayoutCount(count), 0);
    for (int index = 0; index < loadedCatalogue().getLayoutCount(count); ++index) {
      CLyGridImageLayoutInfo* layout = loadedCatalogue().getGridImageLayout(count, index);
      for (int focus = 0; focus < count; ++focus) {
        const CLyGridImageInfo* info = layout->getImageInfo(focus);
        const CLyFloatRectangle& r = info->getRect();
        // Which inner edges some handler of this cell moves.
        bool moves[4] = {r.x1 == 0.0f, r.y1 == 0.0f, r.x2 == 1.0f, r.y2 == 1.0f};
        for (int h = 0; h < info->getHandlerCount(); ++h) {
          CLyFloatRectangle v(0, 0, 0, 0);
          info->getHandlerInfo(h)->getImageVariation(focus, 0.1f, 0.1f, &v);
          if (v.x1 != 0.0f) moves[0] = true;
          if (v.y1 != 0.0f) moves[1] = true;
          if (v.x1 + v.x2 != 0.0f && r.x2 != 1.0f) moves[2] = true;
          if (v.y1 + v.y2 != 0.0f && r.y2 != 1.0f) moves[3] = true;
        }
        EXPECT_TRUE(moves[0] && moves[1] && moves[2] && moves[3])
            << count << " photos, layout " << index << ", cell " << focus;
        EXPECT_LE(info->getHandlerCount(), 4) << "the focus box shows at most four handlers";
      }
    }
  }
}

}  // namespace
