#include "model/size-modifier/CLySizeModifierGrid5Style2.h"

bool CLySizeModifierGrid5Style2::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
      return _focusImage1X(var, limit, marks);
    case 2:
    case 3:
      return _focusImage3X(var, limit, marks);
    case 4:
      return (mHandlerIndex == 0 || mHandlerIndex == 2) ? _focusImage1X(var, limit, marks)
                                                        : _focusImage3X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid5Style2::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 2:
      return _focusImage1Y(var, limit, marks);
    case 1:
    case 3:
      return _focusImage2Y(var, limit, marks);
    case 4:
      return (mHandlerIndex <= 1) ? _focusImage2Y(var, limit, marks) : _focusImage1Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {0, 4} | {1}.
bool CLySizeModifierGrid5Style2::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {0, 4}, {1});
}

// Divider {2} | {4, 3}.
bool CLySizeModifierGrid5Style2::_focusImage3X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {2}, {4, 3});
}

// Divider {0} | {2, 4}.
bool CLySizeModifierGrid5Style2::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {2, 4});
}

// Divider {1, 4} | {3}.
bool CLySizeModifierGrid5Style2::_focusImage2Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {1, 4}, {3});
}
