#include <gtest/gtest.h>

#include <climits>

#include "common/CLyArcPoint.h"
#include "common/CLyFloatPoint.h"
#include "common/CLyFloatRectangle.h"
#include "common/CLyPoint.h"
#include "common/CLyRectangle.h"

TEST(Geometry, DefaultsAndCopies) {
  CLyRectangle r;
  EXPECT_EQ(r, CLyRectangle(0, 0, -1, -1));
  CLyFloatRectangle fr;
  EXPECT_FLOAT_EQ(fr.x2, -1.0f);
  EXPECT_FLOAT_EQ(fr.y2, -1.0f);
  CLyPoint p(3, 4), q;
  q = p;
  EXPECT_EQ(q, p);
  q = q;  // self assignment keeps the value
  EXPECT_EQ(q, CLyPoint(3, 4));
  CLyArcPoint a(1, 2, 7), b(0, 0, 0);
  b = a;
  EXPECT_EQ(b.type, 7);
  CLyFloatPoint fp(1.5f, 2.5f), fq;
  fq = fp;
  EXPECT_FLOAT_EQ(fq.y, 2.5f);
  r.set(1, 2, 3, 4);
  EXPECT_EQ(r, CLyRectangle(1, 2, 3, 4));
  EXPECT_NE(r, CLyRectangle(1, 2, 3, 5));
}

TEST(Geometry, RectangleContainsExcludesRightAndBottomEdges) {
  CLyRectangle r(10, 10, 5, 5);
  EXPECT_FALSE(r.contains(15, 12));
  EXPECT_FALSE(r.contains(12, 15));
  EXPECT_TRUE(r.contains(10, 10));
  EXPECT_TRUE(r.contains(14.9f, 14.9f));
  EXPECT_FALSE(r.contains(9.99f, 12));
  EXPECT_FALSE(CLyRectangle().contains(0, 0));
  EXPECT_FALSE(CLyRectangle(0, 0, 0, 10).contains(0, 0));
  // The right edge of a far rectangle does not overflow into negative numbers.
  EXPECT_TRUE(CLyRectangle(INT_MAX - 1000, 0, 2000, 10).contains(static_cast<float>(INT_MAX - 512), 5));
}

TEST(Geometry, FloatRectangleContainsByEdges) {
  CLyFloatRectangle cell(0, 0, 0.5f, 1);
  EXPECT_FALSE(cell.contains(0.5f, 0.2f));
  EXPECT_TRUE(cell.contains(0.49f, 0.99f));
  EXPECT_TRUE(cell.contains(0, 0));
  EXPECT_FALSE(CLyFloatRectangle().contains(0, 0));
  EXPECT_FALSE(CLyFloatRectangle(-1, -1, 0, 1).contains(-0.5f, 0.5f));
}

TEST(Geometry, HashFoldsUpperHalfAndIgnoresType) {
  auto expected = [](int32_t x, int32_t y) {
    int32_t h = static_cast<int32_t>(static_cast<uint32_t>(y) * 31u) ^ x;
    return h ^ (h >> 16);
  };
  EXPECT_EQ(CLyPoint(0, 0).hashCode(), 0);
  EXPECT_EQ(CLyPoint(1, 2).hashCode(), (62 ^ 1));
  EXPECT_EQ(CLyPoint(5, 100000).hashCode(), expected(5, 100000));
  EXPECT_EQ(CLyPoint(-7, -3).hashCode(), expected(-7, -3));
  // Overflowing products wrap like 32-bit arithmetic.
  EXPECT_EQ(CLyPoint(0, INT_MAX).hashCode(), expected(0, INT_MAX));
  EXPECT_EQ(CLyArcPoint(5, 100000, 1).hashCode(), CLyArcPoint(5, 100000, 9).hashCode());
  EXPECT_EQ(CLyArcPoint(5, 100000, 1).hashCode(), CLyPoint(5, 100000).hashCode());
}
