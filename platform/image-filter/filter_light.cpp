// Light looks: sparkles and a lens flare added over the photo. Both are
// seeded or fixed, and sized from the short side, so a thumbnail and the
// full photo show the same pattern.
#include <algorithm>
#include <cmath>
#include <vector>

#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_simd.h"

namespace imgfilter {

namespace {

struct Rgb {
  int r, g, b;
};

// Screens light of colour `col` at strength amt (0..256) onto one pixel.
inline void addLight(uint8_t* p, const Channels& c, int amt, const Rgb& col) {
  if (amt <= 0) return;
  if (amt > 256) amt = 256;
  const int lr = (col.r * amt) >> 8, lg = (col.g * amt) >> 8, lb = (col.b * amt) >> 8;
  p[c.r] = (uint8_t)(p[c.r] + (lr * (255 - p[c.r]) + 127) / 255);
  p[c.g] = (uint8_t)(p[c.g] + (lg * (255 - p[c.g]) + 127) / 255);
  p[c.b] = (uint8_t)(p[c.b] + (lb * (255 - p[c.b]) + 127) / 255);
}

class Canvas {
 public:
  explicit Canvas(const Frame& f) : mF(f) {}
  void add(int x, int y, double amount, const Rgb& col) const {
    if (x < 0 || y < 0 || x >= mF.width || y >= mF.height) return;
    addLight(mF.dstRow(y) + (size_t)x * 4, mF.ch, (int)(amount * 256.0), col);
  }
  int luma(int x, int y) const {
    const uint8_t* p =
        mF.dstRow(std::clamp(y, 0, mF.height - 1)) + (size_t)std::clamp(x, 0, mF.width - 1) * 4;
    return luma709(p[mF.ch.r], p[mF.ch.g], p[mF.ch.b]);
  }

 private:
  const Frame& mF;
};

void drawSparkle(const Canvas& cv, int cx, int cy, double len, double intensity, const Rgb& col) {
  // Soft core.
  const double sigma = std::max(0.5, len * 0.09);
  const int rc = (int)std::ceil(sigma * 2.5);
  for (int dy = -rc; dy <= rc; ++dy)
    for (int dx = -rc; dx <= rc; ++dx)
      cv.add(cx + dx, cy + dy, intensity * std::exp(-(dx * dx + dy * dy) / (2.0 * sigma * sigma)), col);
  // Four tapering arms along the axes; their width grows with their length,
  // so a sparkle keeps its shape at any image size.
  const double width = std::max(0.3, len * 0.05);
  const int n = (int)len;
  for (int t = 1; t <= n; ++t) {
    const double k = 1.0 - t / len;
    const double a = intensity * k * k;
    const double w = width * k + 0.3;
    const int rw = (int)std::ceil(w * 2.0);
    for (int o = -rw; o <= rw; ++o) {
      const double v = a * std::exp(-(o * o) / (2.0 * w * w));
      cv.add(cx + t, cy + o, v, col);
      cv.add(cx - t, cy + o, v, col);
      cv.add(cx + o, cy + t, v, col);
      cv.add(cx + o, cy - t, v, col);
    }
  }
  // Four short, faint diagonal rays.
  const double dlen = len * 0.3;
  for (int t = 1; t <= (int)dlen; ++t) {
    const double a = 0.45 * intensity * (1.0 - t / dlen);
    cv.add(cx + t, cy + t, a, col);
    cv.add(cx - t, cy + t, a, col);
    cv.add(cx + t, cy - t, a, col);
    cv.add(cx - t, cy - t, a, col);
  }
}

#if defined(__x86_64__)
template <int SR, int SG, int SB, int SA>
__attribute__((target("avx2"))) int flareRowAvx2(const uint8_t* s, uint8_t* d, int width, int32_t dy2,
                                                 const int32_t* dx2, int shift, const int* const* t) {
  using namespace simd;
  const __m256i vdy2 = _mm256_set1_epi32(dy2), maxIdx = _mm256_set1_epi32(4095);
  const __m128i vshift = _mm_cvtsi32_si128(shift);
  int x = 0;
  for (; x + 8 <= width; x += 8) {
    const __m256i d2 = _mm256_add_epi32(vdy2, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(dx2 + x)));
    const __m256i i = _mm256_min_epu32(_mm256_srl_epi32(d2, vshift), maxIdx);
    const __m256i px = load8(s + (size_t)x * 4);
    const __m256i r = screen(channel<SR>(px), _mm256_i32gather_epi32(t[0], i, 4));
    const __m256i g = screen(channel<SG>(px), _mm256_i32gather_epi32(t[1], i, 4));
    const __m256i b = screen(channel<SB>(px), _mm256_i32gather_epi32(t[2], i, 4));
    store8(d + (size_t)x * 4, pack<SR, SG, SB, SA>(r, g, b, px));
  }
  return x;
}
#endif

}  // namespace

void lookStardust(const Frame& f) {
  // Small four-point sparkles, mostly on bright areas. Candidates are spread
  // over the photo in proportion to its area (in units of the short side
  // squared), and a bright spot is more likely to keep its sparkle.
  lookIdentity(f);
  const Canvas cv(f);
  const double s = f.shortSide();
  const int candidates = (int)std::lround(900.0 * f.width * (double)f.height / (s * s));
  Rng rng(0x5354415244555354ull);  // "STARDUST"
  for (int i = 0; i < candidates; ++i) {
    const double u = rng.uniform(), v = rng.uniform(), pick = rng.uniform(), size = rng.uniform(),
                 tint = rng.uniform();
    const int x = std::min(f.width - 1, (int)(u * f.width));
    const int y = std::min(f.height - 1, (int)(v * f.height));
    const int l =
        (cv.luma(x - 1, y) + cv.luma(x + 1, y) + cv.luma(x, y - 1) + cv.luma(x, y + 1) + cv.luma(x, y)) / 5;
    const double bright = clamp01((l - 100) / 155.0);
    if (pick > 0.012 + 0.6 * bright * std::sqrt(bright)) continue;
    const double len = std::max(2.0, s * (0.006 + 0.028 * size * size * size));
    const Rgb col = tint < 0.6 ? Rgb{255, 255, 255} : (tint < 0.82 ? Rgb{255, 236, 186} : Rgb{205, 226, 255});
    drawSparkle(cv, x, y, len, 0.6 + 0.4 * size, col);
  }
}

void lookLightFlare(const Frame& f) {
  // A warm glow from the upper-left corner: a hot core and a wide wash,
  // screened over the photo, and faint ghost discs along the line from the
  // light through the centre.
  const double W = f.width, H = f.height;
  const double diag = std::sqrt(W * W + H * H);
  const double sx = 0.1 * W, sy = 0.07 * H;
  // Glow by squared distance, through a table.
  const double maxD2 = std::max((W - sx) * (W - sx), sx * sx) + std::max((H - sy) * (H - sy), sy * sy);
  int shift = 0;
  while ((maxD2 / (double)(1ll << shift)) >= 4095.0) ++shift;
  std::vector<uint8_t> glow[3];
  const double core = 0.1 * diag, wide = 0.5 * diag;
  for (auto& g : glow) g.resize(4096);
  for (int i = 0; i < 4096; ++i) {
    const double d2 = (double)i * (double)(1ll << shift);
    const double kc = 0.9 * std::exp(-d2 / (core * core)), kw = 0.5 * std::exp(-d2 / (wide * wide));
    glow[0][(size_t)i] = (uint8_t)clamp255((int)std::lround(255.0 * clamp01(kc * 1.0 + kw * 1.0)));
    glow[1][(size_t)i] = (uint8_t)clamp255((int)std::lround(255.0 * clamp01(kc * 0.94 + kw * 0.72)));
    glow[2][(size_t)i] = (uint8_t)clamp255((int)std::lround(255.0 * clamp01(kc * 0.8 + kw * 0.42)));
  }
  // Squared distances fit 32 bits: sides are at most 16384.
  std::vector<int32_t> dx2((size_t)f.width);
  for (int x = 0; x < f.width; ++x) dx2[(size_t)x] = (int32_t)std::llround((x - sx) * (x - sx));
  const std::vector<int> tables = simd::widenTables(glow, 4096);
  const int* t[3] = {&tables[0], &tables[4096], &tables[8192]};
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    constexpr int SR = 8 * c.r, SG = 8 * c.g, SB = 8 * c.b, SA = 8 * c.a;
#if defined(__x86_64__)
    const bool avx2 = simdAvx2();
#endif
    for (int y = 0; y < f.height; ++y) {
      const int32_t dy2 = (int32_t)std::llround((y - sy) * (y - sy));
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      int x = 0;
#if defined(__x86_64__)
      if (avx2) x = flareRowAvx2<SR, SG, SB, SA>(s, d, f.width, dy2, dx2.data(), shift, t);
#endif
      for (; x < f.width; ++x) {
        const int i = std::min(4095, (int)((uint32_t)(dy2 + dx2[(size_t)x]) >> shift));
        const uint32_t px = load32(s + (size_t)x * 4);
        const int r = chan(px, c.r), g = chan(px, c.g), b = chan(px, c.b);
        store32(d + (size_t)x * 4, put(r + (t[0][i] * (255 - r) + 127) / 255, c.r) |
                                       put(g + (t[1][i] * (255 - g) + 127) / 255, c.g) |
                                       put(b + (t[2][i] * (255 - b) + 127) / 255, c.b) |
                                       (px & put(255, c.a)));
      }
    }
    // Ghosts: position along the axis, radius (of the short side), colour, strength.
    struct Ghost {
      double t, radius;
      Rgb col;
      double alpha;
    };
    const Ghost ghosts[] = {{0.72, 0.035, {190, 255, 205}, 0.3},
                            {1.05, 0.09, {255, 205, 150}, 0.16},
                            {1.32, 0.05, {175, 205, 255}, 0.26},
                            {1.62, 0.14, {255, 175, 225}, 0.13},
                            {1.88, 0.06, {255, 240, 175}, 0.22}};
    const Canvas cv(f);
    const double cx = W / 2.0, cy = H / 2.0, s = f.shortSide();
    for (const Ghost& gh : ghosts) {
      const double gx = sx + gh.t * (cx - sx), gy = sy + gh.t * (cy - sy), r = std::max(1.5, gh.radius * s);
      const int x0 = (int)std::floor(gx - r), x1 = (int)std::ceil(gx + r);
      const int y0 = (int)std::floor(gy - r), y1 = (int)std::ceil(gy + r);
      for (int y = std::max(0, y0); y <= std::min(f.height - 1, y1); ++y)
        for (int x = std::max(0, x0); x <= std::min(f.width - 1, x1); ++x) {
          const double q = std::sqrt((x - gx) * (x - gx) + (y - gy) * (y - gy)) / r;
          if (q >= 1.0) continue;
          // Brighter towards the rim, soft at the edge.
          cv.add(x, y, gh.alpha * (0.6 + 0.4 * q * q) * smooth01((1.0 - q) / 0.15), gh.col);
        }
    }
  });
}

}  // namespace imgfilter
