#include "model/size-modifier/CLySizeModifierGrid6Style2.h"

bool CLySizeModifierGrid6Style2::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
    case 2:
    case 5:
      return _focusImage1X(var, limit, marks);
    case 3:
      return _focusImage4X(var, limit, marks);
    case 4:
      return (mHandlerIndex == 0) ? _focusImage4X(var, limit, marks) : _focusImage1X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid6Style2::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 3:
    case 4:
    case 5:
      return _focusImage1Y(var, limit, marks);
    case 1:
      return _focusImage2Y(var, limit, marks);
    case 2:
      return (mHandlerIndex == 0) ? _focusImage2Y(var, limit, marks) : _focusImage1Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {0, 4} | {1, 2, 5}.
bool CLySizeModifierGrid6Style2::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {0, 4}, {1, 2, 5});
}

// Divider {3} | {4}.
bool CLySizeModifierGrid6Style2::_focusImage4X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {3}, {4});
}

// Divider {0, 2} | {3, 4, 5}.
bool CLySizeModifierGrid6Style2::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0, 2}, {3, 4, 5});
}

// Divider {1} | {2}.
bool CLySizeModifierGrid6Style2::_focusImage2Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {1}, {2});
}
