#pragma once
// Size-modifier rule of the grid layout(s) 4: 0 (image count: layout index).

#include "model/size-modifier/CLySizeModifierInter.h"

class CLySizeModifierGrid4Style1 : public CLySizeModifierInter {
 public:
  using CLySizeModifierInter::CLySizeModifierInter;
  bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
  bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
};
