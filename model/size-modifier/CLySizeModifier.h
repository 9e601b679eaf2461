#pragma once
// The size modifier of one drag step: picks the rule of the current layout
// (by cell count and layout index) and forwards to it. Without a rule both
// operations answer false.

#include <memory>

#include "model/size-modifier/CLySizeModifierInter.h"

class CLySizeModifier : public CLySizeModifierBase {
 public:
  CLySizeModifier(int32_t styleIndex, int32_t focusIndex, int32_t handlerIndex,
                  const std::vector<CLyFloatRectangle*>& cells,
                  const std::vector<CLyFloatRectangle>& candidates, const CLyGridHandlerInfo* handler,
                  const CLyPoint* drag);
  ~CLySizeModifier() override;

  bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
  bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;

  // The rule in use, null when the layout has none.
  const CLySizeModifierInter* getRule() const { return mImpl.get(); }

 private:
  std::unique_ptr<CLySizeModifierInter> mImpl;
};
