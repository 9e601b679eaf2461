// Detail and drawing looks: sharpening and the cartoon drawing.
#include <algorithm>
#include <cmath>
#include <cstdlib>

#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_resample.h"

namespace imgfilter {

void lookSharpen(const Frame& f) {
  // Unsharp mask on luma: the detail (luma minus its small blur) is added to
  // every channel, so colours do not fringe. Differences within the noise
  // threshold are left alone, and the boost is capped so edges get no halos.
  Gray luma, blur;
  downscaleLuma(f, 1, luma);
  blur = luma;
  boxBlur(blur, std::max(1, (int)std::lround(f.shortSide() / 1200.0)), 2);
  constexpr int kThreshold = 2;
  constexpr int kAmount = 420;  // 8.8 fixed point: x 1.64
  constexpr int kCap = 44;
  int8_t boost[511];
  for (int i = -255; i <= 255; ++i) {
    int d = std::abs(i) <= kThreshold ? 0 : (i > 0 ? i - kThreshold : i + kThreshold);
    boost[i + 255] = (int8_t)std::clamp((d * kAmount) >> 8, -kCap, kCap);
  }
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      const uint8_t* l = luma.row(y);
      const uint8_t* b = blur.row(y);
      for (int x = 0; x < f.width; ++x, s += 4, d += 4) {
        const int k = boost[l[x] - b[x] + 255];
        const uint32_t px = load32(s);
        const int r = chan(px, c.r), g = chan(px, c.g), bl = chan(px, c.b);
        store32(d, put((uint8_t)clamp255(r + k), c.r) | put((uint8_t)clamp255(g + k), c.g) |
                       put((uint8_t)clamp255(bl + k), c.b) | (px & put(255, c.a)));
      }
    }
  });
}

namespace {

// Luma of a smoothed four-channel image.
void lumaOf(const Rgba& img, Gray& out) {
  out.resize(img.w, img.h);
  for (int y = 0; y < img.h; ++y) {
    const uint8_t* s = img.row(y);
    uint8_t* d = out.row(y);
    for (int x = 0; x < img.w; ++x, s += 4) d[x] = (uint8_t)luma709(s[0], s[1], s[2]);
  }
}

// Edge strength 0..255 from the Sobel magnitude, ramped between two levels.
void edgesOf(const Gray& l, Gray& out, int low, int high) {
  out.resize(l.w, l.h);
  auto at = [&l](int x, int y) -> int { return l.row(std::clamp(y, 0, l.h - 1))[std::clamp(x, 0, l.w - 1)]; };
  for (int y = 0; y < l.h; ++y) {
    uint8_t* d = out.row(y);
    for (int x = 0; x < l.w; ++x) {
      const int gx = at(x + 1, y - 1) + 2 * at(x + 1, y) + at(x + 1, y + 1) - at(x - 1, y - 1) -
                     2 * at(x - 1, y) - at(x - 1, y + 1);
      const int gy = at(x - 1, y + 1) + 2 * at(x, y + 1) + at(x + 1, y + 1) - at(x - 1, y - 1) -
                     2 * at(x, y - 1) - at(x + 1, y - 1);
      const int mag = std::abs(gx) + std::abs(gy);
      d[x] = (uint8_t)clamp255((mag - low) * 255 / (high - low));
    }
  }
}

}  // namespace

void lookCartoon(const Frame& f) {
  // Flat colour regions with dark outlines: the photo is smoothed on a copy
  // about 500 pixels on its short side, its luma is cut into a few bands
  // (colour kept), and strong edges of the smoothed copy are drawn dark. The
  // enlargement makes outlines as wide, relative to the photo, at any size.
  const int factor = reductionFor(f.shortSide(), 500);
  Rgba smooth;
  downscale(f, factor, smooth);
  boxBlur(smooth, std::max(1, std::min(smooth.w, smooth.h) / 300), 2);
  Gray luma, edges;
  lumaOf(smooth, luma);
  edgesOf(luma, edges, 70, 190);
  boxBlur(edges, 1, 1);

  // Band luma: six levels with narrow soft steps between them; the ratio
  // new/old luma (8.8) scales the colour, which keeps its hue.
  constexpr int kLevels = 6;
  uint16_t ratio[256];
  for (int i = 0; i < 256; ++i) {
    const double p = i / 255.0 * kLevels;
    const double k = std::min(std::floor(p), (double)(kLevels - 1));
    const double fr = p - k;
    const double v = std::min(1.0, 1.06 * (k + 0.5 + smooth01((fr - 0.88) / 0.12)) / kLevels);
    ratio[i] = (uint16_t)std::lround(256.0 * 255.0 * v / std::max(i, 12));
  }
  Upsampler<4> upColour(smooth, factor, f.width, f.height);
  Upsampler<1> upEdges(edges, factor, f.width, f.height);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    constexpr int kInk = 24;
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* u = upColour.row(y);
      const uint8_t* e = upEdges.row(y);
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      for (int x = 0; x < f.width; ++x, u += 4, s += 4, d += 4) {
        const int l = luma709(u[0], u[1], u[2]);
        const int k = ratio[l];
        int r = (u[0] * k) >> 8, g = (u[1] * k) >> 8, b = (u[2] * k) >> 8;
        // A little more colour, as in a drawing.
        const int nl = (r + g + b) / 3;
        r = clamp255(nl + (((r - nl) * 310) >> 8));
        g = clamp255(nl + (((g - nl) * 310) >> 8));
        b = clamp255(nl + (((b - nl) * 310) >> 8));
        const int ink = e[x];
        const uint32_t px = load32(s);
        store32(d, put((uint8_t)((r * (255 - ink) + kInk * ink) / 255), c.r) |
                       put((uint8_t)((g * (255 - ink) + kInk * ink) / 255), c.g) |
                       put((uint8_t)((b * (255 - ink) + kInk * ink) / 255), c.b) | (px & put(255, c.a)));
      }
    }
  });
}

}  // namespace imgfilter
