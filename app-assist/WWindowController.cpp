#include "app-assist/WWindowController.h"

#include <cstdlib>
#include <cstring>
#include <string>

#include "app-assist/WDefine.h"
#include "app-assist/WDeletionHook.h"
#include "app-assist/WViewController.h"
#include "common/CLyLog.h"
#include "platform/app.h"
#include "platform/core/app_common.h"
#include "platform/efl_extension.h"

namespace app_assist {

namespace {
// The desktop window opens at a phone-like size.
constexpr int kDesktopWidth = 540;
constexpr int kDesktopHeight = 960;
// The framework's own base layout, for themes without the platform's.
void _setFallbackLayout(Evas_Object* layout) {
  char* res = app_get_resource_path();
  if (!res) {
    LYLOG_E("Failed to get resource path=nullptr");
    return;
  }
  std::string edj = std::string(res) + "edje/WDefaultView.edj";
  free(res);
  if (!elm_layout_file_set(layout, edj.c_str(), "application")) LYLOG_E("Cannot load %s", edj.c_str());
}

}  // namespace

struct _WWindowControllerImpl {
  Evas_Object* _win = nullptr;
  Evas_Object* _baseLayout = nullptr;
  Evas_Object* _conformant = nullptr;
  WViewController* _baseViewController = nullptr;
  // The base view controller deletes itself with its object; the weak
  // pointer tells whether it is still there.
  WViewControllerWeakPtr _baseViewWeak;
  char* _name = nullptr;
  Elm_Win_Type _winType = ELM_WIN_BASIC;
  WWindowController::CreateWinHandler _createWinHandler;
  WWindowController::CreateBaseLayoutHandler _createBaseLayoutHandler;
  WWindowController::BackKeyHandler _backKeyHandler;
};

WWindowController::WWindowController(const char* name, Elm_Win_Type type) : _pv(new _WWindowControllerImpl) {
  WASSERT_MSG(name, "name");
  _pv->_name = strdup(name);
  _pv->_winType = type;
}

WWindowController::~WWindowController() {
  free(_pv->_name);
  delete _pv;
}

const char* WWindowController::getClassName() const {
  return "WWindowController";
}
Evas_Object* WWindowController::getEvasObj() const {
  return _pv->_win;
}
Evas_Object* WWindowController::getBaseLayout() const {
  return _pv->_baseLayout;
}
Evas_Object* WWindowController::getConformant() const {
  return _pv->_conformant;
}
WViewController* WWindowController::getBaseViewController() const {
  return _pv->_baseViewWeak.expired() ? nullptr : _pv->_baseViewController;
}
const char* WWindowController::getName() const {
  return _pv->_name;
}

bool WWindowController::create() {
  if (_pv->_win) return true;
  if (!precreate()) return false;
  evas_object_show(_pv->_win);
  return true;
}

bool WWindowController::precreate() {
  if (_pv->_win) return true;
  Evas_Object* win = _pv->_createWinHandler ? _pv->_createWinHandler() : onCreateWin();
  if (!win) {
    LYLOG_E("Failed to create window");
    return false;
  }
  Evas_Object* conformant = nullptr;
  Evas_Object* baseLayout = _pv->_createBaseLayoutHandler ? _pv->_createBaseLayoutHandler(win, &conformant)
                                                          : onCreateBaseLayout(win, &conformant);
  _pv->_win = win;
  _pv->_baseLayout = baseLayout;
  _pv->_conformant = conformant;

  LYLOG_D("set window instance data");
  evas_object_data_set(win, kWindowInstanceKey, static_cast<IWWindowController*>(this));
  if (baseLayout) evas_object_data_set(baseLayout, kBaseLayoutTagKey, static_cast<IWWindowController*>(this));

  evas_object_smart_callback_add(
      win, "delete,request", [](void*, Evas_Object*, void*) { elm_exit(); }, nullptr);
  wevasobject_add_deletion_hook(win, __onWindowDel, this);
  if (_pv->_backKeyHandler) eext_object_event_callback_add(win, EEXT_CALLBACK_BACK, __onBackKey, this);
  return true;
}

void WWindowController::__onWindowDel(void* data, Evas_Object*) {
  auto* self = static_cast<WWindowController*>(data);
  self->_pv->_win = nullptr;
  self->_pv->_baseLayout = nullptr;
  self->_pv->_conformant = nullptr;
  self->onDestroy();
  delete self;
}

void WWindowController::__onBackKey(void* data, Evas_Object* obj, void* event) {
  auto* self = static_cast<WWindowController*>(data);
  if (self->_pv->_backKeyHandler) self->_pv->_backKeyHandler(obj, event);
}

bool WWindowController::attachBaseViewController(WViewController* vc, void* param) {
  WASSERT_MSG(getBaseViewController() == nullptr, "_pv->_baseViewController == nullptr");
  if (!vc) {
    LYLOG_E("Invalid view controller");
    return false;
  }
  if (_pv->_baseLayout && !vc->create(_pv->_baseLayout, param)) {
    LYLOG_E("Failed to create the base view controller");
    return false;
  }
  onAttachBaseViewController(vc);
  _pv->_baseViewController = vc;
  _pv->_baseViewWeak = vc->getWeakPtr();
  return true;
}

WViewController* WWindowController::detachBaseViewController() {
  WViewController* vc = getBaseViewController();
  onDetachBaseViewController(vc);
  _pv->_baseViewController = nullptr;
  _pv->_baseViewWeak.reset();
  return vc;
}

void WWindowController::destroyBaseViewController() {
  WViewController* vc = getBaseViewController();
  _pv->_baseViewController = nullptr;
  _pv->_baseViewWeak.reset();
  if (vc) vc->destroy();
}

void WWindowController::destroy() {
  if (_pv->_win) {
    evas_object_del(_pv->_win);
    return;
  }
  onDestroy();
  delete this;
}

void WWindowController::setOnCreateWin(CreateWinHandler handler) {
  _pv->_createWinHandler = std::move(handler);
}
void WWindowController::setOnCreateBaseLayout(CreateBaseLayoutHandler handler) {
  _pv->_createBaseLayoutHandler = std::move(handler);
}
void WWindowController::setOnBackKey(BackKeyHandler handler) {
  bool registered = static_cast<bool>(_pv->_backKeyHandler);
  _pv->_backKeyHandler = std::move(handler);
  // A window that already exists gets the key from now on.
  if (_pv->_win && !registered && _pv->_backKeyHandler)
    eext_object_event_callback_add(_pv->_win, EEXT_CALLBACK_BACK, __onBackKey, this);
}

Evas_Object* WWindowController::onCreateWin() {
  Evas_Object* win = app_get_preinitialized_window(_pv->_name);
  if (!win) win = elm_win_add(nullptr, _pv->_name, _pv->_winType);
  if (!win) {
    LYLOG_E("Fail to create win!");
    return nullptr;
  }
  elm_win_title_set(win, _pv->_name);
  elm_win_conformant_set(win, EINA_TRUE);
  elm_win_autodel_set(win, EINA_TRUE);
  if (elm_win_wm_rotation_supported_get(win)) {
    const int rotations[4] = {0, 90, 180, 270};
    elm_win_wm_rotation_available_rotations_set(win, rotations, 4);
  }
  elm_win_indicator_mode_set(win, ELM_WIN_INDICATOR_SHOW);
  elm_win_indicator_opacity_set(win, ELM_WIN_INDICATOR_OPAQUE);
  evas_object_resize(win, kDesktopWidth, kDesktopHeight);
  return win;
}

Evas_Object* WWindowController::onCreateBaseLayout(Evas_Object* win, Evas_Object** conformant) {
  Evas_Object* bg = app_get_preinitialized_background();
  if (!bg) bg = elm_bg_add(win);
  evas_object_size_hint_weight_set(bg, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_win_resize_object_add(win, bg);
  evas_object_show(bg);

  Evas_Object* conform = app_get_preinitialized_conformant();
  if (!conform) conform = elm_conformant_add(win);
  evas_object_size_hint_weight_set(conform, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_win_resize_object_add(win, conform);
  evas_object_show(conform);

  Evas_Object* layout = elm_layout_add(conform);
  if (!elm_layout_theme_set(layout, "layout", "application", "default")) _setFallbackLayout(layout);
  evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_object_content_set(conform, layout);
  evas_object_show(layout);
  if (conformant) *conformant = conform;
  return layout;
}

void WWindowController::onAttachBaseViewController(WViewController* vc) {
  if (!_pv->_baseLayout) {
    LYLOG_W("base layout does not exist!");
    return;
  }
  elm_object_part_content_set(_pv->_baseLayout, "elm.swallow.content", vc->getEvasObj());
}

void WWindowController::onDetachBaseViewController(WViewController*) {}
void WWindowController::onDestroy() {}

}  // namespace app_assist
