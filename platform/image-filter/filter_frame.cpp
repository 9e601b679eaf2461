#include "platform/image-filter/filter_frame.h"

#include <atomic>
#include <cstdlib>

namespace imgfilter {

namespace {

bool avx2Allowed() {
#if defined(__x86_64__)
  return __builtin_cpu_supports("avx2") && !getenv("PICTAVO_FILTER_NO_SIMD");
#else
  return false;
#endif
}

// Read once per look, not in the kernels, which ask for every row.
std::atomic<bool>& avx2Choice() {
  static std::atomic<bool> choice{avx2Allowed()};
  return choice;
}

}  // namespace

bool simdAvx2() {
  return avx2Choice().load(std::memory_order_relaxed);
}

void chooseSimd() {
  avx2Choice().store(avx2Allowed(), std::memory_order_relaxed);
}

GrainTile::GrainTile(uint64_t seed, int amp) : mTile(256 * 256) {
  Rng rng(seed);
  for (int8_t& v : mTile) {
    uint64_t bits = rng.next();
    // Sum of two uniforms: a soft, film-like distribution.
    double u = ((bits & 0xffff) + ((bits >> 16) & 0xffff)) / 65535.0 - 1.0;
    v = (int8_t)std::lround(u * amp);
  }
}

Vignette::Vignette(int width, int height, double strength) : col((size_t)width), row((size_t)height) {
  // Each profile darkens by k at its edge, so a corner gets (1 - k)^2 = 1 - strength.
  double k = 1.0 - std::sqrt(clamp01(1.0 - strength));
  auto fill = [k](std::vector<uint16_t>& out, int n) {
    for (int i = 0; i < n; ++i) {
      double u = n > 1 ? std::fabs(2.0 * i / (n - 1) - 1.0) : 0.0;
      out[(size_t)i] = (uint16_t)std::lround(256.0 * (1.0 - k * std::pow(u, 2.4)));
    }
  };
  fill(col, width);
  fill(row, height);
}

}  // namespace imgfilter
