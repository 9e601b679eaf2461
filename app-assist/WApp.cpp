#include "app-assist/WApp.h"

#include <cstdio>

#include "app-assist/WDeletionHook.h"
#include "app-assist/WMenuPopupController.h"
#include "app-assist/WViewController.h"
#include "app-assist/WWindowController.h"
#include "common/CLyLog.h"

namespace app_assist {

struct _WAppImpl {
  WWindowController* _window = nullptr;
  bool _firstLaunch = true;
};

const char* WApp::getVersion() {
  static char version[24] = {0};
  if (!version[0]) snprintf(version, sizeof version, "%d.%d.%d", 2, 1, 9);
  return version;
}

WApp::WApp() : _pv(new _WAppImpl) {
  LYLOG_D("app_assist %s", getVersion());
}

WApp::~WApp() {
  // The window may outlive the application object (it goes with elm
  // shutdown); stop listening for its deletion.
  if (_pv->_window && _pv->_window->getEvasObj())
    wevasobject_remove_deletion_hook(_pv->_window->getEvasObj(), __onWindowDel, this);
  delete _pv;
}

int WApp::run(int argc, char** argv) {
  ui_app_lifecycle_callback_s callbacks{};
  callbacks.create = __onCreate;
  callbacks.terminate = __onTerminate;
  callbacks.pause = __onPause;
  callbacks.resume = __onResume;
  callbacks.app_control = __onAppControl;
  return ui_app_main(argc, argv, &callbacks, this);
}

bool WApp::attachWindowController(WWindowController* window) {
  WASSERT_MSG(_pv->_window == nullptr, "_pv->_window == nullptr");
  if (!window) {
    LYLOG_E("Invalid window controller");
    return false;
  }
  _pv->_window = window;
  bool created = window->create();
  // The window controller deletes itself with its window; forget it then so
  // terminate does not reach a deleted controller.
  if (Evas_Object* win = window->getEvasObj())
    wevasobject_add_deletion_hook(win, __onWindowDel, this);
  else
    LYLOG_E("Window is not created");
  return created;
}

WWindowController* WApp::getWindowController() const {
  return _pv->_window;
}

void WApp::__onWindowDel(void* data, Evas_Object*) {
  static_cast<WApp*>(data)->_pv->_window = nullptr;
}

bool WApp::__onCreate(void* data) {
  return static_cast<WApp*>(data)->onCreate();
}

void WApp::__onTerminate(void* data) {
  auto* app = static_cast<WApp*>(data);
  app->onTerminate();
  if (WWindowController* window = app->_pv->_window) window->destroyBaseViewController();
}

void WApp::__onPause(void* data) {
  WMenuPopupController::destroyCurrentMenu();
  static_cast<WApp*>(data)->onPause();
}

void WApp::__onResume(void* data) {
  static_cast<WApp*>(data)->onResume();
}

void WApp::__onAppControl(app_control_h request, void* data) {
  auto* app = static_cast<WApp*>(data);
  app->onAppControl(request, app->_pv->_firstLaunch);
  app->_pv->_firstLaunch = false;
}

}  // namespace app_assist
