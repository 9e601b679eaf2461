#include "app-assist/WAppEventHandler.h"

#include "common/CLyLog.h"

namespace app_assist {

struct _WAppEventHandlerImpl {
  app_event_handler_h _handle = nullptr;
  void* _userData = nullptr;
  WAppEventHandler::Handler _handler;
};

WAppEventHandler::WAppEventHandler() : _pv(new _WAppEventHandlerImpl) {}

WAppEventHandler::~WAppEventHandler() {
  removeEventHandler();
  delete _pv;
}

bool WAppEventHandler::addEventHandler(app_event_type_e type, Handler handler, void* userData) {
  removeEventHandler();
  _pv->_handler = std::move(handler);
  _pv->_userData = userData;
  int ret = ui_app_add_event_handler(&_pv->_handle, type, __dispatch, _pv);
  if (ret != APP_ERROR_NONE) {
    LYLOG_E("ui_app_add_event_handler failed [%d]", ret);
    _pv->_handle = nullptr;
    return false;
  }
  return true;
}

void WAppEventHandler::removeEventHandler() {
  if (_pv->_handle) ui_app_remove_event_handler(_pv->_handle);
  _pv->_handle = nullptr;
  _pv->_userData = nullptr;
}

bool WAppEventHandler::isRegistered() const {
  return _pv->_handle != nullptr;
}

void WAppEventHandler::__dispatch(app_event_info_h event, void* data) {
  auto* pv = static_cast<_WAppEventHandlerImpl*>(data);
  // A copy: the handler may re-register or remove this very handler.
  Handler handler = pv->_handler;
  if (handler) handler(event, pv->_userData);
}

}  // namespace app_assist
