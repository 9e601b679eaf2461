#pragma once
// Internal to the image filter: the pixel frame every look works on, and the
// small tools the looks share (curves, luma, seeded noise, vignette tables).

#include <cmath>
#include <cstdint>
#include <cstring>
#include <vector>

namespace imgfilter {

// Byte offsets of the channels inside one 4-byte pixel.
struct Channels {
  int r, g, b, a;
};
// Memory order A, R, G, B (tbm "BA24", buffer "BGRA").
constexpr Channels kOrderARGB{1, 2, 3, 0};
// Memory order B, G, R, A (tbm "AR24", the evas and cairo layout).
constexpr Channels kOrderBGRA{2, 1, 0, 3};

// Compile-time channel orders: kernels written as generic lambdas get
// constant byte offsets through dispatchOrder, which lets the compiler merge
// the byte loads and stores of a pixel.
template <int R, int G, int B, int A>
struct Order {
  static constexpr Channels ch{R, G, B, A};
};
template <typename Fn>
inline void dispatchOrder(const Channels& ch, Fn&& fn) {
  if (ch.a == kOrderARGB.a)
    fn(Order<1, 2, 3, 0>{});
  else
    fn(Order<2, 1, 0, 3>{});
}

// Source and destination share size and channel order; rows may be padded.
// All reads of the source happen before, or at the same pixel as, the write
// of the destination, so the two may be the same memory.
struct Frame {
  const uint8_t* src;
  int srcStride;
  uint8_t* dst;
  int dstStride;
  int width;
  int height;
  Channels ch;

  const uint8_t* srcRow(int y) const { return src + (size_t)y * (size_t)srcStride; }
  uint8_t* dstRow(int y) const { return dst + (size_t)y * (size_t)dstStride; }
  int shortSide() const { return width < height ? width : height; }
};

// Whole-pixel access: one load and one store per pixel, channels by shift.
inline uint32_t load32(const uint8_t* p) {
  uint32_t v;
  std::memcpy(&v, p, 4);
  return v;
}
inline void store32(uint8_t* p, uint32_t v) {
  std::memcpy(p, &v, 4);
}
constexpr int chan(uint32_t px, int byteIndex) {
  return (int)((px >> (8 * byteIndex)) & 255u);
}
constexpr uint32_t put(int v, int byteIndex) {
  return (uint32_t)v << (8 * byteIndex);
}

inline int clamp255(int v) {
  return v < 0 ? 0 : (v > 255 ? 255 : v);
}
inline double clamp01(double v) {
  return v < 0.0 ? 0.0 : (v > 1.0 ? 1.0 : v);
}
inline double smooth01(double t) {
  t = clamp01(t);
  return t * t * (3.0 - 2.0 * t);
}

// Rec. 709 luma in 8.8 fixed point (weights 54 + 183 + 19 = 256).
inline int luma709(int r, int g, int b) {
  return (54 * r + 183 * g + 19 * b) >> 8;
}

// True when the AVX2 kernels may run: the processor has AVX2 and
// PICTAVO_FILTER_NO_SIMD was not set when chooseSimd() last looked (tests
// compare both paths, which must give the same bytes).
bool simdAvx2();
// Looks at PICTAVO_FILTER_NO_SIMD again; every look starts with it.
void chooseSimd();

// Small, fast, seeded generator: every look that needs randomness seeds its
// own, so results never depend on threads or on earlier calls.
struct Rng {
  uint64_t s;
  explicit Rng(uint64_t seed) : s(seed) {}
  uint64_t next() {
    uint64_t z = (s += 0x9E3779B97F4A7C15ull);
    z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
    z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
    return z ^ (z >> 31);
  }
  double uniform() { return (double)(next() >> 11) * (1.0 / 9007199254740992.0); }
};

// A 256 x 256 tile of grain values in [-amp, amp] (triangular distribution);
// rows are picked with a stride so the tile does not repeat on a grid.
class GrainTile {
 public:
  GrainTile(uint64_t seed, int amp);
  const int8_t* row(int y) const { return mTile.data() + (size_t)(((unsigned)y * 167u) & 255u) * 256u; }
  static int column(int x, int y) { return (x + y * 73) & 255; }

 private:
  std::vector<int8_t> mTile;
};

// Darkening towards the corners as the product of a column and a row profile
// (8.8 fixed point); strength is the darkening at a corner (0..1).
struct Vignette {
  std::vector<uint16_t> col;
  std::vector<uint16_t> row;
  Vignette(int width, int height, double strength);
};

// Per-channel curve table indexed by a value in -256..511 (offset by 256),
// so a colour matrix result needs no clamping before the lookup.
struct WideLut {
  uint8_t v[768];
  template <typename F>
  void build(F&& f) {
    for (int i = 0; i < 768; ++i)
      v[i] = (uint8_t)clamp255((int)std::lround(255.0 * clamp01(f(clamp01((i - 256) / 255.0)))));
  }
  // Callers keep values inside -256..511 (saturation at most 2), so the
  // hot loops need no clamping.
  uint8_t at(int value) const { return v[value + 256]; }
};

}  // namespace imgfilter
