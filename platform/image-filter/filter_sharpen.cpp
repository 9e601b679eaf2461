// The sharpen look: an unsharp mask on luma, streamed a row at a time.
#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "platform/image-filter/filter_looks.h"
#include "platform/image-filter/filter_resample.h"
#include "platform/image-filter/filter_simd.h"

namespace imgfilter {

namespace {

// The detail (luma minus its small blur) is added to every channel, so
// colours do not fringe. Differences within the noise threshold are left
// alone, and the boost is capped so edges get no halos.
constexpr int kThreshold = 2;
constexpr int kAmount = 105;  // 6-bit fixed point: x 1.64
constexpr int kCap = 44;

int boost(int detail) {
  const int a = std::abs(detail) - kThreshold;
  if (a <= 0) return 0;
  const int k = std::min((a * kAmount) >> 6, kCap);
  return detail < 0 ? -k : k;
}

#if defined(__x86_64__)
// Sixteen pixels at a time: the boosts in 16-bit lanes, then split into a
// positive and a negative byte per pixel, spread over the three colour bytes
// and applied with saturating adds, which clamp as the plain loop does.
template <int A>
__attribute__((target("avx2"))) int sharpenRowAvx2(const uint8_t* s, uint8_t* d, const uint8_t* l,
                                                   const uint8_t* b, int w) {
  alignas(32) int8_t spreadPos[32], spreadNeg[32];
  for (int i = 0; i < 32; ++i) {
    const int pixel = (i % 16) / 4 + (i >= 16 ? 4 : 0);
    spreadPos[i] = i % 4 == A ? -128 : (int8_t)pixel;
    spreadNeg[i] = i % 4 == A ? -128 : (int8_t)(pixel + 8);
  }
  const __m256i ctlPos = _mm256_load_si256(reinterpret_cast<const __m256i*>(spreadPos));
  const __m256i ctlNeg = _mm256_load_si256(reinterpret_cast<const __m256i*>(spreadNeg));
  const __m256i thr = _mm256_set1_epi16(kThreshold), amount = _mm256_set1_epi16(kAmount);
  const __m256i cap = _mm256_set1_epi16(kCap), zero = _mm256_setzero_si256();
  auto apply8 = [&](uint8_t * out, const uint8_t* in, __m256i bytes) __attribute__((target("avx2"))) {
    const __m256i px = simd::load8(in);
    const __m256i up = _mm256_shuffle_epi8(bytes, ctlPos), down = _mm256_shuffle_epi8(bytes, ctlNeg);
    simd::store8(out, _mm256_subs_epu8(_mm256_adds_epu8(px, up), down));
  };
  int x = 0;
  for (; x + 16 <= w; x += 16) {
    const __m256i detail =
        _mm256_sub_epi16(_mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(l + x))),
                         _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(b + x))));
    __m256i k = _mm256_subs_epu16(_mm256_abs_epi16(detail), thr);
    k = _mm256_min_epi16(_mm256_srli_epi16(_mm256_mullo_epi16(k, amount), 6), cap);
    const __m256i lighter = _mm256_cmpgt_epi16(detail, zero);
    // Per 128-bit lane: eight positive boosts, then eight negative ones.
    const __m256i bytes = _mm256_packus_epi16(_mm256_and_si256(k, lighter), _mm256_andnot_si256(lighter, k));
    apply8(d + (size_t)x * 4, s + (size_t)x * 4, _mm256_permute4x64_epi64(bytes, 0x44));
    apply8(d + (size_t)x * 4 + 32, s + (size_t)x * 4 + 32, _mm256_permute4x64_epi64(bytes, 0xEE));
  }
  return x;
}
#endif

// Luma rows and their horizontal box, kept for the rows the vertical window
// of the current output row reaches (a ring of 2r + 2 rows).
class LumaWindow {
 public:
  LumaWindow(const Frame& f, int radius)
      : mFrame(f),
        mRadius(radius),
        mSlots(2 * radius + 2),
        mLuma((size_t)mSlots * (size_t)f.width),
        mBoxed((size_t)mSlots * (size_t)f.width),
        mLine((size_t)(f.width + 2 * radius + 1)) {}

  // Luma of source row y and its horizontal box; y must not run ahead of
  // the ring.
  const uint8_t* luma(int y) {
    fill(y);
    return slot(mLuma, y);
  }
  const uint8_t* boxed(int y) {
    fill(y);
    return slot(mBoxed, y);
  }

 private:
  void fill(int y) {
    while (mFilled < y) {
      const int row = ++mFilled;
      uint8_t* l = slot(mLuma, row);
      lumaRow(mFrame, row, l);
      const int w = mFrame.width;
      std::memset(mLine.data(), l[0], (size_t)mRadius);
      std::memcpy(mLine.data() + mRadius, l, (size_t)w);
      std::memset(mLine.data() + mRadius + w, l[w - 1], (size_t)mRadius + 1);
      boxRow(mLine.data(), slot(mBoxed, row), w, mRadius, 1);
    }
  }
  uint8_t* slot(std::vector<uint8_t>& rows, int y) {
    return rows.data() + (size_t)(y % mSlots) * (size_t)mFrame.width;
  }

  const Frame& mFrame;
  int mRadius;
  int mSlots;
  int mFilled = -1;
  std::vector<uint8_t> mLuma;
  std::vector<uint8_t> mBoxed;
  std::vector<uint8_t> mLine;
};

}  // namespace

void lookSharpen(const Frame& f) {
  const int radius = std::max(1, (int)std::lround(f.shortSide() / 1500.0));
  const int w = f.width, h = f.height;
  LumaWindow rows(f, radius);
  const uint32_t inv = boxInverse(radius);
  std::vector<uint32_t> sum((size_t)w, 0u);
  std::vector<uint8_t> blurred((size_t)w);
  // Edge rows repeat beyond the top and bottom.
  for (int i = -radius; i <= radius; ++i) {
    const uint8_t* r = rows.boxed(std::clamp(i, 0, h - 1));
    for (int x = 0; x < w; ++x) sum[(size_t)x] += r[x];
  }
  int8_t table[511];
  for (int i = -255; i <= 255; ++i) table[i + 255] = (int8_t)boost(i);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
#if defined(__x86_64__)
    const bool avx2 = simdAvx2();
#endif
    for (int y = 0; y < h; ++y) {
      // The rows ahead are read before this row's pixels are written, so
      // the source and the destination may be one buffer.
      const uint8_t* add = rows.boxed(std::min(y + radius + 1, h - 1));
      const uint8_t* sub = rows.boxed(std::max(y - radius, 0));
      boxColumnStep(sum.data(), add, sub, blurred.data(), (size_t)w, inv);
      const uint8_t* l = rows.luma(y);
      const uint8_t* b = blurred.data();
      const uint8_t* s = f.srcRow(y);
      uint8_t* d = f.dstRow(y);
      int x = 0;
#if defined(__x86_64__)
      if (avx2) x = sharpenRowAvx2<c.a>(s, d, l, b, w);
#endif
      for (; x < w; ++x) {
        const int k = table[l[x] - b[x] + 255];
        const uint32_t px = load32(s + (size_t)x * 4);
        store32(d + (size_t)x * 4, put(clamp255(chan(px, c.r) + k), c.r) |
                                       put(clamp255(chan(px, c.g) + k), c.g) |
                                       put(clamp255(chan(px, c.b) + k), c.b) | (px & put(255, c.a)));
      }
    }
  });
}

}  // namespace imgfilter
