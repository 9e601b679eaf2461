#include "model/size-modifier/CLySizeModifierGrid6Style4.h"

bool CLySizeModifierGrid6Style4::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // The row of cells 1..4; the full-width cells above and below have no
  // divider on this axis, so their focus is treated as the row's first cell.
  if (mFocusIndex < 1 || mFocusIndex > 4) mFocusIndex = 1;
  return _rowRule(AXIS_X, 1, 4, var, limit, marks);
}

bool CLySizeModifierGrid6Style4::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  switch (mFocusIndex) {
    case 0:
      return _focusImage1Y(var, limit, marks);
    case 1:
    case 4:
      return (mHandlerIndex == 0) ? _focusImage1Y(var, limit, marks) : _focusImage6Y(var, limit, marks);
    case 2:
    case 3:
      return (mHandlerIndex <= 1) ? _focusImage1Y(var, limit, marks) : _focusImage6Y(var, limit, marks);
    case 5:
      return _focusImage6Y(var, limit, marks);
    default:
      return false;
  }
}

// Divider {0} | {1, 2, 3, 4}.
bool CLySizeModifierGrid6Style4::_focusImage1Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1, 2, 3, 4});
}

// Divider {1, 2, 3, 4} | {5}.
bool CLySizeModifierGrid6Style4::_focusImage6Y(float var, float limit, const std::vector<int32_t>& marks) {
  return _snapDivider(AXIS_Y, var, limit, marks, {1, 2, 3, 4}, {5});
}
