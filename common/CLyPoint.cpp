#include "common/CLyPoint.h"

#include "common/CLyGeometryHash.h"

CLyPoint& CLyPoint::operator=(const CLyPoint& other) {
  if (this != &other) {
    x = other.x;
    y = other.y;
  }
  return *this;
}

int32_t CLyPoint::hashCode() const {
  return pictavo::geometryHash(x, y);
}
