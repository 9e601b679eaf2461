#include "platform/image-filter/filter_resample.h"

#include <algorithm>
#include <cmath>

#if defined(__x86_64__)
#include <immintrin.h>
#endif

namespace imgfilter {

int reductionFor(int shortSide, int target) {
  int f = target > 0 ? shortSide / target : 1;
  return f < 1 ? 1 : f;
}

int boxRadiusForSigma(double sigma) {
  // Three passes of a box of width n have variance (n^2 - 1) / 4.
  double n = std::sqrt(4.0 * sigma * sigma + 1.0);
  int r = (int)std::lround((n - 1.0) / 2.0);
  return r < 1 ? 1 : r;
}

namespace {

// `out` sized to hold one pixel per `factor` x `factor` block of the frame
// (edge blocks may be smaller); its width.
template <typename Image>
int sizeForBlocks(const Frame& f, int factor, Image& out) {
  const int sw = (f.width + factor - 1) / factor, sh = (f.height + factor - 1) / factor;
  out.resize(sw, sh);
  return sw;
}

// fn(by, y0, y1) for each band of `factor` source rows.
template <typename Fn>
void forEachBand(const Frame& f, int factor, Fn fn) {
  for (int y0 = 0, by = 0; y0 < f.height; y0 += factor, ++by) fn(by, y0, std::min(f.height, y0 + factor));
}

// Source pixels in block `bx` of a band of `rows` rows.
uint32_t blockArea(const Frame& f, int factor, int bx, int rows) {
  return (uint32_t)(rows * (std::min(f.width, (bx + 1) * factor) - bx * factor));
}

}  // namespace

void downscale(const Frame& f, int factor, Rgba& out) {
  const int sw = sizeForBlocks(f, factor, out);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    if (factor == 1) {
      for (int y = 0; y < f.height; ++y) {
        const uint8_t* s = f.srcRow(y);
        uint8_t* d = out.row(y);
        for (int x = 0; x < f.width; ++x, s += 4, d += 4) {
          d[0] = s[c.r];
          d[1] = s[c.g];
          d[2] = s[c.b];
          d[3] = s[c.a];
        }
      }
      return;
    }
    if (factor <= 16) {
      // Even and odd bytes of whole pixels are summed in 16-bit lanes; a
      // block of at most 16 x 16 pixels cannot overflow them.
      std::vector<uint32_t> even((size_t)sw), odd((size_t)sw);
      forEachBand(f, factor, [&](int by, int y0, int y1) {
        std::fill(even.begin(), even.end(), 0u);
        std::fill(odd.begin(), odd.end(), 0u);
        for (int y = y0; y < y1; ++y) {
          const uint8_t* s = f.srcRow(y);
          for (int bx = 0; bx < sw; ++bx) {
            const int x1 = std::min(f.width, (bx + 1) * factor);
            uint32_t e = 0, o = 0;
            for (int x = bx * factor; x < x1; ++x) {
              const uint32_t p = load32(s + (size_t)x * 4);
              e += p & 0x00ff00ffu;
              o += (p >> 8) & 0x00ff00ffu;
            }
            even[(size_t)bx] += e;
            odd[(size_t)bx] += o;
          }
        }
        uint8_t* d = out.row(by);
        const int rows = y1 - y0;
        for (int bx = 0; bx < sw; ++bx) {
          const uint32_t n = blockArea(f, factor, bx, rows);
          const uint32_t e = even[(size_t)bx], o = odd[(size_t)bx];
          const uint32_t byteSum[4] = {e & 0xffffu, o & 0xffffu, e >> 16, o >> 16};
          d[bx * 4 + 0] = (uint8_t)((byteSum[c.r] + n / 2) / n);
          d[bx * 4 + 1] = (uint8_t)((byteSum[c.g] + n / 2) / n);
          d[bx * 4 + 2] = (uint8_t)((byteSum[c.b] + n / 2) / n);
          d[bx * 4 + 3] = (uint8_t)((byteSum[c.a] + n / 2) / n);
        }
      });
      return;
    }
    std::vector<uint32_t> acc((size_t)sw * 4);
    forEachBand(f, factor, [&](int by, int y0, int y1) {
      std::fill(acc.begin(), acc.end(), 0u);
      for (int y = y0; y < y1; ++y) {
        const uint8_t* s = f.srcRow(y);
        for (int bx = 0; bx < sw; ++bx) {
          const int x1 = std::min(f.width, (bx + 1) * factor);
          uint32_t r = 0, g = 0, b = 0, a = 0;
          for (int x = bx * factor; x < x1; ++x) {
            const uint8_t* p = s + (size_t)x * 4;
            r += p[c.r];
            g += p[c.g];
            b += p[c.b];
            a += p[c.a];
          }
          uint32_t* q = &acc[(size_t)bx * 4];
          q[0] += r;
          q[1] += g;
          q[2] += b;
          q[3] += a;
        }
      }
      uint8_t* d = out.row(by);
      const int rows = y1 - y0;
      for (int bx = 0; bx < sw; ++bx) {
        const uint32_t n = blockArea(f, factor, bx, rows);
        for (int k = 0; k < 4; ++k) d[bx * 4 + k] = (uint8_t)((acc[(size_t)bx * 4 + k] + n / 2) / n);
      }
    });
  });
}

void downscaleLuma(const Frame& f, int factor, Gray& out) {
  const int sw = sizeForBlocks(f, factor, out);
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    if (factor == 1) {
      for (int y = 0; y < f.height; ++y) {
        const uint8_t* s = f.srcRow(y);
        uint8_t* d = out.row(y);
        for (int x = 0; x < f.width; ++x, s += 4) d[x] = (uint8_t)luma709(s[c.r], s[c.g], s[c.b]);
      }
      return;
    }
    std::vector<uint32_t> acc((size_t)sw);
    forEachBand(f, factor, [&](int by, int y0, int y1) {
      std::fill(acc.begin(), acc.end(), 0u);
      for (int y = y0; y < y1; ++y) {
        const uint8_t* s = f.srcRow(y);
        for (int x = 0; x < f.width; ++x, s += 4)
          acc[(size_t)(x / factor)] += (uint32_t)luma709(s[c.r], s[c.g], s[c.b]);
      }
      uint8_t* d = out.row(by);
      const int rows = y1 - y0;
      for (int bx = 0; bx < sw; ++bx) {
        const uint32_t n = blockArea(f, factor, bx, rows);
        d[bx] = (uint8_t)((acc[(size_t)bx] + n / 2) / n);
      }
    });
  });
}

namespace {

#if defined(__x86_64__)
// The running sum of one row of four-channel pixels, the four sums in one
// vector; the same integers as the plain loop.
__attribute__((target("avx2"))) void rowRun4(const uint8_t* add, const uint8_t* sub, uint8_t* out, int w,
                                             const uint32_t* start, uint32_t inv) {
  const __m128i vinv = _mm_set1_epi32((int)inv), half = _mm_set1_epi32(1 << 23);
  __m128i sum = _mm_loadu_si128(reinterpret_cast<const __m128i*>(start));
  for (int x = 0; x < w; ++x) {
    __m128i o = _mm_srli_epi32(_mm_add_epi32(_mm_mullo_epi32(sum, vinv), half), 24);
    o = _mm_packus_epi16(_mm_packus_epi32(o, o), o);
    store32(out + (size_t)x * 4, (uint32_t)_mm_cvtsi128_si32(o));
    const __m128i a = _mm_cvtepu8_epi32(_mm_cvtsi32_si128((int)load32(add + (size_t)x * 4)));
    const __m128i b = _mm_cvtepu8_epi32(_mm_cvtsi32_si128((int)load32(sub + (size_t)x * 4)));
    sum = _mm_sub_epi32(_mm_add_epi32(sum, a), b);
  }
}
#endif

template <int N>
void blurRows(Image<N>& img, int r) {
  const int w = img.w;
  const uint32_t inv = (1u << 24) / (uint32_t)(2 * r + 1);
  std::vector<uint8_t> line((size_t)(w + 2 * r + 1) * N);
#if defined(__x86_64__)
  const bool avx2 = simdAvx2();
#endif
  for (int y = 0; y < img.h; ++y) {
    uint8_t* row = img.row(y);
    // Edge pixels repeat beyond both ends.
    for (int i = 0; i < w + 2 * r + 1; ++i) {
      const int x = std::clamp(i - r, 0, w - 1);
      for (int k = 0; k < N; ++k) line[(size_t)i * N + k] = row[(size_t)x * N + k];
    }
    uint32_t sum[N] = {};
    for (int i = 0; i < 2 * r + 1; ++i)
      for (int k = 0; k < N; ++k) sum[k] += line[(size_t)i * N + k];
    const uint8_t* add = line.data() + (size_t)(2 * r + 1) * N;
    const uint8_t* sub = line.data();
#if defined(__x86_64__)
    if constexpr (N == 4) {
      if (avx2) {
        rowRun4(add, sub, row, w, sum, inv);
        continue;
      }
    }
#endif
    for (int x = 0; x < w; ++x) {
      for (int k = 0; k < N; ++k) {
        row[(size_t)x * N + k] = (uint8_t)((sum[k] * inv + (1u << 23)) >> 24);
        sum[k] += (uint32_t)add[k] - (uint32_t)sub[k];
      }
      add += N;
      sub += N;
    }
  }
}

#if defined(__x86_64__)
// One output row of the vertical pass; the same integers as the plain loop.
__attribute__((target("avx2"))) size_t columnsRowAvx2(uint32_t* sum, const uint8_t* add, const uint8_t* sub,
                                                      uint8_t* d, size_t n, uint32_t inv) {
  const __m256i vinv = _mm256_set1_epi32((int)inv), half = _mm256_set1_epi32(1 << 23);
  size_t k = 0;
  for (; k + 8 <= n; k += 8) {
    __m256i s = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(sum + k));
    const __m256i o = _mm256_srli_epi32(_mm256_add_epi32(_mm256_mullo_epi32(s, vinv), half), 24);
    const __m128i o16 = _mm_packus_epi32(_mm256_castsi256_si128(o), _mm256_extracti128_si256(o, 1));
    _mm_storel_epi64(reinterpret_cast<__m128i*>(d + k), _mm_packus_epi16(o16, o16));
    const __m256i a = _mm256_cvtepu8_epi32(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(add + k)));
    const __m256i b = _mm256_cvtepu8_epi32(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(sub + k)));
    s = _mm256_sub_epi32(_mm256_add_epi32(s, a), b);
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(sum + k), s);
  }
  return k;
}
#endif

template <int N>
void blurColumns(Image<N>& img, int r, Image<N>& out) {
  const int w = img.w, h = img.h;
  const size_t n = (size_t)w * N;
  // sum x inv stays below 2^32: sum <= 255 (2r + 1) and inv <= 2^24 / (2r + 1).
  const uint32_t inv = (1u << 24) / (uint32_t)(2 * r + 1);
#if defined(__x86_64__)
  const bool avx2 = simdAvx2();
#endif
  out.resize(w, h);
  std::vector<uint32_t> sum(n, 0u);
  for (int i = -r; i <= r; ++i) {
    const uint8_t* s = img.row(std::clamp(i, 0, h - 1));
    for (size_t k = 0; k < n; ++k) sum[k] += s[k];
  }
  for (int y = 0; y < h; ++y) {
    uint8_t* d = out.row(y);
    const uint8_t* add = img.row(std::min(y + r + 1, h - 1));
    const uint8_t* sub = img.row(std::max(y - r, 0));
    size_t k = 0;
#if defined(__x86_64__)
    if (avx2) k = columnsRowAvx2(sum.data(), add, sub, d, n, inv);
#endif
    for (; k < n; ++k) {
      d[k] = (uint8_t)((sum[k] * inv + (1u << 23)) >> 24);
      sum[k] += (uint32_t)add[k] - (uint32_t)sub[k];
    }
  }
}

}  // namespace

template <int N>
void boxBlur(Image<N>& img, int radius, int passes) {
  if (radius < 1 || img.w < 1 || img.h < 1) return;
  for (int p = 0; p < passes; ++p) blurRows(img, radius);
  Image<N> tmp;
  for (int p = 0; p < passes; ++p) {
    blurColumns(img, radius, tmp);
    std::swap(img.px, tmp.px);
  }
}

namespace {

// out[k] = (a[k] * (256 - w) + b[k] * w + 32768) >> 16, for 8.8 inputs.
void blendRows(const uint16_t* a, const uint16_t* b, uint32_t w, uint8_t* out, size_t n, size_t from) {
  for (size_t k = from; k < n; ++k) out[k] = (uint8_t)((a[k] * (256u - w) + b[k] * w + 32768u) >> 16);
}

#if defined(__x86_64__)
__attribute__((target("avx2"))) size_t blendRowsAvx2(const uint16_t* a, const uint16_t* b, uint32_t w,
                                                     uint8_t* out, size_t n) {
  const __m256i wa = _mm256_set1_epi32((int)(256u - w)), wb = _mm256_set1_epi32((int)w);
  const __m256i round = _mm256_set1_epi32(32768);
  size_t k = 0;
  for (; k + 16 <= n; k += 16) {
    const __m256i va = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(a + k));
    const __m256i vb = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(b + k));
    const __m256i a0 = _mm256_cvtepu16_epi32(_mm256_castsi256_si128(va));
    const __m256i a1 = _mm256_cvtepu16_epi32(_mm256_extracti128_si256(va, 1));
    const __m256i b0 = _mm256_cvtepu16_epi32(_mm256_castsi256_si128(vb));
    const __m256i b1 = _mm256_cvtepu16_epi32(_mm256_extracti128_si256(vb, 1));
    __m256i r0 = _mm256_add_epi32(_mm256_mullo_epi32(a0, wa), _mm256_mullo_epi32(b0, wb));
    __m256i r1 = _mm256_add_epi32(_mm256_mullo_epi32(a1, wa), _mm256_mullo_epi32(b1, wb));
    r0 = _mm256_srli_epi32(_mm256_add_epi32(r0, round), 16);
    r1 = _mm256_srli_epi32(_mm256_add_epi32(r1, round), 16);
    // 16 values 0..255: pack to 16-bit, then to bytes, fixing the lane order.
    const __m256i p16 = _mm256_permute4x64_epi64(_mm256_packus_epi32(r0, r1), 0xD8);
    const __m128i p8 = _mm_packus_epi16(_mm256_castsi256_si128(p16), _mm256_extracti128_si256(p16, 1));
    _mm_storeu_si128(reinterpret_cast<__m128i*>(out + k), p8);
  }
  return k;
}
#endif

}  // namespace

template <int N>
Upsampler<N>::Upsampler(const Image<N>& small, int factor, int fullWidth, int)
    : mSmall(small),
      mFactor(factor),
      mWidth(fullWidth),
      mX0((size_t)fullWidth),
      mWx((size_t)fullWidth),
      mWide0((size_t)fullWidth * N),
      mWide1((size_t)fullWidth * N),
      mOut((size_t)fullWidth * N) {
  for (int x = 0; x < fullWidth; ++x) {
    double u = (x + 0.5) / factor - 0.5;
    u = std::clamp(u, 0.0, (double)(small.w - 1));
    int x0 = std::min((int)u, small.w - 1);
    mX0[(size_t)x] = x0;
    mWx[(size_t)x] = (uint16_t)std::lround((u - x0) * 256.0);
  }
}

template <int N>
void Upsampler<N>::widen(int sy, uint16_t* out) const {
  const uint8_t* s = mSmall.row(sy);
  const int lastX = mSmall.w - 1;
  for (int x = 0; x < mWidth; ++x) {
    const int x0 = mX0[(size_t)x];
    const int x1 = x0 < lastX ? x0 + 1 : x0;
    const uint32_t wx = mWx[(size_t)x];
    const uint8_t* p = s + (size_t)x0 * N;
    const uint8_t* q = s + (size_t)x1 * N;
    for (int k = 0; k < N; ++k) out[(size_t)x * N + k] = (uint16_t)(p[k] * (256u - wx) + q[k] * wx);
  }
}

template <int N>
const uint8_t* Upsampler<N>::row(int y) {
  if (mFactor == 1) return mSmall.row(std::clamp(y, 0, mSmall.h - 1));
  const double v = std::clamp((y + 0.5) / mFactor - 0.5, 0.0, (double)(mSmall.h - 1));
  const int y0 = std::min((int)v, mSmall.h - 1), y1 = std::min(y0 + 1, mSmall.h - 1);
  const uint32_t wy = (uint32_t)std::lround((v - y0) * 256.0);
  // Rows are asked for in order, so the widened rows move down one at a time.
  if (y0 != mRow0) {
    if (y0 == mRow1) {
      std::swap(mWide0, mWide1);
      mRow0 = mRow1;
      mRow1 = -1;
    } else {
      widen(y0, mWide0.data());
      mRow0 = y0;
    }
  }
  if (y1 != mRow1) {
    widen(y1, mWide1.data());
    mRow1 = y1;
  }
  const size_t n = (size_t)mWidth * N;
  size_t k = 0;
#if defined(__x86_64__)
  if (simdAvx2()) k = blendRowsAvx2(mWide0.data(), mWide1.data(), wy, mOut.data(), n);
#endif
  blendRows(mWide0.data(), mWide1.data(), wy, mOut.data(), n, k);
  return mOut.data();
}

template void boxBlur<1>(Image<1>&, int, int);
template void boxBlur<4>(Image<4>&, int, int);
template class Upsampler<1>;
template class Upsampler<4>;

}  // namespace imgfilter
