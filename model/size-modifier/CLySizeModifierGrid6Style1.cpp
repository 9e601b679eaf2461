#include "model/size-modifier/CLySizeModifierGrid6Style1.h"

bool CLySizeModifierGrid6Style1::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 3:
      return _focusImage1X(var, limit, marks);
    case 1:
    case 4:
      return (mHandlerIndex == 0) ? _focusImage1X(var, limit, marks) : _focusImage3X(var, limit, marks);
    case 2:
    case 5:
      return _focusImage3X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid6Style1::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1, 2} | {3, 4, 5}.
  return _snapDivider(AXIS_Y, var, limit, marks, {0, 1, 2}, {3, 4, 5});
}

// Divider {0, 3} | {1, 4}.
bool CLySizeModifierGrid6Style1::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {0, 3}, {1, 4});
}

// Divider {1, 4} | {2, 5}.
bool CLySizeModifierGrid6Style1::_focusImage3X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {1, 4}, {2, 5});
}
