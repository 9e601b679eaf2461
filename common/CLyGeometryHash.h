#pragma once
// The hash shared by the integer point types: h = (y * 31) ^ x, then h ^ (h >> 16).
// Computed in unsigned arithmetic so that overflow wraps like 32-bit signed
// hardware arithmetic instead of being undefined; the shift stays arithmetic.

#include <cstdint>

namespace pictavo {

inline int32_t geometryHash(int32_t x, int32_t y) {
  const int32_t h = static_cast<int32_t>(static_cast<uint32_t>(y) * 31u) ^ x;
  return h ^ (h >> 16);
}

}  // namespace pictavo
