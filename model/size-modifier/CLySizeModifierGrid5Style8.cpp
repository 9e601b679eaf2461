#include "model/size-modifier/CLySizeModifierGrid5Style8.h"

bool CLySizeModifierGrid5Style8::modifyX(float, float, int32_t, const std::vector<int32_t>&) {
  // No divider runs across this axis.
  return false;
}

bool CLySizeModifierGrid5Style8::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // Every cell side by side along the axis.
  return _rowRule(AXIS_Y, 0, cellCount() - 1, var, limit, marks);
}
