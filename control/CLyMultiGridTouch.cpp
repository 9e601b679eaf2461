// Touch interaction of the collage control: selection, pan, pinch, the
// long-press drag that swaps two photos, the handler drag of the focus box
// and the press effect of placeholder cells. Everything runs on the main
// loop; the gesture control feeds __processGestureEvent.

#include <Elementary.h>

#include <cmath>
#include <cstdlib>
#include <new>
#include <vector>

#include "animation/CLyPressAnimation.h"
#include "app-assist/WTimer.h"
#include "codec/Bitmap.h"
#include "common/CLyCairoCanvas.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "control/CLyFocusBox.h"
#include "control/CLyGesture.h"
#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridImpl.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "model/style/CLyMultiGridStyleManager.h"

using app_assist::WTimer;

namespace {

const char* const kHoverPart = "elm.swallow.hover";
const double kTransitSeconds = 1.0;
const double kZoomInFrom = 0.4;
const float kPinchTolerance = 0.01f;
const int kPanTolerance = 10;  // design pixels

int scaled(double size) {
  double base = elm_app_base_scale_get();
  if (base <= 0.0) base = 1.0;
  return (int)(size * elm_config_scale_get() / base);
}

}  // namespace

// Touch state that only this file uses, kept behind _CLyMultiGridImpl::touchExtra.
struct _CLyMultiGridTouchState {
  Evas_Object* hoverSwallow = nullptr;   // image object in "elm.swallow.hover"
  Evas_Object* responseImage = nullptr;  // zoom-in of the cell that received a swapped photo
  int responseIndex = -1;
  Elm_Transit* zoomInTransit = nullptr;
  Elm_Transit* moveBackTransit = nullptr;
  int doubleTapIndex = -1;
  // The gesture layer reports a tap only once the double-tap time has passed,
  // after the release reset the press: the release keeps what the tap needs.
  bool tapPending = false;
  int tapPressedIndex = -1;
  int tapTouchedIndex = -1;
  // Cells are drawn with the draft filter during a handler drag; the
  // canvas's own filter comes back on release.
  bool drafting = false;
  cairo_filter_t savedFilter = CAIRO_FILTER_BILINEAR;
  // The cell whose photo is lifted, from the long press to the drop.
  int liftedIndex = -1;
};

namespace {

_CLyMultiGridTouchState* touchState(_CLyMultiGridImpl* impl) {
  return impl ? static_cast<_CLyMultiGridTouchState*>(impl->touchExtra) : nullptr;
}

void deleteObject(Evas_Object*& obj) {
  if (obj) evas_object_del(obj);
  obj = nullptr;
}

}  // namespace

// ---------------------------------------------------------------- callbacks

void CLyMultiGrid::setMouseDownCallback(MouseDownCallback cb) {
  if (_pImpl) _pImpl->mouseDownCb = std::move(cb);
}
void CLyMultiGrid::setSelectionCallback(SelectionCallback cb) {
  if (_pImpl) _pImpl->selectionCb = std::move(cb);
}
void CLyMultiGrid::setChangeCallback(ChangeCallback cb) {
  if (_pImpl) _pImpl->changeCb = std::move(cb);
}
void CLyMultiGrid::setAddPictureCallback(AddPictureCallback cb) {
  if (_pImpl) _pImpl->addPictureCb = std::move(cb);
}
void CLyMultiGrid::setSwapCallback(SwapCallback cb) {
  if (_pImpl) _pImpl->swapCb = std::move(cb);
}

int CLyMultiGrid::getInteractionMode() const {
  return _pImpl ? _pImpl->mode : LY_MULTIGRID_MODE_IDLE;
}

CLyFocusBox* CLyMultiGrid::getFocusBox() const {
  return _pImpl ? _pImpl->focusBox : nullptr;
}

// ---------------------------------------------------------------- set-up

void CLyMultiGrid::__setupTouch() {
  if (!_pImpl || _pImpl->touchExtra) return;
  auto* state = new (std::nothrow) _CLyMultiGridTouchState;
  if (!state) {
    LYLOG_E("Failed to create touch state");
    return;
  }
  _pImpl->touchExtra = state;
  __createHover();
}

void CLyMultiGrid::__createHover() {
  _CLyMultiGridTouchState* state = touchState(_pImpl);
  if (!state || !_pImpl->layout) return;
  Evas_Object* swallow = evas_object_image_filled_add(evas_object_evas_get(_pImpl->layout));
  evas_object_pass_events_set(swallow, EINA_TRUE);
  elm_object_part_content_set(_pImpl->layout, kHoverPart, swallow);
  state->hoverSwallow = swallow;

  CLyFocusBox* box = new (std::nothrow) CLyFocusBox;
  if (!box || !box->create(_pImpl->layout, swallow)) {
    LYLOG_E("Failed to create focusBox");
    delete box;
    return;
  }
  _pImpl->focusBox = box;
  box->setPressCallback([this](bool pressed) {
    _pImpl->handlerPressState = pressed ? 1 : 2;
    LYLOG_D("In focus pot: %d", _pImpl->handlerPressState);
    if (!pressed) __endHandlerDrag();
  });
  box->setMoveCallback([this](const CLyPoint& delta, int dotIndex) { __resizeFocusRect(delta, dotIndex); });
  // The layout gets its final place only when the window lays it out.
  evas_object_event_callback_add(_pImpl->layout, EVAS_CALLBACK_RESIZE, __onLayoutGeometry, this);
  evas_object_event_callback_add(_pImpl->layout, EVAS_CALLBACK_MOVE, __onLayoutGeometry, this);
}

void CLyMultiGrid::__endHandlerDrag() {
  _CLyMultiGridTouchState* ts = touchState(_pImpl);
  if (!ts || !ts->drafting) return;
  ts->drafting = false;
  __forgetDrawnPixels();
  if (!_pImpl->canvas) return;
  _pImpl->canvas->setFilter(ts->savedFilter);
  __updateGridImages();
  if (_pImpl->focusBox && __isValidItemIndex(_pImpl->currentIndex)) __updateFocusRect();
}

void CLyMultiGrid::__onLayoutGeometry(void* data, Evas*, Evas_Object*, void*) {
  auto* self = static_cast<CLyMultiGrid*>(data);
  if (!self || !self->_pImpl || !self->_pImpl->focusBox) return;
  self->__resizeFocusBox();
  if (self->__isValidItemIndex(self->_pImpl->currentIndex)) self->__updateFocusRect();
}

void CLyMultiGrid::__teardownTouch() {
  if (!_pImpl) return;
  _CLyMultiGridTouchState* state = touchState(_pImpl);
  if (state) {
    // Transits call back on deletion: detach them from this control first.
    if (state->zoomInTransit) {
      elm_transit_del_cb_set(state->zoomInTransit, nullptr, nullptr);
      elm_transit_del(state->zoomInTransit);
    }
    if (state->moveBackTransit) {
      elm_transit_del_cb_set(state->moveBackTransit, nullptr, nullptr);
      elm_transit_del(state->moveBackTransit);
    }
    deleteObject(state->responseImage);
    if (_pImpl->layout) {
      evas_object_event_callback_del_full(_pImpl->layout, EVAS_CALLBACK_RESIZE, __onLayoutGeometry, this);
      evas_object_event_callback_del_full(_pImpl->layout, EVAS_CALLBACK_MOVE, __onLayoutGeometry, this);
    }
    delete state;
    _pImpl->touchExtra = nullptr;
  }
  deleteObject(_pImpl->dragImage);
  deleteObject(_pImpl->responseDimRect);
  delete _pImpl->focusBox;
  _pImpl->focusBox = nullptr;
  delete _pImpl->pressEffect;
  _pImpl->pressEffect = nullptr;
}

void CLyMultiGrid::__resizeFocusBox() {
  if (!_pImpl || !_pImpl->focusBox) return;
  _pImpl->focusBox->resize();
}

// ---------------------------------------------------------------- helpers

int CLyMultiGrid::__getClickIndex(int x, int y) {
  if (!_pImpl || !_pImpl->drawRectList) return -1;
  return _pImpl->drawRectList->getIndex((float)x, (float)y);
}

bool CLyMultiGrid::__isPlaceholder(int index) const {
  if (!_pImpl || !_pImpl->singleImageMode || !_pImpl->srcItemList) return false;
  CLyMultiGridSrcItem* item = _pImpl->srcItemList->get(index);
  return item && item->isFake();
}

CLyFloatRectangle CLyMultiGrid::__cellRect(int index) const {
  return _pImpl && _pImpl->drawRectList ? _pImpl->drawRectList->get(index) : CLyFloatRectangle(0, 0, 0, 0);
}

// Gives item `index` the crop fitted to its cell.
void CLyMultiGrid::__fitCrop(int index) {
  CLyMultiGridSrcItem* item = _pImpl->srcItemList ? _pImpl->srcItemList->get(index) : nullptr;
  if (!item || !item->getBitmap() || !item->getSrcRect()) return;
  CLyRectangle crop;
  if (!__calculateRectSize(*item->getSrcRect(), __cellRect(index), crop)) {
    LYLOG_E("Failed to get new Rect");
    return;
  }
  CLyRectangle* owned = new (std::nothrow) CLyRectangle(crop);
  if (owned) item->setSrcRect(owned);
}

// ---------------------------------------------------------------- dispatch

void CLyMultiGrid::__processGestureEvent(int type, int state, void* info) {
  if (!_pImpl) return;
  auto* gi = static_cast<const CLyGestureInfo*>(info);
  if (!gi) {
    LYLOG_E("Invalid gesture info");
    return;
  }
  if (_pImpl->surfaces.empty()) {
    LYLOG_D("Surfaces are not created yet");
    return;
  }
  if (_pImpl->mode == LY_MULTIGRID_MODE_DROPPING) {
    LYLOG_D("Ignore");
    return;
  }
  if (_pImpl->handlerPressState != 0) {
    LYLOG_D("Focus handler processing");
    if (type == LY_GESTURE_MOUSE_UP && _pImpl->handlerPressState == 2) _pImpl->handlerPressState = 0;
    return;
  }
  switch (type) {
    case LY_GESTURE_MOUSE_DOWN:
      __onMouseDown(gi->x, gi->y);
      break;
    case LY_GESTURE_MOUSE_UP:
      __onMouseUp(gi->x, gi->y);
      break;
    case LY_GESTURE_MOUSE_MOVE:
      __onMouseMove(gi->x, gi->y);
      break;
    case LY_GESTURE_MULTI_DOWN:
      _pImpl->fingerCount++;
      // A resting finger never reports a move: remember where it came down.
      __setFingerPosition(gi->device, gi->x, gi->y);
      break;
    case LY_GESTURE_MULTI_UP:
      _pImpl->fingerCount--;
      LYLOG_D("Finger count Multi[%d]", _pImpl->fingerCount);
      __resetStatusAfterMouseUp(gi->x, gi->y);
      break;
    case LY_GESTURE_MULTI_MOVE:
      if (_pImpl->fingerCount > 1) {
        LYLOG_D("x and y (%d,%d)[%d]", gi->x, gi->y, gi->device);
        __setFingerPosition(gi->device, gi->x, gi->y);
      }
      break;
    case LY_GESTURE_TAP:
    case LY_GESTURE_DOUBLE_TAP:
      __onTap(type, state, gi->x, gi->y);
      break;
    case LY_GESTURE_LONG_TAP:
      __onLongTap(state, gi->x, gi->y);
      break;
    case LY_GESTURE_MOMENTUM:
      __onMomentum(state, gi->x, gi->y, gi->fingers);
      break;
    case LY_GESTURE_ZOOM:
      __onZoom(state, gi->x, gi->y, gi->zoom);
      break;
    default:
      LYLOG_E("Unknown gesture type[%d]", type);
      break;
  }
}

void CLyMultiGrid::__setFingerPosition(int device, int x, int y) {
  if (device == 1) {
    _pImpl->finger2X = x;
    _pImpl->finger2Y = y;
  } else {
    _pImpl->finger1X = x;
    _pImpl->finger1Y = y;
  }
}

// ---------------------------------------------------------------- raw events

void CLyMultiGrid::__onMouseDown(int x, int y) {
  _pImpl->fingerCount++;
  if (_pImpl->mode == LY_MULTIGRID_MODE_DRAGGING) {
    LYLOG_D("Drag mode[%d], ignore", _pImpl->mode);
    return;
  }
  LYLOG_D("x and y (%d,%d)", x, y);
  _pImpl->finger1X = x;
  _pImpl->finger1Y = y;
  const int index = __getClickIndex(x, y);
  if (__isPlaceholder(index)) {
    LYLOG_D("Fake image");
    __runPressEffect(index, x, y);
    __postMouseDown(index, true);
    return;
  }
  if (_pImpl->mode != LY_MULTIGRID_MODE_IDLE) {
    LYLOG_D("Invalid mode[%d]", _pImpl->mode);
    return;
  }
  if (_CLyMultiGridTouchState* ts = touchState(_pImpl)) ts->tapPending = false;
  _pImpl->pressedIndex = index;
  _pImpl->touchedIndex = index;
  _pImpl->mode = LY_MULTIGRID_MODE_PRESSED;
  if (__isValidItemIndex(index)) {
    _pImpl->srcItemList->setLastPoint(x, y);
    if (index == _pImpl->currentIndex) {
      LYLOG_D("Same as foucs valid index[%d]", index);
      return;
    }
  } else {
    LYLOG_D("Invalid index");
  }
  __postMouseDown(index, false);
}

void CLyMultiGrid::__postMouseDown(int index, bool placeholder) {
  if (!_pImpl->mouseDownCb || !_pImpl->controlObj) return;
  // Outside the gesture layer's own callback: the main view may rebuild
  // screens from it.
  WTimer::addJob(
      [this, index, placeholder](void*) {
        if (_pImpl && _pImpl->mouseDownCb) _pImpl->mouseDownCb(index, placeholder);
      },
      nullptr, _pImpl->controlObj);
}

void CLyMultiGrid::__onMouseMove(int x, int y) {
  if (_pImpl->fingerCount < 2) return;
  _pImpl->finger1X = x;
  _pImpl->finger1Y = y;
  if (_pImpl->singleImageMode && _pImpl->mode == LY_MULTIGRID_MODE_IDLE &&
      !__isPlaceholder(__getClickIndex(x, y)))
    __runReleaseEffect();
}

void CLyMultiGrid::__onMouseUp(int x, int y) {
  _pImpl->fingerCount--;
  LYLOG_D("Finger count Single[%d]", _pImpl->fingerCount);
  if (_pImpl->singleImageMode && _pImpl->mode == LY_MULTIGRID_MODE_IDLE) {
    if (__isPlaceholder(__getClickIndex(x, y))) {
      if (__runReleaseEffect()) {
        CLyUtil::playTouchSound();
        if (_pImpl->addPictureCb) _pImpl->addPictureCb();
      }
    } else {
      // Released away from the placeholder: never leave it tinted.
      __abortPressEffect();
    }
  }
  __resetStatusAfterMouseUp(x, y);
}

void CLyMultiGrid::__resetStatusAfterMouseUp(int x, int y) {
  if (_pImpl->fingerCount > 0) return;
  if (_pImpl->fingerCount < 0) {
    LYLOG_E("Debug me, invalid finger count[%d]", _pImpl->fingerCount);
    _pImpl->fingerCount = 0;
  }
  switch (_pImpl->mode) {
    case LY_MULTIGRID_MODE_PRESSED:
      // A press released without panning may still become a tap.
      if (_CLyMultiGridTouchState* ts = touchState(_pImpl)) {
        ts->tapPending = true;
        ts->tapPressedIndex = _pImpl->pressedIndex;
        ts->tapTouchedIndex = _pImpl->touchedIndex;
      }
      _pImpl->mode = LY_MULTIGRID_MODE_IDLE;
      break;
    case LY_MULTIGRID_MODE_PANNING:
      _pImpl->mode = LY_MULTIGRID_MODE_IDLE;
      break;
    case LY_MULTIGRID_MODE_DRAGGING:
      _pImpl->mode = LY_MULTIGRID_MODE_DROPPING;
      __dropDragImage(x, y);
      break;
    default:
      break;
  }
  _pImpl->touchedIndex = -1;
}

// ---------------------------------------------------------------- taps and selection

void CLyMultiGrid::__onTap(int type, int state, int x, int y) {
  _CLyMultiGridTouchState* ts = touchState(_pImpl);
  const bool released = ts && ts->tapPending && _pImpl->mode == LY_MULTIGRID_MODE_IDLE;
  if (_pImpl->mode != LY_MULTIGRID_MODE_PRESSED && !released) {
    LYLOG_D("View is not in DOWN/SELECT_DOWN mode[%d]", _pImpl->mode);
    return;
  }
  const int touched = released ? ts->tapTouchedIndex : _pImpl->touchedIndex;
  const int pressed = released ? ts->tapPressedIndex : _pImpl->pressedIndex;
  if (touched < 0) {
    LYLOG_D("No Mouse Down Event");
    return;
  }
  if (type == LY_GESTURE_DOUBLE_TAP && state == LY_GESTURE_STATE_START && ts) ts->doubleTapIndex = touched;
  if (state != LY_GESTURE_STATE_END) {
    if (state == LY_GESTURE_STATE_ABORT && released && type == LY_GESTURE_TAP) ts->tapPending = false;
    return;
  }
  if (released) ts->tapPending = false;
  if (type == LY_GESTURE_TAP) CLyUtil::playTouchSound();
  const int index = __getClickIndex(x, y);
  if (index != touched) return;
  LYLOG_D("Same index");
  if (index != _pImpl->currentIndex)
    __tryClickHover(x, y, pressed, touched);
  else
    LYLOG_D("Clicked index: %d", index);
}

void CLyMultiGrid::__tryClickHover(int x, int y, int pressed, int touched) {
  if (pressed == touched && __isValidItemIndex(touched)) {
    if (!_pImpl->controlObj) return;
    WTimer::addJob(
        [this, x, y](void*) {
          if (!_pImpl) return;
          LYLOG_D("To focus image");
          const int index = __getClickIndex(x, y);
          if (!__isValidItemIndex(index)) return;
          _pImpl->previousIndex = _pImpl->currentIndex;
          _pImpl->currentIndex = index;
          __updateFocusRect();
          __notifyMainView();
        },
        nullptr, _pImpl->controlObj);
  } else if (_pImpl->currentIndex >= 0) {
    clearSelection();
  }
}

void CLyMultiGrid::__notifyMainView() {
  if (!__isValidItemIndex(_pImpl->currentIndex)) {
    LYLOG_E("Invalid index[%d]", _pImpl->currentIndex);
    return;
  }
  if (_pImpl->selectionCb) _pImpl->selectionCb();
}

bool CLyMultiGrid::clearSelection() {
  if (!_pImpl || _pImpl->currentIndex < 0) return false;
  _pImpl->previousIndex = _pImpl->currentIndex;
  _pImpl->currentIndex = -1;
  // A lifted photo must still be dropped and fly back: idling the mode
  // there would leave it hanging over a blank cell.
  if (_pImpl->mode != LY_MULTIGRID_MODE_DRAGGING && _pImpl->mode != LY_MULTIGRID_MODE_DROPPING)
    _pImpl->mode = LY_MULTIGRID_MODE_IDLE;
  __destroyFocusRect();
  return true;
}

// ---------------------------------------------------------------- focus frame

void CLyMultiGrid::__updateFocusRect() {
  if (!_pImpl) return;
  if (!__isValidItemIndex(_pImpl->currentIndex)) {
    LYLOG_D("Invalid index[%d]", _pImpl->currentIndex);
    return;
  }
  __destroyFocusRect();
  if (!_pImpl->focusBox) return;
  _pImpl->focusBox->show(__cellRect(_pImpl->currentIndex), 0);
  __showFocusHandler();
}

void CLyMultiGrid::__destroyFocusRect() {
  if (!_pImpl) return;
  if (_pImpl->previousIndex < 0) LYLOG_D("Invalid index[%d]", _pImpl->previousIndex);
  // The box knows what it painted: wipe that, whichever cell it framed.
  if (_pImpl->focusBox) _pImpl->focusBox->clearFrame();
  _pImpl->previousIndex = -1;
}

// The layout cell of the selected photo, with its handlers; logged when missing.
CLyGridImageInfo* CLyMultiGrid::__currentImageInfo() const {
  CLyMultiGridDrawRectList* list = _pImpl->drawRectList;
  CLyGridImageLayoutInfo* layout =
      CLyMultiGridStyleManager::getInstance().getGridImageLayout(list->getCount(), list->getStyleIndex());
  if (!layout) {
    LYLOG_E("Invalid gridLayoutInfo");
    return nullptr;
  }
  CLyGridImageInfo* info = layout->getImageInfo(_pImpl->currentIndex);
  if (!info) LYLOG_E("Invalid imageInfo");
  return info;
}

void CLyMultiGrid::__showFocusHandler() {
  CLyMultiGridDrawRectList* list = _pImpl->drawRectList;
  if (!list || !_pImpl->focusBox) return;
  const int current = _pImpl->currentIndex;
  CLyGridImageInfo* info = __currentImageInfo();
  if (!info) return;
  const int count = info->getHandlerCount();
  LYLOG_D("handler count: %d", count);
  const CLyFloatRectangle cell = list->get(current);
  std::vector<CLyFloatPoint> points;
  for (int i = 0; i < count && i < CLyFocusBox::kGripCount; ++i) {
    CLyGridHandlerInfo* handler = info->getHandlerInfo(i);
    float fx = 0, fy = 0;
    int base = 0;
    if (!handler || !handler->getPostion(&fx, &fy, &base)) continue;
    const CLyFloatRectangle b = list->get(base);
    float px = b.x1 + b.x2 * fx;
    float py = b.y1 + b.y2 * fy;
    px = std::min(std::max(px, cell.x1), cell.x1 + cell.x2);
    py = std::min(std::max(py, cell.y1), cell.y1 + cell.y2);
    points.emplace_back(px, py);
  }
  _pImpl->focusBox->showHandlers(points);
}

void CLyMultiGrid::__resizeFocusRect(const CLyPoint& delta, int dotIndex) {
  if (!_pImpl || !_pImpl->drawRectList) return;
  LYLOG_D("dotIndex[%d]", dotIndex);
  CLyMultiGridDrawRectList* list = _pImpl->drawRectList;
  const int current = _pImpl->currentIndex;
  if (!__isValidItemIndex(current)) {
    LYLOG_E("Invalid index[%d]", current);
    return;
  }
  CLyGridImageInfo* info = __currentImageInfo();
  if (!info) return;
  list->updateItem(current, info, dotIndex, delta);
  // A divider drag repaints every cell along the divider on each step: draw
  // them with the cheap filter while the finger moves, and once more
  // properly when it lifts (__endHandlerDrag).
  _CLyMultiGridTouchState* ts = touchState(_pImpl);
  if (ts && _pImpl->canvas && !ts->drafting) {
    ts->drafting = true;
    ts->savedFilter = _pImpl->canvas->getFilter();
    _pImpl->canvas->setFilter(CAIRO_FILTER_FAST);
    __forgetDrawnPixels();
  }
  // Between steps a cell mostly keeps its scale: its pixels move (or stay)
  // rather than being drawn again. Not while a press effect paints a cell.
  _pImpl->reusePixels = ts && ts->drafting;
  if (_pImpl->pressEffect) __forgetDrawnPixels();
  // Photos are opaque: copying them (SOURCE) skips reading the canvas back.
  // Placeholder icons need blending, so single-image mode keeps OVER.
  cairo_t* cr = _pImpl->canvas ? _pImpl->canvas->getContext() : nullptr;
  const bool copy = cr && !_pImpl->singleImageMode;
  if (copy) {
    cairo_save(cr);
    cairo_set_operator(cr, CAIRO_OPERATOR_SOURCE);
  }
  __drawGridImages();
  if (copy) cairo_restore(cr);
  _pImpl->reusePixels = false;
  if (_pImpl->focusBox) {
    _pImpl->previousIndex = current;
    __destroyFocusRect();
    _pImpl->focusBox->show(list->get(current), 0);
    __showFocusHandler();
  }
  notifyChanged(true);
}

// ---------------------------------------------------------------- pan

int CLyMultiGrid::__tryUpdateCurrentIndex(int x, int y) {
  const int index = __getClickIndex(x, y);
  if (!__isValidItemIndex(index)) {
    LYLOG_D("Invalid index[%d]", index);
    _pImpl->touchedIndex = -1;
    return 0;
  }
  if (index == _pImpl->touchedIndex) return 1;
  LYLOG_D("changed currentIndex %d %d", _pImpl->touchedIndex, index);
  _pImpl->touchedIndex = index;
  return 2;
}

void CLyMultiGrid::__onMomentum(int state, int x, int y, int fingers) {
  const int mode = _pImpl->mode;
  if (mode != LY_MULTIGRID_MODE_PRESSED && mode != LY_MULTIGRID_MODE_PANNING &&
      mode != LY_MULTIGRID_MODE_DRAGGING) {
    LYLOG_D("View is not in MOVE/DRAG mode[%d]", mode);
    if (_pImpl->singleImageMode && mode == LY_MULTIGRID_MODE_IDLE && !__isPlaceholder(__getClickIndex(x, y)))
      __runReleaseEffect();
    return;
  }
  // Two fingers pinch; they never pan (the pan of one cell would follow the
  // point between the fingers, which may lie on another cell).
  if ((fingers > 1 || _pImpl->fingerCount > 1) &&
      (state == LY_GESTURE_STATE_START || state == LY_GESTURE_STATE_MOVE) &&
      mode != LY_MULTIGRID_MODE_DRAGGING) {
    LYLOG_D("Pinch, no move");
    return;
  }
  switch (state) {
    case LY_GESTURE_STATE_START:
      LYLOG_D("Move start");
      __tryUpdateCurrentIndex(x, y);
      break;
    case LY_GESTURE_STATE_MOVE:
      if (mode == LY_MULTIGRID_MODE_DRAGGING) {
        __moveDragImage(x, y);
      } else {
        __movePhoto(x, y);
      }
      break;
    default:
      LYLOG_D("Move end");
      if (mode != LY_MULTIGRID_MODE_DRAGGING) {
        if (_pImpl->srcItemList) _pImpl->srcItemList->resetMove();
        _pImpl->mode = LY_MULTIGRID_MODE_PRESSED;
      }
      break;
  }
}

void CLyMultiGrid::__movePhoto(int x, int y) {
  const int index = _pImpl->touchedIndex;
  if (index < 0 || !_pImpl->srcItemList) return;
  if (_pImpl->mode == LY_MULTIGRID_MODE_PRESSED) {
    const int tolerance = scaled(kPanTolerance);
    LYLOG_D("Move item scaledTollerence: %d", tolerance);
    int lastX = 0, lastY = 0;
    _pImpl->srcItemList->getLastPoint(lastX, lastY);
    if (std::abs(x - lastX) <= tolerance && std::abs(y - lastY) <= tolerance) return;
    LYLOG_D("Move item start");
    _pImpl->mode = LY_MULTIGRID_MODE_PANNING;
    _pImpl->srcItemList->select(index);
  }
  if (_pImpl->srcItemList->move(index, x, y)) {
    __updateImage(index, __cellRect(index), false);
    notifyChanged(true);
  }
}

// ---------------------------------------------------------------- pinch

void CLyMultiGrid::__onZoom(int state, int x, int y, double zoom) {
  if (_pImpl->mode == LY_MULTIGRID_MODE_DRAGGING) {
    LYLOG_D("Drag, ignore");
    return;
  }
  if (_pImpl->mode == LY_MULTIGRID_MODE_IDLE) {
    LYLOG_D("Normal, ignore");
    return;
  }
  switch (state) {
    case LY_GESTURE_STATE_START:
      LYLOG_D("Zoom start");
      _pImpl->zooming = true;
      break;
    case LY_GESTURE_STATE_MOVE:
      if (!_pImpl->zooming) return;
      if (_pImpl->lastZoom == -1.0f) {
        __tryUpdateCurrentIndex(x, y);
        const int touched = _pImpl->touchedIndex;
        const int i2 = __getClickIndex(_pImpl->finger2X, _pImpl->finger2Y);
        if (i2 != touched || touched < 0) {
          LYLOG_D("Different indexs 1[%d / %d]", i2, touched);
          _pImpl->zooming = false;
          return;
        }
        const int i1 = __getClickIndex(_pImpl->finger1X, _pImpl->finger1Y);
        if (i1 != touched) {
          LYLOG_D("Different indexs 2[%d / %d]", i1, touched);
          _pImpl->zooming = false;
          return;
        }
        _pImpl->lastZoom = (float)zoom;
      }
      __pinchGridImage((float)zoom);
      break;
    default:
      _pImpl->zooming = false;
      _pImpl->lastZoom = -1.0f;
      LYLOG_D("Zoom end");
      break;
  }
}

void CLyMultiGrid::__pinchGridImage(float zoom) {
  const float d = zoom - _pImpl->lastZoom;
  if (std::fabs(d) < kPinchTolerance) {
    LYLOG_D("Less than tollerence[%f]", d);
    return;
  }
  _pImpl->lastZoom = zoom;
  const int index = _pImpl->touchedIndex;
  CLyMultiGridSrcItem* item = _pImpl->srcItemList ? _pImpl->srcItemList->get(index) : nullptr;
  if (!item) {
    LYLOG_E("Failed to get srcItem[%d]", index);
    return;
  }
  if (!_pImpl->srcItemList->pinchZoom(index, d)) {
    LYLOG_D("Failed to pinch");
    return;
  }
  LYLOG_D("Try to pinch image");
  __fitCrop(index);
  __updateImage(index, __cellRect(index), false);
  notifyChanged(true);
}

// ---------------------------------------------------------------- drag and drop

void CLyMultiGrid::__onLongTap(int state, int x, int y) {
  if (state != LY_GESTURE_STATE_MOVE) return;
  if (_pImpl->mode != LY_MULTIGRID_MODE_PRESSED) {
    LYLOG_D("View is not in DOWN/SELECT_DOWN mode[%d]", _pImpl->mode);
    return;
  }
  if (_pImpl->touchedIndex < 0) {
    LYLOG_D("No Mouse Down Event");
    return;
  }
  const int index = __getClickIndex(x, y);
  if (index != _pImpl->touchedIndex) return;
  LYLOG_D("Same index");
  if (index != _pImpl->currentIndex || !__isValidItemIndex(index)) return;
  _pImpl->mode = LY_MULTIGRID_MODE_DRAGGING;
  if (_CLyMultiGridTouchState* ts = touchState(_pImpl)) ts->liftedIndex = index;
  __cleanGridImage(index);
  __createDragImage();
}

void CLyMultiGrid::__cleanGridImage(int index) {
  if (!__isValidItemIndex(index) || !_pImpl->canvas) {
    LYLOG_E("Invalid index [%d]", index);
    return;
  }
  const CLyFloatRectangle cell = __cellRect(index);
  const double r = _pImpl->drawRectList->getRoundness();
  __forgetDrawnPixels();
  _pImpl->canvas->fillRoundRect(CLyFloatRectangle(0, 0, 0, 1.0f), cell, r, r);
  _pImpl->canvas->update(cell);
}

Evas_Object* CLyMultiGrid::__drawImage(int index) {
  CLyMultiGridSrcItem* item = _pImpl->srcItemList ? _pImpl->srcItemList->get(index) : nullptr;
  if (!item) {
    LYLOG_E("Failed to get srcItem");
    return nullptr;
  }
  if (_pImpl->singleImageMode && item->isFake()) {
    LYLOG_D("Fake image");
    return nullptr;
  }
  Bitmap* bitmap = item->getBitmap();
  const CLyRectangle* crop = item->getSrcRect();
  if (!bitmap || !bitmap->getPixels() || !crop) {
    LYLOG_E("Invalid buffer");
    return nullptr;
  }
  // Cut the crop out of the bitmap, clamped into it.
  int left = crop->x, top = crop->y, w = crop->w - crop->x, h = crop->h - crop->y;
  if (left < 0) {
    LYLOG_D("Negative x[%d]", left);
    left = 0;
  }
  if (top < 0) {
    LYLOG_D("Negative y[%d]", top);
    top = 0;
  }
  if (left + w > bitmap->getWidth()) {
    LYLOG_D("Larger width[%d]", w);
    w = bitmap->getWidth() - left;
  }
  if (top + h > bitmap->getHeight()) {
    LYLOG_D("Larger height[%d]", h);
    h = bitmap->getHeight() - top;
  }
  if (w < 1 || h < 1) {
    LYLOG_E("Invalid buffer");
    return nullptr;
  }
  const CLyFloatRectangle cell = __cellRect(index);
  const int cw = std::max(1, (int)cell.x2), ch = std::max(1, (int)cell.y2);
  Evas_Object* image = evas_object_image_filled_add(evas_object_evas_get(_pImpl->controlObj));
  if (!image) {
    LYLOG_E("Failed to add canvas");
    return nullptr;
  }
  evas_object_image_colorspace_set(image, EVAS_COLORSPACE_ARGB8888);
  evas_object_image_alpha_set(image, EINA_TRUE);
  CLyCairoCanvas* canvas = new (std::nothrow) CLyCairoCanvas(image, cw, ch, false);
  if (!canvas || !canvas->isValid()) {
    LYLOG_E("Failed to add canvas");
    delete canvas;
    evas_object_del(image);
    return nullptr;
  }
  // The photo's surface wraps its bitmap: drawing from it needs no copy.
  cairo_surface_t* surface = (size_t)index < _pImpl->surfaces.size() ? _pImpl->surfaces[index] : nullptr;
  cairo_surface_t* own = nullptr;
  if (!surface) surface = own = canvas->createSurface(bitmap);
  const CLyFloatRectangle dst(0, 0, (float)cw, (float)ch);
  canvas->clear();
  canvas->beginPath();
  canvas->setRectPath(dst);
  canvas->drawBitmap(surface, dst, CLyRectangle(left, top, w, h));
  canvas->update();
  delete canvas;
  if (own) cairo_surface_destroy(own);
  return image;
}

void CLyMultiGrid::__createDragImage() {
  deleteObject(_pImpl->dragImage);
  const int index = _pImpl->currentIndex;
  if (!__isValidItemIndex(index)) {
    LYLOG_E("Invalid index[%d]", index);
    return;
  }
  Evas_Object* image = __drawImage(index);
  if (!image) return;
  const CLyFloatRectangle cell = __cellRect(index);
  int lastX = 0, lastY = 0;
  _pImpl->srcItemList->getLastPoint(lastX, lastY);
  evas_object_move(image, lastX - (int)(cell.x2 / 2), lastY - (int)(cell.y2 / 2));
  evas_object_pass_events_set(image, EINA_TRUE);
  if (_pImpl->focusBox && _pImpl->focusBox->getImageObject())
    evas_object_layer_set(image, evas_object_layer_get(_pImpl->focusBox->getImageObject()));
  evas_object_smart_member_add(image, _pImpl->controlObj);
  evas_object_raise(image);
  evas_object_show(image);
  _pImpl->dragImage = image;
}

void CLyMultiGrid::__moveDragImage(int x, int y) {
  const int result = __tryUpdateCurrentIndex(x, y);
  if (!_pImpl->dragImage) {
    LYLOG_E("Invalid dragImage object");
  } else {
    int w = 0, h = 0;
    evas_object_geometry_get(_pImpl->dragImage, nullptr, nullptr, &w, &h);
    evas_object_move(_pImpl->dragImage, x - w / 2, y - h / 2);
  }
  if (result == 2)
    __createResponseDimRect(_pImpl->touchedIndex);
  else if (result == 0)
    deleteObject(_pImpl->responseDimRect);
}

void CLyMultiGrid::__createResponseDimRect(int target) {
  deleteObject(_pImpl->responseDimRect);
  if (!__isValidItemIndex(target)) return;
  const CLyFloatRectangle cell = __cellRect(target);
  const int cw = std::max(1, (int)cell.x2), ch = std::max(1, (int)cell.y2);
  Evas_Object* image = evas_object_image_filled_add(evas_object_evas_get(_pImpl->controlObj));
  if (!image) {
    LYLOG_E("Failed to add canvas");
    return;
  }
  evas_object_image_colorspace_set(image, EVAS_COLORSPACE_ARGB8888);
  evas_object_image_alpha_set(image, EINA_TRUE);
  CLyCairoCanvas* canvas = new (std::nothrow) CLyCairoCanvas(image, cw, ch, false);
  if (!canvas || !canvas->isValid()) {
    LYLOG_E("Failed to add canvas");
    delete canvas;
    evas_object_del(image);
    return;
  }
  const double r = _pImpl->drawRectList->getRoundness();
  canvas->clear();
  canvas->fillRoundRect(CLyFloatRectangle(0, 0, 0, 0.5f), CLyFloatRectangle(0, 0, (float)cw, (float)ch), r,
                        r);
  canvas->update();
  delete canvas;
  evas_object_move(image, (int)cell.x1, (int)cell.y1);
  evas_object_pass_events_set(image, EINA_TRUE);
  if (_pImpl->canvasImage) evas_object_layer_set(image, evas_object_layer_get(_pImpl->canvasImage));
  evas_object_smart_member_add(image, _pImpl->controlObj);
  // Over the photo, under the lifted one.
  if (_pImpl->canvasImage) evas_object_stack_above(image, _pImpl->canvasImage);
  evas_object_show(image);
  _pImpl->responseDimRect = image;
}

void CLyMultiGrid::__dropDragImage(int x, int y) {
  _CLyMultiGridTouchState* state = touchState(_pImpl);
  CLyMultiGridSrcItemList* items = _pImpl->srcItemList;
  // The lifted cell, even if the selection was cleared meanwhile.
  const int source = state && state->liftedIndex >= 0 ? state->liftedIndex : _pImpl->currentIndex;
  if (state) state->liftedIndex = -1;
  const int target = __getClickIndex(x, y);
  int dropTarget = source;
  if (__isValidItemIndex(target) && target != source && items->swap(source, target)) {
    // A surface wraps its item's bitmap, so it moves with the item.
    if ((size_t)std::max(source, target) < _pImpl->surfaces.size())
      std::swap(_pImpl->surfaces[source], _pImpl->surfaces[target]);
    dropTarget = target;
    if (_pImpl->swapCb) _pImpl->swapCb(source, target);
    // The swapped-in photo still has its initial crop: fit it to its new
    // cell before it is shown.
    __fitCrop(source);
    __fitCrop(target);
    __startZoomIn(source);
  }
  items->setDragSource(source);
  items->setDragTarget(dropTarget);

  if (!_pImpl->dragImage) {
    __onMoveBackTransitDone(this, nullptr);
    return;
  }
  const CLyFloatRectangle cell = __cellRect(dropTarget);
  int ix = 0, iy = 0, iw = 0, ih = 0;
  evas_object_geometry_get(_pImpl->dragImage, &ix, &iy, &iw, &ih);
  Elm_Transit* transit = elm_transit_add();
  if (!transit) {
    __onMoveBackTransitDone(this, nullptr);
    return;
  }
  elm_transit_object_add(transit, _pImpl->dragImage);
  elm_transit_tween_mode_set(transit, ELM_TRANSIT_TWEEN_MODE_SINUSOIDAL);
  elm_transit_duration_set(transit, kTransitSeconds);
  elm_transit_event_enabled_set(transit, EINA_TRUE);
  elm_transit_effect_translation_add(transit, 0, 0, cell.x1 - ix, cell.y1 - iy);
  elm_transit_effect_resizing_add(transit, iw, ih, (Evas_Coord)cell.x2, (Evas_Coord)cell.y2);
  elm_transit_del_cb_set(transit, __onMoveBackTransitDone, this);
  if (state) state->moveBackTransit = transit;
  elm_transit_go(transit);
  if (source != dropTarget) notifyChanged(true);
}

void CLyMultiGrid::__startZoomIn(int index) {
  _CLyMultiGridTouchState* state = touchState(_pImpl);
  Evas_Object* image = state ? __drawImage(index) : nullptr;
  if (!image) {
    __updateImage(index, __cellRect(index), true);
    return;
  }
  const CLyFloatRectangle cell = __cellRect(index);
  evas_object_move(image, (int)cell.x1, (int)cell.y1);
  evas_object_pass_events_set(image, EINA_TRUE);
  evas_object_smart_member_add(image, _pImpl->controlObj);
  evas_object_raise(image);
  evas_object_show(image);
  Elm_Transit* transit = elm_transit_add();
  if (!transit) {
    evas_object_del(image);
    __updateImage(index, cell, true);
    return;
  }
  state->responseImage = image;
  state->responseIndex = index;
  elm_transit_object_add(transit, image);
  elm_transit_tween_mode_set(transit, ELM_TRANSIT_TWEEN_MODE_SINUSOIDAL);
  elm_transit_duration_set(transit, kTransitSeconds);
  elm_transit_event_enabled_set(transit, EINA_TRUE);
  elm_transit_effect_zoom_add(transit, kZoomInFrom, 1.0);
  elm_transit_del_cb_set(transit, __onZoomInTransitDone, this);
  state->zoomInTransit = transit;
  elm_transit_go(transit);
}

void CLyMultiGrid::__onZoomInTransitDone(void* data, Elm_Transit*) {
  auto* self = static_cast<CLyMultiGrid*>(data);
  _CLyMultiGridTouchState* state = self ? touchState(self->_pImpl) : nullptr;
  if (!state) {
    LYLOG_E("Invalid data");
    return;
  }
  state->zoomInTransit = nullptr;
  deleteObject(state->responseImage);
  const int index = state->responseIndex;
  state->responseIndex = -1;
  if (!self->__isValidItemIndex(index)) return;
  self->__fitCrop(index);
  self->__updateImage(index, self->__cellRect(index), true);
}

void CLyMultiGrid::__onMoveBackTransitDone(void* data, Elm_Transit*) {
  auto* self = static_cast<CLyMultiGrid*>(data);
  if (!self || !self->_pImpl) {
    LYLOG_E("Invalid data");
    return;
  }
  _CLyMultiGridImpl* impl = self->_pImpl;
  _CLyMultiGridTouchState* state = touchState(impl);
  if (state) state->moveBackTransit = nullptr;
  deleteObject(impl->dragImage);
  deleteObject(impl->responseDimRect);
  CLyMultiGridSrcItemList* items = impl->srcItemList;
  const int source = items ? items->getDragSource() : -1;
  const int target = items ? items->getDragTarget() : -1;
  if (self->__isValidItemIndex(target)) {
    self->__fitCrop(target);
    self->__updateImage(target, self->__cellRect(target), true);
  }
  if (items) items->resetDrag();
  impl->mode = LY_MULTIGRID_MODE_IDLE;
  if (source != target && self->__isValidItemIndex(target)) {
    impl->previousIndex = impl->currentIndex;
    impl->currentIndex = target;
    self->__updateFocusRect();
  }
}

// ---------------------------------------------------------------- press effect

void CLyMultiGrid::__runPressEffect(int index, int /*x*/, int /*y*/) {
  delete _pImpl->pressEffect;
  _pImpl->pressEffect = nullptr;
  CLyPressAnimation* effect = new (std::nothrow) CLyPressAnimation;
  const int radius = _pImpl->drawRectList ? _pImpl->drawRectList->getRoundness() : 0;
  if (!effect || effect->prepare(_pImpl->controlObj, _pImpl->canvas, __cellRect(index), radius) != 0) {
    LYLOG_E("Failed to create press animation");
    delete effect;
    return;
  }
  _pImpl->pressEffect = effect;
  effect->draw(1.0f, true);
}

bool CLyMultiGrid::__runReleaseEffect() {
  if (!_pImpl || !_pImpl->pressEffect) return false;
  LYLOG_D("Check release effect");
  _pImpl->pressEffect->draw(1.0f, false);
  delete _pImpl->pressEffect;
  _pImpl->pressEffect = nullptr;
  return true;
}

void CLyMultiGrid::__abortPressEffect() {
  if (!_pImpl || !_pImpl->pressEffect) return;
  LYLOG_D("Check abort effect");
  _pImpl->pressEffect->draw(1.0f, false);
  delete _pImpl->pressEffect;
  _pImpl->pressEffect = nullptr;
}
