// The press effect drawing on a real canvas.

#include <Elementary.h>
#include <gtest/gtest.h>

#include <cstdint>
#include <memory>

#include "animation/CLyPressAnimation.h"
#include "common/CLyCairoCanvas.h"
#include "tests/support/TestSupport.h"
#include "tests/touch/TouchTestSupport.h"

using pictavo::test::LogCapture;

namespace {

class PressAnimationTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::touch::setUnitScale();
    win = pictavo::test::createTestWindow(400, 400);
    image = evas_object_image_filled_add(evas_object_evas_get(win));
    evas_object_image_alpha_set(image, EINA_TRUE);
    canvas = std::make_unique<CLyCairoCanvas>(image, CLyRectangle(0, 0, 400, 400), false);
    evas_object_show(image);
    canvas->clear();
  }
  void TearDown() override {
    canvas.reset();
    evas_object_del(image);
    evas_object_del(win);
  }
  uint32_t pixel(int x, int y) {
    int stride = evas_object_image_stride_get(image) / 4;
    auto* px = static_cast<uint32_t*>(evas_object_image_data_get(image, EINA_FALSE));
    uint32_t v = px[y * stride + x];
    evas_object_image_data_set(image, px);
    return v;
  }

  Evas_Object* win = nullptr;
  Evas_Object* image = nullptr;
  std::unique_ptr<CLyCairoCanvas> canvas;
};

TEST_F(PressAnimationTest, PrepareNeedsOwnerAndCanvas) {
  LogCapture log;
  CLyPressAnimation a;
  EXPECT_EQ(-1, a.prepare(nullptr, canvas.get(), CLyFloatRectangle(0, 0, 10, 10), 0));
  EXPECT_TRUE(log.contains("Invalid view"));
  EXPECT_EQ(-1, a.prepare(image, nullptr, CLyFloatRectangle(0, 0, 10, 10), 0));
  EXPECT_TRUE(log.contains("Invalid canvas"));
  // Drawing an unprepared effect draws nothing.
  a.draw(1.0f, true);
  EXPECT_EQ(0u, pixel(5, 5));
  EXPECT_EQ(0, a.prepare(image, canvas.get(), CLyFloatRectangle(0, 0, 10, 10), 0));
  EXPECT_FLOAT_EQ(125 / 255.0f, a.getPressColor().y2);
}

TEST_F(PressAnimationTest, PressedTintsReleasedRestoresTheBlackPlaceholderWithIcon) {
  CLyPressAnimation a;
  const CLyFloatRectangle cell(50, 60, 300, 280);
  ASSERT_EQ(0, a.prepare(image, canvas.get(), cell, 20));
  a.draw(1.0f, true);
  uint32_t pressed = pixel(60, 200);
  EXPECT_EQ(125u, pressed >> 24) << "press colour at alpha 125 over a transparent canvas";
  EXPECT_EQ(0u, pixel(51, 61) >> 24) << "rounded corner stays outside";
  EXPECT_EQ(0u, pixel(20, 20)) << "outside the cell";

  a.draw(1.0f, false);
  EXPECT_EQ(0xff000000u, pixel(60, 200)) << "opaque black";
  EXPECT_EQ(0xff000000u, pixel(295, 275));
  // The icon sits in the middle: some pixel there is not black.
  bool iconSeen = false;
  for (int y = 130; y < 210 && !iconSeen; ++y)
    for (int x = 130; x < 220 && !iconSeen; ++x) iconSeen = (pixel(x, y) & 0x00ffffffu) != 0;
  EXPECT_TRUE(iconSeen);
}

TEST_F(PressAnimationTest, FactorScalesThePressAlpha) {
  CLyPressAnimation a;
  ASSERT_EQ(0, a.prepare(image, canvas.get(), CLyFloatRectangle(0, 0, 100, 100), 0));
  a.draw(0.0f, true);
  EXPECT_EQ(0u, pixel(5, 5) >> 24);
  a.draw(0.5f, true);
  uint32_t alpha = pixel(5, 5) >> 24;
  EXPECT_NEAR(62, (int)alpha, 2);
}

}  // namespace
