#include "codec/Resampler.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <new>

#include "codec/CodecLog.h"

#ifdef __SSE2__
#include <emmintrin.h>
#endif

namespace BitmapFactory {

namespace {
constexpr int kWeightBits = 14;
constexpr int kOne = 1 << kWeightBits;
// Resized rows keep 7 bits below a level (at most 255 x 128, which fits a
// signed 16-bit lane for the vector multiply-adds).
constexpr int kFractionBits = 7;

// acc[i] += w * src[i] over n values.
void accumulate(int32_t* acc, const uint16_t* src, int32_t w, size_t n) {
  size_t i = 0;
#ifdef __SSE2__
  const __m128i zero = _mm_setzero_si128();
  const __m128i wv = _mm_set1_epi32(w & 0xffff);  // pairs (w, 0) for madd
  for (; i + 8 <= n; i += 8) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(src + i));
    __m128i* a = reinterpret_cast<__m128i*>(acc + i);
    _mm_storeu_si128(a, _mm_add_epi32(_mm_loadu_si128(a), _mm_madd_epi16(_mm_unpacklo_epi16(v, zero), wv)));
    _mm_storeu_si128(a + 1,
                     _mm_add_epi32(_mm_loadu_si128(a + 1), _mm_madd_epi16(_mm_unpackhi_epi16(v, zero), wv)));
  }
#endif
  for (; i < n; ++i) acc[i] += w * src[i];
}
}  // namespace

Resampler::Resampler(int inWidth, int inHeight, int outWidth, int outHeight, uint8_t* out, bool bottomUp)
    : mInW(inWidth), mInH(inHeight), mOutW(outWidth), mOutH(outHeight), mOut(out), mBottomUp(bottomUp) {
  mCopy = (inWidth == outWidth && inHeight == outHeight);
  if (mCopy) return;
  try {
    buildTaps(mHTaps, mInW, mOutW);
    buildTaps(mVTaps, mInH, mOutH);
    const size_t rowLen = static_cast<size_t>(mOutW) * 4;
    // Shrinking sums every source row into the (at most two) output rows it
    // covers; enlarging keeps the last few source rows.
    mShrinkV = mInH > mOutH;
    mRing = mShrinkV ? 1 : mVTaps.maxCount + 1;
    mRows.assign(static_cast<size_t>(mRing) * rowLen, 0);
    mAcc.assign(2 * rowLen, 0);
  } catch (const std::bad_alloc&) {
    IVLOG_E("no memory for %d x %d -> %d x %d", inWidth, inHeight, outWidth, outHeight);
    mOk = false;
  }
}

// Shrinking: each source pixel weighs its share of the output pixel's area.
// Enlarging: linear interpolation between the two nearest centres.
void Resampler::buildTaps(Taps& taps, int in, int out) {
  taps.start.resize(out);
  taps.count.resize(out);
  taps.offset.resize(out);
  taps.weight.clear();
  taps.maxCount = 0;
  const double scale = static_cast<double>(in) / out;
  std::vector<double> w;
  for (int i = 0; i < out; ++i) {
    w.clear();
    int first;
    if (in > out) {
      const double lo = i * scale;
      const double hi = std::min(static_cast<double>(in), (i + 1) * scale);
      first = static_cast<int>(std::floor(lo));
      int last = std::min(in - 1, static_cast<int>(std::ceil(hi)) - 1);
      if (last < first) last = first;
      for (int j = first; j <= last; ++j)
        w.push_back(std::max(0.0, std::min(hi, j + 1.0) - std::max(lo, static_cast<double>(j))) / scale);
    } else {
      double src = (i + 0.5) * scale - 0.5;
      src = std::max(0.0, std::min(static_cast<double>(in - 1), src));
      first = static_cast<int>(std::floor(src));
      const double frac = src - first;
      w.push_back(1.0 - frac);
      if (first + 1 < in && frac > 1e-9) w.push_back(frac);
    }
    // Fixed point, the rounding left over going to the largest weight so that
    // a flat area stays exactly flat.
    int sum = 0;
    size_t largest = 0;
    const size_t base = taps.weight.size();
    for (size_t k = 0; k < w.size(); ++k) {
      const int q = static_cast<int>(std::lround(w[k] * kOne));
      taps.weight.push_back(static_cast<int16_t>(q));
      sum += q;
      if (w[k] > w[largest]) largest = k;
    }
    taps.weight[base + largest] = static_cast<int16_t>(taps.weight[base + largest] + (kOne - sum));
    taps.start[i] = first;
    taps.count[i] = static_cast<int>(w.size());
    taps.offset[i] = static_cast<int>(base);
    taps.maxCount = std::max(taps.maxCount, taps.count[i]);
  }
}

void Resampler::horizontal(const uint8_t* row, uint16_t* dst) const {
  const int16_t* weights = mHTaps.weight.data();
  constexpr int kShift = kWeightBits - kFractionBits, kHalf = 1 << (kShift - 1);
#ifdef __SSE2__
  // Two neighbouring source pixels at a time: their channels interleaved as
  // 16-bit pairs, multiplied by the pair of weights and summed in one step.
  const __m128i zero = _mm_setzero_si128();
  const __m128i half = _mm_set1_epi32(kHalf);
  for (int x = 0; x < mOutW; ++x, dst += 4) {
    const int16_t* w = weights + mHTaps.offset[x];
    const uint8_t* p = row + static_cast<size_t>(mHTaps.start[x]) * 4;
    const int n = mHTaps.count[x];
    __m128i acc = _mm_setzero_si128();
    int k = 0;
    for (; k + 1 < n; k += 2, p += 8) {
      int32_t a, b;
      memcpy(&a, p, 4);
      memcpy(&b, p + 4, 4);
      const __m128i pa = _mm_unpacklo_epi8(_mm_cvtsi32_si128(a), zero);
      const __m128i pb = _mm_unpacklo_epi8(_mm_cvtsi32_si128(b), zero);
      const __m128i pair = _mm_unpacklo_epi16(pa, pb);
      const __m128i wpair = _mm_set1_epi32(static_cast<int32_t>(
          (static_cast<uint32_t>(static_cast<uint16_t>(w[k + 1])) << 16) | static_cast<uint16_t>(w[k])));
      acc = _mm_add_epi32(acc, _mm_madd_epi16(pair, wpair));
    }
    if (k < n) {
      int32_t a;
      memcpy(&a, p, 4);
      const __m128i pa = _mm_unpacklo_epi16(_mm_unpacklo_epi8(_mm_cvtsi32_si128(a), zero), zero);
      acc = _mm_add_epi32(acc, _mm_madd_epi16(pa, _mm_set1_epi32(static_cast<uint16_t>(w[k]))));
    }
    acc = _mm_srai_epi32(_mm_add_epi32(acc, half), kShift);
    _mm_storel_epi64(reinterpret_cast<__m128i*>(dst), _mm_packs_epi32(acc, acc));
  }
#else
  for (int x = 0; x < mOutW; ++x, dst += 4) {
    const int16_t* w = weights + mHTaps.offset[x];
    const uint8_t* p = row + static_cast<size_t>(mHTaps.start[x]) * 4;
    int32_t b = 0, g = 0, r = 0, a = 0;
    for (int k = 0, n = mHTaps.count[x]; k < n; ++k, p += 4) {
      b += w[k] * p[0];
      g += w[k] * p[1];
      r += w[k] * p[2];
      a += w[k] * p[3];
    }
    dst[0] = static_cast<uint16_t>((b + kHalf) >> kShift);
    dst[1] = static_cast<uint16_t>((g + kHalf) >> kShift);
    dst[2] = static_cast<uint16_t>((r + kHalf) >> kShift);
    dst[3] = static_cast<uint16_t>((a + kHalf) >> kShift);
  }
#endif
}

void Resampler::pushRow(const uint8_t* row) {
  if (!mOk || mPushed >= mInH) return;
  const size_t rowLen = static_cast<size_t>(mOutW) * 4;
  if (mCopy) {
    const int y = mBottomUp ? mInH - 1 - mPushed : mPushed;
    memcpy(mOut + static_cast<size_t>(y) * rowLen, row, rowLen);
    ++mPushed;
    return;
  }
  if (!mShrinkV) {
    horizontal(row, &mRows[static_cast<size_t>(mPushed % mRing) * rowLen]);
    ++mPushed;
    emitReady();
    return;
  }
  // Shrinking: add the resized row into the output rows it covers.
  uint16_t* h = mRows.data();
  horizontal(row, h);
  const int j = mPushed++;
  for (int slot = 0; slot < 2 && mEmitted + slot < mOutH; ++slot) {
    const int y = mEmitted + slot;
    const int k = j - mVTaps.start[y];
    if (k < 0 || k >= mVTaps.count[y]) continue;
    const int32_t w = mVTaps.weight[mVTaps.offset[y] + k];
    int32_t* acc = &mAcc[slot * rowLen];
    accumulate(acc, h, w, rowLen);
  }
  while (mEmitted < mOutH && mVTaps.start[mEmitted] + mVTaps.count[mEmitted] <= mPushed) {
    storeRow(mEmitted, mAcc.data());
    ++mEmitted;
    // The next row's partial sum moves to the front; the back starts over.
    std::swap_ranges(mAcc.begin(), mAcc.begin() + rowLen, mAcc.begin() + rowLen);
    std::fill(mAcc.begin() + rowLen, mAcc.end(), 0);
  }
}

void Resampler::emitReady() {
  while (mEmitted < mOutH && mVTaps.start[mEmitted] + mVTaps.count[mEmitted] <= mPushed) {
    emitRow(mEmitted);
    ++mEmitted;
  }
}

void Resampler::emitRow(int y) {
  const int16_t* w = &mVTaps.weight[mVTaps.offset[y]];
  const int start = mVTaps.start[y];
  const size_t rowLen = static_cast<size_t>(mOutW) * 4;
  std::fill(mAcc.begin(), mAcc.begin() + rowLen, 0);
  int32_t* acc = mAcc.data();
  for (int k = 0; k < mVTaps.count[y]; ++k) {
    const uint16_t* s = &mRows[static_cast<size_t>((start + k) % mRing) * rowLen];
    const int32_t wk = w[k];
    accumulate(acc, s, wk, rowLen);
  }
  storeRow(y, acc);
}

// Sums are levels x 128 x (1 << 14) of non-negative weights adding up to
// one, so they come back to bytes without clamping, and a premultiplied
// colour stays at or below its alpha.
void Resampler::storeRow(int y, const int32_t* acc) {
  const int outY = mBottomUp ? mOutH - 1 - y : y;
  uint8_t* dst = mOut + static_cast<size_t>(outY) * mOutW * 4;
  const size_t rowLen = static_cast<size_t>(mOutW) * 4;
  constexpr int kShift = kWeightBits + kFractionBits, kHalf = 1 << (kShift - 1);
  size_t i = 0;
#ifdef __SSE2__
  const __m128i half = _mm_set1_epi32(kHalf);
  for (; i + 8 <= rowLen; i += 8) {
    const __m128i lo = _mm_srai_epi32(
        _mm_add_epi32(_mm_loadu_si128(reinterpret_cast<const __m128i*>(acc + i)), half), kShift);
    const __m128i hi = _mm_srai_epi32(
        _mm_add_epi32(_mm_loadu_si128(reinterpret_cast<const __m128i*>(acc + i + 4)), half), kShift);
    const __m128i words = _mm_packs_epi32(lo, hi);
    _mm_storel_epi64(reinterpret_cast<__m128i*>(dst + i), _mm_packus_epi16(words, words));
  }
#endif
  for (; i < rowLen; ++i) dst[i] = static_cast<uint8_t>((acc[i] + kHalf) >> kShift);
}

void Resampler::finish() {
  if (!mOk) return;
  if (mPushed < mInH) {
    std::vector<uint8_t> blank(static_cast<size_t>(mInW) * 4, 0);
    while (mPushed < mInH) pushRow(blank.data());
  }
}

}  // namespace BitmapFactory
