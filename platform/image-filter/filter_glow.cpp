// Blurs and glows: looks built on a blurred copy of the photo. The blur runs
// on a reduced copy (box passes approximate a Gaussian) and is enlarged
// bilinearly while it is blended, so wide radii stay cheap.
#include <algorithm>
#include <cmath>
#include <vector>

#include "platform/image-filter/filter_grade.h"
#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_resample.h"
#include "platform/image-filter/filter_simd.h"

namespace imgfilter {

namespace {

// The blurred source at a reduced size; sigma as a fraction of the short side.
struct Blurred {
  Rgba small;
  int factor = 1;
};

void blurSource(const Frame& f, double sigmaFraction, Blurred& out) {
  const double sigma = std::max(0.8, sigmaFraction * f.shortSide());
  // Reduce while the reduced sigma stays at or above about three pixels:
  // the blurred copy is smooth enough there for a bilinear enlargement.
  out.factor = std::max(1, (int)(sigma / 3.0));
  downscale(f, out.factor, out.small);
  boxBlur(out.small, boxRadiusForSigma(sigma / out.factor), 3);
}

struct GlowBlend {
  int soften = 0;             // 0..256: how much of the blur is mixed into the base
  bool fromLuma = false;      // glow driven by the blur's luma instead of each channel
  uint8_t glow[3][256] = {};  // glow amount per channel, screened over the base
};

// Screens the enlarged blur over the destination, in place.
struct GlowTables {
  int soften;
  bool fromLuma;
  const int* glow[3];
};

template <int SR, int SG, int SB, int SA>
inline uint32_t glowPixel(const uint8_t* u, uint32_t px, const GlowTables& t) {
  const int br = u[0], bg = u[1], bb = u[2];
  int r = (int)((px >> SR) & 255u), g = (int)((px >> SG) & 255u), bl = (int)((px >> SB) & 255u);
  r += ((br - r) * t.soften) >> 8;
  g += ((bg - g) * t.soften) >> 8;
  bl += ((bb - bl) * t.soften) >> 8;
  const int l = t.fromLuma ? luma709(br, bg, bb) : 0;
  const int gr = t.glow[0][t.fromLuma ? l : br], gg = t.glow[1][t.fromLuma ? l : bg],
            gbv = t.glow[2][t.fromLuma ? l : bb];
  r += (gr * (255 - r) + 127) / 255;
  g += (gg * (255 - g) + 127) / 255;
  bl += (gbv * (255 - bl) + 127) / 255;
  return (uint32_t)r << SR | (uint32_t)g << SG | (uint32_t)bl << SB | (px & (255u << SA));
}

#if defined(__x86_64__)
template <int SR, int SG, int SB, int SA>
__attribute__((target("avx2"))) int glowRowAvx2(const uint8_t* u, uint8_t* d, int width,
                                                const GlowTables& t) {
  using namespace simd;
  const __m256i soften = _mm256_set1_epi32(t.soften);
  int x = 0;
  for (; x + 8 <= width; x += 8) {
    const __m256i up = load8(u + (size_t)x * 4), px = load8(d + (size_t)x * 4);
    const __m256i br = channel<0>(up), bg = channel<8>(up), bb = channel<16>(up);
    __m256i r = channel<SR>(px), g = channel<SG>(px), b = channel<SB>(px);
    r = _mm256_add_epi32(r, _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_sub_epi32(br, r), soften), 8));
    g = _mm256_add_epi32(g, _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_sub_epi32(bg, g), soften), 8));
    b = _mm256_add_epi32(b, _mm256_srai_epi32(_mm256_mullo_epi32(_mm256_sub_epi32(bb, b), soften), 8));
    __m256i i0 = br, i1 = bg, i2 = bb;
    if (t.fromLuma) i0 = i1 = i2 = luma(br, bg, bb);
    r = screen(r, _mm256_i32gather_epi32(t.glow[0], i0, 4));
    g = screen(g, _mm256_i32gather_epi32(t.glow[1], i1, 4));
    b = screen(b, _mm256_i32gather_epi32(t.glow[2], i2, 4));
    store8(d + (size_t)x * 4, pack<SR, SG, SB, SA>(r, g, b, px));
  }
  return x;
}
#endif

// Screens the enlarged blur over the destination, in place.
void blendGlow(const Frame& f, const Blurred& b, const GlowBlend& gb) {
  Upsampler<4> up(b.small, b.factor, f.width, f.height);
  const std::vector<int> tables = simd::widenTables(gb.glow, 256);
  const GlowTables t{gb.soften, gb.fromLuma, {&tables[0], &tables[256], &tables[512]}};
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    constexpr int SR = 8 * c.r, SG = 8 * c.g, SB = 8 * c.b, SA = 8 * c.a;
#if defined(__x86_64__)
    const bool avx2 = simdAvx2();
#endif
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* u = up.row(y);
      uint8_t* d = f.dstRow(y);
      int x = 0;
#if defined(__x86_64__)
      if (avx2) x = glowRowAvx2<SR, SG, SB, SA>(u, d, f.width, t);
#endif
      for (; x < f.width; ++x)
        store32(d + (size_t)x * 4,
                glowPixel<SR, SG, SB, SA>(u + (size_t)x * 4, load32(d + (size_t)x * 4), t));
    }
  });
}

template <typename F>
void fillGlow(uint8_t (&lut)[256], F&& f) {
  for (int i = 0; i < 256; ++i) lut[i] = (uint8_t)clamp255((int)std::lround(255.0 * clamp01(f(i / 255.0))));
}

Frame inPlace(const Frame& f) {
  return Frame{f.dst, f.dstStride, f.dst, f.dstStride, f.width, f.height, f.ch};
}

}  // namespace

void lookBlur(const Frame& f) {
  // Smooth Gaussian-like blur, sigma about 1 % of the short side.
  Blurred b;
  blurSource(f, 0.01, b);
  Upsampler<4> up(b.small, b.factor, f.width, f.height);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* u = up.row(y);
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      for (int x = 0; x < f.width; ++x, u += 4, s += 4, d += 4) {
        const uint32_t px = load32(s);
        store32(d, put(u[0], c.r) | put(u[1], c.g) | put(u[2], c.b) | (px & put(255, c.a)));
      }
    }
  });
}

void lookSoftGlow(const Frame& f) {
  // Dreamy: a wide blur softens the base and is screened over it, so the
  // highlights bloom.
  Blurred b;
  blurSource(f, 0.02, b);
  lookIdentity(f);
  GlowBlend gb;
  gb.soften = 70;
  for (auto& lut : gb.glow) fillGlow(lut, [](double t) { return 0.62 * std::pow(t, 1.7); });
  blendGlow(inPlace(f), b, gb);
}

void lookNostalgia(const Frame& f) {
  // Faded warm memory: warm tone, lowered contrast, a soft warm glow and a
  // vignette.
  Blurred b;
  blurSource(f, 0.015, b);
  Grade g;
  g.setSaturation(0.8);
  auto base = [](double t) { return range(contrast(t, -0.2), 0.07, 0.95); };
  g.setCurves([base](double t) { return base(t) + 0.06 * mids(t) + 0.02; },
              [base](double t) { return base(t) + 0.02 * mids(t); },
              [base](double t) { return base(t) - 0.06 * mids(t) - 0.01; });
  g.vignette = 0.35;
  applyGrade(f, g);
  GlowBlend gb;
  gb.soften = 40;
  fillGlow(gb.glow[0], [](double t) { return 0.42 * std::pow(t, 1.5); });
  fillGlow(gb.glow[1], [](double t) { return 0.36 * std::pow(t, 1.5); });
  fillGlow(gb.glow[2], [](double t) { return 0.24 * std::pow(t, 1.5); });
  blendGlow(inPlace(f), b, gb);
}

void lookSunshine(const Frame& f) {
  // Sunny: brighter and warmer, yellows and oranges boosted, a warm glow
  // around the highlights.
  Blurred b;
  blurSource(f, 0.02, b);
  Selective s;
  s.target = Selective::kWarmHues;
  s.satOther = 1.08;
  s.satTarget = 1.45;
  auto base = [](double t) { return std::pow(t, 0.82); };
  s.setCurves([base](double t) { return base(t) + 0.06 * mids(t); },
              [base](double t) { return base(t) + 0.025 * mids(t); },
              [base](double t) { return base(t) - 0.06 * mids(t); });
  applySelective(f, s);
  GlowBlend gb;
  gb.fromLuma = true;
  auto bloom = [](double t) { return smooth01((t - 0.55) / 0.45); };
  fillGlow(gb.glow[0], [bloom](double t) { return 0.55 * bloom(t); });
  fillGlow(gb.glow[1], [bloom](double t) { return 0.45 * bloom(t); });
  fillGlow(gb.glow[2], [bloom](double t) { return 0.22 * bloom(t); });
  blendGlow(inPlace(f), b, gb);
}

}  // namespace imgfilter
