#include "common/CLyRectangle.h"

CLyRectangle& CLyRectangle::operator=(const CLyRectangle& other) {
  if (this != &other) set(other.x, other.y, other.w, other.h);
  return *this;
}

void CLyRectangle::set(int32_t nx, int32_t ny, int32_t nw, int32_t nh) {
  x = nx;
  y = ny;
  w = nw;
  h = nh;
}

bool CLyRectangle::operator==(const CLyRectangle& other) const {
  return x == other.x && y == other.y && w == other.w && h == other.h;
}

bool CLyRectangle::contains(float px, float py) const {
  if (w < 1 || h < 1) return false;
  // Compare in double so that large coordinates do not round onto an edge.
  const double l = x, t = y, r = static_cast<double>(x) + w, b = static_cast<double>(y) + h;
  return l <= px && px < r && t <= py && py < b;
}
