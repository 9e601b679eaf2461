#include "model/size-modifier/CLySizeModifierGrid4Style5.h"

bool CLySizeModifierGrid4Style5::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 3:
      return _focusImage1X(var, limit, marks);
    case 1:
      return (mHandlerIndex == 0) ? _focusImage1X(var, limit, marks) : _focusImage2X(var, limit, marks);
    case 2:
      return _focusImage2X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid4Style5::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1, 2} | {3}.
  return _snapDivider(AXIS_Y, var, limit, marks, {0, 1, 2}, {3});
}

// Divider {0} | {1}.
bool CLySizeModifierGrid4Style5::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {0}, {1});
}

// Divider {1} | {2}.
bool CLySizeModifierGrid4Style5::_focusImage2X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {1}, {2});
}
