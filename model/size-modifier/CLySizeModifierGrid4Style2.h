#pragma once
// Size-modifier rule of the grid layout(s) 4: 1 (image count: layout index).

#include "model/size-modifier/CLySizeModifierInter.h"

class CLySizeModifierGrid4Style2 : public CLySizeModifierInter {
 public:
  using CLySizeModifierInter::CLySizeModifierInter;
  bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
  bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;

 private:
  bool _focusImage1X(float var, float limit, const std::vector<int32_t>& marks);
  bool _focusImage3X(float var, float limit, const std::vector<int32_t>& marks);
  bool _focusImage1Y(float var, float limit, const std::vector<int32_t>& marks);
};
