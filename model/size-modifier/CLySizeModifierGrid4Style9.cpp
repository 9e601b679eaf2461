#include "model/size-modifier/CLySizeModifierGrid4Style9.h"

bool CLySizeModifierGrid4Style9::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
      return _focusImage1X(var, limit, marks);
    case 1:
    case 2:
      return (mHandlerIndex == 0) ? _focusImage1X(var, limit, marks) : _focusImage4X(var, limit, marks);
    case 3:
      return _focusImage4X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid4Style9::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {1} | {2}.
  return _snapDivider(AXIS_Y, var, limit, marks, {1}, {2});
}

// Divider {0} | {1, 2}.
bool CLySizeModifierGrid4Style9::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {0}, {1, 2});
}

// Divider {1, 2} | {3}.
bool CLySizeModifierGrid4Style9::_focusImage4X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {1, 2}, {3});
}
