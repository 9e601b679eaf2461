#include "model/size-modifier/CLySizeModifierGrid4Style6.h"

bool CLySizeModifierGrid4Style6::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0} | {1, 2, 3}.
  return _snapDivider(AXIS_X, var, limit, marks, {0}, {1, 2, 3});
}

bool CLySizeModifierGrid4Style6::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
      return _focusImage2Y(var, limit, marks);
    case 2:
      return (mHandlerIndex == 0) ? _focusImage2Y(var, limit, marks) : _focusImage4Y(var, limit, marks);
    case 3:
      return _focusImage4Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {1} | {2}.
bool CLySizeModifierGrid4Style6::_focusImage2Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {1}, {2});
}

// Divider {2} | {3}.
bool CLySizeModifierGrid4Style6::_focusImage4Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {2}, {3});
}
