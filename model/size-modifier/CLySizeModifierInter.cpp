#include "model/size-modifier/CLySizeModifierInter.h"

#include <algorithm>

#include "common/CLyLog.h"
#include "model/style/CLyGridHandlerInfo.h"

CLySizeModifierInter::CLySizeModifierInter(int32_t focusIndex, int32_t handlerIndex,
                                           const std::vector<CLyFloatRectangle*>& cells,
                                           const std::vector<CLyFloatRectangle>& candidates,
                                           const CLyGridHandlerInfo* handler, const CLyPoint* drag)
    : mFocusIndex(focusIndex),
      mHandlerIndex(handlerIndex),
      mCells(cells),
      mCandidates(new std::vector<CLyFloatRectangle>(candidates)),
      mHandler(handler),
      mDrag(drag) {}

CLySizeModifierInter::~CLySizeModifierInter() {
  // Only the candidate copies belong to the rule; the cells are the list's.
  delete mCandidates;
}

bool CLySizeModifierInter::modifyX(float, float, int32_t, const std::vector<int32_t>&) {
  return false;
}

bool CLySizeModifierInter::modifyY(float, float, int32_t, const std::vector<int32_t>&) {
  return false;
}

float CLySizeModifierInter::lo(Axis axis, int i) const {
  return axis == AXIS_X ? mCells[i]->x1 : mCells[i]->y1;
}

float CLySizeModifierInter::hi(Axis axis, int i) const {
  return axis == AXIS_X ? mCells[i]->x2 : mCells[i]->y2;
}

void CLySizeModifierInter::setLo(Axis axis, int i, float value) {
  (axis == AXIS_X ? mCells[i]->x1 : mCells[i]->y1) = value;
}

void CLySizeModifierInter::setHi(Axis axis, int i, float value) {
  (axis == AXIS_X ? mCells[i]->x2 : mCells[i]->y2) = value;
}

bool CLySizeModifierInter::marked(const std::vector<int32_t>& marks, int i) const {
  return i >= 0 && static_cast<size_t>(i) < marks.size() && marks[i] == 1;
}

void CLySizeModifierInter::variation(Axis axis, int i, float var, float* shift, float* change) const {
  CLyFloatRectangle v(0, 0, 0, 0);
  if (mHandler) {
    if (axis == AXIS_X) {
      mHandler->getImageVariation(i, var, 0.0f, &v);
    } else {
      mHandler->getImageVariation(i, 0.0f, var, &v);
    }
  }
  *shift = axis == AXIS_X ? v.x1 : v.y1;
  *change = axis == AXIS_X ? v.x2 : v.y2;
}

float CLySizeModifierInter::dragPixels(Axis axis) const {
  if (!mDrag) return 0.0f;
  return static_cast<float>(axis == AXIS_X ? mDrag->x : mDrag->y);
}

bool CLySizeModifierInter::_snapDivider(Axis axis, float var, float limit, const std::vector<int32_t>& marks,
                                        std::initializer_list<int> low, std::initializer_list<int> high) {
  for (int i : low) {
    if (i < 0 || i >= cellCount()) return false;
  }
  for (int i : high) {
    if (i < 0 || i >= cellCount()) return false;
  }
  const std::initializer_list<int>& squeezed = var < 0.0f ? low : high;
  if (std::none_of(squeezed.begin(), squeezed.end(), [&](int i) { return marked(marks, i); })) return false;

  const float pos = hi(axis, *low.begin());
  float target;
  if (var < 0.0f) {
    target = 0.0f;
    for (int i : low) target = std::max(target, lo(axis, i) + limit);
    if (pos <= target + kEpsilon) return true;  // already as far as it may go
  } else {
    target = 1.0f;
    for (int i : high) target = std::min(target, hi(axis, i) - limit);
    if (pos >= target - kEpsilon) return true;
  }
  for (int i : low) setHi(axis, i, target);
  for (int i : high) setLo(axis, i, target);
  return true;
}

bool CLySizeModifierInter::_clampAlongHandler(Axis axis, float var, float limit) {
  const int n = cellCount();
  std::vector<float> shift(n), change(n);
  float t = 1.0f;
  for (int i = 0; i < n; ++i) {
    variation(axis, i, var, &shift[i], &change[i]);
    const float l = lo(axis, i), h = hi(axis, i), w = h - l;
    const float nl = l >= kEpsilon ? l + shift[i] : l;
    const float nh = h <= 1.0f - kEpsilon ? nl + w + change[i] : h;
    const float delta = (nh - nl) - w;
    if (delta < 0.0f) t = std::min(t, std::max(0.0f, (w - limit) / -delta));
  }
  if (t <= 0.0f) return true;
  for (int i = 0; i < n; ++i) {
    const float l = lo(axis, i), h = hi(axis, i), w = h - l;
    const float nl = l >= kEpsilon ? l + t * shift[i] : l;
    const float nh = h <= 1.0f - kEpsilon ? nl + w + t * change[i] : h;
    setLo(axis, i, nl);
    setHi(axis, i, nh);
  }
  return true;
}

bool CLySizeModifierInter::_rowRule(Axis axis, int first, int last, float var, float limit,
                                    const std::vector<int32_t>& marks) {
  if (first < 0 || last >= cellCount() || first >= last) return false;
  const int n = last - first + 1;
  const int f = mFocusIndex - first;
  if (f < 0 || f >= n) return false;
  if (mHandlerIndex == 0 && f != 0) {
    return var <= 0.0f ? _packLeading(axis, first, f, var, limit, marks)
                       : _growFocusLeading(axis, first, f, var, limit, marks);
  }
  // The last cell has no trailing divider: whatever moved, keep it sound.
  if (f == n - 1) return _clampAlongHandler(axis, var, limit);
  return var < 0.0f ? _shrinkFocusTrailing(axis, first, last, f, var, limit, marks)
                    : _packTrailing(axis, first, last, f, var, limit, marks);
}

// Leading divider of the focus dragged toward the start: the cells before the
// focus shrink. Marked cells stop at the limit; the right edges of the others
// take over their share (f / k times their normal change), never closer than
// the limit to their own left edge.
bool CLySizeModifierInter::_packLeading(Axis axis, int first, int f, float var, float limit,
                                        const std::vector<int32_t>& marks) {
  int count = 0;
  for (int i = 0; i < f; ++i) count += marked(marks, first + i) ? 1 : 0;
  if (count == 0) return _clampAlongHandler(axis, var, limit);

  const float start = lo(axis, first);
  const int fa = first + f;
  if (count == f) {
    if (lo(axis, fa) - start <= static_cast<float>(f) * limit + kEpsilon) return true;
    float pos = start;
    for (int i = 0; i < f; ++i) {
      if (i > 0) setLo(axis, first + i, pos);
      pos += limit;
      setHi(axis, first + i, pos);
    }
    setLo(axis, fa, pos);
    return true;
  }
  const float k = static_cast<float>(f - count);
  for (int i = 0; i < f; ++i) {
    const int a = first + i;
    if (i > 0) setLo(axis, a, hi(axis, a - 1));
    const float floor = lo(axis, a) + limit;
    float edge = floor;
    if (!marked(marks, a)) {
      float shift = 0.0f, change = 0.0f;
      variation(axis, a, var, &shift, &change);
      edge = std::min(hi(axis, a), hi(axis, a) + static_cast<float>(f) * change / k);
      if (edge < floor + kEpsilon) edge = floor;
    }
    setHi(axis, a, edge);
  }
  setLo(axis, fa, hi(axis, fa - 1));
  return true;
}

// Leading divider dragged away from the start: the focus shrinks, to the limit
// at most, and the cells before it follow.
bool CLySizeModifierInter::_growFocusLeading(Axis axis, int first, int f, float var, float limit,
                                             const std::vector<int32_t>& marks) {
  const int fa = first + f;
  float var2 = var;
  if (marked(marks, fa)) {
    const float w = hi(axis, fa) - lo(axis, fa);
    if (w <= limit + kEpsilon) return true;
    const float px = dragPixels(axis);
    var2 = px != 0.0f ? var * (w - limit) / px : 0.0f;
    setLo(axis, fa, hi(axis, fa) - limit);
  } else {
    // Nothing this divider squeezes is marked: keep the move sound.
    return _clampAlongHandler(axis, var, limit);
  }
  for (int i = 0; i < f; ++i) {
    float shift = 0.0f, change = 0.0f;
    variation(axis, first + i, var2, &shift, &change);
    setHi(axis, first + i, hi(axis, first + i) + std::max(0.0f, change));
    if (i > 0) setLo(axis, first + i, hi(axis, first + i - 1));
    if (i == f - 1) setHi(axis, first + i, lo(axis, fa));
  }
  return true;
}

// Trailing divider dragged toward the start: the focus shrinks to the limit
// at most and the cells after it follow.
bool CLySizeModifierInter::_shrinkFocusTrailing(Axis axis, int first, int last, int f, float var, float limit,
                                                const std::vector<int32_t>& marks) {
  const int fa = first + f;
  if (!marked(marks, fa)) return _clampAlongHandler(axis, var, limit);
  const float w = hi(axis, fa) - lo(axis, fa);
  if (w <= limit + kEpsilon) return true;
  const float px = dragPixels(axis);
  const float var2 = px != 0.0f ? var * (w - limit) / px : 0.0f;
  setHi(axis, fa, lo(axis, fa) + limit);
  for (int i = fa + 1; i <= last; ++i) {
    const float prevHi = hi(axis, i - 1);
    if (hi(axis, i) <= 1.0f - kEpsilon) {
      float shift = 0.0f, change = 0.0f;
      variation(axis, i, var2, &shift, &change);
      // A trailing edge may only follow the freed space, never overtake the
      // next cell's own minimum.
      float next = hi(axis, i) + change;
      next = std::max(next, prevHi + limit);
      next = std::min(next, hi(axis, i));
      setHi(axis, i, next);
    }
    setLo(axis, i, prevHi);
  }
  return true;
}

// Trailing divider dragged toward the end: the cells after the focus shrink;
// marked ones stop at the limit, packed from the end when all are.
bool CLySizeModifierInter::_packTrailing(Axis axis, int first, int last, int f, float var, float limit,
                                         const std::vector<int32_t>& marks) {
  const int fa = first + f;
  const int m = last - fa;
  int count = 0;
  for (int j = fa + 1; j <= last; ++j) count += marked(marks, j) ? 1 : 0;
  if (count == 0) return _clampAlongHandler(axis, var, limit);

  const float end = hi(axis, last);
  std::vector<float> widths(m + 1, limit);  // indexed by j - fa
  if (count == m) {
    if (end - hi(axis, fa) <= static_cast<float>(m) * limit + kEpsilon) return true;
  } else {
    const float k = static_cast<float>(m - count);
    for (int j = fa + 1; j <= last; ++j) {
      if (marked(marks, j)) continue;
      float shift = 0.0f, change = 0.0f;
      variation(axis, j, var, &shift, &change);
      const float w = hi(axis, j) - lo(axis, j);
      const float next = std::min(w, w + static_cast<float>(m) * change / k);
      widths[j - fa] = next <= limit + kEpsilon ? limit : next;
    }
  }
  float pos = end;
  for (int j = last; j > fa; --j) {
    if (j < last) setHi(axis, j, pos);
    pos -= widths[j - fa];
    setLo(axis, j, pos);
  }
  setHi(axis, fa, pos);
  return true;
}
