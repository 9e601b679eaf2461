#include "model/size-modifier/CLySizeModifierGrid2Style2.h"

bool CLySizeModifierGrid2Style2::modifyX(float, float, int32_t, const std::vector<int32_t>&) {
  // No divider runs across this axis.
  return false;
}

bool CLySizeModifierGrid2Style2::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0} | {1}.
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1});
}
