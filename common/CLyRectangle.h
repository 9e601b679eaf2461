#pragma once
// Integer rectangle: origin (x, y) and size (w, h). The default (w, h = -1) is
// the empty rectangle. Some callers keep left, top, right, bottom in the four
// fields instead and say so where they do.

#include <cstdint>

class CLyRectangle {
 public:
  CLyRectangle() = default;
  CLyRectangle(int32_t x, int32_t y, int32_t w, int32_t h) : x(x), y(y), w(w), h(h) {}
  CLyRectangle(const CLyRectangle& other) = default;
  CLyRectangle& operator=(const CLyRectangle& other);
  virtual ~CLyRectangle() = default;

  void set(int32_t x, int32_t y, int32_t w, int32_t h);
  bool operator==(const CLyRectangle& other) const;
  bool operator!=(const CLyRectangle& other) const { return !(*this == other); }

  // Left and top edges inside, right and bottom edges outside; an empty
  // rectangle (w or h below 1) contains nothing.
  bool contains(float px, float py) const;

  int32_t x = 0;
  int32_t y = 0;
  int32_t w = -1;
  int32_t h = -1;
};
