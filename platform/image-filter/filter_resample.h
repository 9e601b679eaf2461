#pragma once
// Internal to the image filter: small interleaved working images, box
// downscaling, running-sum box blurs and bilinear upsampling. Blurs run on a
// reduced copy where the look allows it, which keeps wide radii cheap.

#include <cstdint>
#include <vector>

#include "platform/image-filter/filter_frame.h"

namespace imgfilter {

// N bytes per pixel, rows packed. Four-channel images are in R, G, B, A order.
template <int N>
struct Image {
  int w = 0;
  int h = 0;
  std::vector<uint8_t> px;
  void resize(int width, int height) {
    w = width;
    h = height;
    px.assign((size_t)width * (size_t)height * N, 0);
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
// Luma of the frame's source, averaged over factor x factor blocks.
void downscaleLuma(const Frame& f, int factor, Gray& out);

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
  std::vector<int> mX0;
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
