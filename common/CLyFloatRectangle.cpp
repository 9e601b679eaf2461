#include "common/CLyFloatRectangle.h"

CLyFloatRectangle& CLyFloatRectangle::operator=(const CLyFloatRectangle& other) {
  if (this != &other) set(other.x1, other.y1, other.x2, other.y2);
  return *this;
}

void CLyFloatRectangle::set(float nx1, float ny1, float nx2, float ny2) {
  x1 = nx1;
  y1 = ny1;
  x2 = nx2;
  y2 = ny2;
}

bool CLyFloatRectangle::contains(float px, float py) const {
  if (x2 <= 0.0f || y2 <= 0.0f) return false;
  return x1 <= px && px < x2 && y1 <= py && py < y2;
}
