#include "model/size-modifier/CLySizeModifierGrid3Style4.h"

bool CLySizeModifierGrid3Style4::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1} | {2}.
  return _snapDivider(AXIS_X, var, limit, marks, {0, 1}, {2});
}

bool CLySizeModifierGrid3Style4::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0} | {1}.
  return _snapDivider(AXIS_Y, var, limit, marks, {0}, {1});
}
