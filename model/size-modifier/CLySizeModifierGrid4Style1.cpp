#include "model/size-modifier/CLySizeModifierGrid4Style1.h"

bool CLySizeModifierGrid4Style1::modifyX(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 2} | {1, 3}.
  return _snapDivider(AXIS_X, var, limit, marks, {0, 2}, {1, 3});
}

bool CLySizeModifierGrid4Style1::modifyY(float var, float limit, int32_t /*count*/,
                                         const std::vector<int32_t>& marks) {
  // One divider: {0, 1} | {2, 3}.
  return _snapDivider(AXIS_Y, var, limit, marks, {0, 1}, {2, 3});
}
