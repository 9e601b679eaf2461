#pragma once
// One command of a clip path in pixels; the meaning of x and y depends on
// `type`, whose codes belong to the path's producer.

#include <cstdint>

class CLyArcPoint {
 public:
  CLyArcPoint(int32_t x, int32_t y, int32_t type) : x(x), y(y), type(type) {}
  CLyArcPoint(const CLyArcPoint& other) = default;
  CLyArcPoint& operator=(const CLyArcPoint& other);
  virtual ~CLyArcPoint() = default;

  // Same hash as CLyPoint; the type does not take part.
  virtual int32_t hashCode() const;

  int32_t x;
  int32_t y;
  int32_t type;
};
