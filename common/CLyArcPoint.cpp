#include "common/CLyArcPoint.h"

#include "common/CLyGeometryHash.h"

CLyArcPoint& CLyArcPoint::operator=(const CLyArcPoint& other) {
  if (this != &other) {
    x = other.x;
    y = other.y;
    type = other.type;
  }
  return *this;
}

int32_t CLyArcPoint::hashCode() const {
  return pictavo::geometryHash(x, y);
}
