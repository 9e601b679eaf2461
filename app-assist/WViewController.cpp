#include "app-assist/WViewController.h"

#include <cstdlib>
#include <cstring>

#include "app-assist/IWWindowController.h"
#include "app-assist/WDefine.h"
#include "app-assist/WDeletionHook.h"
#include "common/CLyLog.h"

namespace app_assist {

struct WViewControllerImpl {
  Evas_Object* _obj = nullptr;
  char* _name = nullptr;
  WViewControllerWeakPtr _popup;
  WViewController::CreateViewFunc _createViewFunc;
  IWWindowController* _windowController = nullptr;
  std::shared_ptr<WViewController> _self;
};

namespace {

Evas_Object* parentOf(Evas_Object* obj) {
  if (elm_object_widget_check(obj)) {
    if (Evas_Object* parent = elm_object_parent_widget_get(obj)) return parent;
  }
  return evas_object_smart_parent_get(obj);
}

Evas_Object* findUpwards(Evas_Object* from, const char* key) {
  for (Evas_Object* obj = from; obj; obj = parentOf(obj))
    if (evas_object_data_get(obj, key)) return obj;
  return nullptr;
}

}  // namespace

WViewController::WViewController() : _pv(new WViewControllerImpl) {}

WViewController::~WViewController() {
  _pv->_self.reset();
  free(_pv->_name);
  delete _pv;
}

const char* WViewController::getClassName() const {
  return "WViewController";
}

bool WViewController::create(Evas_Object* parent, void* param) {
  if (_pv->_obj) return true;
  if (!onCreate(param)) return false;
  Evas_Object* view =
      _pv->_createViewFunc ? _pv->_createViewFunc(parent, param) : onCreateView(parent, param);
  if (!view) {
    LYLOG_E("No view object created!");
    return false;
  }
  // The view may not be linked into the widget tree yet: search from its
  // parent as well.
  Evas_Object* holder = findUpwards(view, kWindowInstanceKey);
  if (!holder && parent) holder = findUpwards(parent, kWindowInstanceKey);
  WASSERT_MSG(holder, "Cannot find window controll.");
  _pv->_windowController = static_cast<IWWindowController*>(evas_object_data_get(holder, kWindowInstanceKey));

  if (_pv->_name) evas_object_name_set(view, _pv->_name);
  evas_object_data_set(view, kViewInstanceKey, this);
  wevasobject_add_deletion_hook(view, __onViewDel, this);
  _pv->_obj = view;
  onCreated();
  return true;
}

void WViewController::__onViewDel(void* data, Evas_Object* obj) {
  auto* self = static_cast<WViewController*>(data);
  evas_object_data_del(obj, kViewInstanceKey);
  // A popup shown for this view must not outlive it: its handlers refer to
  // the view.
  self->destroyPopup();
  self->onDestroy();
  self->_pv->_obj = nullptr;
  self->_pv->_self.reset();
  delete self;
}

void WViewController::destroy() {
  if (_pv->_obj) {
    evas_object_del(_pv->_obj);
    return;
  }
  onDestroy();
  _pv->_self.reset();
  delete this;
}

Evas_Object* WViewController::getEvasObj() const {
  return _pv->_obj;
}

void WViewController::setName(const char* name) {
  free(_pv->_name);
  _pv->_name = name ? strdup(name) : nullptr;
  if (_pv->_obj && _pv->_name) evas_object_name_set(_pv->_obj, _pv->_name);
}

const char* WViewController::getName() const {
  return _pv->_name;
}

IWWindowController* WViewController::getWindowController() const {
  return _pv->_windowController;
}

WViewControllerWeakPtr WViewController::getWeakPtr() {
  if (!_pv->_self) _pv->_self = std::shared_ptr<WViewController>(this, [](WViewController*) {});
  return _pv->_self;
}

Evas_Object* WViewController::getWindowBaseLayoutEvasObj() const {
  if (!_pv->_windowController) {
    LYLOG_E("Fail to get base layout!");
    return nullptr;
  }
  return _pv->_windowController->getBaseLayout();
}

void WViewController::setOnCreateView(CreateViewFunc func) {
  _pv->_createViewFunc = std::move(func);
}

bool WViewController::setPartContent(const char* part, WViewController* child) {
  if (!_pv->_obj) {
    LYLOG_E("Container object is not yet created!");
    return false;
  }
  if (!child || !child->create(_pv->_obj, nullptr)) {
    LYLOG_E("Fail to create the view");
    return false;
  }
  elm_object_part_content_set(_pv->_obj, part, child->getEvasObj());
  return true;
}

WViewController* WViewController::getPartContent(const char* part) const {
  if (!_pv->_obj) {
    LYLOG_E("Container object is not yet created!");
    return nullptr;
  }
  Evas_Object* content = elm_object_part_content_get(_pv->_obj, part);
  if (!content) {
    LYLOG_W("Content has not been set or the part does not exist!");
    return nullptr;
  }
  auto* vc = fromEvasObj(content);
  if (!vc) LYLOG_E("This is not a view controller object");
  return vc;
}

void WViewController::attachPopup(WViewController* popup) {
  if (!popup) {
    LYLOG_E("Invalid popup");
    return;
  }
  Evas_Object* parent = _pv->_obj ? findUpwards(_pv->_obj, kBaseLayoutTagKey) : nullptr;
  if (!parent) {
    LYLOG_E("Cannot find parent View!");
    parent = _pv->_obj ? elm_object_top_widget_get(_pv->_obj) : nullptr;
  }
  if (!popup->create(parent, nullptr)) {
    LYLOG_E("Fail to create the popup");
    popup->destroy();
    return;
  }
  WViewControllerWeakPtr previous = _pv->_popup;
  _pv->_popup = popup->getWeakPtr();
  if (auto old = previous.lock()) old->destroy();
}

void WViewController::destroyPopup() {
  WViewControllerWeakPtr popup = _pv->_popup;
  _pv->_popup.reset();
  if (auto alive = popup.lock()) alive->destroy();
}

WViewController* WViewController::fromEvasObj(Evas_Object* obj) {
  return obj ? static_cast<WViewController*>(evas_object_data_get(obj, kViewInstanceKey)) : nullptr;
}

bool WViewController::onCreate(void*) {
  return true;
}
Evas_Object* WViewController::onCreateView(Evas_Object*, void*) {
  return nullptr;
}
void WViewController::onCreated() {}
void WViewController::onDestroy() {}

}  // namespace app_assist
