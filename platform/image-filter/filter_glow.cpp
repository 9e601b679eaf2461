// Blurs and glows: looks built on a blurred copy of the photo. The blur runs
// on a reduced copy (box passes approximate a Gaussian) and is enlarged
// bilinearly while it is blended, so wide radii stay cheap.
#include <algorithm>
#include <cmath>

#include "platform/image-filter/filter_grade.h"
#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_resample.h"

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
void blendGlow(const Frame& f, const Blurred& b, const GlowBlend& gb) {
  Upsampler<4> up(b.small, b.factor, f.width, f.height);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    const int soften = gb.soften;
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* u = up.row(y);
      uint8_t* d = f.dstRow(y);
      for (int x = 0; x < f.width; ++x, u += 4, d += 4) {
        const int br = u[0], bg = u[1], bb = u[2];
        const uint32_t px = load32(d);
        int r = chan(px, c.r), g = chan(px, c.g), bl = chan(px, c.b);
        r += ((br - r) * soften) >> 8;
        g += ((bg - g) * soften) >> 8;
        bl += ((bb - bl) * soften) >> 8;
        int gr, gg, gbv;
        if (gb.fromLuma) {
          const int l = luma709(br, bg, bb);
          gr = gb.glow[0][l];
          gg = gb.glow[1][l];
          gbv = gb.glow[2][l];
        } else {
          gr = gb.glow[0][br];
          gg = gb.glow[1][bg];
          gbv = gb.glow[2][bb];
        }
        store32(d, put((uint8_t)(r + ((gr * (255 - r) + 127) / 255)), c.r) |
                       put((uint8_t)(g + ((gg * (255 - g) + 127) / 255)), c.g) |
                       put((uint8_t)(bl + ((gbv * (255 - bl) + 127) / 255)), c.b) | (px & put(255, c.a)));
      }
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
