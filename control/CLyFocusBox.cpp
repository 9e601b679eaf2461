#include "control/CLyFocusBox.h"

#include <Elementary.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <new>
#include <string>

#include "app-assist/WDeletionHook.h"
#include "common/CLyCairoCanvas.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "platform/core/app_common.h"
#include "platform/uxt_theme.h"

namespace {

const char* const kGripTypeKey = "grip_type";
const char* const kGripIndexKey = "grip_index";
const char* const kIconNormal = "images/pictavo_crop_rectangle.png";
const char* const kIconPressed = "images/pictavo_crop_rectangle_press.png";

// Edge masks: 1 left, 2 right, 4 top, 8 bottom.
const int kGripTypes[CLyFocusBox::kGripCount] = {5, 6, 10, 9};

// Events closer together than this (ms) must move proportionally further.
const unsigned int kFastEventMs = 150;

int scaled(double size) {
  double base = elm_app_base_scale_get();
  if (base <= 0.0) base = 1.0;
  return (int)(size * elm_config_scale_get() / base);
}

std::string resourceFile(const char* name) {
  char* res = app_get_resource_path();
  if (!res) return std::string();
  std::string path = std::string(res) + name;
  free(res);
  return path;
}

// Colour of a colour-table entry as 0..1 components; `fallback` (0..255)
// stays when the table has no such entry.
CLyFloatRectangle themeColor(const char* code, int r, int g, int b, int a) {
  CLyUtil::getThemeColor(code, &r, &g, &b, &a, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                         nullptr);
  return CLyFloatRectangle(r / 255.0f, g / 255.0f, b / 255.0f, a / 255.0f);
}

int dotIndexFromMask(int mask) {
  for (int i = 0; i < CLyFocusBox::kGripCount; ++i)
    if ((mask & kGripTypes[i]) == kGripTypes[i]) return i;
  return 0;
}

}  // namespace

struct _CLyFocusBoxImpl {
  bool enabled = true;
  bool dragging = false;
  bool frozen = false;
  unsigned int lastTimestamp = 0;
  Evas_Object* parent = nullptr;
  Evas_Object* swallow = nullptr;
  Evas_Object* image = nullptr;
  CLyCairoCanvas* canvas = nullptr;
  CLyFocusBox::MoveCallback moveCb;
  CLyFocusBox::PressCallback pressCb;
  Evas_Object* grips[CLyFocusBox::kGripCount] = {};
  Evas_Object* icons[CLyFocusBox::kGripCount] = {};
  CLyPoint lastPos;
  CLyRectangle boxRect;
  int pressedGrip = -1;
  // Region painted since the last clear (x, y, w, h), for clearFrame, and a
  // hole inside it that no paint touched (a frame leaves its inside alone:
  // wiping only the band keeps a handler drag from clearing a whole cell's
  // area on every step).
  CLyFloatRectangle painted;
  bool hasPainted = false;
  CLyFloatRectangle hole;
  bool hasHole = false;

  void addPainted(const CLyFloatRectangle& r, const CLyFloatRectangle* untouched = nullptr) {
    const bool holed = untouched && untouched->x2 > 0 && untouched->y2 > 0;
    if (!hasPainted) {
      painted = r;
      hasPainted = true;
      hasHole = holed;
      if (holed) hole = *untouched;
      return;
    }
    const float x1 = std::min(painted.x1, r.x1), y1 = std::min(painted.y1, r.y1);
    const float x2 = std::max(painted.x1 + painted.x2, r.x1 + r.x2);
    const float y2 = std::max(painted.y1 + painted.y2, r.y1 + r.y2);
    painted = CLyFloatRectangle(x1, y1, x2 - x1, y2 - y1);
    if (!hasHole || !holed) {
      hasHole = false;
      return;
    }
    // Only what every paint left alone stays untouched.
    const float hx1 = std::max(hole.x1, untouched->x1), hy1 = std::max(hole.y1, untouched->y1);
    const float hx2 = std::min(hole.x1 + hole.x2, untouched->x1 + untouched->x2);
    const float hy2 = std::min(hole.y1 + hole.y2, untouched->y1 + untouched->y2);
    hasHole = hx2 > hx1 && hy2 > hy1;
    if (hasHole) hole = CLyFloatRectangle(hx1, hy1, hx2 - hx1, hy2 - hy1);
  }
};

namespace {

// Objects of the box die with their smart parent; forget them then, so the
// destructor never deletes twice.
void onOwnedObjectDel(void* data, Evas_Object* obj) {
  auto* impl = static_cast<_CLyFocusBoxImpl*>(data);
  if (obj == impl->image) {
    delete impl->canvas;  // its surface wraps the object's pixels
    impl->canvas = nullptr;
    impl->image = nullptr;
  }
  for (int i = 0; i < CLyFocusBox::kGripCount; ++i) {
    if (impl->grips[i] == obj) impl->grips[i] = nullptr;
    if (impl->icons[i] == obj) impl->icons[i] = nullptr;
  }
}

void unwatchAndDelete(_CLyFocusBoxImpl* impl, Evas_Object*& obj);

// Foreign smart members outlive a deleted smart parent (evas only lets go of
// them), so the box removes its objects itself when its parent goes.
void onParentDel(void* data, Evas_Object*) {
  auto* impl = static_cast<_CLyFocusBoxImpl*>(data);
  impl->dragging = false;
  for (int i = 0; i < CLyFocusBox::kGripCount; ++i) {
    unwatchAndDelete(impl, impl->grips[i]);
    unwatchAndDelete(impl, impl->icons[i]);
  }
  delete impl->canvas;
  impl->canvas = nullptr;
  unwatchAndDelete(impl, impl->image);
  impl->parent = nullptr;
  impl->swallow = nullptr;
}

void watch(_CLyFocusBoxImpl* impl, Evas_Object* obj) {
  app_assist::wevasobject_add_deletion_hook(obj, onOwnedObjectDel, impl);
}

void unwatchAndDelete(_CLyFocusBoxImpl* impl, Evas_Object*& obj) {
  if (!obj) return;
  app_assist::wevasobject_remove_deletion_hook(obj, onOwnedObjectDel, impl);
  evas_object_del(obj);
  obj = nullptr;
}

}  // namespace

CLyFocusBox::CLyFocusBox() : _pImpl(new (std::nothrow) _CLyFocusBoxImpl) {
  if (!_pImpl) LYLOG_E("Failed to create implement");
}

CLyFocusBox::~CLyFocusBox() {
  if (!_pImpl) return;
  if (_pImpl->parent) app_assist::wevasobject_remove_deletion_hook(_pImpl->parent, onParentDel, _pImpl);
  for (int i = 0; i < kGripCount; ++i) {
    unwatchAndDelete(_pImpl, _pImpl->grips[i]);
    unwatchAndDelete(_pImpl, _pImpl->icons[i]);
  }
  delete _pImpl->canvas;
  _pImpl->canvas = nullptr;
  unwatchAndDelete(_pImpl, _pImpl->image);
  delete _pImpl;
}

bool CLyFocusBox::create(Evas_Object* parent, Evas_Object* swallow) {
  if (!_pImpl) return false;
  if (!parent) {
    LYLOG_E("Invalid param parent");
    return false;
  }
  if (_pImpl->image) {
    LYLOG_W("Already created");
    return true;
  }
  _pImpl->parent = parent;
  _pImpl->swallow = swallow;

  Evas_Coord x = 0, y = 0, w = 0, h = 0;
  evas_object_geometry_get(parent, &x, &y, &w, &h);
  LYLOG_D("size %d %d %d %d", x, y, w, h);

  // The box's objects stay with the collage's other members, so they move,
  // clip and die with it; a plain swallow is not a smart object.
  // (Elementary widgets answer no classic smart class, but they have members.)
  auto isSmart = [](Evas_Object* obj) {
    Eina_List* members = obj ? evas_object_smart_members_get(obj) : nullptr;
    const bool smart = members != nullptr || (obj && evas_object_smart_smart_get(obj));
    eina_list_free(members);
    return smart;
  };
  Evas_Object* smartParent = nullptr;
  if (isSmart(parent))
    smartParent = parent;
  else if (swallow)
    smartParent = isSmart(swallow) ? swallow : evas_object_smart_parent_get(swallow);

  Evas* evas = evas_object_evas_get(parent);
  Evas_Object* image = evas_object_image_filled_add(evas);
  if (!image) {
    LYLOG_E("Failed to add canvas");
    return false;
  }
  evas_object_image_colorspace_set(image, EVAS_COLORSPACE_ARGB8888);
  evas_object_image_alpha_set(image, EINA_TRUE);
  // Covers the parent where it is; a canvas at (0, 0) would miss the part
  // of a parent placed lower or further right.
  _pImpl->canvas =
      new (std::nothrow) CLyCairoCanvas(image, CLyRectangle(x, y, w > 0 ? w : 1, h > 0 ? h : 1), false);
  if (!_pImpl->canvas || !_pImpl->canvas->isValid()) {
    LYLOG_E("Failed to add canvas");
    delete _pImpl->canvas;
    _pImpl->canvas = nullptr;
    evas_object_del(image);
    return false;
  }
  _pImpl->image = image;
  watch(_pImpl, image);
  app_assist::wevasobject_add_deletion_hook(parent, onParentDel, _pImpl);
  evas_object_pass_events_set(image, EINA_TRUE);
  if (smartParent) evas_object_smart_member_add(image, smartParent);
  evas_object_show(image);

  std::string normal = resourceFile(kIconNormal);
  if (normal.empty()) LYLOG_E("Failed to get icon path");
  for (int i = 0; i < kGripCount; ++i) {
    Evas_Object* icon = evas_object_image_filled_add(evas);
    evas_object_image_scale_hint_set(icon, EVAS_IMAGE_SCALE_HINT_STATIC);
    evas_object_pass_events_set(icon, EINA_TRUE);
    if (!normal.empty()) {
      evas_object_image_file_set(icon, normal.c_str(), nullptr);
      if (evas_object_image_load_error_get(icon) != EVAS_LOAD_ERROR_NONE)
        LYLOG_E("Failed to load icon %s", normal.c_str());
    }
    // Colours after joining: an elementary parent gives new members its own colour.
    if (smartParent) evas_object_smart_member_add(icon, smartParent);
    uxt_theme_object_set_color(icon, LY_COLOR_MAIN);
    evas_object_hide(icon);
    _pImpl->icons[i] = icon;
    watch(_pImpl, icon);
  }
  // Grips after the icons: they lie on top and catch the finger.
  for (int i = 0; i < kGripCount; ++i) {
    Evas_Object* grip = evas_object_rectangle_add(evas);
    evas_object_repeat_events_set(grip, EINA_TRUE);
    evas_object_data_set(grip, kGripTypeKey, (void*)(intptr_t)kGripTypes[i]);
    evas_object_data_set(grip, kGripIndexKey, (void*)(intptr_t)(i + 1));
    evas_object_event_callback_add(grip, EVAS_CALLBACK_MOUSE_DOWN, __onGripMouseDown, this);
    evas_object_event_callback_add(grip, EVAS_CALLBACK_MOUSE_UP, __onGripMouseUp, this);
    evas_object_event_callback_add(grip, EVAS_CALLBACK_MOUSE_MOVE, __onGripMouseMoveCb, this);
    if (smartParent) evas_object_smart_member_add(grip, smartParent);
    evas_object_color_set(grip, 0, 0, 0, 0);  // an invisible touch area
    evas_object_hide(grip);
    _pImpl->grips[i] = grip;
    watch(_pImpl, grip);
  }
  return true;
}

void CLyFocusBox::resize() {
  if (!_pImpl || !_pImpl->parent || !_pImpl->canvas) return;
  Evas_Coord x = 0, y = 0, w = 0, h = 0;
  evas_object_geometry_get(_pImpl->parent, &x, &y, &w, &h);
  LYLOG_D("size %d %d %d %d", x, y, w, h);
  _pImpl->canvas->setGeometry(CLyRectangle(x, y, w > 0 ? w : 1, h > 0 ? h : 1));
  _pImpl->canvas->clear();
  _pImpl->hasPainted = false;
  _pImpl->canvas->update();
}

void CLyFocusBox::show(const CLyFloatRectangle& rect, int roundness) {
  if (!_pImpl || !_pImpl->canvas) return;
  CLyFloatRectangle color = themeColor(LY_COLOR_FOCUS, 0x3d, 0xb9, 0xcc, 0xff);
  const int line = scaled(4);
  _pImpl->canvas->strokeRoundRect(color, line, rect, roundness, roundness);
  // The stroke straddles the path: half of it lies left of and above the
  // rectangle, so the dirty region reaches a line width around it.
  const CLyFloatRectangle region(rect.x1 - line, rect.y1 - line, rect.x2 + 2 * line, rect.y2 + 2 * line);
  _pImpl->canvas->update(region);
  // The stroke reaches half a line inside the path, and a rounded corner
  // bends at most `roundness` further in; one more pixel for antialiasing.
  const float inset = line + (roundness > 0 ? roundness : 0) + 1.0f;
  const CLyFloatRectangle inside(rect.x1 + inset, rect.y1 + inset, rect.x2 - 2 * inset, rect.y2 - 2 * inset);
  _pImpl->addPainted(region, &inside);
  _pImpl->boxRect.set((int)floor(rect.x1 + 0.01), (int)floor(rect.y1 + 0.01), (int)floor(rect.x2 + 0.01),
                      (int)floor(rect.y2 + 0.01));
  LYLOG_D("(%d %d %d %d)", _pImpl->boxRect.x, _pImpl->boxRect.y, _pImpl->boxRect.w, _pImpl->boxRect.h);
}

void CLyFocusBox::showDimmed(const CLyFloatRectangle& outer, const CLyFloatRectangle& inner, int roundness) {
  if (!_pImpl || !_pImpl->canvas) return;
  CLyFloatRectangle dim = themeColor(LY_COLOR_DIM, 0, 0, 0, 125);
  dim.y2 = 125 / 255.0f;
  _pImpl->canvas->fillRoundFrame(dim, outer, inner, roundness, roundness);
  _pImpl->canvas->update(outer);
  _pImpl->addPainted(outer);
  show(inner, roundness);
}

void CLyFocusBox::clear() {
  if (!_pImpl) return;
  if (_pImpl->canvas) _pImpl->canvas->clear();
  for (int i = 0; i < kGripCount; ++i) {
    if (_pImpl->grips[i]) evas_object_hide(_pImpl->grips[i]);
    if (_pImpl->icons[i]) evas_object_hide(_pImpl->icons[i]);
  }
  if (_pImpl->canvas) _pImpl->canvas->update();
  _pImpl->hasPainted = false;
}

void CLyFocusBox::clearFrame() {
  if (!_pImpl) return;
  for (int i = 0; i < kGripCount; ++i) {
    if (_pImpl->grips[i]) evas_object_hide(_pImpl->grips[i]);
    if (_pImpl->icons[i]) evas_object_hide(_pImpl->icons[i]);
  }
  if (!_pImpl->canvas || !_pImpl->hasPainted) return;
  if (_pImpl->hasHole) {
    // Four bands around the untouched hole, each cleared and updated alone.
    const CLyFloatRectangle& p = _pImpl->painted;
    const CLyFloatRectangle& h = _pImpl->hole;
    const float px2 = p.x1 + p.x2, py2 = p.y1 + p.y2, hx2 = h.x1 + h.x2, hy2 = h.y1 + h.y2;
    const CLyFloatRectangle bands[4] = {
        CLyFloatRectangle(p.x1, p.y1, p.x2, h.y1 - p.y1),  // above
        CLyFloatRectangle(p.x1, hy2, p.x2, py2 - hy2),     // below
        CLyFloatRectangle(p.x1, h.y1, h.x1 - p.x1, h.y2),  // left
        CLyFloatRectangle(hx2, h.y1, px2 - hx2, h.y2),     // right
    };
    for (const CLyFloatRectangle& b : bands) {
      if (b.x2 <= 0 || b.y2 <= 0) continue;
      _pImpl->canvas->clearRect(b);
      _pImpl->canvas->update(b);
    }
  } else {
    _pImpl->canvas->clearRect(_pImpl->painted);
    _pImpl->canvas->update(_pImpl->painted);
  }
  _pImpl->hasPainted = false;
  _pImpl->hasHole = false;
}

void CLyFocusBox::showHandlers(const std::vector<CLyFloatPoint>& positions) {
  if (!_pImpl) return;
  const int half = scaled(40);
  const int size = scaled(80);
  for (size_t i = 0; i < positions.size() && i < (size_t)kGripCount; ++i) {
    int px = (int)floor(positions[i].x + 0.01);
    int py = (int)floor(positions[i].y + 0.01);
    LYLOG_D("pos: %d %d", px, py);
    Evas_Object* grip = _pImpl->grips[i];
    Evas_Object* icon = _pImpl->icons[i];
    if (grip) {
      evas_object_move(grip, px - half, py - half);
      evas_object_resize(grip, size, size);
      evas_object_show(grip);
      evas_object_raise(grip);
    }
    if (icon) {
      evas_object_move(icon, px - half, py - half);
      evas_object_resize(icon, size, size);
      evas_object_show(icon);
    }
  }
}

void CLyFocusBox::setMoveCallback(MoveCallback cb) {
  if (_pImpl) _pImpl->moveCb = std::move(cb);
}

void CLyFocusBox::setPressCallback(PressCallback cb) {
  if (_pImpl) _pImpl->pressCb = std::move(cb);
}

void CLyFocusBox::setEnabled(bool enabled) {
  if (_pImpl) _pImpl->enabled = enabled;
}

void CLyFocusBox::setFrozen(bool frozen) {
  if (_pImpl) _pImpl->frozen = frozen;
}

bool CLyFocusBox::isDragging() const {
  return _pImpl && _pImpl->dragging;
}

const CLyRectangle& CLyFocusBox::getBoxRect() const {
  static const CLyRectangle kEmpty;
  return _pImpl ? _pImpl->boxRect : kEmpty;
}

Evas_Object* CLyFocusBox::getGrip(int index) const {
  if (!_pImpl || index < 0 || index >= kGripCount) return nullptr;
  return _pImpl->grips[index];
}

Evas_Object* CLyFocusBox::getImageObject() const {
  return _pImpl ? _pImpl->image : nullptr;
}

bool CLyFocusBox::filterMove(const CLyPoint& last, unsigned int lastTimestamp, int x, int y,
                             unsigned int timestamp, int threshold, CLyPoint& delta, CLyPoint& next) {
  const int dx = x - last.x;
  const int dy = y - last.y;
  if (abs(dx) < threshold && abs(dy) < threshold) return false;

  LYLOG_D("range: %d, timestamp: %d", threshold, (int)timestamp);
  unsigned int dt = timestamp - lastTimestamp;
  if (dt < kFastEventMs) {
    // Two events in the same millisecond would divide by zero: count them 1 ms apart.
    if (dt == 0) dt = 1;
    const int range = (int)(((double)kFastEventMs / dt) * threshold);
    LYLOG_D("range: %d", range);
    if (abs(dx) < range && abs(dy) < range) return false;
  }
  delta.x = abs(dx) < threshold ? 0 : dx;
  delta.y = abs(dy) < threshold ? 0 : dy;
  next.x = abs(dx) < threshold ? last.x : x;
  next.y = abs(dy) < threshold ? last.y : y;
  return true;
}

void CLyFocusBox::__onGripMouseMove(Evas_Object* grip, int x, int y, unsigned int timestamp) {
  if (!_pImpl->dragging) return;
  if (_pImpl->frozen) {
    LYLOG_D("Freezed");
    return;
  }
  CLyPoint delta, next;
  if (!filterMove(_pImpl->lastPos, _pImpl->lastTimestamp, x, y, timestamp, scaled(5), delta, next)) return;
  _pImpl->lastTimestamp = timestamp;
  _pImpl->lastPos = next;
  int mask = (int)(intptr_t)evas_object_data_get(grip, kGripTypeKey);
  if (_pImpl->moveCb) _pImpl->moveCb(delta, dotIndexFromMask(mask));
}

void CLyFocusBox::__setIcon(int index, bool pressed) {
  Evas_Object* icon = _pImpl->icons[index];
  if (!icon) return;
  std::string path = resourceFile(pressed ? kIconPressed : kIconNormal);
  if (path.empty()) {
    LYLOG_E("Failed to get icon path");
    return;
  }
  evas_object_image_file_set(icon, path.c_str(), nullptr);
  if (evas_object_image_load_error_get(icon) != EVAS_LOAD_ERROR_NONE)
    LYLOG_E("Failed to load icon %s", path.c_str());
  uxt_theme_object_set_color(icon, LY_COLOR_MAIN);
}

void CLyFocusBox::__onGripMouseDown(void* data, Evas*, Evas_Object* obj, void* info) {
  auto* self = static_cast<CLyFocusBox*>(data);
  auto* ev = static_cast<Evas_Event_Mouse_Down*>(info);
  if (!self || !self->_pImpl || !ev || !self->_pImpl->enabled) return;
  int index = (int)(intptr_t)evas_object_data_get(obj, kGripIndexKey) - 1;
  if (index < 0 || index >= kGripCount) {
    LYLOG_E("Invalid index");
    return;
  }
  self->__setIcon(index, true);
  self->_pImpl->pressedGrip = index;
  self->_pImpl->dragging = true;
  self->_pImpl->lastPos = CLyPoint(ev->output.x, ev->output.y);
  self->_pImpl->lastTimestamp = ev->timestamp;
  if (self->_pImpl->pressCb) self->_pImpl->pressCb(true);
}

void CLyFocusBox::__onGripMouseUp(void* data, Evas*, Evas_Object* obj, void*) {
  auto* self = static_cast<CLyFocusBox*>(data);
  if (!self || !self->_pImpl || !self->_pImpl->dragging) return;
  int index = (int)(intptr_t)evas_object_data_get(obj, kGripIndexKey) - 1;
  if (index >= 0 && index < kGripCount) self->__setIcon(index, false);
  self->_pImpl->pressedGrip = -1;
  self->_pImpl->dragging = false;
  if (self->_pImpl->pressCb) self->_pImpl->pressCb(false);
}

void CLyFocusBox::__onGripMouseMoveCb(void* data, Evas*, Evas_Object* obj, void* info) {
  auto* self = static_cast<CLyFocusBox*>(data);
  auto* ev = static_cast<Evas_Event_Mouse_Move*>(info);
  if (!self || !self->_pImpl || !ev) return;
  self->__onGripMouseMove(obj, ev->cur.output.x, ev->cur.output.y, ev->timestamp);
}
