#include "control/CLyGesture.h"

#include <Elementary.h>

#include <new>

#include "app-assist/WDeletionHook.h"
#include "common/CLyLog.h"

namespace {
// The gesture layer reads the target's events at a late priority of its
// own; releases must reach the collage after it, presses before it.
const short kBeforeLayer = EVAS_CALLBACK_PRIORITY_BEFORE * 10;
const short kAfterLayer = EVAS_CALLBACK_PRIORITY_AFTER * 10;
}  // namespace

struct _CLyGestureImpl {
  CLyGesture* owner = nullptr;
  Evas_Object* layer = nullptr;
  Evas_Object* target = nullptr;
  bool attached = false;
  double longTapTimeout = -1.0;
  CLyGesture::Handler handler;

  static int mapState(Elm_Gesture_State state) {
    switch (state) {
      case ELM_GESTURE_STATE_START:
        return LY_GESTURE_STATE_START;
      case ELM_GESTURE_STATE_MOVE:
        return LY_GESTURE_STATE_MOVE;
      case ELM_GESTURE_STATE_END:
        return LY_GESTURE_STATE_END;
      default:
        return LY_GESTURE_STATE_ABORT;
    }
  }

  // ---- raw events of the target ----
  // Presses and releases of either kind report where they happened; a mouse
  // move also reports where it came from; multi-touch events name the finger.
  static void point(CLyGestureInfo& info, const Evas_Coord_Point& at) {
    info.x = info.startX = at.x;
    info.y = info.startY = at.y;
  }
  template <typename Event>
  static void finger(CLyGestureInfo& info, const Event* e) {
    info.device = e->device;
    info.timestamp = e->timestamp;
  }
  static void emit(void* data, int type, CLyGestureInfo& info) {
    static_cast<_CLyGestureImpl*>(data)->owner->__emit(type, LY_GESTURE_STATE_START, info);
  }

  template <typename Event, int Type>
  static void onMouseButton(void* data, Evas*, Evas_Object*, void* ev) {
    auto* e = static_cast<Event*>(ev);
    CLyGestureInfo info;
    point(info, e->canvas);
    info.timestamp = e->timestamp;
    emit(data, Type, info);
  }
  static void onMouseMove(void* data, Evas*, Evas_Object*, void* ev) {
    auto* e = static_cast<Evas_Event_Mouse_Move*>(ev);
    CLyGestureInfo info;
    info.x = e->cur.canvas.x;
    info.y = e->cur.canvas.y;
    info.startX = e->prev.canvas.x;
    info.startY = e->prev.canvas.y;
    info.timestamp = e->timestamp;
    emit(data, LY_GESTURE_MOUSE_MOVE, info);
  }
  template <typename Event, int Type>
  static void onMultiButton(void* data, Evas*, Evas_Object*, void* ev) {
    auto* e = static_cast<Event*>(ev);
    CLyGestureInfo info;
    point(info, Evas_Coord_Point{e->canvas.x, e->canvas.y});
    finger(info, e);
    emit(data, Type, info);
  }
  static constexpr Evas_Object_Event_Cb onMouseDown =
      onMouseButton<Evas_Event_Mouse_Down, LY_GESTURE_MOUSE_DOWN>;
  static constexpr Evas_Object_Event_Cb onMouseUp = onMouseButton<Evas_Event_Mouse_Up, LY_GESTURE_MOUSE_UP>;
  static constexpr Evas_Object_Event_Cb onMultiDown =
      onMultiButton<Evas_Event_Multi_Down, LY_GESTURE_MULTI_DOWN>;
  static constexpr Evas_Object_Event_Cb onMultiUp = onMultiButton<Evas_Event_Multi_Up, LY_GESTURE_MULTI_UP>;
  static void onMultiMove(void* data, Evas*, Evas_Object*, void* ev) {
    auto* e = static_cast<Evas_Event_Multi_Move*>(ev);
    CLyGestureInfo info;
    point(info, Evas_Coord_Point{e->cur.canvas.x, e->cur.canvas.y});
    finger(info, e);
    emit(data, LY_GESTURE_MULTI_MOVE, info);
  }
  static void onTargetDel(void* data, Evas_Object*) {
    auto* impl = static_cast<_CLyGestureImpl*>(data);
    impl->owner->__detach();
    impl->target = nullptr;
  }

  // ---- gestures of the layer; one function per (type, state) ----
  template <int Type, Elm_Gesture_State State>
  static Evas_Event_Flags onTaps(void* data, void* ev) {
    auto* e = static_cast<Elm_Gesture_Taps_Info*>(ev);
    // Taps count only with one finger: two-finger taps belong to a pinch.
    if (!e || e->n != 1) return EVAS_EVENT_FLAG_NONE;
    CLyGestureInfo info;
    info.x = info.startX = e->x;
    info.y = info.startY = e->y;
    info.fingers = (int)e->n;
    info.timestamp = e->timestamp;
    static_cast<_CLyGestureImpl*>(data)->owner->__emit(Type, mapState(State), info);
    return EVAS_EVENT_FLAG_NONE;
  }
  template <Elm_Gesture_State State>
  static Evas_Event_Flags onMomentum(void* data, void* ev) {
    auto* e = static_cast<Elm_Gesture_Momentum_Info*>(ev);
    if (!e) return EVAS_EVENT_FLAG_NONE;
    CLyGestureInfo info;
    info.startX = e->x1;
    info.startY = e->y1;
    info.x = e->x2;
    info.y = e->y2;
    info.fingers = (int)e->n;
    info.timestamp = e->tx;
    static_cast<_CLyGestureImpl*>(data)->owner->__emit(LY_GESTURE_MOMENTUM, mapState(State), info);
    return EVAS_EVENT_FLAG_NONE;
  }
  template <Elm_Gesture_State State>
  static Evas_Event_Flags onZoom(void* data, void* ev) {
    auto* e = static_cast<Elm_Gesture_Zoom_Info*>(ev);
    if (!e) return EVAS_EVENT_FLAG_NONE;
    CLyGestureInfo info;
    info.x = info.startX = e->x;
    info.y = info.startY = e->y;
    info.fingers = 2;
    info.zoom = e->zoom;
    static_cast<_CLyGestureImpl*>(data)->owner->__emit(LY_GESTURE_ZOOM, mapState(State), info);
    return EVAS_EVENT_FLAG_NONE;
  }
};

CLyGesture::CLyGesture(Handler handler) : _pImpl(new (std::nothrow) _CLyGestureImpl) {
  if (!_pImpl) {
    LYLOG_E("Failed to create implement");
    return;
  }
  _pImpl->owner = this;
  _pImpl->handler = std::move(handler);
}

CLyGesture::~CLyGesture() {
  if (!_pImpl) return;
  __detach();
  if (_pImpl->target)
    app_assist::wevasobject_remove_deletion_hook(_pImpl->target, _CLyGestureImpl::onTargetDel, _pImpl);
  delete _pImpl;
}

void CLyGesture::setHandler(Handler handler) {
  if (_pImpl) _pImpl->handler = std::move(handler);
}

void CLyGesture::setTarget(Evas_Object* target) {
  if (!_pImpl || target == _pImpl->target) return;
  __detach();
  if (_pImpl->target)
    app_assist::wevasobject_remove_deletion_hook(_pImpl->target, _CLyGestureImpl::onTargetDel, _pImpl);
  _pImpl->target = target;
  if (target) {
    app_assist::wevasobject_add_deletion_hook(target, _CLyGestureImpl::onTargetDel, _pImpl);
    __attach();
  }
}

Evas_Object* CLyGesture::getTarget() const {
  return _pImpl ? _pImpl->target : nullptr;
}

Evas_Object* CLyGesture::getGestureLayer() const {
  return _pImpl ? _pImpl->layer : nullptr;
}

void CLyGesture::setLongTapTimeout(double seconds) {
  if (!_pImpl) return;
  _pImpl->longTapTimeout = seconds;
  if (_pImpl->layer && seconds > 0) elm_gesture_layer_long_tap_start_timeout_set(_pImpl->layer, seconds);
}

Evas_Object* CLyGesture::onCreateView(Evas_Object* parent, void*) {
  if (!_pImpl) return nullptr;
  if (!parent) {
    LYLOG_E("Invalid parent");
    return nullptr;
  }
  Evas_Object* layer = elm_gesture_layer_add(parent);
  if (!layer) {
    LYLOG_E("Failed to add gesture layer");
    return nullptr;
  }
  _pImpl->layer = layer;
  if (_pImpl->longTapTimeout > 0) elm_gesture_layer_long_tap_start_timeout_set(layer, _pImpl->longTapTimeout);

  using I = _CLyGestureImpl;
  struct LayerCallback {
    Elm_Gesture_Type type;
    Elm_Gesture_State state;
    Elm_Gesture_Event_Cb cb;
  };
  static const LayerCallback kCallbacks[] = {
      {ELM_GESTURE_N_TAPS, ELM_GESTURE_STATE_START, I::onTaps<LY_GESTURE_TAP, ELM_GESTURE_STATE_START>},
      {ELM_GESTURE_N_TAPS, ELM_GESTURE_STATE_END, I::onTaps<LY_GESTURE_TAP, ELM_GESTURE_STATE_END>},
      {ELM_GESTURE_N_TAPS, ELM_GESTURE_STATE_ABORT, I::onTaps<LY_GESTURE_TAP, ELM_GESTURE_STATE_ABORT>},
      {ELM_GESTURE_N_LONG_TAPS, ELM_GESTURE_STATE_START,
       I::onTaps<LY_GESTURE_LONG_TAP, ELM_GESTURE_STATE_START>},
      {ELM_GESTURE_N_LONG_TAPS, ELM_GESTURE_STATE_MOVE,
       I::onTaps<LY_GESTURE_LONG_TAP, ELM_GESTURE_STATE_MOVE>},
      {ELM_GESTURE_N_LONG_TAPS, ELM_GESTURE_STATE_END, I::onTaps<LY_GESTURE_LONG_TAP, ELM_GESTURE_STATE_END>},
      {ELM_GESTURE_N_LONG_TAPS, ELM_GESTURE_STATE_ABORT,
       I::onTaps<LY_GESTURE_LONG_TAP, ELM_GESTURE_STATE_ABORT>},
      {ELM_GESTURE_N_DOUBLE_TAPS, ELM_GESTURE_STATE_START,
       I::onTaps<LY_GESTURE_DOUBLE_TAP, ELM_GESTURE_STATE_START>},
      {ELM_GESTURE_N_DOUBLE_TAPS, ELM_GESTURE_STATE_END,
       I::onTaps<LY_GESTURE_DOUBLE_TAP, ELM_GESTURE_STATE_END>},
      {ELM_GESTURE_N_DOUBLE_TAPS, ELM_GESTURE_STATE_ABORT,
       I::onTaps<LY_GESTURE_DOUBLE_TAP, ELM_GESTURE_STATE_ABORT>},
      {ELM_GESTURE_MOMENTUM, ELM_GESTURE_STATE_START, I::onMomentum<ELM_GESTURE_STATE_START>},
      {ELM_GESTURE_MOMENTUM, ELM_GESTURE_STATE_MOVE, I::onMomentum<ELM_GESTURE_STATE_MOVE>},
      {ELM_GESTURE_MOMENTUM, ELM_GESTURE_STATE_END, I::onMomentum<ELM_GESTURE_STATE_END>},
      {ELM_GESTURE_MOMENTUM, ELM_GESTURE_STATE_ABORT, I::onMomentum<ELM_GESTURE_STATE_ABORT>},
      {ELM_GESTURE_ZOOM, ELM_GESTURE_STATE_START, I::onZoom<ELM_GESTURE_STATE_START>},
      {ELM_GESTURE_ZOOM, ELM_GESTURE_STATE_MOVE, I::onZoom<ELM_GESTURE_STATE_MOVE>},
      {ELM_GESTURE_ZOOM, ELM_GESTURE_STATE_END, I::onZoom<ELM_GESTURE_STATE_END>},
      {ELM_GESTURE_ZOOM, ELM_GESTURE_STATE_ABORT, I::onZoom<ELM_GESTURE_STATE_ABORT>},
  };
  for (const LayerCallback& c : kCallbacks) elm_gesture_layer_cb_set(layer, c.type, c.state, c.cb, _pImpl);
  __attach();
  return layer;
}

void CLyGesture::onDestroy() {
  if (!_pImpl) return;
  __detach();
  _pImpl->layer = nullptr;
}

namespace {
struct RawCallback {
  Evas_Callback_Type type;
  Evas_Callback_Priority priority;
  Evas_Object_Event_Cb cb;
};
const RawCallback kRawCallbacks[] = {
    {EVAS_CALLBACK_MOUSE_DOWN, kBeforeLayer, _CLyGestureImpl::onMouseDown},
    {EVAS_CALLBACK_MOUSE_MOVE, kBeforeLayer, _CLyGestureImpl::onMouseMove},
    {EVAS_CALLBACK_MULTI_DOWN, kBeforeLayer, _CLyGestureImpl::onMultiDown},
    {EVAS_CALLBACK_MULTI_MOVE, kBeforeLayer, _CLyGestureImpl::onMultiMove},
    {EVAS_CALLBACK_MOUSE_UP, kAfterLayer, _CLyGestureImpl::onMouseUp},
    {EVAS_CALLBACK_MULTI_UP, kAfterLayer, _CLyGestureImpl::onMultiUp},
};
}  // namespace

void CLyGesture::__attach() {
  if (!_pImpl || _pImpl->attached || !_pImpl->layer || !_pImpl->target) return;
  Evas_Object* t = _pImpl->target;
  // Presses and moves first, releases last: see the header.
  for (const RawCallback& c : kRawCallbacks)
    evas_object_event_callback_priority_add(t, c.type, c.priority, c.cb, _pImpl);
  elm_gesture_layer_attach(_pImpl->layer, t);
  _pImpl->attached = true;
}

void CLyGesture::__detach() {
  if (!_pImpl || !_pImpl->attached) return;
  _pImpl->attached = false;
  Evas_Object* t = _pImpl->target;
  if (!t) return;
  for (const RawCallback& c : kRawCallbacks) evas_object_event_callback_del_full(t, c.type, c.cb, _pImpl);
}

void CLyGesture::__emit(int type, int state, CLyGestureInfo& info) {
  if (_pImpl && _pImpl->handler) _pImpl->handler(type, state, &info);
}
