#include "common/CLyFloatPoint.h"

CLyFloatPoint& CLyFloatPoint::operator=(const CLyFloatPoint& other) {
  if (this != &other) {
    x = other.x;
    y = other.y;
  }
  return *this;
}
