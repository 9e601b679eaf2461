#include "platform/image-filter/filter_grade.h"

#include <cmath>
#include <memory>

namespace imgfilter {

namespace {
constexpr double kLumaW[3] = {0.2126, 0.7152, 0.0722};
constexpr int kOne = 4096;
}  // namespace

Grade::Grade() {
  setSaturation(1.0);
  setCurves([](double t) { return t; }, [](double t) { return t; }, [](double t) { return t; });
}

void Grade::setSaturation(double s) {
  s = s < 0.0 ? 0.0 : (s > 2.0 ? 2.0 : s);  // keeps results inside the curve tables
  for (int c = 0; c < 3; ++c)
    for (int k = 0; k < 3; ++k)
      m[c][k] = (int)std::lround(kOne * ((1.0 - s) * kLumaW[k] + (c == k ? s : 0.0)));
}

void Grade::setMonochrome() {
  setSaturation(0.0);
}

void applyGrade(const Frame& f, const Grade& g) {
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    const int m00 = g.m[0][0], m01 = g.m[0][1], m02 = g.m[0][2];
    const int m10 = g.m[1][0], m11 = g.m[1][1], m12 = g.m[1][2];
    const int m20 = g.m[2][0], m21 = g.m[2][1], m22 = g.m[2][2];
    const WideLut &lr = g.lut[0], &lg = g.lut[1], &lb = g.lut[2];
    std::unique_ptr<Vignette> vig;
    std::unique_ptr<GrainTile> grain;
    if (g.vignette > 0.0) vig = std::make_unique<Vignette>(f.width, f.height, g.vignette);
    if (g.grain > 0) grain = std::make_unique<GrainTile>(g.seed, g.grain);

    for (int y = 0; y < f.height; ++y) {
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      if (!vig && !grain) {
        for (int x = 0; x < f.width; ++x, s += 4, d += 4) {
          const int r = s[c.r], gg = s[c.g], b = s[c.b];
          const uint8_t a = s[c.a];
          d[c.r] = lr.at((m00 * r + m01 * gg + m02 * b + 2048) >> 12);
          d[c.g] = lg.at((m10 * r + m11 * gg + m12 * b + 2048) >> 12);
          d[c.b] = lb.at((m20 * r + m21 * gg + m22 * b + 2048) >> 12);
          d[c.a] = a;
        }
        continue;
      }
      const int rowV = vig ? vig->row[(size_t)y] : 256;
      const int8_t* noise = grain ? grain->row(y) : nullptr;
      for (int x = 0; x < f.width; ++x, s += 4, d += 4) {
        const int r = s[c.r], gg = s[c.g], b = s[c.b];
        const uint8_t a = s[c.a];
        int or_ = lr.at((m00 * r + m01 * gg + m02 * b + 2048) >> 12);
        int og = lg.at((m10 * r + m11 * gg + m12 * b + 2048) >> 12);
        int ob = lb.at((m20 * r + m21 * gg + m22 * b + 2048) >> 12);
        if (vig) {
          const int v = (vig->col[(size_t)x] * rowV) >> 8;
          or_ = (or_ * v) >> 8;
          og = (og * v) >> 8;
          ob = (ob * v) >> 8;
        }
        if (noise) {
          // Grain is stronger in the mid-tones, as on film.
          const int n = noise[GrainTile::column(x, y)];
          const int l = (or_ + og + ob) / 3;
          const int amt = (n * (64 + ((l * (255 - l)) >> 6))) >> 8;
          or_ = clamp255(or_ + amt);
          og = clamp255(og + amt);
          ob = clamp255(ob + amt);
        }
        d[c.r] = (uint8_t)or_;
        d[c.g] = (uint8_t)og;
        d[c.b] = (uint8_t)ob;
        d[c.a] = a;
      }
    }
  });
}

void applySelective(const Frame& f, const Selective& sel) {
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    const int satO = (int)std::lround(sel.satOther * 256.0);
    const int satT = (int)std::lround(sel.satTarget * 256.0);
    const int dark = (int)std::lround(sel.darkenTarget * 256.0);
    const bool greens = sel.target == Selective::kGreens;
    const WideLut &lr = sel.lut[0], &lg = sel.lut[1], &lb = sel.lut[2];
    for (int y = 0; y < f.height; ++y) {
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      for (int x = 0; x < f.width; ++x, s += 4, d += 4) {
        const int r = s[c.r], g = s[c.g], b = s[c.b];
        const uint8_t a = s[c.a];
        const int l = luma709(r, g, b);
        int w;
        if (greens) {
          w = (g - (r > b ? r : b)) * 5;
        } else {
          const int greenish = g > r ? g - r : 0;
          w = 2 * (g - b) - 4 * greenish;
        }
        w = w < 0 ? 0 : (w > 255 ? 255 : w);
        const int sat = satO + (((satT - satO) * w) >> 8);
        const int k = 256 - ((dark * w) >> 8);
        const int nr = ((l + (((r - l) * sat) >> 8)) * k) >> 8;
        const int ng = ((l + (((g - l) * sat) >> 8)) * k) >> 8;
        const int nb = ((l + (((b - l) * sat) >> 8)) * k) >> 8;
        d[c.r] = lr.at(nr);
        d[c.g] = lg.at(ng);
        d[c.b] = lb.at(nb);
        d[c.a] = a;
      }
    }
  });
}

}  // namespace imgfilter
