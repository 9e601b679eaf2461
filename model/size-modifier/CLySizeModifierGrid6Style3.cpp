#include "model/size-modifier/CLySizeModifierGrid6Style3.h"

bool CLySizeModifierGrid6Style3::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
    case 1:
    case 2:
      return _focusImage1X(var, limit, marks);
    case 3:
      return _focusImage3X(var, limit, marks);
    case 4:
      return (mHandlerIndex == 0) ? _focusImage3X(var, limit, marks) : _focusImage4X(var, limit, marks);
    case 5:
      return _focusImage4X(var, limit, marks);
    default:
      return false;
  }
}

bool CLySizeModifierGrid6Style3::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
      return _focusImage1Y(var, limit, marks);
    case 1:
    case 2:
      return (mHandlerIndex == 0) ? _focusImage1Y(var, limit, marks) : _focusImage2Y(var, limit, marks);
    case 3:
    case 4:
    case 5:
      return _focusImage2Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {1} | {2}.
bool CLySizeModifierGrid6Style3::_focusImage1X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {1}, {2});
}

// Divider {3} | {4}.
bool CLySizeModifierGrid6Style3::_focusImage3X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {3}, {4});
}

// Divider {4} | {5}.
bool CLySizeModifierGrid6Style3::_focusImage4X(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_X, var, limit, marks, {4}, {5});
}

// Divider {0} | {1, 2}.
bool CLySizeModifierGrid6Style3::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1, 2});
}

// Divider {1, 2} | {3, 4, 5}.
bool CLySizeModifierGrid6Style3::_focusImage2Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {1, 2}, {3, 4, 5});
}
