#include "model/size-modifier/CLySizeModifierGrid2Style1.h"

bool CLySizeModifierGrid2Style1::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0} | {1}.
  return _snapDivider(AXIS_X, var, limit, marks, {0}, {1});
}

bool CLySizeModifierGrid2Style1::modifyY(float, float, int32_t, const std::vector<int32_t>&) {
  // No divider runs across this axis.
  return false;
}
