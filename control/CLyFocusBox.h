#pragma once
// The frame around the selected cell of the collage and its handler dots.
//
// The box paints the frame on its own software canvas laid over its parent,
// and puts one touch area ("grip") with an icon at each handler position.
// Finger movement on a grip is filtered and reported to the owner as steps
// (delta in pixels, dot index); the owner moves the dividers. Grips repeat
// their events to the objects below, so the gesture layer under them sees
// the whole touch and knows (through the press-state callback) that a
// handler owns it.

#include <Evas.h>

#include <functional>
#include <vector>

#include "common/CLyFloatPoint.h"
#include "common/CLyFloatRectangle.h"
#include "common/CLyPoint.h"
#include "common/CLyRectangle.h"

struct _CLyFocusBoxImpl;

class CLyFocusBox {
 public:
  // Number of handler dots a box can show.
  static constexpr int kGripCount = 4;

  using MoveCallback = std::function<void(const CLyPoint& delta, int dotIndex)>;
  using PressCallback = std::function<void(bool pressed)>;

  CLyFocusBox();
  virtual ~CLyFocusBox();
  CLyFocusBox(const CLyFocusBox&) = delete;
  CLyFocusBox& operator=(const CLyFocusBox&) = delete;

  // Builds the canvas over `parent` and the grips; the box's objects join
  // the smart object `swallow` belongs to (or `parent` when it is one).
  bool create(Evas_Object* parent, Evas_Object* swallow);
  // Follows the parent's new geometry (the drawing is cleared).
  void resize();

  // Frame around `rect` (x, y, w, h in evas coordinates).
  void show(const CLyFloatRectangle& rect, int roundness);
  // Dims the band between `outer` and the rounded `inner`, then frames `inner`.
  void showDimmed(const CLyFloatRectangle& outer, const CLyFloatRectangle& inner, int roundness);
  // Clears the canvas and hides every handler.
  void clear();
  // Wipes only the last frame (and any dimmed band) and hides the handlers:
  // cheaper than clear() on a large canvas, for frames that follow a finger.
  void clearFrame();
  // One handler per position, in grip order; positions beyond the fourth are ignored.
  void showHandlers(const std::vector<CLyFloatPoint>& positions);

  void setMoveCallback(MoveCallback cb);
  void setPressCallback(PressCallback cb);

  void setEnabled(bool enabled);
  // A frozen box ignores handler movement.
  void setFrozen(bool frozen);
  bool isDragging() const;
  // The last frame rectangle (x, y, w, h).
  const CLyRectangle& getBoxRect() const;
  // The touch area of grip i (null beyond the range or before create), for tests and tools.
  Evas_Object* getGrip(int index) const;
  Evas_Object* getImageObject() const;

  // The movement filter on its own: decides whether a grip at `last`
  // (accepted at `lastTimestamp`) moving to (x, y) at `timestamp` makes a
  // step. On acceptance fills `delta` (an axis below the threshold reports
  // 0) and `next` (the new last position). `threshold` is 5 scaled pixels.
  static bool filterMove(const CLyPoint& last, unsigned int lastTimestamp, int x, int y,
                         unsigned int timestamp, int threshold, CLyPoint& delta, CLyPoint& next);

 private:
  static void __onGripMouseDown(void* data, Evas* e, Evas_Object* obj, void* info);
  static void __onGripMouseUp(void* data, Evas* e, Evas_Object* obj, void* info);
  static void __onGripMouseMoveCb(void* data, Evas* e, Evas_Object* obj, void* info);
  void __onGripMouseMove(Evas_Object* grip, int x, int y, unsigned int timestamp);
  void __setIcon(int index, bool pressed);

  _CLyFocusBoxImpl* _pImpl = nullptr;
};
