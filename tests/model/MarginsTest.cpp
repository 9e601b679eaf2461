#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

#include "model/CLyMultiGridModel.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::TempDir;

TEST(Margins, ShippedFileHasThreeRatiosWithFourPaddings) {
  CLyMultiGridModel model;
  ASSERT_EQ(model.getMarginsCount(), 3);
  for (int i = 0; i < 3; ++i) {
    ASSERT_EQ(model.getMargins(i).size(), 4u) << i;
    for (int v : model.getMargins(i)) EXPECT_GE(v, 0);
  }
  LogCapture capture;
  EXPECT_TRUE(model.getMargins(3).empty());
  EXPECT_TRUE(model.getMargins(-1).empty());
  EXPECT_TRUE(capture.contains("Invalid margin index(3)"));
}

TEST(Margins, BadItemsAreSkippedAndBadFilesLeaveTheTableEmpty) {
  TempDir dir;
  std::filesystem::create_directories(dir.path() + "/config");
  const std::string file = dir.path() + "/config/margins.json";
  const std::string res = dir.path() + "/";

  std::ofstream(file, std::ios::trunc) << R"({"items": [3, {"x": 1}, {"margins": [1, 2, 3, 4]}]})";
  CLyMultiGridModel skipped(res);
  ASSERT_EQ(skipped.getMarginsCount(), 1);
  EXPECT_EQ(skipped.getMargins(0), (std::vector<int>{1, 2, 3, 4}));

  LogCapture capture;
  std::ofstream(file, std::ios::trunc) << R"({"other": []})";
  EXPECT_EQ(CLyMultiGridModel(res).getMarginsCount(), 0);
  EXPECT_TRUE(capture.contains("Invalid array"));
  std::ofstream(file, std::ios::trunc) << "{";
  EXPECT_EQ(CLyMultiGridModel(res).getMarginsCount(), 0);
  std::filesystem::remove(file);
  EXPECT_EQ(CLyMultiGridModel(res).getMarginsCount(), 0);
  EXPECT_TRUE(capture.contains("Failed to load"));
}
