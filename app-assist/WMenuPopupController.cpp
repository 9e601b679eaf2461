#include "app-assist/WMenuPopupController.h"

#include <vector>

#include "app-assist/IWEvasObject.h"
#include "app-assist/WDeletionHook.h"
#include "common/CLyLog.h"
#include "platform/efl_extension.h"

namespace app_assist {

namespace {
// The menu that is open now, anywhere in the process.
Evas_Object* gCurrentMenu = nullptr;
}  // namespace

struct _WMenuPopupControllerImpl {
  Evas_Object* _win = nullptr;
  Evas_Object* _layout = nullptr;
  // The window and layout may go before the menu (or be half-deleted when
  // it goes): their callbacks are only removed while they still exist.
  std::weak_ptr<IWEvasObject> _winRef;
  std::weak_ptr<IWEvasObject> _layoutRef;
  Evas_Object* _ctxpopup = nullptr;
  std::vector<std::function<void()>> _itemCallbacks;
};

WMenuPopupController::WMenuPopupController() : _mp(new _WMenuPopupControllerImpl) {}

WMenuPopupController::~WMenuPopupController() {
  delete _mp;
}

const char* WMenuPopupController::getClassName() const {
  return "WMenuPopupController";
}

bool WMenuPopupController::createMenu(Evas_Object* window, Evas_Object* layout) {
  _mp->_win = window;
  _mp->_layout = layout;
  return create(window, nullptr);
}

Evas_Object* WMenuPopupController::onCreateView(Evas_Object*, void*) {
  if (!_mp->_win) {
    LYLOG_E("Call createMenu first!");
    return nullptr;
  }
  Evas_Object* ctx = elm_ctxpopup_add(_mp->_win);
  if (!ctx) {
    LYLOG_E("Cannot create ctxpopup");
    return nullptr;
  }
  // Themes without the device's menu style get the plain ctxpopup.
  if (!elm_object_style_set(ctx, "more/default")) elm_object_style_set(ctx, "default");
  elm_ctxpopup_auto_hide_disabled_set(ctx, EINA_TRUE);
  eext_object_event_callback_add(ctx, EEXT_CALLBACK_BACK, __onBackKey, this);
  eext_object_event_callback_add(ctx, EEXT_CALLBACK_MORE, __onBackKey, this);
  if (_mp->_layout) {
    _mp->_layoutRef = wevasobject_get_weak_ptr(_mp->_layout);
    evas_object_event_callback_add(_mp->_layout, EVAS_CALLBACK_RESIZE, __onLayoutResize, this);
  }
  _mp->_winRef = wevasobject_get_weak_ptr(_mp->_win);
  evas_object_smart_callback_add(_mp->_win, "rotation,changed", __onRotationChanged, this);
  elm_ctxpopup_direction_priority_set(ctx, ELM_CTXPOPUP_DIRECTION_DOWN, ELM_CTXPOPUP_DIRECTION_UP,
                                      ELM_CTXPOPUP_DIRECTION_UNKNOWN, ELM_CTXPOPUP_DIRECTION_UNKNOWN);
  evas_object_smart_callback_add(ctx, "dismissed", __onDismissed, this);
  evas_object_smart_callback_add(ctx, "language,changed", __onDismissed, this);
  // Must run before the view controller's own deletion handling deletes this.
  wevasobject_add_deletion_hook(ctx, __onMenuDel, this, true);
  _mp->_ctxpopup = ctx;
  gCurrentMenu = ctx;
  return ctx;
}

void WMenuPopupController::__onMenuDel(void* data, Evas_Object* obj) {
  auto* self = static_cast<WMenuPopupController*>(data);
  if (gCurrentMenu == obj) gCurrentMenu = nullptr;
  if (auto layout = self->_mp->_layoutRef.lock())
    evas_object_event_callback_del_full(layout->getEvasObj(), EVAS_CALLBACK_RESIZE, __onLayoutResize, self);
  if (auto win = self->_mp->_winRef.lock())
    evas_object_smart_callback_del_full(win->getEvasObj(), "rotation,changed", __onRotationChanged, self);
  self->_mp->_layoutRef.reset();
  self->_mp->_winRef.reset();
  self->_mp->_layout = nullptr;
  self->_mp->_win = nullptr;
  self->_mp->_ctxpopup = nullptr;
}

void WMenuPopupController::_move() {
  if (!_mp->_ctxpopup || _mp->_winRef.expired()) return;
  int w = 0, h = 0;
  elm_win_screen_size_get(_mp->_win, nullptr, nullptr, &w, &h);
  int rotation = elm_win_rotation_get(_mp->_win);
  if (rotation == 90 || rotation == 270) {
    int t = w;
    w = h;
    h = t;
  }
  evas_object_move(_mp->_ctxpopup, w / 2, h);
}

void WMenuPopupController::__onLayoutResize(void* data, Evas*, Evas_Object*, void*) {
  static_cast<WMenuPopupController*>(data)->_move();
}

void WMenuPopupController::__onRotationChanged(void* data, Evas_Object*, void*) {
  static_cast<WMenuPopupController*>(data)->_move();
}

void WMenuPopupController::__onDismissed(void*, Evas_Object* obj, void*) {
  evas_object_del(obj);
}

void WMenuPopupController::__onBackKey(void*, Evas_Object* obj, void*) {
  // An empty menu has nothing to animate away, so it would never report
  // its dismissal.
  if (!elm_ctxpopup_first_item_get(obj))
    evas_object_del(obj);
  else
    elm_ctxpopup_dismiss(obj);
}

Elm_Object_Item* WMenuPopupController::appendItem(const char* label, std::function<void()> cb) {
  if (!_mp->_ctxpopup) {
    LYLOG_E("Create pop-up first!");
    return nullptr;
  }
  _mp->_itemCallbacks.push_back(std::move(cb));
  auto index = static_cast<intptr_t>(_mp->_itemCallbacks.size() - 1);
  return elm_ctxpopup_item_append(_mp->_ctxpopup, label, nullptr, __onItemSelected,
                                  reinterpret_cast<void*>(index));
}

void WMenuPopupController::__onItemSelected(void* data, Evas_Object* obj, void*) {
  auto* self = static_cast<WMenuPopupController*>(fromEvasObj(obj));
  if (!self) return;
  auto index = static_cast<size_t>(reinterpret_cast<intptr_t>(data));
  if (index >= self->_mp->_itemCallbacks.size()) return;
  WViewControllerWeakPtr weak = self->getWeakPtr();
  Evas_Object* ctx = self->_mp->_ctxpopup;
  // A copy: the callback may close the menu, which frees the list.
  std::function<void()> cb = self->_mp->_itemCallbacks[index];
  if (cb) cb();
  if (!weak.expired() && ctx) evas_object_del(ctx);
}

bool WMenuPopupController::showMenu() {
  if (!_mp->_ctxpopup) {
    LYLOG_E("Pop-up is Not created!");
    return false;
  }
  _move();
  evas_object_show(_mp->_ctxpopup);
  return true;
}

void WMenuPopupController::destroyCurrentMenu() {
  if (Evas_Object* menu = gCurrentMenu) {
    gCurrentMenu = nullptr;
    evas_object_del(menu);
  }
}

Evas_Object* WMenuPopupController::getCurrentMenu() {
  return gCurrentMenu;
}

}  // namespace app_assist
