// The cartoon drawing look.
#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <vector>

#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_resample.h"
#include "platform/image-filter/filter_simd.h"

namespace imgfilter {

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
  auto strength = [low, high](int gx, int gy) {
    return (uint8_t)clamp255((std::abs(gx) + std::abs(gy) - low) * 255 / (high - low));
  };
  for (int y = 0; y < l.h; ++y) {
    uint8_t* d = out.row(y);
    const bool inner = y > 0 && y < l.h - 1;
    for (int x = 0; x < l.w; ++x) {
      if (inner && x > 0 && x < l.w - 1) {
        // Inside: direct reads, no clamping.
        const uint8_t* u = l.row(y - 1) + x;
        const uint8_t* m = l.row(y) + x;
        const uint8_t* b = l.row(y + 1) + x;
        const int gx = u[1] + 2 * m[1] + b[1] - u[-1] - 2 * m[-1] - b[-1];
        const int gy = b[-1] + 2 * b[0] + b[1] - u[-1] - 2 * u[0] - u[1];
        d[x] = strength(gx, gy);
        continue;
      }
      const int gx = at(x + 1, y - 1) + 2 * at(x + 1, y) + at(x + 1, y + 1) - at(x - 1, y - 1) -
                     2 * at(x - 1, y) - at(x - 1, y + 1);
      const int gy = at(x - 1, y + 1) + 2 * at(x, y + 1) + at(x + 1, y + 1) - at(x - 1, y - 1) -
                     2 * at(x, y - 1) - at(x + 1, y - 1);
      d[x] = strength(gx, gy);
    }
  }
}

}  // namespace

namespace {

constexpr int kInk = 24;

// Banded colour with a little more saturation, darkened towards the ink by
// the edge strength.
template <int SR, int SG, int SB, int SA>
inline uint32_t cartoonPixel(const uint8_t* u, int ink, uint32_t px, const int* ratio) {
  const int k = ratio[luma709(u[0], u[1], u[2])];
  int r = (u[0] * k) >> 8, g = (u[1] * k) >> 8, b = (u[2] * k) >> 8;
  const int nl = ((r + g + b) * 21846) >> 16;  // (r + g + b) / 3 in this range
  r = clamp255(nl + (((r - nl) * 290) >> 8));
  g = clamp255(nl + (((g - nl) * 290) >> 8));
  b = clamp255(nl + (((b - nl) * 290) >> 8));
  r = (r * (255 - ink) + kInk * ink) / 255;
  g = (g * (255 - ink) + kInk * ink) / 255;
  b = (b * (255 - ink) + kInk * ink) / 255;
  return (uint32_t)r << SR | (uint32_t)g << SG | (uint32_t)b << SB | (px & (255u << SA));
}

#if defined(__x86_64__)
template <int SR, int SG, int SB, int SA>
__attribute__((target("avx2"))) int cartoonRowAvx2(const uint8_t* u, const uint8_t* e, const uint8_t* s,
                                                   uint8_t* d, int width, const int* ratio) {
  using namespace simd;
  const __m256i zero = _mm256_setzero_si256(), k255 = _mm256_set1_epi32(255), k310 = _mm256_set1_epi32(290);
  const __m256i ink24 = _mm256_set1_epi32(kInk), third = _mm256_set1_epi32(21846);
  int x = 0;
  for (; x + 8 <= width; x += 8) {
    const __m256i up = load8(u + (size_t)x * 4), px = load8(s + (size_t)x * 4);
    const __m256i u0 = channel<0>(up), u1 = channel<8>(up), u2 = channel<16>(up);
    const __m256i k = _mm256_i32gather_epi32(ratio, luma(u0, u1, u2), 4);
    __m256i r = _mm256_srai_epi32(_mm256_mullo_epi32(u0, k), 8);
    __m256i g = _mm256_srai_epi32(_mm256_mullo_epi32(u1, k), 8);
    __m256i b = _mm256_srai_epi32(_mm256_mullo_epi32(u2, k), 8);
    const __m256i nl =
        _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_add_epi32(_mm256_add_epi32(r, g), b), third), 16);
    auto boost = [&](__m256i v) __attribute__((target("avx2"))) {
      v = _mm256_add_epi32(nl, _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_sub_epi32(v, nl), k310), 8));
      return _mm256_min_epi32(_mm256_max_epi32(v, zero), k255);
    };
    r = boost(r);
    g = boost(g);
    b = boost(b);
    const __m256i ink = _mm256_cvtepu8_epi32(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(e + x)));
    const __m256i keep = _mm256_sub_epi32(k255, ink), inkPart = _mm256_mullo_epi32(ink24, ink);
    r = div255(_mm256_add_epi32(_mm256_mullo_epi32(r, keep), inkPart));
    g = div255(_mm256_add_epi32(_mm256_mullo_epi32(g, keep), inkPart));
    b = div255(_mm256_add_epi32(_mm256_mullo_epi32(b, keep), inkPart));
    store8(d + (size_t)x * 4, pack<SR, SG, SB, SA>(r, g, b, px));
  }
  return x;
}
#endif

}  // namespace

void lookCartoon(const Frame& f) {
  // Flat colour regions with dark outlines: the photo is smoothed on a copy
  // about 500 pixels on its short side, its luma is cut into a few bands
  // (colour kept), and strong edges of the smoothed copy are drawn dark. The
  // enlargement makes outlines as wide, relative to the photo, at any size.
  const int factor = reductionFor(f.shortSide(), 500);
  Rgba smooth;
  downscale(f, factor, smooth);
  const int smallSide = std::min(smooth.w, smooth.h);
  boxBlur(smooth, std::max(1, smallSide / 300), 2);
  Gray luma, edges;
  // Outlines come from a smoother luma, so texture does not draw ink.
  lumaOf(smooth, luma);
  boxBlur(luma, std::max(1, smallSide / 200), 1);
  edgesOf(luma, edges, 50, 160);
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
  std::vector<int> ratio32(ratio, ratio + 256);
  // The enlarged edge map is soft; a steep curve turns it into crisp,
  // anti-aliased ink lines.
  uint8_t inkCurve[256];
  for (int i = 0; i < 256; ++i) inkCurve[i] = (uint8_t)std::lround(235.0 * smooth01((i - 50) / 80.0));
  std::vector<uint8_t> inkRow((size_t)f.width);
  Upsampler<4> upColour(smooth, factor, f.width, f.height);
  Upsampler<1> upEdges(edges, factor, f.width, f.height);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    constexpr int SR = 8 * c.r, SG = 8 * c.g, SB = 8 * c.b, SA = 8 * c.a;
#if defined(__x86_64__)
    const bool avx2 = simdAvx2();
#endif
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* u = upColour.row(y);
      const uint8_t* soft = upEdges.row(y);
      for (int x = 0; x < f.width; ++x) inkRow[(size_t)x] = inkCurve[soft[x]];
      const uint8_t* e = inkRow.data();
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      int x = 0;
#if defined(__x86_64__)
      if (avx2) x = cartoonRowAvx2<SR, SG, SB, SA>(u, e, s, d, f.width, ratio32.data());
#endif
      for (; x < f.width; ++x)
        store32(d + (size_t)x * 4, cartoonPixel<SR, SG, SB, SA>(u + (size_t)x * 4, e[x],
                                                                load32(s + (size_t)x * 4), ratio32.data()));
    }
  });
}

}  // namespace imgfilter
