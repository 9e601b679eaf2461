#include "model/size-modifier/CLySizeModifierGrid5Style5.h"

bool CLySizeModifierGrid5Style5::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
      return _focusImage1X(var, limit, marks);
    case 1:
      return (mHandlerIndex == 0) ? _focusImage1X(var, limit, marks) : _focusImage3X(var, limit, marks);
    case 2:
      return _focusImage3X(var, limit, marks);
    case 3:
    case 4:
      return _focusImage4X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid5Style5::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1, 2} | {3, 4}.
  return _snapDivider(AXIS_Y, var, limit, marks, {0, 1, 2}, {3, 4});
}

// Divider {0} | {1}.
bool CLySizeModifierGrid5Style5::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {0}, {1});
}

// Divider {1} | {2}.
bool CLySizeModifierGrid5Style5::_focusImage3X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {1}, {2});
}

// Divider {3} | {4}.
bool CLySizeModifierGrid5Style5::_focusImage4X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {3}, {4});
}
