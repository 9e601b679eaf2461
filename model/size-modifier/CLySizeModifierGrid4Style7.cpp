#include "model/size-modifier/CLySizeModifierGrid4Style7.h"

bool CLySizeModifierGrid4Style7::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1, 2} | {3}.
  return _snapDivider(AXIS_X, var, limit, marks, {0, 1, 2}, {3});
}

bool CLySizeModifierGrid4Style7::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 3:
      return _focusImage1Y(var, limit, marks);
    case 1:
      return (mHandlerIndex == 0) ? _focusImage1Y(var, limit, marks) : _focusImage3Y(var, limit, marks);
    case 2:
      return _focusImage3Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {0} | {1}.
bool CLySizeModifierGrid4Style7::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1});
}

// Divider {1} | {2}.
bool CLySizeModifierGrid4Style7::_focusImage3Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {1}, {2});
}
