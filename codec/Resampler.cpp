#include "codec/Resampler.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <new>

#include "codec/CodecLog.h"

namespace BitmapFactory {

Resampler::Resampler(int inWidth, int inHeight, int outWidth, int outHeight, uint8_t* out, bool bottomUp)
    : mInW(inWidth), mInH(inHeight), mOutW(outWidth), mOutH(outHeight), mOut(out), mBottomUp(bottomUp) {
  mCopy = (inWidth == outWidth && inHeight == outHeight);
  if (mCopy) return;
  try {
    buildTaps(mHTaps, mInW, mOutW);
    buildTaps(mVTaps, mInH, mOutH);
    // Shrinking sums every source row into the (at most two) output rows it
    // covers; enlarging keeps the last few source rows.
    mShrinkV = mInH > mOutH;
    mRing = mShrinkV ? 3 : mVTaps.maxCount + 1;
    mRows.assign(static_cast<size_t>(mRing) * mOutW * 4, 0.0f);
  } catch (const std::bad_alloc&) {
    IVLOG_E("no memory for %d x %d -> %d x %d", inWidth, inHeight, outWidth, outHeight);
    mOk = false;
  }
}

// For every output index the span of source indexes it reads and their
// weights. Shrinking: the share of each source pixel in the output pixel's
// area. Enlarging: linear interpolation between the two nearest centres.
void Resampler::buildTaps(Taps& taps, int in, int out) {
  taps.start.resize(out);
  taps.count.resize(out);
  taps.offset.resize(out);
  taps.weight.clear();
  taps.maxCount = 0;
  const double scale = static_cast<double>(in) / out;
  for (int i = 0; i < out; ++i) {
    taps.offset[i] = static_cast<int>(taps.weight.size());
    if (in > out) {
      const double lo = i * scale;
      const double hi = std::min(static_cast<double>(in), (i + 1) * scale);
      int first = static_cast<int>(std::floor(lo));
      int last = std::min(in - 1, static_cast<int>(std::ceil(hi)) - 1);
      if (last < first) last = first;
      taps.start[i] = first;
      taps.count[i] = last - first + 1;
      for (int j = first; j <= last; ++j) {
        const double cover = std::min(hi, j + 1.0) - std::max(lo, static_cast<double>(j));
        taps.weight.push_back(static_cast<float>(std::max(0.0, cover) / scale));
      }
    } else {
      double src = (i + 0.5) * scale - 0.5;
      src = std::max(0.0, std::min(static_cast<double>(in - 1), src));
      int j0 = static_cast<int>(std::floor(src));
      const double frac = src - j0;
      if (j0 + 1 < in && frac > 1e-6) {
        taps.start[i] = j0;
        taps.count[i] = 2;
        taps.weight.push_back(static_cast<float>(1.0 - frac));
        taps.weight.push_back(static_cast<float>(frac));
      } else {
        taps.start[i] = j0;
        taps.count[i] = 1;
        taps.weight.push_back(1.0f);
      }
    }
    taps.maxCount = std::max(taps.maxCount, taps.count[i]);
  }
}

void Resampler::horizontal(const uint8_t* row, float* dst) const {
  for (int x = 0; x < mOutW; ++x) {
    const float* w = &mHTaps.weight[mHTaps.offset[x]];
    const uint8_t* p = row + static_cast<size_t>(mHTaps.start[x]) * 4;
    float b = 0, g = 0, r = 0, a = 0;
    for (int k = 0, n = mHTaps.count[x]; k < n; ++k, p += 4) {
      b += w[k] * p[0];
      g += w[k] * p[1];
      r += w[k] * p[2];
      a += w[k] * p[3];
    }
    dst[0] = b;
    dst[1] = g;
    dst[2] = r;
    dst[3] = a;
    dst += 4;
  }
}

void Resampler::pushRow(const uint8_t* row) {
  if (!mOk || mPushed >= mInH) return;
  if (mCopy) {
    const int y = mBottomUp ? mInH - 1 - mPushed : mPushed;
    memcpy(mOut + static_cast<size_t>(y) * mOutW * 4, row, static_cast<size_t>(mOutW) * 4);
    ++mPushed;
    return;
  }
  if (!mShrinkV) {
    horizontal(row, &mRows[static_cast<size_t>(mPushed % mRing) * mOutW * 4]);
    ++mPushed;
    emitReady();
    return;
  }
  // Shrinking: slot 2 takes the resized row, slots 0 and 1 accumulate the
  // output rows mEmitted and mEmitted + 1.
  const size_t rowLen = static_cast<size_t>(mOutW) * 4;
  float* h = &mRows[2 * rowLen];
  horizontal(row, h);
  const int j = mPushed++;
  const double scale = static_cast<double>(mInH) / mOutH;
  for (int slot = 0; slot < 2 && mEmitted + slot < mOutH; ++slot) {
    const int y = mEmitted + slot;
    const double lo = y * scale, hi = std::min(static_cast<double>(mInH), (y + 1) * scale);
    const double cover = std::min(hi, j + 1.0) - std::max(lo, static_cast<double>(j));
    if (cover <= 0) continue;
    const float w = static_cast<float>(cover / scale);
    float* acc = &mRows[slot * rowLen];
    for (size_t i = 0; i < rowLen; ++i) acc[i] += w * h[i];
  }
  while (mEmitted < mOutH && mVTaps.start[mEmitted] + mVTaps.count[mEmitted] <= mPushed) {
    storeRow(mEmitted, &mRows[0]);
    ++mEmitted;
    std::copy(mRows.begin() + rowLen, mRows.begin() + 2 * rowLen, mRows.begin());
    std::fill(mRows.begin() + rowLen, mRows.begin() + 2 * rowLen, 0.0f);
  }
}

void Resampler::emitReady() {
  while (mEmitted < mOutH && mVTaps.start[mEmitted] + mVTaps.count[mEmitted] <= mPushed) {
    emitRow(mEmitted);
    ++mEmitted;
  }
}

void Resampler::emitRow(int y) {
  const float* w = &mVTaps.weight[mVTaps.offset[y]];
  const int start = mVTaps.start[y];
  const int n = mVTaps.count[y];
  const size_t rowLen = static_cast<size_t>(mOutW) * 4;
  mAcc.assign(rowLen, 0.0f);
  for (int k = 0; k < n; ++k) {
    const float* s = &mRows[static_cast<size_t>((start + k) % mRing) * rowLen];
    for (size_t i = 0; i < rowLen; ++i) mAcc[i] += w[k] * s[i];
  }
  storeRow(y, mAcc.data());
}

void Resampler::storeRow(int y, const float* acc) {
  const int outY = mBottomUp ? mOutH - 1 - y : y;
  uint8_t* dst = mOut + static_cast<size_t>(outY) * mOutW * 4;
  const size_t rowLen = static_cast<size_t>(mOutW) * 4;
  for (size_t i = 0; i < rowLen; i += 4) {
    int a = static_cast<int>(acc[i + 3] + 0.5f);
    a = std::max(0, std::min(255, a));
    for (int c = 0; c < 3; ++c) {
      int v = static_cast<int>(acc[i + c] + 0.5f);
      dst[i + c] = static_cast<uint8_t>(std::max(0, std::min(a, v)));  // premultiplied: colour <= alpha
    }
    dst[i + 3] = static_cast<uint8_t>(a);
  }
}

void Resampler::finish() {
  if (!mOk) return;
  if (mPushed < mInH) {
    std::vector<uint8_t> blank(static_cast<size_t>(mInW) * 4, 0);
    while (mPushed < mInH) pushRow(blank.data());
  }
}

}  // namespace BitmapFactory
