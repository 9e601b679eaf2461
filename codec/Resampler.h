#pragma once
// Streaming resize of B, G, R, A premultiplied rows to an exact output size.
// Rows go in one at a time, top to bottom (or bottom to top with
// `bottomUp`), so a decoder never has to hold the whole source image: only a
// few rows of the output width are kept. Shrinking averages the covered
// area of every output pixel; enlarging interpolates linearly.

#include <cstdint>
#include <vector>

namespace BitmapFactory {

class Resampler {
 public:
  // Writes into `out`: outWidth x outHeight pixels of 4 bytes, packed rows.
  Resampler(int inWidth, int inHeight, int outWidth, int outHeight, uint8_t* out, bool bottomUp = false);
  // False when the working memory could not be had (a logged failure).
  bool ok() const { return mOk; }
  // Feeds the next source row (inWidth premultiplied BGRA pixels).
  void pushRow(const uint8_t* row);
  // Fills the rows that were never fed (a short source) with transparent
  // pixels, so the output is always complete.
  void finish();
  int rowsPushed() const { return mPushed; }

 private:
  // For every output index: the first source index it reads, how many, and
  // their weights (fixed point, summing to 1 << 14) from `offset`.
  struct Taps {
    std::vector<int> start;
    std::vector<int> count;
    std::vector<int> offset;
    std::vector<int16_t> weight;
    int maxCount = 0;
  };
  static void buildTaps(Taps& taps, int in, int out);
  // One source row resized to the output width, in 1/128 steps of a level.
  void horizontal(const uint8_t* row, uint16_t* dst) const;
  void emitReady();
  void emitRow(int y);
  void storeRow(int y, const int32_t* acc);

  int mInW, mInH, mOutW, mOutH;
  uint8_t* mOut;
  bool mBottomUp;
  bool mOk = true;
  bool mCopy = false;     // same size: rows are copied straight through
  bool mShrinkV = false;  // fewer output rows than source rows
  Taps mHTaps, mVTaps;
  int mRing = 0;                // resized source rows kept when enlarging
  std::vector<uint16_t> mRows;  // mRing rows of outWidth x 4
  std::vector<int32_t> mAcc;    // shrinking: sums of output rows mEmitted and mEmitted + 1
  int mPushed = 0;              // source rows fed so far
  int mEmitted = 0;             // output rows written so far
};

}  // namespace BitmapFactory
