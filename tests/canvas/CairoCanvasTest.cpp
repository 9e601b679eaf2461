// The cairo canvas on a real evas image object (buffer engine): coordinates,
// paths, fills, bitmaps and the scaling filters.

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>

#include "codec/Bitmap.h"
#include "codec/BitmapFactory.h"
#include "common/CLyCairoCanvas.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

namespace {

const CLyFloatRectangle kRed(1, 0, 0, 1);
const CLyFloatRectangle kBlue(0, 0, 1, 1);

class CairoCanvasTest : public ::testing::Test {
 protected:
  void SetUp() override {
    mWin = pictavo::test::createTestWindow(400, 400);
    mImage = evas_object_image_filled_add(evas_object_evas_get(mWin));
    evas_object_image_colorspace_set(mImage, EVAS_COLORSPACE_ARGB8888);
    evas_object_image_alpha_set(mImage, EINA_TRUE);
  }
  void TearDown() override { evas_object_del(mWin); }

  // Pixel (x, y) of the canvas surface as 0xAARRGGBB (premultiplied).
  static uint32_t px(CLyCairoCanvas& c, int x, int y) {
    cairo_surface_flush(c.getSurface());
    const unsigned char* d = cairo_image_surface_get_data(c.getSurface());
    const int stride = cairo_image_surface_get_stride(c.getSurface());
    return *reinterpret_cast<const uint32_t*>(d + y * stride + x * 4);
  }
  static int alpha(uint32_t p) { return p >> 24; }

  Evas_Object* mWin = nullptr;
  Evas_Object* mImage = nullptr;
};

Bitmap* quadrants(int w, int h) {
  // top-left red, top-right green, bottom-left blue, bottom-right white
  Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
  auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int y = 0; y < h; y++)
    for (int x = 0; x < w; x++) {
      bool right = x >= w / 2, bottom = y >= h / 2;
      p[y * w + x] = !bottom ? (right ? 0xFF00FF00u : 0xFFFF0000u) : (right ? 0xFFFFFFFFu : 0xFF0000FFu);
    }
  return b;
}

}  // namespace

TEST_F(CairoCanvasTest, CanvasIsPlacedAndSizedAndDrawsInEvasCoordinates) {
  CLyCairoCanvas c(mImage, CLyRectangle(100, 50, 200, 120), false);
  ASSERT_TRUE(c.isValid());
  EXPECT_FALSE(c.isGl());
  int x, y, w, h;
  evas_object_geometry_get(mImage, &x, &y, &w, &h);
  EXPECT_EQ(100, x);
  EXPECT_EQ(50, y);
  EXPECT_EQ(200, w);
  EXPECT_EQ(120, h);
  c.clear();
  c.fillRect(kRed, CLyFloatRectangle(100, 50, 10, 10));
  EXPECT_EQ(0xFFFF0000u, px(c, 0, 0));
  EXPECT_EQ(0xFFFF0000u, px(c, 9, 9));
  EXPECT_EQ(0u, px(c, 10, 10));
  // The canvas draws into the image object's own pixels: no copy.
  EXPECT_EQ(evas_object_image_data_get(mImage, EINA_FALSE), cairo_image_surface_get_data(c.getSurface()));
  evas_object_image_data_set(mImage, evas_object_image_data_get(mImage, EINA_FALSE));
}

TEST_F(CairoCanvasTest, GlRequestFallsBackToSoftware) {
  LogCapture log;
  CLyCairoCanvas c(mImage, 64, 64, true);
  EXPECT_TRUE(c.isValid());
  EXPECT_FALSE(c.isGl());
  c.fillRect(kBlue, CLyFloatRectangle(0, 0, 64, 64));
  EXPECT_EQ(0xFF0000FFu, px(c, 32, 32));
}

TEST_F(CairoCanvasTest, ResizeAndSetGeometryMakeANewSurface) {
  CLyCairoCanvas c(mImage, 50, 40, false);
  c.resize(80, 60);
  EXPECT_EQ(80, cairo_image_surface_get_width(c.getSurface()));
  EXPECT_EQ(60, cairo_image_surface_get_height(c.getSurface()));
  c.setGeometry(CLyRectangle(5, 6, 30, 20));
  int x, y, w, h;
  evas_object_geometry_get(mImage, &x, &y, &w, &h);
  EXPECT_EQ(5, x);
  EXPECT_EQ(6, y);
  EXPECT_EQ(30, w);
  EXPECT_EQ(20, h);
  EXPECT_EQ(0, c.getGeometry().x - 5);
  // A zero size is refused, not crashed on.
  c.resize(0, 0);
  EXPECT_TRUE(c.isValid());
}

TEST_F(CairoCanvasTest, RoundRectWithOneZeroRadiusIsAPlainRectangle) {
  CLyCairoCanvas c(mImage, 200, 200, false);
  c.clear();
  c.fillRoundRect(kRed, CLyFloatRectangle(10, 10, 100, 100), 0, 30);
  EXPECT_EQ(0xFFFF0000u, px(c, 10, 10));  // the corner pixel is filled
  EXPECT_EQ(0xFFFF0000u, px(c, 109, 109));
}

TEST_F(CairoCanvasTest, RoundRectRadiiAreClampedToHalfTheRectangle) {
  CLyCairoCanvas c(mImage, 200, 200, false);
  c.clear();
  // 100 x 40 with radii 50: corners become 50 x 20 ellipse quarters.
  c.fillRoundRect(kRed, CLyFloatRectangle(0, 0, 100, 40), 50, 50);
  EXPECT_EQ(0, alpha(px(c, 1, 1)));      // outside the top-left ellipse
  EXPECT_EQ(0, alpha(px(c, 98, 38)));    // outside the bottom-right ellipse
  EXPECT_EQ(255, alpha(px(c, 50, 1)));   // top edge midpoint: radius 50 reaches it
  EXPECT_EQ(255, alpha(px(c, 1, 20)));   // left edge at half height: radius 20 reaches it
  EXPECT_EQ(255, alpha(px(c, 50, 20)));  // centre
  EXPECT_EQ(0, alpha(px(c, 100, 20)));   // outside the rectangle
  // The radii are an ellipse, not a circle of 20: (8, 8) lies outside the 50 x 20 corner.
  EXPECT_EQ(0, alpha(px(c, 8, 3)));
}

TEST_F(CairoCanvasTest, FramesFillOnlyTheBand) {
  CLyCairoCanvas c(mImage, 100, 100, false);
  c.clear();
  c.fillFrame(kRed, CLyFloatRectangle(0, 0, 100, 100), CLyFloatRectangle(20, 20, 60, 60));
  EXPECT_EQ(0xFFFF0000u, px(c, 5, 5));
  EXPECT_EQ(0u, px(c, 50, 50));
  c.clear();
  c.fillRoundFrame(kRed, CLyFloatRectangle(0, 0, 100, 100), CLyFloatRectangle(20, 20, 60, 60), 20, 20);
  EXPECT_EQ(0xFFFF0000u, px(c, 21, 21));  // inside the inner square but outside its rounded corner
  EXPECT_EQ(0u, px(c, 50, 50));
}

TEST_F(CairoCanvasTest, ClearRectClearsOnlyInside) {
  CLyCairoCanvas c(mImage, 100, 100, false);
  c.fillRect(kBlue, CLyFloatRectangle(0, 0, 100, 100));
  c.clearRect(CLyFloatRectangle(10, 10, 20, 20));
  EXPECT_EQ(0u, px(c, 15, 15));
  EXPECT_EQ(0xFF0000FFu, px(c, 5, 5));
  EXPECT_EQ(0xFF0000FFu, px(c, 30, 30));
  // The clear did not leak its operator: later fills paint normally.
  c.fillRect(kRed, CLyFloatRectangle(10, 10, 5, 5));
  EXPECT_EQ(0xFFFF0000u, px(c, 12, 12));
}

TEST_F(CairoCanvasTest, StrokeRectTracesTheOutline) {
  CLyCairoCanvas c(mImage, 100, 100, false);
  c.clear();
  c.strokeRect(kRed, 4, CLyFloatRectangle(20, 20, 40, 40));
  EXPECT_EQ(255, alpha(px(c, 20, 40)));
  EXPECT_EQ(0, alpha(px(c, 40, 40)));
  c.clear();
  c.strokeRoundRect(kRed, 4, CLyFloatRectangle(20, 20, 40, 40), 10, 10);
  EXPECT_EQ(0, alpha(px(c, 40, 40)));
  EXPECT_EQ(255, alpha(px(c, 40, 20)));
  EXPECT_LT(alpha(px(c, 20, 20)), 255);  // the corner is cut
}

TEST_F(CairoCanvasTest, CreateSurfaceOfNullIsAnEmpty32x32Surface) {
  CLyCairoCanvas c(mImage, 10, 10, false);
  LogCapture log;
  cairo_surface_t* s = c.createSurface(nullptr);
  ASSERT_NE(nullptr, s);
  EXPECT_EQ(CAIRO_STATUS_SUCCESS, cairo_surface_status(s));
  EXPECT_EQ(32, cairo_image_surface_get_width(s));
  EXPECT_EQ(32, cairo_image_surface_get_height(s));
  EXPECT_EQ(0, cairo_image_surface_get_data(s)[0]);
  EXPECT_TRUE(log.contains("Invalid bitmap"));
  cairo_surface_destroy(s);
}

TEST_F(CairoCanvasTest, CreateSurfaceWrapsTheBitmapWithoutCopying) {
  CLyCairoCanvas c(mImage, 10, 10, false);
  Bitmap* b = quadrants(8, 6);
  cairo_surface_t* s = c.createSurface(b);
  ASSERT_NE(nullptr, s);
  EXPECT_EQ(b->getPixels(), cairo_image_surface_get_data(s));
  cairo_surface_destroy(s);
  // A bitmap in another pixel format is refused.
  Bitmap* rgb565 = BitmapFactory::createBitmap(4, 4, BITMAP_FORMAT_RGB565);
  LogCapture log;
  EXPECT_EQ(nullptr, c.createSurface(rgb565));
  delete rgb565;
  delete b;
}

TEST_F(CairoCanvasTest, DrawBitmapMapsTheSourceRectangleOntoTheDestination) {
  CLyCairoCanvas c(mImage, CLyRectangle(10, 20, 100, 100), false);
  c.setFilter(CAIRO_FILTER_NEAREST);
  Bitmap* b = quadrants(40, 40);
  cairo_surface_t* s = c.createSurface(b);
  c.clear();
  // The green top-right quadrant (20, 0, 20, 20) stretched onto 50 x 50 at canvas (0, 0).
  c.beginPath();
  c.setRectPath(CLyFloatRectangle(10, 20, 50, 50));
  c.drawBitmap(s, CLyFloatRectangle(10, 20, 50, 50), CLyRectangle(20, 0, 20, 20));
  EXPECT_EQ(0xFF00FF00u, px(c, 0, 0));
  EXPECT_EQ(0xFF00FF00u, px(c, 49, 49));
  EXPECT_EQ(0u, px(c, 50, 50));  // the path limits the fill
  // The whole bitmap onto (50, 50, 50, 50): its quadrants land in order.
  c.beginPath();
  c.setRectPath(CLyFloatRectangle(60, 70, 50, 50));
  c.drawBitmap(b, CLyFloatRectangle(60, 70, 50, 50));
  EXPECT_EQ(0xFFFF0000u, px(c, 55, 55));
  EXPECT_EQ(0xFF00FF00u, px(c, 95, 55));
  EXPECT_EQ(0xFF0000FFu, px(c, 55, 95));
  EXPECT_EQ(0xFFFFFFFFu, px(c, 95, 95));
  cairo_surface_destroy(s);
  delete b;
}

TEST_F(CairoCanvasTest, BadBitmapsAndSurfacesDrawNothing) {
  CLyCairoCanvas c(mImage, 50, 50, false);
  c.clear();
  LogCapture log;
  c.setRectPath(CLyFloatRectangle(0, 0, 50, 50));
  c.drawBitmap(static_cast<cairo_surface_t*>(nullptr), CLyFloatRectangle(0, 0, 50, 50),
               CLyRectangle(0, 0, 1, 1));
  EXPECT_TRUE(log.contains("Invalid surface"));
  c.setRectPath(CLyFloatRectangle(0, 0, 50, 50));
  c.drawBitmap(static_cast<Bitmap*>(nullptr), CLyFloatRectangle(0, 0, 50, 50));
  EXPECT_TRUE(log.contains("Invalid bitmap"));
  EXPECT_EQ(0u, px(c, 25, 25));
  // The failed draws consumed their path: a fill afterwards covers only its own rectangle.
  c.fillRect(kRed, CLyFloatRectangle(0, 0, 5, 5));
  EXPECT_EQ(0u, px(c, 25, 25));
}

TEST_F(CairoCanvasTest, DrawIconCentresThePngAndClipsIt) {
  CLyCairoCanvas c(mImage, 100, 100, false);
  pictavo::test::TempDir dir;
  cairo_surface_t* icon = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, 10, 10);
  cairo_t* cr = cairo_create(icon);
  cairo_set_source_rgb(cr, 1, 0, 0);
  cairo_paint(cr);
  cairo_destroy(cr);
  ASSERT_EQ(CAIRO_STATUS_SUCCESS, cairo_surface_write_to_png(icon, dir.file("i.png").c_str()));
  cairo_surface_destroy(icon);
  c.clear();
  c.drawIcon(dir.file("i.png").c_str(), CLyFloatRectangle(0, 0, 100, 100));
  EXPECT_EQ(0xFFFF0000u, px(c, 45, 45));
  EXPECT_EQ(0xFFFF0000u, px(c, 54, 54));
  EXPECT_EQ(0u, px(c, 44, 44));
  EXPECT_EQ(0u, px(c, 55, 55));
  c.clear();
  c.drawIcon(dir.file("i.png").c_str(), CLyFloatRectangle(0, 0, 4, 4));  // clipped to 4 x 4
  EXPECT_EQ(0u, px(c, 5, 5));
  LogCapture log;
  c.drawIcon(dir.file("missing.png").c_str(), CLyFloatRectangle(0, 0, 4, 4));
  EXPECT_TRUE(log.contains("Failed to load icon"));
}

// A one-pixel checkerboard shrunk about 10 times: the box-averaged
// downscale of the save pass (and cairo's GOOD filter) give an even grey;
// bilinear, used on screen, samples it and aliases into light and dark.
TEST_F(CairoCanvasTest, SmoothDownscaleDoesNotAliasWhenShrinkingALargeCrop) {
  Bitmap* b = BitmapFactory::createBitmap(1000, 1000, BITMAP_FORMAT_BGRA);
  auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int y = 0; y < 1000; y++)
    for (int x = 0; x < 1000; x++) p[y * 1000 + x] = ((x + y) & 1) ? 0xFFFFFFFFu : 0xFF000000u;
  auto spread = [&](cairo_filter_t filter, bool smooth) {
    CLyCairoCanvas c(mImage, 100, 100, false);
    c.setFilter(filter);
    c.setSmoothDownscale(smooth);
    c.clear();
    // 97 rather than 100: a shrink by exactly 10 puts every bilinear sample
    // half-way between two texels, which hides the aliasing.
    cairo_surface_t* s = c.createSurface(b);
    c.beginPath();
    c.setRectPath(CLyFloatRectangle(0, 0, 97, 97));
    c.drawBitmap(s, CLyFloatRectangle(0, 0, 97, 97), CLyRectangle(0, 0, 1000, 1000));
    cairo_surface_destroy(s);
    // The largest distance from the true mean grey (127.5) inside the cell.
    int worst = 0;
    for (int y = 10; y < 90; y++)
      for (int x = 10; x < 90; x++)
        worst = std::max(worst, std::abs(2 * (int)(px(c, x, y) & 0xFF) - 255) / 2);
    return worst;
  };
  EXPECT_LT(spread(CAIRO_FILTER_BILINEAR, true), 12);
  EXPECT_LT(spread(CAIRO_FILTER_GOOD, false), 12);
  EXPECT_GT(spread(CAIRO_FILTER_BILINEAR, false), 100);
  delete b;
}

TEST_F(CairoCanvasTest, SmoothDownscaleKeepsTheSourceRectangleInPlace) {
  CLyCairoCanvas c(mImage, CLyRectangle(10, 10, 100, 100), false);
  c.setSmoothDownscale(true);
  Bitmap* b = quadrants(400, 400);
  cairo_surface_t* s = c.createSurface(b);
  c.clear();
  c.beginPath();
  c.setRectPath(CLyFloatRectangle(10, 10, 100, 100));
  c.drawBitmap(s, CLyFloatRectangle(10, 10, 100, 100), CLyRectangle(0, 0, 400, 400));  // 4x smaller
  EXPECT_EQ(0xFFFF0000u, px(c, 20, 20));
  EXPECT_EQ(0xFF00FF00u, px(c, 80, 20));
  EXPECT_EQ(0xFF0000FFu, px(c, 20, 80));
  EXPECT_EQ(0xFFFFFFFFu, px(c, 80, 80));
  // Only the green quadrant (200, 0, 200, 200), 3 times smaller, at an odd offset.
  c.clear();
  c.beginPath();
  c.setRectPath(CLyFloatRectangle(10, 10, 66, 66));
  c.drawBitmap(s, CLyFloatRectangle(10, 10, 66, 66), CLyRectangle(200, 0, 200, 200));
  for (int y : {1, 33, 64})
    for (int x : {1, 33, 64}) EXPECT_EQ(0xFF00FF00u, px(c, x, y)) << x << "," << y;
  // A crop reaching past the bitmap is cut to it rather than read out of bounds.
  c.clear();
  c.beginPath();
  c.setRectPath(CLyFloatRectangle(10, 10, 50, 50));
  c.drawBitmap(s, CLyFloatRectangle(10, 10, 50, 50), CLyRectangle(300, 300, 200, 200));
  EXPECT_EQ(0xFFFFFFFFu, px(c, 5, 5));
  cairo_surface_destroy(s);
  delete b;
}
