#include "app-entry/CLyApp.h"

#include <Elementary.h>
#include <signal.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include "app-assist/WContentViewController.h"
#include "app-assist/WNaviframeController.h"
#include "app-assist/WWindowController.h"
#include "common/CLyAppData.h"
#include "common/CLyEvent.h"
#include "common/CLyLog.h"
#include "manager/CLyEventManager.h"
#include "platform/app_control.h"
#include "platform/notification.h"
#include "platform/system_settings.h"

namespace {

constexpr const char* kWindowName = "pictavo";
constexpr double kBaseScale = 2.6;

// The caller id that counts as the gallery, fixed before main runs.
const std::string gGalleryAppId = APP_CONTROL_GALLERY_APP_ID;

// Whether SIGTERM was ignored when the process started, before the main
// loop's libraries installed handlers of their own.
bool sigtermIgnored() {
  struct sigaction current = {};
  return sigaction(SIGTERM, nullptr, &current) == 0 && current.sa_handler == SIG_IGN;
}
const bool gSigtermIgnoredAtStart = sigtermIgnored();

}  // namespace

CLyApp::CLyApp() = default;

CLyApp::~CLyApp() = default;

const char* CLyApp::getGalleryAppId() {
  return gGalleryAppId.c_str();
}

void CLyApp::__onSigterm(int) {
  // Only asks the main loop to end (safe inside a signal handler).
  ui_app_exit();
}

void CLyApp::_installSigtermHandler() {
  struct sigaction action = {};
  action.sa_handler = __onSigterm;
  sigemptyset(&action.sa_mask);
  struct sigaction previous = {};
  if (sigaction(SIGTERM, &action, &previous) != 0) {
    LYLOG_E("Cannot install the SIGTERM handler: %s", strerror(errno));
    return;
  }
  if (previous.sa_handler == SIG_IGN || gSigtermIgnoredAtStart) {
    // Whoever started us wants SIGTERM ignored: keep it so.
    sigaction(SIGTERM, &previous, nullptr);
    if (previous.sa_handler != SIG_IGN) signal(SIGTERM, SIG_IGN);
    LYLOG_W("SIGTERM stays ignored");
  }
}

bool CLyApp::onCreate() {
  _installSigtermHandler();
  elm_app_base_scale_set(kBaseScale);

  CLyAppData* data = CLyAppData::getInstance();
  data->setTextDomain();

  _languageHandler.addEventHandler(
      APP_EVENT_LANGUAGE_CHANGED, [this](app_event_info_h, void*) { _onLanguageChanged(); }, nullptr);
  _lowMemoryHandler.addEventHandler(
      APP_EVENT_LOW_MEMORY, [this](app_event_info_h, void*) { _onLowMemory(); }, nullptr);

  auto* window = new (std::nothrow) app_assist::WWindowController(kWindowName, ELM_WIN_BASIC);
  if (!window) {
    LYLOG_E("Failed to create the window controller");
    return false;
  }
  data->setWindowController(window);
  data->setThemeExtension();
  data->setColorTable();
  data->setFontTable();

  CLyEventManager::getInstance();

  if (!attachWindowController(window)) {
    LYLOG_E("Failed to create the window");
    return false;
  }
  Evas_Object* win = window->getEvasObj();
  elm_win_indicator_opacity_set(win, ELM_WIN_INDICATOR_TRANSPARENT);
  if (Evas_Object* conformant = window->getConformant()) {
    elm_object_signal_emit(conformant, "elm,state,indicator,overlap", "");
    evas_object_data_set(conformant, "overlap", reinterpret_cast<void*>(1));
  }
  // Status messages and the applications launched in group mode belong to
  // this window.
  notification_set_window(win);

  auto* naviframe = new (std::nothrow) app_assist::WNaviframeController();
  if (!naviframe) {
    LYLOG_E("Failed to create the naviframe");
    return false;
  }
  naviframe->setOnLastItemPop([](bool* popOut) {
    // Leaving the last screen ends the program.
    *popOut = true;
    ui_app_exit();
  });
  window->attachBaseViewController(naviframe);
  return true;
}

void CLyApp::_onLanguageChanged() {
  char* language = nullptr;
  int ret = system_settings_get_value_string(SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE, &language);
  if (ret != SYSTEM_SETTINGS_ERROR_NONE || !language) {
    LYLOG_E("Failed to get the language[%d]", ret);
  } else {
    elm_language_set(language);
    free(language);
  }
  CLyEventManager::getInstance()->notify(CLyEvent(CLyEvent::LANGUAGE_CHANGED, CLyEvent::MODE_THROTTLED, 0));
}

void CLyApp::_onLowMemory() {
  CLyEventManager::getInstance()->notify(CLyEvent(CLyEvent::LOW_MEMORY, CLyEvent::MODE_THROTTLED, 0));
}

void CLyApp::onPause() {
  CLyEventManager::getInstance()->notify(CLyEvent(CLyEvent::APP_PAUSED, CLyEvent::MODE_IMMEDIATE, 0));
}

void CLyApp::onResume() {}

void CLyApp::onTerminate() {
  // The window controller pointer is not used after this point.
  CLyAppData::destroyInstance();
}

void CLyApp::onAppControl(app_control_h request, bool firstLaunch) {
  char* caller = nullptr;
  app_control_get_caller(request, &caller);
  bool fromGallery = caller && gGalleryAppId == caller;
  free(caller);
  if (fromGallery) {
    LYLOG_W("Caller is Gallery");
  } else {
    LYLOG_W("Caller is Homescreen");
  }
  if (!firstLaunch) return;
  if (!fromGallery) _launchedFromHome = true;
  // The collage screen takes this place once it exists; until then the
  // window shows a placeholder page.
  _pushPlaceholder();
}

void CLyApp::_pushPlaceholder() {
  app_assist::WWindowController* window = getWindowController();
  auto* naviframe =
      window ? dynamic_cast<app_assist::WNaviframeController*>(window->getBaseViewController()) : nullptr;
  if (!naviframe) {
    LYLOG_E("Failed to get frame");
    return;
  }
  auto* page = new (std::nothrow) app_assist::WContentViewController(kWindowName);
  if (!page) {
    LYLOG_E("Failed to create the page");
    return;
  }
  page->setTitle("Pictavo");
  naviframe->push(page);
}
