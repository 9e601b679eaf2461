// The nearest-neighbour copy behind redraws while a finger moves: it must
// paint exactly what cairo paints for the same rounded cell, also at
// fractional edges, rounded corners, enlargements and crops that reach past
// the bitmap (PAD), and leave everything outside the cell alone.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "codec/Bitmap.h"
#include "codec/BitmapFactory.h"
#include "common/CLyCairoCanvas.h"
#include "tests/support/TestSupport.h"

namespace {

Bitmap* noise(int w, int h, uint32_t seed) {
  Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
  auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int i = 0; i < w * h; i++) {
    seed = seed * 1664525u + 1013904223u;
    p[i] = 0xFF000000u | (seed >> 8);
  }
  return b;
}

std::vector<uint32_t> pixels(CLyCairoCanvas& c) {
  cairo_surface_t* s = c.getSurface();
  cairo_surface_flush(s);
  const int w = cairo_image_surface_get_width(s), h = cairo_image_surface_get_height(s);
  const int stride = cairo_image_surface_get_stride(s);
  const unsigned char* d = cairo_image_surface_get_data(s);
  std::vector<uint32_t> out;
  for (int y = 0; y < h; y++) {
    const auto* row = reinterpret_cast<const uint32_t*>(d + (size_t)y * stride);
    out.insert(out.end(), row, row + w);
  }
  return out;
}

struct Case {
  CLyFloatRectangle dst;
  CLyRectangle src;
  double radius;
};

}  // namespace

TEST(DraftCopy, CopyPaintsWhatCairoPaints) {
  Evas_Object* win = pictavo::test::createTestWindow(300, 300);
  Evas* e = evas_object_evas_get(win);
  Evas_Object* imgA = evas_object_image_filled_add(e);
  Evas_Object* imgB = evas_object_image_filled_add(e);
  Bitmap* photo = noise(240, 180, 7);
  const CLyRectangle geometry(10, 20, 200, 160);
  const Case cases[] = {
      {{30, 40, 120, 90}, {0, 0, 240, 180}, 0},                // whole photo, shrunk, integer edges
      {{30.4f, 40.7f, 119.3f, 90.45f}, {13, 9, 200, 150}, 0},  // fractional edges
      {{25.5f, 33.25f, 140.6f, 101.1f}, {40, 30, 60, 45}, 9},  // enlarged, rounded
      {{12.2f, 24.9f, 80, 60}, {200, 150, 90, 70}, 200},       // past the bitmap (PAD), radius clamped
      {{0, 0, 400, 400}, {5, 5, 100, 100}, 3},                 // larger than the canvas
  };
  for (const Case& k : cases) {
    CLyCairoCanvas a(imgA, geometry, false), b(imgB, geometry, false);
    for (CLyCairoCanvas* c : {&a, &b}) {
      c->fillRect(CLyFloatRectangle(0.2f, 0.5f, 0.3f, 0.4f), CLyFloatRectangle(10, 20, 200, 160));
      c->setFilter(CAIRO_FILTER_FAST);
      cairo_set_operator(c->getContext(), CAIRO_OPERATOR_SOURCE);
    }
    cairo_surface_t* sa = a.createSurface(photo);
    cairo_surface_t* sb = b.createSurface(photo);
    a.beginPath();
    a.setRoundRectPath(k.dst, k.radius, k.radius);
    a.drawBitmap(sa, k.dst, k.src);
    b.drawBitmapInRoundRect(sb, k.dst, k.src, k.radius);
    const std::vector<uint32_t> pa = pixels(a), pb = pixels(b);
    ASSERT_EQ(pa.size(), pb.size());
    // Inside the cell, away from edges and rounded corners, the copy gives
    // cairo's texels exactly. The partly covered edge cairo draws in both,
    // but under a clip: its nearest texel may differ by one there (pixman's
    // fixed-point transform depends on the composite extents) and the blend
    // may round by a step or two, so there only the coverage (alpha) must
    // agree, within 2. Outside the cell nothing changes (alpha included).
    const double l = k.dst.x1 - geometry.x, t = k.dst.y1 - geometry.y;
    const double rx = std::min(k.radius, k.dst.x2 * 0.5), ry = std::min(k.radius, k.dst.y2 * 0.5);
    size_t inner = 0, innerDiffer = 0, alphaDiffer = 0;
    for (size_t i = 0; i < pa.size(); i++) {
      const int x = (int)(i % geometry.w), y = (int)(i / geometry.w);
      if (std::abs((int)(pa[i] >> 24) - (int)(pb[i] >> 24)) > 2) alphaDiffer++;
      const bool deepInside = x >= l + rx + 1 && x + 1 <= l + k.dst.x2 - rx - 1 && y >= t + ry + 1 &&
                              y + 1 <= t + k.dst.y2 - ry - 1;
      if (!deepInside) continue;
      inner++;
      innerDiffer += pa[i] != pb[i];
    }
    EXPECT_EQ(0u, innerDiffer) << "cell " << k.dst.x1 << "," << k.dst.y1 << " " << k.dst.x2 << "x"
                               << k.dst.y2;
    EXPECT_EQ(0u, alphaDiffer) << "cell " << k.dst.x1 << "," << k.dst.y1;
    cairo_surface_destroy(sa);
    cairo_surface_destroy(sb);
  }
  delete photo;
  evas_object_del(win);
}

TEST(DraftCopy, OtherOperatorsFiltersAndClipsGoThroughCairo) {
  Evas_Object* win = pictavo::test::createTestWindow(200, 200);
  Evas* e = evas_object_evas_get(win);
  Evas_Object* imgA = evas_object_image_filled_add(e);
  Evas_Object* imgB = evas_object_image_filled_add(e);
  Bitmap* photo = noise(64, 48, 3);
  const CLyFloatRectangle dst(10.5f, 12.25f, 100, 75);
  const CLyRectangle src(0, 0, 64, 48);
  for (int variant = 0; variant < 3; variant++) {
    CLyCairoCanvas a(imgA, 150, 120, false), b(imgB, 150, 120, false);
    for (CLyCairoCanvas* c : {&a, &b}) {
      c->setFilter(variant == 1 ? CAIRO_FILTER_BILINEAR : CAIRO_FILTER_FAST);
      if (variant != 0) cairo_set_operator(c->getContext(), CAIRO_OPERATOR_SOURCE);
      if (variant == 2) {
        cairo_rectangle(c->getContext(), 0, 0, 40, 40);  // a caller's clip
        cairo_clip(c->getContext());
      }
    }
    cairo_surface_t* sa = a.createSurface(photo);
    cairo_surface_t* sb = b.createSurface(photo);
    a.beginPath();
    a.setRoundRectPath(dst, 6, 6);
    a.drawBitmap(sa, dst, src);
    b.drawBitmapInRoundRect(sb, dst, src, 6);
    EXPECT_EQ(pixels(a), pixels(b)) << "variant " << variant;
    cairo_surface_destroy(sa);
    cairo_surface_destroy(sb);
  }
  delete photo;
  evas_object_del(win);
}
