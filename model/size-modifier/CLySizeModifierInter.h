#pragma once
// Base of the per-layout rules. Holds the live cells of the draw rectangle
// list (rules write through these pointers), copies of the candidate cells,
// the dragged handler and the drag, plus the shared mechanics the rules are
// built from.

#include <initializer_list>
#include <vector>

#include "common/CLyFloatRectangle.h"
#include "common/CLyPoint.h"
#include "model/size-modifier/CLySizeModifierBase.h"

class CLyGridHandlerInfo;

class CLySizeModifierInter : public CLySizeModifierBase {
 public:
  CLySizeModifierInter(int32_t focusIndex, int32_t handlerIndex, const std::vector<CLyFloatRectangle*>& cells,
                       const std::vector<CLyFloatRectangle>& candidates, const CLyGridHandlerInfo* handler,
                       const CLyPoint* drag);
  ~CLySizeModifierInter() override;

  bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
  bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;

 protected:
  enum Axis { AXIS_X, AXIS_Y };
  static constexpr float kEpsilon = 0.000001f;

  int cellCount() const { return static_cast<int>(mCells.size()); }
  float lo(Axis axis, int i) const;
  float hi(Axis axis, int i) const;
  void setLo(Axis axis, int i, float value);
  void setHi(Axis axis, int i, float value);
  bool marked(const std::vector<int32_t>& marks, int i) const;
  // The handler's normal movement of cell i: edge shift and size change.
  void variation(Axis axis, int i, float var, float* shift, float* change) const;
  float dragPixels(Axis axis) const;

  // One divider between the cells `low` (left of / above it) and `high`:
  // when a marked cell on the squeezed side shares it, the divider is
  // placed where the tightest squeezed cell is exactly `limit`, and every
  // cell on it is re-attached. False when no squeezed cell is marked.
  bool _snapDivider(Axis axis, float var, float limit, const std::vector<int32_t>& marks,
                    std::initializer_list<int> low, std::initializer_list<int> high);

  // The row rule: cells first..last side by side along the axis, focus f
  // (relative to first); h 0 of a cell past the first is its leading
  // divider, any other handler its trailing one.
  bool _rowRule(Axis axis, int first, int last, float var, float limit, const std::vector<int32_t>& marks);

  // Sound fallback for any state a rule does not recognise: moves every cell
  // by the largest part of the drag that keeps all cells at least `limit`.
  bool _clampAlongHandler(Axis axis, float var, float limit);

  int32_t mFocusIndex;
  int32_t mHandlerIndex;
  std::vector<CLyFloatRectangle*> mCells;
  std::vector<CLyFloatRectangle>* mCandidates;
  const CLyGridHandlerInfo* mHandler;
  const CLyPoint* mDrag;

 private:
  bool _packLeading(Axis axis, int first, int f, float var, float limit, const std::vector<int32_t>& marks);
  bool _growFocusLeading(Axis axis, int first, int f, float var, float limit,
                         const std::vector<int32_t>& marks);
  bool _shrinkFocusTrailing(Axis axis, int first, int last, int f, float var, float limit,
                            const std::vector<int32_t>& marks);
  bool _packTrailing(Axis axis, int first, int last, int f, float var, float limit,
                     const std::vector<int32_t>& marks);
};
