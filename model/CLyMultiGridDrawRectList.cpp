#include "model/CLyMultiGridDrawRectList.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <new>
#include <vector>

#include "common/CLyLog.h"
#include "model/size-modifier/CLySizeModifier.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"

struct _CLyMultiGridDrawRectListImpl {
  int32_t styleIndex = -1;
  int32_t width = 0;
  int32_t height = 0;
  int32_t offsetY = 0;
  int32_t offsetX = 0;
  int32_t maxRoundStep = 10;
  int32_t maxSpacingStep = 10;
  float spacingBase = 0.0f;
  float spacingMax = 0.04f;
  float roundBase = 0.0f;
  float roundMax = 0.2f;
  float spacingStepSize = 0.0039999997f;
  float roundStepSize = 0.02f;
  float roundness = 0.0f;
  float spacing = 0.0f;
  std::vector<CLyFloatRectangle*> items;
};

namespace {

constexpr float kEdgeEpsilon = 0.000001f;

// Truncation toward zero that saturates instead of overflowing.
int toInt(double value) {
  if (!(value == value)) return 0;
  if (value >= static_cast<double>(std::numeric_limits<int>::max())) return std::numeric_limits<int>::max();
  if (value <= static_cast<double>(std::numeric_limits<int>::min())) return std::numeric_limits<int>::min();
  return static_cast<int>(value);
}

float stepValue(float base, float stepSize, int step, int maxStep) {
  if (step < 0) return base;
  return base + static_cast<float>(std::min(step, maxStep)) * stepSize;
}

}  // namespace

CLyMultiGridDrawRectList::CLyMultiGridDrawRectList() : mImpl(new _CLyMultiGridDrawRectListImpl) {}

CLyMultiGridDrawRectList::~CLyMultiGridDrawRectList() {
  // The rectangles belong to the caller unless it cleared with deletion;
  // the list itself frees only its vector.
  delete mImpl;
}

void CLyMultiGridDrawRectList::setSize(int width, int height) {
  mImpl->width = width;
  mImpl->height = height;
}
int CLyMultiGridDrawRectList::getWidth() const {
  return mImpl->width;
}
int CLyMultiGridDrawRectList::getHeight() const {
  return mImpl->height;
}
void CLyMultiGridDrawRectList::setOffsetX(int x) {
  mImpl->offsetX = x;
}
void CLyMultiGridDrawRectList::setOffsetY(int y) {
  mImpl->offsetY = y;
}
int CLyMultiGridDrawRectList::getOffsetX() const {
  return mImpl->offsetX;
}
int CLyMultiGridDrawRectList::getOffsetY() const {
  return mImpl->offsetY;
}
void CLyMultiGridDrawRectList::setStyleIndex(int index) {
  mImpl->styleIndex = index;
}
int CLyMultiGridDrawRectList::getStyleIndex() const {
  return mImpl->styleIndex;
}

void CLyMultiGridDrawRectList::setSpacingStep(int step) {
  mImpl->spacing = stepValue(mImpl->spacingBase, mImpl->spacingStepSize, step, mImpl->maxSpacingStep);
}

int CLyMultiGridDrawRectList::getSpacingStep() const {
  return static_cast<int>((mImpl->spacing - mImpl->spacingBase) / mImpl->spacingStepSize);
}

int CLyMultiGridDrawRectList::getSpacingStep(int pixels) const {
  if (mImpl->width <= 0) {
    LYLOG_E("Invalid width[%d]", mImpl->width);
    return 0;
  }
  const float r = static_cast<float>(pixels) / static_cast<float>(mImpl->width);
  int step = toInt((r - mImpl->spacingBase) / mImpl->spacingStepSize);
  step = std::max(0, std::min(step, mImpl->maxSpacingStep));
  LYLOG_D("spacingWidth: %f, step: %d", r, step);
  return step;
}

float CLyMultiGridDrawRectList::getSpacing() const {
  return mImpl->spacing;
}

void CLyMultiGridDrawRectList::setRoundStep(int step) {
  mImpl->roundness = stepValue(mImpl->roundBase, mImpl->roundStepSize, step, mImpl->maxRoundStep);
}

int CLyMultiGridDrawRectList::getRoundStep() const {
  return static_cast<int>((mImpl->roundness - mImpl->roundBase) / mImpl->roundStepSize);
}

int CLyMultiGridDrawRectList::getRoundness() const {
  return static_cast<int>(static_cast<float>(mImpl->width) * mImpl->roundness);
}

bool CLyMultiGridDrawRectList::addItem(CLyFloatRectangle* rect) {
  if (!rect) {
    LYLOG_E("Invalid Rect");
    return false;
  }
  if (mImpl->items.size() >= static_cast<size_t>(kMaxItems)) {
    LYLOG_E("Too many items(%d)", static_cast<int>(mImpl->items.size()));
    return false;
  }
  mImpl->items.push_back(rect);
  return true;
}

CLyFloatRectangle* CLyMultiGridDrawRectList::getItem(int i) const {
  if (i < 0 || i >= getCount()) return nullptr;
  return mImpl->items[i];
}

int CLyMultiGridDrawRectList::getCount() const {
  return static_cast<int>(mImpl->items.size());
}

void CLyMultiGridDrawRectList::clear(bool deleteItems) {
  if (deleteItems) {
    for (CLyFloatRectangle* rect : mImpl->items) delete rect;
  }
  mImpl->items.clear();
}

void CLyMultiGridDrawRectList::copyItems(CLyMultiGridDrawRectList* other) const {
  if (!other) {
    LYLOG_E("Invalid list");
    return;
  }
  for (const CLyFloatRectangle* rect : mImpl->items) {
    CLyFloatRectangle* copy = new (std::nothrow) CLyFloatRectangle(*rect);
    if (!copy) {
      LYLOG_E("Failed to create rect");
      return;
    }
    if (!other->addItem(copy)) {
      delete copy;
      return;
    }
  }
}

CLyFloatRectangle CLyMultiGridDrawRectList::get(int i) const {
  if (i < 0 || i >= getCount()) {
    LYLOG_D("Invalid index[%d]", i);
    return CLyFloatRectangle(0, 0, 0, 0);
  }
  const CLyFloatRectangle* rect = mImpl->items[i];
  if (!rect) {
    LYLOG_E("Invalid Rect");
    return CLyFloatRectangle(0, 0, 0, 0);
  }
  const int width = mImpl->width, height = mImpl->height;
  const int m = toInt(static_cast<float>(width) * mImpl->spacing);
  const int ox = mImpl->offsetX, oy = mImpl->offsetY;
  auto edge = [](float fraction, int size) { return toInt(std::floor(0.01 + fraction * size)); };
  const int L = rect->x1 == 0.0f ? ox + 2 * m : edge(rect->x1, width) + m + ox;
  const int T = rect->y1 == 0.0f ? oy + 2 * m : edge(rect->y1, height) + m + oy;
  const int R = rect->x2 == 1.0f ? width - 2 * m + ox : edge(rect->x2, width) - m + ox;
  const int B = rect->y2 == 1.0f ? height - 2 * m + oy : edge(rect->y2, height) - m + oy;
  return CLyFloatRectangle(static_cast<float>(L), static_cast<float>(T),
                           std::max(static_cast<float>(R) - static_cast<float>(L), 1.0f),
                           std::max(static_cast<float>(B) - static_cast<float>(T), 1.0f));
}

int CLyMultiGridDrawRectList::getIndex(float x, float y) const {
  if (mImpl->width <= 0 || mImpl->height <= 0) return -1;
  const float u = (x - static_cast<float>(mImpl->offsetX)) / static_cast<float>(mImpl->width);
  const float v = (y - static_cast<float>(mImpl->offsetY)) / static_cast<float>(mImpl->height);
  for (int i = getCount() - 1; i >= 0; --i) {
    if (mImpl->items[i] && mImpl->items[i]->contains(u, v)) return i;
  }
  return -1;
}

void CLyMultiGridDrawRectList::updateItem(int selected, const CLyGridImageInfo* info, int handlerIndex,
                                          const CLyPoint& drag) {
  if (mImpl->width <= 0 || mImpl->height <= 0) {
    LYLOG_E("Invalid size[%d x %d]", mImpl->width, mImpl->height);
    return;
  }
  const int count = getCount();
  const float varX = static_cast<float>(drag.x) / static_cast<float>(mImpl->width);
  const float varY = static_cast<float>(drag.y) / static_cast<float>(mImpl->height);
  LYLOG_D("------->count[%d] varX[%f] varY[%f]", count, varX, varY);

  const CLyGridHandlerInfo* handler = info ? info->getHandlerInfo(handlerIndex) : nullptr;
  if (!handler) {
    LYLOG_E("Failed to get handler");
    return;
  }

  std::vector<CLyFloatRectangle> candidates;
  candidates.reserve(count);
  std::vector<int32_t> narrowMarks(count, 0), shortMarks(count, 0);
  int narrowCount = 0, shortCount = 0;
  for (int i = 0; i < count; ++i) {
    const CLyFloatRectangle& cur = *mImpl->items[i];
    CLyFloatRectangle change(0, 0, 0, 0);
    handler->getImageVariation(i, varX, varY, &change);

    float l = cur.x1, r = cur.x2, t = cur.y1, b = cur.y2;
    if (cur.x1 >= kEdgeEpsilon) l = cur.x1 + change.x1;
    if (cur.x2 <= 1.0f - kEdgeEpsilon) {
      r = l + (cur.x2 - cur.x1) + change.x2;
      if (r > 1.0f) LYLOG_D("------->width[%f]", r);
    }
    LYLOG_D("[%d] %f %f real width: %f", i, l, r, r - l);
    if (r - l < kDetectLimit) {
      LYLOG_D("++++++++++++++++minW");
      narrowMarks[i] = 1;
      ++narrowCount;
    }
    if (cur.y1 >= kEdgeEpsilon) t = cur.y1 + change.y1;
    if (cur.y2 <= 1.0f - kEdgeEpsilon) {
      b = t + (cur.y2 - cur.y1) + change.y2;
      if (b > 1.0f) LYLOG_D("------->height[%f]", b);
    }
    LYLOG_D("[%d] %f %f real height: %f", i, t, b, b - t);
    if (b - t < kDetectLimit) {
      LYLOG_D("-----------------minH");
      shortMarks[i] = 1;
      ++shortCount;
    }
    candidates.emplace_back(l, t, r, b);
  }
  LYLOG_D("minCount: [%d] [%d]", narrowCount, shortCount);

  bool isChangeX = false, isChangeY = false;
  if (narrowCount > 0 || shortCount > 0) {
    CLyPoint dragCopy(drag);
    CLySizeModifier modifier(mImpl->styleIndex, selected, handlerIndex, mImpl->items, candidates, handler,
                             &dragCopy);
    if (narrowCount > 0 && varX != 0.0f) {
      isChangeX = modifier.modifyX(varX, kMinCellSize, narrowCount, narrowMarks);
    }
    if (shortCount > 0 && varY != 0.0f) {
      isChangeY = modifier.modifyY(varY, kMinCellSize, shortCount, shortMarks);
    }
    LYLOG_D("isChangeX: [%d] isChangeY: [%d]", isChangeX, isChangeY);
  }
  // An axis no rule handled must not squeeze a cell below the limit (no
  // rule for the layout, or a state the rule does not recognise): that axis
  // then keeps its current values for this step.
  auto squeezes = [&](const std::vector<int32_t>& marks, bool xAxis) {
    for (int i = 0; i < count; ++i) {
      const CLyFloatRectangle& cur = *mImpl->items[i];
      const float before = xAxis ? cur.x2 - cur.x1 : cur.y2 - cur.y1;
      const float after = xAxis ? candidates[i].x2 - candidates[i].x1 : candidates[i].y2 - candidates[i].y1;
      if (marks[i] && after < before) return true;
    }
    return false;
  };
  if (!isChangeX && narrowCount > 0 && squeezes(narrowMarks, true)) {
    LYLOG_W("No rule for the narrow cells: the horizontal drag is held");
    isChangeX = true;
  }
  if (!isChangeY && shortCount > 0 && squeezes(shortMarks, false)) {
    LYLOG_W("No rule for the short cells: the vertical drag is held");
    isChangeY = true;
  }

  for (int i = 0; i < count; ++i) {
    CLyFloatRectangle* cell = mImpl->items[i];
    const CLyFloatRectangle& cand = candidates[i];
    if (!isChangeX) {
      cell->x1 = cand.x1;
      cell->x2 = cand.x2;
    }
    if (!isChangeY) {
      cell->y1 = cand.y1;
      cell->y2 = cand.y2;
    }
  }
}
