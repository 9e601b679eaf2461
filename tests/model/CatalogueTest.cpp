#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>

#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "model/style/CLyMultiGridStyleManager.h"
#include "tests/model/ModelTestHelp.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::TempDir;

namespace {

class Catalogue : public ::testing::Test {
 protected:
  // Tests that load other resource folders leave the shipped catalogue behind.
  void TearDown() override { ASSERT_TRUE(CLyMultiGridStyleManager::getInstance().initialize()); }
  CLyMultiGridStyleManager& catalogue() { return pictavo::test::loadedCatalogue(); }

  // A resource folder with the shipped style files, ready to be spoiled.
  std::string copyOfStyles(const TempDir& dir) {
    namespace fs = std::filesystem;
    const char* res = getenv("PICTAVO_RES_DIR");
    EXPECT_NE(res, nullptr);
    fs::create_directories(dir.path() + "/styles/grid");
    for (int n = 2; n <= 6; ++n) {
      const std::string name = "/styles/grid/styleimage" + std::to_string(n) + ".json";
      fs::copy_file(std::string(res) + name, dir.path() + name);
    }
    return dir.path() + "/";
  }
};

TEST_F(Catalogue, LoadsTheShippedCounts) {
  ASSERT_TRUE(catalogue().initialize());
  const int expected[] = {2, 6, 9, 8, 7};
  int total = 0;
  for (int n = 2; n <= 6; ++n) {
    EXPECT_EQ(catalogue().getLayoutCount(n), expected[n - 2]);
    EXPECT_EQ(catalogue().getGridLayoutCount(n), expected[n - 2]);
    EXPECT_EQ(CLyMultiGridStyleManager::getThumbnailCount(n), expected[n - 2]);
    total += catalogue().getLayoutCount(n);
    for (int i = 0; i < catalogue().getLayoutCount(n); ++i) {
      EXPECT_EQ(catalogue().getGridImageLayout(n, i)->getImageCount(), n);
    }
  }
  EXPECT_EQ(total, 32);
  EXPECT_EQ(catalogue().getRandomStyleRange(), 28);
}

TEST_F(Catalogue, BadCountsAndIndexes) {
  LogCapture capture;
  EXPECT_EQ(catalogue().getGridImageLayout(3, 6), nullptr);
  EXPECT_TRUE(capture.contains("nIndex(6) is invalid!"));
  EXPECT_EQ(catalogue().getGridImageLayout(3, -1), nullptr);
  EXPECT_EQ(catalogue().getGridImageLayout(7, 0), nullptr);
  EXPECT_TRUE(capture.contains("imgCnt(7) is invalid!"));
  EXPECT_EQ(catalogue().getGridImageLayout(1, 0), nullptr);
  EXPECT_TRUE(capture.contains("imgCnt(1) is invalid!"));
  EXPECT_EQ(catalogue().getLayoutCount(1), 0);
  EXPECT_EQ(catalogue().getLayoutCount(7), 0);
  EXPECT_EQ(catalogue().getGridLayoutCount(9), 0);
  float out[6][4] = {};
  EXPECT_FALSE(catalogue().getDrawRects(7, 0, 0, out));
  // A missing layout leaves the output alone and still answers true.
  out[0][0] = 5;
  EXPECT_TRUE(catalogue().getDrawRects(3, 0, 40, out));
  EXPECT_FLOAT_EQ(out[0][0], 5.0f);
}

TEST_F(Catalogue, ThumbnailsFollowTheTable) {
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(3, 2, true), "pictavo_ic_2depth_03_3_press.png");
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(2, 0, false), "pictavo_ic_2depth_02_1.png");
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(6, 6, false), "pictavo_ic_2depth_06_7.png");
  LogCapture capture;
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(8, 0, false), "");
  EXPECT_TRUE(capture.contains("imgCnt(8) is Invalid"));
  // Past the row of its count there is no icon (not the next count's icons).
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(2, 2, false), "");
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(6, 7, true), "");
  EXPECT_EQ(catalogue().getLayoutThumbnailPath(4, -1, true), "");
}

TEST_F(Catalogue, DrawRectsFillOnlyTheLayoutsCells) {
  float out[6][4] = {};
  ASSERT_TRUE(catalogue().getDrawRects(2, 3, 0, out));
  EXPECT_FLOAT_EQ(out[0][2], 0.5f);
  EXPECT_FLOAT_EQ(out[1][0], 0.5f);
  for (int k = 2; k < 6; ++k) {
    for (int j = 0; j < 4; ++j) EXPECT_EQ(out[k][j], 0.0f);
  }
}

TEST_F(Catalogue, MissingLayoutsKeyStopsTheLaterCounts) {
  TempDir dir;
  const std::string res = copyOfStyles(dir);
  std::ofstream(res + "styles/grid/styleimage4.json", std::ios::trunc) << R"({"other": []})";
  LogCapture capture;
  EXPECT_FALSE(catalogue().initialize(res));
  EXPECT_TRUE(capture.contains("pArray is nullptr!"));
  EXPECT_EQ(catalogue().getLayoutCount(2), 2);
  EXPECT_EQ(catalogue().getLayoutCount(3), 6);
  EXPECT_EQ(catalogue().getLayoutCount(4), 0);
  EXPECT_EQ(catalogue().getLayoutCount(5), 0);
  EXPECT_EQ(catalogue().getLayoutCount(6), 0);
  EXPECT_EQ(catalogue().getGridImageLayout(5, 0), nullptr);
}

TEST_F(Catalogue, BrokenFilesAreLoggedNotThrown) {
  TempDir dir;
  const std::string res = copyOfStyles(dir);
  const struct {
    const char* content;
    const char* log;
  } cases[] = {
      {"{not json", "Failed to load"},
      {"", "Failed to load"},
      {R"({"layouts": [{"images": [{"rect": [0,0,1,1], "handlers": []}]}]})", "has 1 cells"},
  };
  for (const auto& c : cases) {
    std::ofstream(res + "styles/grid/styleimage3.json", std::ios::trunc) << c.content;
    LogCapture capture;
    EXPECT_FALSE(catalogue().initialize(res)) << c.content;
    EXPECT_TRUE(capture.contains(c.log)) << c.content;
    EXPECT_EQ(catalogue().getLayoutCount(2), 2);
    EXPECT_EQ(catalogue().getLayoutCount(3), 0);
  }
  std::filesystem::remove(res + "styles/grid/styleimage2.json");
  EXPECT_FALSE(catalogue().initialize(res));
  EXPECT_EQ(catalogue().getLayoutCount(2), 0);
}

TEST_F(Catalogue, ReinitialisingDoesNotDuplicate) {
  ASSERT_TRUE(catalogue().initialize());
  ASSERT_TRUE(catalogue().initialize());
  EXPECT_EQ(catalogue().getLayoutCount(4), 9);
}

}  // namespace
