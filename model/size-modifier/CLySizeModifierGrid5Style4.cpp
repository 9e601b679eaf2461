#include "model/size-modifier/CLySizeModifierGrid5Style4.h"

bool CLySizeModifierGrid5Style4::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // Every cell side by side along the axis.
  return _rowRule(AXIS_X, 0, cellCount() - 1, var, limit, marks);
}

bool CLySizeModifierGrid5Style4::modifyY(float, float, int32_t, const std::vector<int32_t>&) {
  // No divider runs across this axis.
  return false;
}
