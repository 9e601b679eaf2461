#pragma once
// Touch input of the collage as one event stream: the raw mouse and
// multi-touch events of a target object together with the recognised
// gestures of an elementary gesture layer attached to it. On a desktop the
// mouse stands for the first finger; multi-touch devices add the others.
//
// Raw events are read around the gesture layer's own handlers: presses and
// moves before it (so a gesture starting on a press sees the press), releases
// after it (so a tap ending on a release sees the touch still down).

#include <Evas.h>

#include <functional>

#include "control/CLyControl.h"

struct _CLyGestureImpl;

// Event types of the stream.
enum ECGestureType : int {
  LY_GESTURE_MOUSE_DOWN = 0,
  LY_GESTURE_MOUSE_UP = 1,
  LY_GESTURE_MOUSE_MOVE = 2,
  LY_GESTURE_MULTI_DOWN = 3,
  LY_GESTURE_MULTI_UP = 4,
  LY_GESTURE_MULTI_MOVE = 5,
  LY_GESTURE_TAP = 6,
  LY_GESTURE_LONG_TAP = 7,
  LY_GESTURE_DOUBLE_TAP = 8,
  LY_GESTURE_MOMENTUM = 9,
  LY_GESTURE_ZOOM = 10,
};

// Gesture states; raw events come with LY_GESTURE_STATE_START.
enum ECGestureState : int {
  LY_GESTURE_STATE_START = 0,
  LY_GESTURE_STATE_MOVE = 1,
  LY_GESTURE_STATE_ABORT = 2,
  LY_GESTURE_STATE_END = 3,
};

// What every event carries (the `info` of the handler points to one; valid
// during the call only). Coordinates are evas canvas coordinates.
struct CLyGestureInfo {
  int x = 0;  // current point: the pointer, the tap, the momentum's current end, the zoom centre
  int y = 0;
  int startX = 0;  // momentum: where the line started; otherwise the same as x, y
  int startY = 0;
  int device = 0;     // multi-touch device (finger) index; 0 for the mouse
  int fingers = 1;    // fingers involved in a gesture
  double zoom = 1.0;  // zoom factor (zoom gesture)
  unsigned int timestamp = 0;
};

class CLyGesture : public CLyControl {
 public:
  using Handler = std::function<void(int type, int state, void* info)>;

  explicit CLyGesture(Handler handler = nullptr);
  ~CLyGesture() override;
  CLyGesture(const CLyGesture&) = delete;
  CLyGesture& operator=(const CLyGesture&) = delete;

  const char* getClassName() const override { return "CLyGesture"; }

  void setHandler(Handler handler);
  // The object whose touches are read (the collage control's object). May
  // be set before or after create; a deleted target is forgotten.
  void setTarget(Evas_Object* target);
  Evas_Object* getTarget() const;
  // The elementary gesture layer (the control's own object).
  Evas_Object* getGestureLayer() const;
  // Seconds a finger must rest before a long tap starts (the layer's default otherwise).
  void setLongTapTimeout(double seconds);

 protected:
  Evas_Object* onCreateView(Evas_Object* parent, void* param) override;
  void onDestroy() override;

 private:
  friend struct _CLyGestureImpl;
  void __attach();
  void __detach();
  void __emit(int type, int state, CLyGestureInfo& info);

  _CLyGestureImpl* _pImpl = nullptr;
};
