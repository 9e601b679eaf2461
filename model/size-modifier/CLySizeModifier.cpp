#include "model/size-modifier/CLySizeModifier.h"

#include <new>

#include "common/CLyLog.h"
#include "model/size-modifier/CLySizeModifierGrid2Style1.h"
#include "model/size-modifier/CLySizeModifierGrid2Style2.h"
#include "model/size-modifier/CLySizeModifierGrid3Style1.h"
#include "model/size-modifier/CLySizeModifierGrid3Style2.h"
#include "model/size-modifier/CLySizeModifierGrid3Style4.h"
#include "model/size-modifier/CLySizeModifierGrid3Style5.h"
#include "model/size-modifier/CLySizeModifierGrid4Style1.h"
#include "model/size-modifier/CLySizeModifierGrid4Style2.h"
#include "model/size-modifier/CLySizeModifierGrid4Style4.h"
#include "model/size-modifier/CLySizeModifierGrid4Style5.h"
#include "model/size-modifier/CLySizeModifierGrid4Style6.h"
#include "model/size-modifier/CLySizeModifierGrid4Style7.h"
#include "model/size-modifier/CLySizeModifierGrid4Style9.h"
#include "model/size-modifier/CLySizeModifierGrid5Style1.h"
#include "model/size-modifier/CLySizeModifierGrid5Style2.h"
#include "model/size-modifier/CLySizeModifierGrid5Style3.h"
#include "model/size-modifier/CLySizeModifierGrid5Style4.h"
#include "model/size-modifier/CLySizeModifierGrid5Style5.h"
#include "model/size-modifier/CLySizeModifierGrid5Style6.h"
#include "model/size-modifier/CLySizeModifierGrid5Style7.h"
#include "model/size-modifier/CLySizeModifierGrid5Style8.h"
#include "model/size-modifier/CLySizeModifierGrid6Style1.h"
#include "model/size-modifier/CLySizeModifierGrid6Style2.h"
#include "model/size-modifier/CLySizeModifierGrid6Style3.h"
#include "model/size-modifier/CLySizeModifierGrid6Style4.h"
#include "model/size-modifier/CLySizeModifierGrid6Style5.h"
#include "model/size-modifier/CLySizeModifierGrid6Style6.h"
#include "model/size-modifier/CLySizeModifierGrid6Style7.h"

namespace {

template <typename Rule>
CLySizeModifierInter* make(int32_t f, int32_t h, const std::vector<CLyFloatRectangle*>& cells,
                           const std::vector<CLyFloatRectangle>& candidates,
                           const CLyGridHandlerInfo* handler, const CLyPoint* drag) {
  return new (std::nothrow) Rule(f, h, cells, candidates, handler, drag);
}

using Maker = CLySizeModifierInter* (*)(int32_t, int32_t, const std::vector<CLyFloatRectangle*>&,
                                        const std::vector<CLyFloatRectangle>&, const CLyGridHandlerInfo*,
                                        const CLyPoint*);

// Rule per (cell count, layout index); the row and column rules serve
// layouts of several counts.
const Maker kRules2[] = {make<CLySizeModifierGrid2Style1>, make<CLySizeModifierGrid2Style2>};
const Maker kRules3[] = {make<CLySizeModifierGrid3Style1>, make<CLySizeModifierGrid3Style2>,
                         make<CLySizeModifierGrid5Style4>, make<CLySizeModifierGrid3Style4>,
                         make<CLySizeModifierGrid3Style5>, make<CLySizeModifierGrid5Style8>};
const Maker kRules4[] = {
    make<CLySizeModifierGrid4Style1>, make<CLySizeModifierGrid4Style2>, make<CLySizeModifierGrid5Style4>,
    make<CLySizeModifierGrid4Style4>, make<CLySizeModifierGrid4Style5>, make<CLySizeModifierGrid4Style6>,
    make<CLySizeModifierGrid4Style7>, make<CLySizeModifierGrid5Style8>, make<CLySizeModifierGrid4Style9>};
const Maker kRules5[] = {make<CLySizeModifierGrid5Style1>, make<CLySizeModifierGrid5Style2>,
                         make<CLySizeModifierGrid5Style3>, make<CLySizeModifierGrid5Style4>,
                         make<CLySizeModifierGrid5Style5>, make<CLySizeModifierGrid5Style6>,
                         make<CLySizeModifierGrid5Style7>, make<CLySizeModifierGrid5Style8>};
const Maker kRules6[] = {make<CLySizeModifierGrid6Style1>, make<CLySizeModifierGrid6Style2>,
                         make<CLySizeModifierGrid6Style3>, make<CLySizeModifierGrid6Style4>,
                         make<CLySizeModifierGrid6Style5>, make<CLySizeModifierGrid6Style6>,
                         make<CLySizeModifierGrid6Style7>};

struct RuleRow {
  const Maker* makers;
  int count;
};

template <size_t N>
constexpr RuleRow row(const Maker (&makers)[N]) {
  return {makers, static_cast<int>(N)};
}

}  // namespace

CLySizeModifier::CLySizeModifier(int32_t styleIndex, int32_t focusIndex, int32_t handlerIndex,
                                 const std::vector<CLyFloatRectangle*>& cells,
                                 const std::vector<CLyFloatRectangle>& candidates,
                                 const CLyGridHandlerInfo* handler, const CLyPoint* drag) {
  static const RuleRow kRows[] = {row(kRules2), row(kRules3), row(kRules4), row(kRules5), row(kRules6)};
  const int n = static_cast<int>(candidates.size());
  if (n < 2 || n > 6 || cells.size() != candidates.size()) return;
  const RuleRow& rules = kRows[n - 2];
  if (styleIndex < 0 || styleIndex >= rules.count) return;
  mImpl.reset(rules.makers[styleIndex](focusIndex, handlerIndex, cells, candidates, handler, drag));
  if (!mImpl) LYLOG_E("Failed to create size modifier(%d / %d)", n, styleIndex);
}

CLySizeModifier::~CLySizeModifier() = default;

bool CLySizeModifier::modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) {
  return mImpl ? mImpl->modifyX(var, limit, count, marks) : false;
}

bool CLySizeModifier::modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) {
  return mImpl ? mImpl->modifyY(var, limit, count, marks) : false;
}
