#pragma once
// Float rectangle with two readings: a layout cell as left (x1), top (y1),
// right (x2), bottom (y2) fractions 0..1 of the collage, or a pixel rectangle
// as x, y, width, height. Colours for the canvas use it as r, g, b, a.
// The default (0, 0, -1, -1) contains nothing.

class CLyFloatRectangle {
 public:
  CLyFloatRectangle() = default;
  CLyFloatRectangle(float x1, float y1, float x2, float y2) : x1(x1), y1(y1), x2(x2), y2(y2) {}
  CLyFloatRectangle(const CLyFloatRectangle& other) = default;
  CLyFloatRectangle& operator=(const CLyFloatRectangle& other);
  virtual ~CLyFloatRectangle() = default;

  void set(float x1, float y1, float x2, float y2);

  // Edge reading: true when x1 <= px < x2 and y1 <= py < y2; false when the
  // right or bottom edge is not above 0.
  bool contains(float px, float py) const;

  float x1 = 0.0f;
  float y1 = 0.0f;
  float x2 = -1.0f;
  float y2 = -1.0f;
};
