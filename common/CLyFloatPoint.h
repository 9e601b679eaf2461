#pragma once
// Float point: pixels or fractions, as the caller reads it.

class CLyFloatPoint {
 public:
  CLyFloatPoint() = default;
  CLyFloatPoint(float x, float y) : x(x), y(y) {}
  CLyFloatPoint(const CLyFloatPoint& other) = default;
  CLyFloatPoint& operator=(const CLyFloatPoint& other);
  virtual ~CLyFloatPoint() = default;

  float x = 0.0f;
  float y = 0.0f;
};
