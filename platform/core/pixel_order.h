#pragma once
// Turning four-byte pixels round (A,R,G,B <-> B,G,R,A), the one conversion
// between the two 32-bit pixel orders the platform's surfaces and the
// application's buffers use. Vector code where the processor has it: a
// 12 MB photo turns in about the time of a plain copy.

#include <cstddef>
#include <cstdint>
#include <cstring>

#if defined(__x86_64__)
#include <immintrin.h>
#endif

namespace pixel_order {

#if defined(__x86_64__)
__attribute__((target("avx2"))) inline size_t reverseAvx2(const unsigned char* from, unsigned char* to,
                                                          size_t pixels) {
  const __m256i turn = _mm256_setr_epi8(3, 2, 1, 0, 7, 6, 5, 4, 11, 10, 9, 8, 15, 14, 13, 12, 3, 2, 1, 0, 7,
                                        6, 5, 4, 11, 10, 9, 8, 15, 14, 13, 12);
  size_t i = 0;
  for (; i + 8 <= pixels; i += 8) {
    const __m256i v = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(from + i * 4));
    _mm256_storeu_si256(reinterpret_cast<__m256i*>(to + i * 4), _mm256_shuffle_epi8(v, turn));
  }
  return i;
}
#endif

// Copies `pixels` pixels from `from` to `to`, reversing the four bytes of
// each. `to` may equal `from` (turning in place), but the two must not
// otherwise overlap.
inline void copyReversed(const unsigned char* from, unsigned char* to, size_t pixels) {
  size_t i = 0;
#if defined(__x86_64__)
  if (__builtin_cpu_supports("avx2")) i = reverseAvx2(from, to, pixels);
#endif
  for (; i < pixels; ++i) {
    uint32_t v;
    std::memcpy(&v, from + i * 4, 4);
    v = __builtin_bswap32(v);
    std::memcpy(to + i * 4, &v, 4);
  }
}

}  // namespace pixel_order
