#pragma once
// Internal to the image filter: small interleaved working images, box
// downscaling, running-sum box blurs and bilinear upsampling. Blurs run on a
// reduced copy where the look allows it, which keeps wide radii cheap.

#include <cstdint>
#include <vector>

#include "platform/image-filter/filter_frame.h"
#include "platform/image-filter/filter_scratch.h"

namespace imgfilter {

// N bytes per pixel, rows packed. Four-channel images are in R, G, B, A order.
template <int N>
struct Image {
  int w = 0;
  int h = 0;
  ScratchBlock px;
  // All pixels zero.
  void resize(int width, int height) {
    w = width;
    h = height;
    px.assignZero((size_t)width * (size_t)height * N);
  }
  uint8_t* row(int y) { return px.data() + (size_t)y * (size_t)w * N; }
  const uint8_t* row(int y) const { return px.data() + (size_t)y * (size_t)w * N; }
};
using Rgba = Image<4>;
using Gray = Image<1>;

// The reduction factor that brings the short side near `target` (at least 1).
int reductionFor(int shortSide, int target);

// Averages factor x factor blocks of the frame's source into R, G, B, A order.
void downscale(const Frame& f, int factor, Rgba& out);
// Luma of row y of the frame's source.
void lumaRow(const Frame& f, int y, uint8_t* out);

// Box passes round like this: out = (sum * boxInverse(r) + 2^23) >> 24.
uint32_t boxInverse(int radius);
// One row of a horizontal box of radius r over pixels of `step` bytes:
// out[i] averages line[i + k step] for k = 0 .. 2r. The line is the row
// padded with r copies of its edge pixel at each end; count + (2r + 1) step
// bytes must be readable.
void boxRow(const uint8_t* line, uint8_t* out, int count, int radius, int step);
// One output row of a vertical box pass over n bytes: out from the window
// sums, then the window moves down a row (sum += add - sub).
void boxColumnStep(uint32_t* sum, const uint8_t* add, const uint8_t* sub, uint8_t* out, size_t n,
                   uint32_t inv);

// `passes` horizontal and vertical box passes of the given radius; three
// passes give a close approximation of a Gaussian.
template <int N>
void boxBlur(Image<N>& img, int radius, int passes);
// Box radius whose three passes give about the given Gaussian sigma.
int boxRadiusForSigma(double sigma);

// Bilinear enlargement of a reduced image back to full size, one row at a time
// (a reduced pixel covers `factor` full pixels, centres aligned).
template <int N>
class Upsampler {
 public:
  Upsampler(const Image<N>& small, int factor, int fullWidth, int fullHeight);
  // The full-resolution row y: fullWidth x N bytes, valid until the next call.
  const uint8_t* row(int y);

 private:
  // Reduced row `sy` enlarged across, in 8.8 fixed point, into `out`.
  void widen(int sy, uint16_t* out) const;

  const Image<N>& mSmall;
  int mFactor;
  int mWidth;
  // Per full column: the two reduced columns it lies between, and the 8.8
  // weight of the second, repeated for each of the N bytes.
  std::vector<int> mX0;
  std::vector<int> mX1;
  std::vector<uint16_t> mWx;
  // The two widened reduced rows the current full rows lie between.
  int mRow0 = -1;
  int mRow1 = -1;
  std::vector<uint16_t> mWide0;
  std::vector<uint16_t> mWide1;
  std::vector<uint8_t> mOut;
};

extern template void boxBlur<1>(Image<1>&, int, int);
extern template void boxBlur<4>(Image<4>&, int, int);
extern template class Upsampler<1>;
extern template class Upsampler<4>;

}  // namespace imgfilter
