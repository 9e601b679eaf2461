#include "model/size-modifier/CLySizeModifierGrid4Style2.h"

bool CLySizeModifierGrid4Style2::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
      return _focusImage1X(var, limit, marks);
    case 2:
      return (mHandlerIndex == 0) ? _focusImage1X(var, limit, marks) : _focusImage3X(var, limit, marks);
    case 3:
      return _focusImage3X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid4Style2::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
    case 2:
    case 3:
      return _focusImage1Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {1} | {2}.
bool CLySizeModifierGrid4Style2::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {1}, {2});
}

// Divider {2} | {3}.
bool CLySizeModifierGrid4Style2::_focusImage3X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {2}, {3});
}

// Divider {0} | {1, 2, 3}.
bool CLySizeModifierGrid4Style2::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1, 2, 3});
}
