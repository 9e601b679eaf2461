#include "platform/image-filter/filter_resample.h"

#include <algorithm>
#include <cmath>
#include <cstring>

#include "platform/image-filter/filter_simd.h"

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

// floor(x / n) by one multiply, exact for x < 2^24 and 0 < n < 2^16.
struct Divider {
  uint64_t m;
  explicit Divider(uint32_t n) : m(((1ull << 40) + n - 1) / n) {}
  uint32_t operator()(uint32_t x) const { return (uint32_t)(((uint64_t)x * m) >> 40); }
};

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
      // Column sums of a band in 16-bit lanes (the loop vectorises), then a
      // block's four channel sums in one 64-bit word: a block of at most
      // 16 x 16 pixels cannot overflow a lane.
      const size_t n = (size_t)f.width * 4;
      std::vector<uint16_t> cols(n);
      forEachBand(f, factor, [&](int by, int y0, int y1) {
        std::fill(cols.begin(), cols.end(), (uint16_t)0);
        for (int y = y0; y < y1; ++y) {
          const uint8_t* s = f.srcRow(y);
          for (size_t k = 0; k < n; ++k) cols[k] = (uint16_t)(cols[k] + s[k]);
        }
        uint8_t* d = out.row(by);
        const int rows = y1 - y0;
        const Divider inner((uint32_t)(rows * factor));
        for (int bx = 0; bx < sw; ++bx) {
          const int x1 = std::min(f.width, (bx + 1) * factor);
          uint64_t sum = 0;
          for (int x = bx * factor; x < x1; ++x) {
            uint64_t v;
            std::memcpy(&v, &cols[(size_t)x * 4], 8);
            sum += v;
          }
          const uint32_t area = blockArea(f, factor, bx, rows);
          const Divider div = x1 - bx * factor == factor ? inner : Divider(area);
          auto average = [&](int byteIndex) {
            return (uint8_t)div((uint32_t)(sum >> (16 * byteIndex)) % 65536u + area / 2);
          };
          d[bx * 4 + 0] = average(c.r);
          d[bx * 4 + 1] = average(c.g);
          d[bx * 4 + 2] = average(c.b);
          d[bx * 4 + 3] = average(c.a);
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

namespace {

#if defined(__x86_64__)
// Sixteen 32-bit values 0..255 (two vectors of eight) stored as sixteen
// bytes: packed to 16-bit, then to bytes, with the lane order fixed.
__attribute__((target("avx2"))) inline void storeBytes16(uint8_t* out, __m256i lo, __m256i hi) {
  const __m256i p16 = _mm256_permute4x64_epi64(_mm256_packus_epi32(lo, hi), 0xD8);
  _mm_storeu_si128(reinterpret_cast<__m128i*>(out),
                   _mm_packus_epi16(_mm256_castsi256_si128(p16), _mm256_extracti128_si256(p16, 1)));
}

template <int SR, int SG, int SB>
__attribute__((target("avx2"))) int lumaRowAvx2(const uint8_t* s, uint8_t* out, int w) {
  using namespace simd;
  int x = 0;
  for (; x + 16 <= w; x += 16) {
    const __m256i p0 = load8(s + (size_t)x * 4), p1 = load8(s + (size_t)x * 4 + 32);
    storeBytes16(out + x, luma(channel<SR>(p0), channel<SG>(p0), channel<SB>(p0)),
                 luma(channel<SR>(p1), channel<SG>(p1), channel<SB>(p1)));
  }
  return x;
}

// Window sums are exact, so direct sums give the same integers as the
// running sums of the plain loop.
__attribute__((target("avx2"))) int boxRowAvx2(const uint8_t* line, uint8_t* out, int count, int radius,
                                               int step, uint32_t inv) {
  const __m256i vinv = _mm256_set1_epi32((int)inv), half = _mm256_set1_epi32(1 << 23);
  int i = 0;
  for (; i + 16 <= count; i += 16) {
    __m256i sum = _mm256_setzero_si256();
    for (int k = 0; k <= 2 * radius; ++k)
      sum = _mm256_add_epi16(
          sum, _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(line + i + k * step))));
    const __m256i lo = _mm256_cvtepu16_epi32(_mm256_castsi256_si128(sum));
    const __m256i hi = _mm256_cvtepu16_epi32(_mm256_extracti128_si256(sum, 1));
    storeBytes16(out + i, _mm256_srli_epi32(_mm256_add_epi32(_mm256_mullo_epi32(lo, vinv), half), 24),
                 _mm256_srli_epi32(_mm256_add_epi32(_mm256_mullo_epi32(hi, vinv), half), 24));
  }
  return i;
}
#endif

}  // namespace

void lumaRow(const Frame& f, int y, uint8_t* out) {
  dispatchOrder(f.ch, [&](auto order) {
    constexpr Channels c = decltype(order)::ch;
    const uint8_t* s = f.srcRow(y);
    int x = 0;
#if defined(__x86_64__)
    if (simdAvx2()) x = lumaRowAvx2<8 * c.r, 8 * c.g, 8 * c.b>(s, out, f.width);
#endif
    for (; x < f.width; ++x) out[x] = (uint8_t)luma709(s[x * 4 + c.r], s[x * 4 + c.g], s[x * 4 + c.b]);
  });
}

uint32_t boxInverse(int radius) {
  return (1u << 24) / (uint32_t)(2 * radius + 1);
}

void boxRow(const uint8_t* line, uint8_t* out, int count, int radius, int step) {
  const uint32_t inv = boxInverse(radius);
  auto rounded = [inv](uint32_t sum) { return (uint8_t)((sum * inv + (1u << 23)) >> 24); };
  int i = 0;
#if defined(__x86_64__)
  // A direct sum per output beats the running sum in vectors while the
  // window is short.
  if (radius <= 8 && simdAvx2()) i = boxRowAvx2(line, out, count, radius, step, inv);
#endif
  if (i > 0) {
    for (; i < count; ++i) {
      uint32_t sum = 0;
      for (int k = 0; k <= 2 * radius; ++k) sum += line[i + k * step];
      out[i] = rounded(sum);
    }
    return;
  }
  const int span = (2 * radius + 1) * step;
  for (int c = 0; c < step; ++c) {
    uint32_t sum = 0;
    for (int k = c; k < span; k += step) sum += line[k];
    for (int j = c; j < count; j += step) {
      out[j] = rounded(sum);
      sum += (uint32_t)line[j + span] - (uint32_t)line[j];
    }
  }
}

namespace {

template <int N>
void blurRows(Image<N>& img, int r) {
  const int w = img.w;
  std::vector<uint8_t> line((size_t)(w + 2 * r + 1) * N);
  for (int y = 0; y < img.h; ++y) {
    uint8_t* row = img.row(y);
    // Edge pixels repeat beyond both ends.
    for (int i = 0; i < r; ++i) std::memcpy(&line[(size_t)i * N], row, N);
    std::memcpy(&line[(size_t)r * N], row, (size_t)w * N);
    for (int i = r + w; i < w + 2 * r + 1; ++i)
      std::memcpy(&line[(size_t)i * N], row + (size_t)(w - 1) * N, N);
    boxRow(line.data(), row, w * N, r, N);
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
  const uint32_t inv = boxInverse(r);
  out.resize(w, h);
  std::vector<uint32_t> sum(n, 0u);
  for (int i = -r; i <= r; ++i) {
    const uint8_t* s = img.row(std::clamp(i, 0, h - 1));
    for (size_t k = 0; k < n; ++k) sum[k] += s[k];
  }
  for (int y = 0; y < h; ++y)
    boxColumnStep(sum.data(), img.row(std::min(y + r + 1, h - 1)), img.row(std::max(y - r, 0)), out.row(y), n,
                  inv);
}

}  // namespace

void boxColumnStep(uint32_t* sum, const uint8_t* add, const uint8_t* sub, uint8_t* out, size_t n,
                   uint32_t inv) {
  // sum x inv stays below 2^32: sum <= 255 (2r + 1) and inv <= 2^24 / (2r + 1).
  size_t k = 0;
#if defined(__x86_64__)
  if (simdAvx2()) k = columnsRowAvx2(sum, add, sub, out, n, inv);
#endif
  for (; k < n; ++k) {
    out[k] = (uint8_t)((sum[k] * inv + (1u << 23)) >> 24);
    sum[k] += (uint32_t)add[k] - (uint32_t)sub[k];
  }
}

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
    storeBytes16(out + k, r0, r1);
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
      mX1((size_t)fullWidth),
      mWx((size_t)fullWidth * N),
      mWide0((size_t)fullWidth * N),
      mWide1((size_t)fullWidth * N),
      mOut((size_t)fullWidth * N) {
  for (int x = 0; x < fullWidth; ++x) {
    double u = (x + 0.5) / factor - 0.5;
    u = std::clamp(u, 0.0, (double)(small.w - 1));
    const int x0 = std::min((int)u, small.w - 1);
    mX0[(size_t)x] = x0;
    mX1[(size_t)x] = std::min(x0 + 1, small.w - 1);
    const uint16_t wx = (uint16_t)std::lround((u - x0) * 256.0);
    for (int k = 0; k < N; ++k) mWx[(size_t)x * N + k] = wx;
  }
}

#if defined(__x86_64__)
// Eight four-channel pixels per step: both neighbours gathered, then the
// 8.8 mix in 16-bit lanes (it stays below 2^16, so wrapping products are exact).
__attribute__((target("avx2"))) int widen4Avx2(const uint8_t* s, const int* x0, const int* x1,
                                               const uint16_t* wx, uint16_t* out, int width) {
  const int* px = reinterpret_cast<const int*>(s);
  const __m256i k256 = _mm256_set1_epi16(256);
  int x = 0;
  for (; x + 8 <= width; x += 8) {
    const __m256i p =
        _mm256_i32gather_epi32(px, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(x0 + x)), 4);
    const __m256i q =
        _mm256_i32gather_epi32(px, _mm256_loadu_si256(reinterpret_cast<const __m256i*>(x1 + x)), 4);
    for (int half = 0; half < 2; ++half) {
      const __m128i p4 = half ? _mm256_extracti128_si256(p, 1) : _mm256_castsi256_si128(p);
      const __m128i q4 = half ? _mm256_extracti128_si256(q, 1) : _mm256_castsi256_si128(q);
      const size_t at = (size_t)(x + 4 * half) * 4;
      const __m256i wq = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(wx + at));
      const __m256i mixed =
          _mm256_add_epi16(_mm256_mullo_epi16(_mm256_cvtepu8_epi16(p4), _mm256_sub_epi16(k256, wq)),
                           _mm256_mullo_epi16(_mm256_cvtepu8_epi16(q4), wq));
      _mm256_storeu_si256(reinterpret_cast<__m256i*>(out + at), mixed);
    }
  }
  return x;
}
#endif

template <int N>
void Upsampler<N>::widen(int sy, uint16_t* out) const {
  const uint8_t* s = mSmall.row(sy);
  int x = 0;
#if defined(__x86_64__)
  if constexpr (N == 4) {
    if (simdAvx2()) x = widen4Avx2(s, mX0.data(), mX1.data(), mWx.data(), out, mWidth);
  }
#endif
  for (; x < mWidth; ++x) {
    const uint8_t* p = s + (size_t)mX0[(size_t)x] * N;
    const uint8_t* q = s + (size_t)mX1[(size_t)x] * N;
    const uint32_t wx = mWx[(size_t)x * N];
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
