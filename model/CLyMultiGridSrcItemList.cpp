#include "model/CLyMultiGridSrcItemList.h"

#include <cstdlib>
#include <vector>

#include "common/CLyLog.h"
#include "model/CLyMultiGridSrcItem.h"

struct _CLyMultiGridSrcItemListImpl {
  int32_t moveThreshold = CLyMultiGridSrcItemList::kMoveThreshold;
  int32_t selected = -1;
  int32_t lastX = 0;
  int32_t lastY = 0;
  int32_t dragSource = -1;
  int32_t dragTarget = -1;
  bool moving = false;
  std::vector<CLyMultiGridSrcItem*> items;

  bool valid(int i) const { return i >= 0 && i < static_cast<int>(items.size()); }
};

CLyMultiGridSrcItemList::CLyMultiGridSrcItemList() : _pv(new _CLyMultiGridSrcItemListImpl) {}

CLyMultiGridSrcItemList::~CLyMultiGridSrcItemList() {
  clear(true);
  delete _pv;
}

void CLyMultiGridSrcItemList::add(CLyMultiGridSrcItem* item) {
  if (!item) {
    LYLOG_E("Invalid item");
    return;
  }
  _pv->items.push_back(item);
}

CLyMultiGridSrcItem* CLyMultiGridSrcItemList::get(int index) const {
  return _pv->valid(index) ? _pv->items[index] : nullptr;
}

int CLyMultiGridSrcItemList::count() const {
  return static_cast<int>(_pv->items.size());
}

bool CLyMultiGridSrcItemList::remove(int index, bool deleteItem) {
  if (!_pv->valid(index)) return false;
  if (deleteItem) delete _pv->items[index];
  _pv->items.erase(_pv->items.begin() + index);
  // The pan in progress belonged to an item that has moved or gone.
  if (_pv->selected >= index) resetMove();
  return true;
}

void CLyMultiGridSrcItemList::clear(bool deleteItems) {
  if (deleteItems)
    for (CLyMultiGridSrcItem* item : _pv->items) delete item;
  _pv->items.clear();
  resetMove();
}

bool CLyMultiGridSrcItemList::swap(int i, int j) {
  if (!_pv->valid(i) || !_pv->valid(j) || i == j) return false;
  std::swap(_pv->items[i], _pv->items[j]);
  _pv->items[i]->refresh();
  _pv->items[j]->refresh();
  return true;
}

void CLyMultiGridSrcItemList::select(int index) {
  if (!_pv->valid(index)) return;
  _pv->selected = index;
  _pv->moving = true;
}

int CLyMultiGridSrcItemList::getSelected() const {
  return _pv->selected;
}
bool CLyMultiGridSrcItemList::isMoving() const {
  return _pv->moving;
}

bool CLyMultiGridSrcItemList::move(int index, int x, int y) {
  if (!_pv->moving || index != _pv->selected || !_pv->valid(index)) {
    _pv->selected = -1;
    return false;
  }
  const int dx = x - _pv->lastX, dy = y - _pv->lastY;
  if (std::abs(dx) <= _pv->moveThreshold && std::abs(dy) <= _pv->moveThreshold) return false;
  _pv->lastX = x;
  _pv->lastY = y;
  return _pv->items[index]->pan(dx, dy);
}

void CLyMultiGridSrcItemList::setLastPoint(int x, int y) {
  _pv->lastX = x;
  _pv->lastY = y;
}

void CLyMultiGridSrcItemList::getLastPoint(int& x, int& y) const {
  x = _pv->lastX;
  y = _pv->lastY;
}

void CLyMultiGridSrcItemList::resetMove() {
  _pv->selected = -1;
  _pv->lastX = 0;
  _pv->lastY = 0;
  _pv->moving = false;
}

bool CLyMultiGridSrcItemList::pinchZoom(int index, float distance) {
  CLyMultiGridSrcItem* item = get(index);
  return item ? item->pinchZoom(distance) : false;
}

bool CLyMultiGridSrcItemList::setBitmapOfSelected(Bitmap* bitmap) {
  CLyMultiGridSrcItem* item = get(_pv->selected);
  if (!item) {
    LYLOG_E("No selected item");
    return false;
  }
  item->setBitmap(bitmap, true);
  return true;
}

int CLyMultiGridSrcItemList::indexOfLargest() const {
  int best = -1;
  int64_t most = -1;
  for (int i = 0; i < count(); ++i) {
    const int64_t pixels = _pv->items[i]->getPixelCount();
    if (pixels > most) {
      most = pixels;
      best = i;
    }
  }
  return best;
}

int CLyMultiGridSrcItemList::getDragSource() const {
  return _pv->dragSource;
}
void CLyMultiGridSrcItemList::setDragSource(int index) {
  _pv->dragSource = index;
}
int CLyMultiGridSrcItemList::getDragTarget() const {
  return _pv->dragTarget;
}
void CLyMultiGridSrcItemList::setDragTarget(int index) {
  _pv->dragTarget = index;
}
void CLyMultiGridSrcItemList::resetDrag() {
  _pv->dragSource = -1;
  _pv->dragTarget = -1;
}
