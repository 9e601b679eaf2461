// Bilinear resize and the two strength blends.
#include <gtest/gtest.h>

#include <array>
#include <cmath>

#include "image-editor/IE_Engine.h"
#include "tests/imageeditor/EffectTestImages.h"
#include "tests/support/TestSupport.h"

using effects_test::makeImage;

TEST(AlphaBlending, At100GivesSrcTimes255Over256AndKeepsTheFourthByte) {
  auto src = makeImage(7, 5, 1), dst = makeImage(7, 5, 2);
  const auto before = dst;
  IeImageInfo s{7, 5, 9, src.data()}, d{7, 5, 9, dst.data()};
  ASSERT_EQ(IEL_Alpha_blending(&s, &d, 100.0f), IE_ERROR_NONE);
  for (size_t i = 0; i < dst.size(); ++i) {
    if (i % 4 == 3)
      EXPECT_EQ(dst[i], before[i]) << i;
    else
      EXPECT_EQ(dst[i], (src[i] * 255) >> 8) << i;
  }
}

TEST(AlphaBlending, IntermediateStrengthsFollowTheTruncatedWeight) {
  for (float alpha : {0.0f, 39.0f, 50.0f, 57.0f}) {
    auto src = makeImage(5, 5, 3), dst = makeImage(5, 5, 4);
    const auto before = dst;
    IeImageInfo s{5, 5, 8, src.data()}, d{5, 5, 8, dst.data()};
    ASSERT_EQ(IEL_Alpha_blending(&s, &d, alpha), IE_ERROR_NONE);
    const unsigned a = (unsigned char)(alpha / 100.0f * 255.0f);
    for (size_t i = 0; i < dst.size(); ++i)
      if (i % 4 != 3) {
        ASSERT_EQ(dst[i], (before[i] * (255 - a) + src[i] * a) >> 8) << alpha << " @" << i;
      }
  }
}

TEST(AlphaBlending, InvalidInputGivesCodesAndLeavesTheDestination) {
  pictavo::test::LogCapture log;
  auto src = makeImage(3, 3), dst = makeImage(3, 3, 5);
  const auto before = dst;
  IeImageInfo s{3, 3, 9, src.data()}, d{3, 3, 9, dst.data()};
  EXPECT_EQ(IEL_Alpha_blending(&s, &d, -0.5f), IE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IEL_Alpha_blending(&s, &d, 100.5f), IE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IEL_Alpha_blending(&s, &d, std::nanf("")), IE_ERROR_INVALID_PARAMETER);
  EXPECT_TRUE(log.contains("IEL_Alpha_blending Invalid  alpha val:"));
  EXPECT_EQ(IEL_Alpha_blending(nullptr, &d, 50), IE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IEL_Alpha_blending(&s, nullptr, 50), IE_ERROR_INVALID_PARAMETER);
  IeImageInfo noBuf{3, 3, 9, nullptr};
  EXPECT_EQ(IEL_Alpha_blending(&noBuf, &d, 50), IE_ERROR_INVALID_PARAMETER);
  IeImageInfo empty{0, 3, 9, src.data()};
  EXPECT_EQ(IEL_Alpha_blending(&empty, &d, 50), IE_ERROR_INVALID_SIZE);
  IeImageInfo badFormat{3, 3, 12, src.data()};
  EXPECT_EQ(IEL_Alpha_blending(&badFormat, &d, 50), IE_ERROR_INVALID_FORMAT);
  EXPECT_EQ(dst, before);
}

TEST(PercentBlending, BlendsFirstOverSecondAndNeverWritesTheFourthByte) {
  auto first = makeImage(6, 4, 1), second = makeImage(6, 4, 2);
  std::vector<uint8_t> out(first.size(), 0xAB);
  IEL_Percent_blending(first.data(), second.data(), out.data(), 6, 4, 60);
  const unsigned a = (unsigned char)(60 / 100.0f * 255.0f);
  for (size_t i = 0; i < out.size(); ++i) {
    if (i % 4 == 3)
      EXPECT_EQ(out[i], 0xAB);
    else
      EXPECT_EQ(out[i], (second[i] * (255 - a) + first[i] * a) >> 8);
  }
  // In place on the first buffer gives the same bytes.
  auto inPlace = first;
  IEL_Percent_blending(inPlace.data(), second.data(), inPlace.data(), 6, 4, 60);
  for (size_t i = 0; i < out.size(); ++i)
    if (i % 4 != 3) {
      EXPECT_EQ(inPlace[i], out[i]);
    }
}

TEST(PercentBlending, OutOfRangePercentIsClampedAndBadBuffersAreRefused) {
  auto first = makeImage(2, 2, 1), second = makeImage(2, 2, 2);
  std::vector<uint8_t> over(first.size()), full(first.size());
  IEL_Percent_blending(first.data(), second.data(), over.data(), 2, 2, 250);
  IEL_Percent_blending(first.data(), second.data(), full.data(), 2, 2, 100);
  EXPECT_EQ(over, full);
  std::vector<uint8_t> untouched(first.size(), 9);
  IEL_Percent_blending(nullptr, second.data(), untouched.data(), 2, 2, 50);
  IEL_Percent_blending(first.data(), second.data(), untouched.data(), 0, 2, 50);
  EXPECT_EQ(untouched, std::vector<uint8_t>(first.size(), 9));
}

namespace {

// A 32-bit image where every pixel of row y has value rows[y] in each byte.
std::vector<uint8_t> rowImage(const std::vector<int>& rows, int width) {
  std::vector<uint8_t> px;
  for (int v : rows)
    for (int x = 0; x < width * 4; ++x) px.push_back((uint8_t)v);
  return px;
}

}  // namespace

TEST(Resize, SameSizeSamplesRowYAtYMinusAHalf) {
  const std::vector<int> rows = {0, 100, 50, 255, 3, 4};
  auto src = rowImage(rows, 5);
  std::vector<uint8_t> out(src.size(), 0);
  IeImageInfo s{5, 6, 9, src.data()}, d{5, 6, 9, out.data()};
  ASSERT_EQ(IEL_resize_image(&s, &d), IE_ERROR_NONE);
  for (int y = 0; y < 6; ++y) {
    // Row 0 is row 0; every later one the even blend of rows y - 1 and y.
    const int expect =
        y == 0 ? rows[0] : (int)(rows[(size_t)y - 1] + (rows[(size_t)y] - rows[(size_t)y - 1]) * 0.5f + 0.5f);
    for (int k = 0; k < 20; ++k) ASSERT_EQ(out[(size_t)y * 20 + (size_t)k], expect) << "row " << y;
  }
}

TEST(Resize, SameSizeBlendsColumnsLikewiseAndKeepsChannelOrder) {
  // One row; pixel x has bytes (10x, 10x+1, 10x+2, 10x+3).
  std::vector<uint8_t> src;
  for (int x = 0; x < 6; ++x)
    for (int k = 0; k < 4; ++k) src.push_back((uint8_t)(10 * x + k));
  std::vector<uint8_t> out(src.size());
  IeImageInfo s{6, 1, 9, src.data()}, d{6, 1, 9, out.data()};
  ASSERT_EQ(IEL_resize_image(&s, &d), IE_ERROR_NONE);
  for (int k = 0; k < 4; ++k) EXPECT_EQ(out[(size_t)k], k);
  for (int x = 1; x < 6; ++x)
    for (int k = 0; k < 4; ++k) EXPECT_EQ(out[(size_t)x * 4 + (size_t)k], (int)(10 * x - 5 + k + 0.5f)) << x;
}

TEST(Resize, ConstantColourSurvivesAnyScaleAndOnePixelSidesStayInside) {
  for (auto [sw, sh, dw, dh] :
       {std::array{1, 1, 9, 7}, {1, 5, 4, 4}, {5, 1, 3, 8}, {40, 30, 7, 5}, {3, 3, 64, 48}}) {
    std::vector<uint8_t> src((size_t)sw * sh * 4);
    for (size_t i = 0; i < src.size(); i += 4) {
      src[i] = 12;
      src[i + 1] = 34;
      src[i + 2] = 56;
      src[i + 3] = 78;
    }
    std::vector<uint8_t> out((size_t)dw * dh * 4, 0);
    IeImageInfo s{sw, sh, 9, src.data()}, d{dw, dh, 9, out.data()};
    ASSERT_EQ(IEL_resize_image(&s, &d), IE_ERROR_NONE);
    for (size_t i = 0; i < out.size(); i += 4) {
      ASSERT_EQ(out[i], 12);
      ASSERT_EQ(out[i + 1], 34);
      ASSERT_EQ(out[i + 2], 56);
      ASSERT_EQ(out[i + 3], 78);
    }
  }
}

TEST(Resize, InvalidRecordsAreRefused) {
  std::vector<uint8_t> px(16, 1), out(16, 2);
  IeImageInfo s{2, 2, 9, px.data()}, d{2, 2, 9, out.data()};
  EXPECT_EQ(IEL_resize_image(nullptr, &d), IE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(IEL_resize_image(&s, nullptr), IE_ERROR_INVALID_PARAMETER);
  IeImageInfo zero{0, 2, 9, px.data()}, dzero{2, 0, 9, out.data()};
  EXPECT_EQ(IEL_resize_image(&zero, &d), IE_ERROR_INVALID_SIZE);
  EXPECT_EQ(IEL_resize_image(&s, &dzero), IE_ERROR_INVALID_SIZE);
  EXPECT_EQ(out, std::vector<uint8_t>(16, 2));
}
