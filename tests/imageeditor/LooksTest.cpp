// What the looks do to a photo: each one measured for the property its name
// promises, on format-9 (B, G, R, A) images.
#include <gtest/gtest.h>

#include <cmath>

#include "image-editor/IE_Engine.h"
#include "tests/imageeditor/EffectTestImages.h"

using effects_test::apply;
using effects_test::makeImage;

namespace {

enum Effect {
  kVintage = 0,
  kOldPhoto = 1,
  kGreyscale = 3,
  kFaded = 5,
  kCartoon = 7,
  kSharpen = 8,
  kSoftGlow = 9,
  kBlur = 14,
  kRetro = 15,
  kSunshine = 16,
  kNostalgia = 17,
  kStardust = 22,
  kLightFlare = 23,
  kCalm = 30,
  kDawn = 31,
  kDeep = 32,
  kEvergreen = 33,
  kFilm = 34,
  kPastel = 35
};

struct Stats {
  double meanR = 0, meanG = 0, meanB = 0, lumaSd = 0, sat = 0, detail = 0;
};

double luma(const uint8_t* p) {
  return 0.2126 * p[2] + 0.7152 * p[1] + 0.0722 * p[0];
}

Stats stats(const std::vector<uint8_t>& px, int w, int h) {
  Stats s;
  double sum = 0, sum2 = 0;
  const double n = (double)w * h;
  for (int y = 0; y < h; ++y)
    for (int x = 0; x < w; ++x) {
      const uint8_t* p = &px[((size_t)y * w + x) * 4];
      s.meanB += p[0] / n;
      s.meanG += p[1] / n;
      s.meanR += p[2] / n;
      const double l = luma(p);
      sum += l;
      sum2 += l * l;
      s.sat += (std::max({p[0], p[1], p[2]}) - std::min({p[0], p[1], p[2]})) / n;
      if (x > 0) s.detail += std::fabs(l - luma(p - 4)) / n;
    }
  s.lumaSd = std::sqrt(std::max(0.0, sum2 / n - (sum / n) * (sum / n)));
  return s;
}

constexpr int kW = 120, kH = 90;

}  // namespace

class Looks : public ::testing::Test {
 protected:
  std::vector<uint8_t> src = makeImage(kW, kH, 5);
  Stats before = stats(src, kW, kH);
  Stats after(int effect) { return stats(apply(src, kW, kH, 9, effect), kW, kH); }
};

TEST_F(Looks, GreyscaleAndOldPhotoAreMonochrome) {
  const auto grey = apply(src, kW, kH, 9, kGreyscale);
  const auto sepia = apply(src, kW, kH, 9, kOldPhoto);
  for (size_t i = 0; i < grey.size(); i += 4) {
    ASSERT_EQ(grey[i], grey[i + 1]);
    ASSERT_EQ(grey[i + 1], grey[i + 2]);
    // Sepia: red over green over blue.
    ASSERT_GE(sepia[i + 2] + 2, sepia[i + 1]);
    ASSERT_GE(sepia[i + 1] + 2, sepia[i]);
  }
  EXPECT_NEAR(stats(grey, kW, kH).lumaSd, before.lumaSd, 3.0);
}

TEST_F(Looks, ToneLooksMoveSaturationAndContrastTheirWay) {
  EXPECT_LT(after(kPastel).sat, before.sat * 0.85);
  EXPECT_LT(after(kPastel).lumaSd, before.lumaSd);
  EXPECT_GT(after(kDeep).sat, before.sat * 1.1);
  EXPECT_GT(after(kDeep).lumaSd, before.lumaSd);
  EXPECT_LT(after(kFaded).sat, before.sat * 0.75);
  EXPECT_LT(after(kFaded).lumaSd, before.lumaSd);
  EXPECT_LT(after(kCalm).sat, before.sat);
  const Stats calm = after(kCalm);
  EXPECT_GT(calm.meanB - calm.meanR, before.meanB - before.meanR);  // cooler
  for (int warm : {kDawn, kVintage, kNostalgia, kSunshine, kRetro}) {
    const Stats s = after(warm);
    EXPECT_GT(s.meanR - s.meanB, before.meanR - before.meanB) << warm;  // warmer
  }
  EXPECT_GT(after(kSunshine).meanG + after(kSunshine).meanR, before.meanG + before.meanR);  // brighter
}

TEST_F(Looks, EvergreenBoostsGreensAndMutesOtherHues) {
  // Left half pure-ish green, right half red.
  std::vector<uint8_t> px((size_t)kW * kH * 4);
  for (int y = 0; y < kH; ++y)
    for (int x = 0; x < kW; ++x) {
      uint8_t* p = &px[((size_t)y * kW + x) * 4];
      const bool green = x < kW / 2;
      p[0] = 60, p[1] = green ? 150 : 70, p[2] = green ? 80 : 170, p[3] = 255;
    }
  const auto out = apply(px, kW, kH, 9, kEvergreen);
  auto spread = [](const uint8_t* p) { return std::max({p[0], p[1], p[2]}) - std::min({p[0], p[1], p[2]}); };
  const uint8_t* g0 = &px[0];
  const uint8_t* g1 = &out[0];
  const uint8_t* r0 = &px[(size_t)(kW - 1) * 4];
  const uint8_t* r1 = &out[(size_t)(kW - 1) * 4];
  EXPECT_GT(spread(g1), spread(g0));
  EXPECT_LT(spread(r1), spread(r0));
}

TEST_F(Looks, BlurSoftensAndSharpenCrispens) {
  EXPECT_LT(after(kBlur).detail, before.detail * 0.5);
  EXPECT_GT(after(kSharpen).detail, before.detail * 1.1);
  EXPECT_LT(after(kSoftGlow).detail, before.detail);
  EXPECT_GT(after(kSoftGlow).meanG, before.meanG);  // glow brightens
}

TEST_F(Looks, BlurOfAFlatImageStaysFlat) {
  std::vector<uint8_t> flat((size_t)kW * kH * 4);
  for (size_t i = 0; i < flat.size(); i += 4)
    flat[i] = 30, flat[i + 1] = 140, flat[i + 2] = 220, flat[i + 3] = 255;
  for (int e : {kBlur, kSharpen}) EXPECT_EQ(apply(flat, kW, kH, 9, e), flat) << e;
}

TEST_F(Looks, LightLooksOnlyAddLight) {
  for (int e : {kStardust, kLightFlare}) {
    const auto out = apply(src, kW, kH, 9, e);
    for (size_t i = 0; i < out.size(); ++i)
      if (i % 4 != 3) {
        ASSERT_GE(out[i], src[i]) << e << " @" << i;
      }
  }
  // The flare comes from the upper-left corner.
  const auto flare = apply(src, kW, kH, 9, kLightFlare);
  auto gain = [&](int x, int y) {
    const size_t i = ((size_t)y * kW + x) * 4;
    return luma(&flare[i]) - luma(&src[i]);
  };
  EXPECT_GT(gain(kW / 10, kH / 10), gain(kW - 2, kH - 2) + 20);
}

TEST_F(Looks, StardustPrefersBrightAreasAndScalesWithTheImage) {
  // Light added over the whole frame, summed over the colour bytes.
  auto added = [](const std::vector<uint8_t>& a, const std::vector<uint8_t>& b) {
    double sum = 0;
    for (size_t i = 0; i < a.size(); ++i)
      if (i % 4 != 3) sum += b[i] - a[i];
    return sum;
  };
  const int w = 600, h = 400;
  std::vector<uint8_t> dark((size_t)w * h * 4, 40), bright((size_t)w * h * 4, 170);
  const double onDark = added(dark, apply(dark, w, h, 9, kStardust));
  const double onBright = added(bright, apply(bright, w, h, 9, kStardust));
  EXPECT_GT(onBright, 3 * onDark);
  // Twice the size: the same pattern scaled, about four times the light.
  std::vector<uint8_t> big((size_t)w * h * 16, 170);
  const double ratio = added(big, apply(big, w * 2, h * 2, 9, kStardust)) / onBright;
  EXPECT_GT(ratio, 2.5);
  EXPECT_LT(ratio, 6.0);
}

TEST_F(Looks, CartoonFlattensColoursAndDrawsDarkOutlines) {
  // A disc on a gradient: its rim must get a dark outline.
  std::vector<uint8_t> px = makeImage(kW, kH, 9);
  for (int y = 0; y < kH; ++y)
    for (int x = 0; x < kW; ++x) {
      const double d = std::hypot(x - kW / 2.0, y - kH / 2.0);
      if (d < 25) {
        uint8_t* p = &px[((size_t)y * kW + x) * 4];
        p[0] = 230, p[1] = 230, p[2] = 240;
      }
    }
  const auto out = apply(px, kW, kH, 9, kCartoon);
  // The noise is smoothed away inside the regions.
  EXPECT_LT(stats(out, kW, kH).detail, 0.6 * stats(px, kW, kH).detail);
  double rimMin = 255;
  for (int a = 0; a < 360; a += 10) {
    const int x = (int)std::lround(kW / 2.0 + 25 * std::cos(a * M_PI / 180));
    const int y = (int)std::lround(kH / 2.0 + 25 * std::sin(a * M_PI / 180));
    rimMin = std::min(rimMin, luma(&out[((size_t)y * kW + x) * 4]));
  }
  EXPECT_LT(rimMin, 90);
}

TEST_F(Looks, FilmAndOldPhotoGrainIsSeededNotRandom) {
  for (int e : {kFilm, kOldPhoto}) EXPECT_EQ(apply(src, kW, kH, 9, e), apply(src, kW, kH, 9, e));
  // Grain: a flat grey frame gets texture.
  std::vector<uint8_t> flat((size_t)kW * kH * 4, 128);
  EXPECT_GT(stats(apply(flat, kW, kH, 9, kFilm), kW, kH).detail, 1.0);
}
