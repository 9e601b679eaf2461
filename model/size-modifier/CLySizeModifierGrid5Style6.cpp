#include "model/size-modifier/CLySizeModifierGrid5Style6.h"

bool CLySizeModifierGrid5Style6::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1} | {2, 3, 4}.
  return _snapDivider(AXIS_X, var, limit, marks, {0, 1}, {2, 3, 4});
}

bool CLySizeModifierGrid5Style6::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
      return _focusImage1Y(var, limit, marks);
    case 2:
      return _focusImage3Y(var, limit, marks);
    case 3:
      return (mHandlerIndex == 0) ? _focusImage3Y(var, limit, marks) : _focusImage5Y(var, limit, marks);
    case 4:
      return _focusImage5Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {0} | {1}.
bool CLySizeModifierGrid5Style6::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1});
}

// Divider {2} | {3}.
bool CLySizeModifierGrid5Style6::_focusImage3Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {2}, {3});
}

// Divider {3} | {4}.
bool CLySizeModifierGrid5Style6::_focusImage5Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {3}, {4});
}
