#pragma once
// Integer point in pixels.

#include <cstdint>

class CLyPoint {
 public:
  CLyPoint() = default;
  CLyPoint(int32_t x, int32_t y) : x(x), y(y) {}
  CLyPoint(const CLyPoint& other) = default;
  CLyPoint& operator=(const CLyPoint& other);
  virtual ~CLyPoint() = default;

  bool operator==(const CLyPoint& other) const { return x == other.x && y == other.y; }
  bool operator!=(const CLyPoint& other) const { return !(*this == other); }

  // h = (y * 31) ^ x, folded with its upper half; 32-bit signed arithmetic.
  virtual int32_t hashCode() const;

  int32_t x = 0;
  int32_t y = 0;
};
