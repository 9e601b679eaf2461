#pragma once
// Size-modifier rule of the grid layout(s) 3: 2, 4: 2, 5: 3 (image count: layout index).

#include "model/size-modifier/CLySizeModifierInter.h"

class CLySizeModifierGrid5Style4 : public CLySizeModifierInter {
 public:
  using CLySizeModifierInter::CLySizeModifierInter;
  bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
  bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
};
