#pragma once
// Internal to the image filter: small AVX2 helpers shared by the vector
// kernels. Every vector kernel has a plain twin computing the same integers;
// the vector one runs when simdAvx2() says so.

#include <cstddef>
#include <vector>

namespace imgfilter::simd {

// Three per-channel tables of `n` entries widened to ints in one block, the
// form the vector gathers read.
template <typename Tables>
std::vector<int> widenTables(const Tables& tables, size_t n) {
  std::vector<int> ints(3 * n);
  for (size_t k = 0; k < 3; ++k)
    for (size_t i = 0; i < n; ++i) ints[k * n + i] = tables[k][i];
  return ints;
}

}  // namespace imgfilter::simd

#if defined(__x86_64__)
#include <immintrin.h>

#include <cstdint>

namespace imgfilter::simd {

// Channel at bit `shift` of eight 32-bit pixels, as eight ints.
template <int Shift>
__attribute__((target("avx2"))) inline __m256i channel(__m256i px) {
  return _mm256_and_si256(_mm256_srli_epi32(px, Shift), _mm256_set1_epi32(255));
}

// floor(x / 255) for 0 <= x <= 65534.
__attribute__((target("avx2"))) inline __m256i div255(__m256i x) {
  return _mm256_srli_epi32(
      _mm256_add_epi32(_mm256_add_epi32(x, _mm256_set1_epi32(1)), _mm256_srli_epi32(x, 8)), 8);
}

// c + (g * (255 - c) + 127) / 255: light g screened onto c.
__attribute__((target("avx2"))) inline __m256i screen(__m256i c, __m256i g) {
  const __m256i inv = _mm256_sub_epi32(_mm256_set1_epi32(255), c);
  return _mm256_add_epi32(c, div255(_mm256_add_epi32(_mm256_mullo_epi32(g, inv), _mm256_set1_epi32(127))));
}

// Rec. 709 luma in 8.8 fixed point, as luma709().
__attribute__((target("avx2"))) inline __m256i luma(__m256i r, __m256i g, __m256i b) {
  const __m256i s = _mm256_add_epi32(_mm256_mullo_epi32(r, _mm256_set1_epi32(54)),
                                     _mm256_mullo_epi32(g, _mm256_set1_epi32(183)));
  return _mm256_srai_epi32(_mm256_add_epi32(s, _mm256_mullo_epi32(b, _mm256_set1_epi32(19))), 8);
}

// Eight pixels from channels r, g, b (ints 0..255) and the alpha of `px`.
template <int SR, int SG, int SB, int SA>
__attribute__((target("avx2"))) inline __m256i pack(__m256i r, __m256i g, __m256i b, __m256i px) {
  const __m256i rg = _mm256_or_si256(_mm256_slli_epi32(r, SR), _mm256_slli_epi32(g, SG));
  return _mm256_or_si256(_mm256_or_si256(rg, _mm256_slli_epi32(b, SB)),
                         _mm256_and_si256(px, _mm256_set1_epi32((int)(255u << SA))));
}

__attribute__((target("avx2"))) inline __m256i load8(const uint8_t* p) {
  return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p));
}
__attribute__((target("avx2"))) inline void store8(uint8_t* p, __m256i v) {
  _mm256_storeu_si256(reinterpret_cast<__m256i*>(p), v);
}

}  // namespace imgfilter::simd
#endif
