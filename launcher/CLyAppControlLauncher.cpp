#include "launcher/CLyAppControlLauncher.h"

#include <Ecore.h>

#include <memory>

#include "app-assist/IWEvasObject.h"
#include "common/CLyLog.h"

struct _CLyAppControlLauncherImpl {
  Ecore_Timer* freezeTimer = nullptr;
  std::weak_ptr<app_assist::IWEvasObject> frozenObj;
  app_control_h request = nullptr;
};

namespace {
CLyAppControlLauncher* gInstance = nullptr;
}

CLyAppControlLauncher* CLyAppControlLauncher::getInstance() {
  if (!gInstance) gInstance = new (std::nothrow) CLyAppControlLauncher;
  if (!gInstance) LYLOG_E("Failed to create the launcher");
  return gInstance;
}

void CLyAppControlLauncher::destroy() {
  CLyAppControlLauncher* instance = gInstance;
  gInstance = nullptr;
  delete instance;
}

CLyAppControlLauncher::CLyAppControlLauncher() : _pv(new _CLyAppControlLauncherImpl) {}

CLyAppControlLauncher::~CLyAppControlLauncher() {
  _clearAll();
  delete _pv;
}

bool CLyAppControlLauncher::sendLaunchRequest(app_control_h request, app_control_reply_cb reply,
                                              void* userData, Evas_Object* freezeObj, double freezeSeconds) {
  _clearAll();
  if (!request) {
    LYLOG_E("Invalid request");
    return false;
  }
  _pv->request = request;
  if (freezeObj) {
    _pv->frozenObj = app_assist::wevasobject_get_weak_ptr(freezeObj);
    evas_object_freeze_events_set(freezeObj, EINA_TRUE);
    _pv->freezeTimer = ecore_timer_add(freezeSeconds, __onFreezeTimer, this);
    // Evas holds back every callback of an object whose events are frozen,
    // its DEL callback included; the object-level deletion event still comes.
    efl_event_callback_add(freezeObj, EFL_EVENT_DEL, __onFrozenObjDel, this);
  }
  int ret = app_control_send_launch_request(request, reply, userData);
  if (ret != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control ret error code= %d", ret);
    app_control_destroy(_pv->request);
    _pv->request = nullptr;
    return false;
  }
  return true;
}

void CLyAppControlLauncher::_clearAll() {
  if (_pv->request) {
    int ret = app_control_send_terminate_request(_pv->request);
    if (ret != APP_CONTROL_ERROR_NONE) LYLOG_W("app_control ret error code= %d", ret);
    app_control_destroy(_pv->request);
    _pv->request = nullptr;
  }
  _releaseFreeze();
}

bool CLyAppControlLauncher::hasCurrentRequest() const {
  return _pv->request != nullptr;
}

bool CLyAppControlLauncher::isFreezing() const {
  return _pv->freezeTimer != nullptr || !_pv->frozenObj.expired();
}

void CLyAppControlLauncher::_releaseFreeze() {
  if (auto frozen = _pv->frozenObj.lock()) {
    Evas_Object* obj = frozen->getEvasObj();
    evas_object_freeze_events_set(obj, EINA_FALSE);
    efl_event_callback_del(obj, EFL_EVENT_DEL, __onFrozenObjDel, this);
  }
  _pv->frozenObj.reset();
  if (_pv->freezeTimer) {
    ecore_timer_del(_pv->freezeTimer);
    _pv->freezeTimer = nullptr;
  }
}

Eina_Bool CLyAppControlLauncher::__onFreezeTimer(void* data) {
  auto* self = static_cast<CLyAppControlLauncher*>(data);
  // Returning cancel removes the timer; forget it before releasing.
  self->_pv->freezeTimer = nullptr;
  self->_releaseFreeze();
  return ECORE_CALLBACK_CANCEL;
}

void CLyAppControlLauncher::__onFrozenObjDel(void* data, const Efl_Event*) {
  auto* self = static_cast<CLyAppControlLauncher*>(data);
  // The object is going: nothing to unfreeze on it; the timer goes too.
  self->_pv->frozenObj.reset();
  if (self->_pv->freezeTimer) {
    ecore_timer_del(self->_pv->freezeTimer);
    self->_pv->freezeTimer = nullptr;
  }
}
