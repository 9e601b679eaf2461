#include "platform/app.h"

#include <Ecore.h>
#include <Ecore_Evas.h>
#include <Elementary.h>
#include <fcntl.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "common/CLyLog.h"
#include "platform/app_control_private.h"
#include "platform/app_private.h"

struct app_event_handler {
  app_event_type_e type;
  app_event_cb callback;
  void* userData;
};

struct app_event_info {
  app_event_type_e type;
  std::string language;
  app_event_low_memory_status_e lowMemory = APP_EVENT_LOW_MEMORY_SOFT_WARNING;
};

namespace {

struct PostedRequest {
  Ecore_Job* job;
  app_control_h request;
};

// The window manager's view of a window, as its notifications tell it.
struct WatchedWindow {
  Evas_Object* window;
  bool iconified = false;
  bool withdrawn = false;
  bool obscured = false;
};

struct AppState {
  bool running = false;
  bool paused = false;
  bool created = false;
  ui_app_lifecycle_callback_s callbacks{};
  void* userData = nullptr;
  Ecore_Event_Handler* signalHandler = nullptr;
  // ui_app_exit may be called from a signal handler: it only writes to this
  // pipe, and the main loop quits when it reads it.
  int exitPipe[2] = {-1, -1};
  Ecore_Fd_Handler* exitHandler = nullptr;
  volatile sig_atomic_t exitRequested = 0;
  std::vector<PostedRequest> posted;
  std::vector<WatchedWindow> windows;
};

AppState gApp;
std::vector<app_event_handler*> gHandlers;

const char* kWindowSignals[] = {"iconified", "normal", "withdrawn", "fully_obscured", "unobscured"};

bool windowVisible(const WatchedWindow& watched) {
  return evas_object_visible_get(watched.window) && !watched.iconified && !watched.withdrawn &&
         !watched.obscured;
}

void updatePauseState() {
  if (!gApp.running || !gApp.created || gApp.windows.empty()) return;
  bool visible = std::any_of(gApp.windows.begin(), gApp.windows.end(), windowVisible);
  if (!visible && !gApp.paused) {
    gApp.paused = true;
    LYLOG_D("pause");
    if (gApp.callbacks.pause) gApp.callbacks.pause(gApp.userData);
  } else if (visible && gApp.paused) {
    gApp.paused = false;
    LYLOG_D("resume");
    if (gApp.callbacks.resume) gApp.callbacks.resume(gApp.userData);
  }
}

WatchedWindow* findWatched(Evas_Object* win) {
  for (auto& watched : gApp.windows)
    if (watched.window == win) return &watched;
  return nullptr;
}

void onWindowSignal(void* data, Evas_Object* win, void*) {
  const char* signal = static_cast<const char*>(data);
  if (WatchedWindow* watched = findWatched(win)) {
    if (strcmp(signal, "iconified") == 0) watched->iconified = true;
    if (strcmp(signal, "withdrawn") == 0) watched->withdrawn = true;
    if (strcmp(signal, "normal") == 0) watched->iconified = watched->withdrawn = false;
    if (strcmp(signal, "fully_obscured") == 0) watched->obscured = true;
    if (strcmp(signal, "unobscured") == 0) watched->obscured = false;
  }
  updatePauseState();
}

void onWindowShowHide(void*, Evas*, Evas_Object*, void*) {
  updatePauseState();
}

void unwatchWindow(Evas_Object* win);

void onWindowDel(void*, const Efl_Event* ev) {
  unwatchWindow(ev->object);
}

void unwatchWindow(Evas_Object* win) {
  auto it = std::find_if(gApp.windows.begin(), gApp.windows.end(),
                         [win](const WatchedWindow& w) { return w.window == win; });
  if (it == gApp.windows.end()) return;
  gApp.windows.erase(it);
  for (const char* signal : kWindowSignals)
    evas_object_smart_callback_del_full(win, signal, onWindowSignal, signal);
  evas_object_event_callback_del(win, EVAS_CALLBACK_SHOW, onWindowShowHide);
  evas_object_event_callback_del(win, EVAS_CALLBACK_HIDE, onWindowShowHide);
  efl_event_callback_del(win, EFL_EVENT_DEL, onWindowDel, nullptr);
}

void watchExistingWindows() {
  Eina_List* list = ecore_evas_ecore_evas_list_get();
  void* item;
  EINA_LIST_FREE(list, item) {
    auto* ee = static_cast<Ecore_Evas*>(item);
    // Elementary keeps each window's object on its canvas; skip windows
    // that are being deleted.
    auto* win = static_cast<Evas_Object*>(ecore_evas_data_get(ee, "elm_win"));
    if (win && !efl_invalidated_get(win) && elm_win_get(win) == win) ui_app_watch_window(win);
  }
}

void deliverRequest(void* data) {
  auto* request = static_cast<app_control_h>(data);
  auto it = std::find_if(gApp.posted.begin(), gApp.posted.end(),
                         [request](const PostedRequest& p) { return p.request == request; });
  if (it != gApp.posted.end()) gApp.posted.erase(it);
  if (gApp.running && !gApp.exitRequested) {
    watchExistingWindows();
    if (gApp.callbacks.app_control) gApp.callbacks.app_control(request, gApp.userData);
  }
  app_control_destroy(request);
}

bool postRequest(app_control_h request) {
  Ecore_Job* job = ecore_job_add(deliverRequest, request);
  if (!job) {
    LYLOG_E("failed to post the launch request");
    app_control_destroy(request);
    return false;
  }
  gApp.posted.push_back({job, request});
  return true;
}

std::string languageFromEnvironment() {
  const char* lang = getenv("LANGUAGE");
  if (!lang || !*lang) lang = getenv("LANG");
  if (!lang || !*lang) return "en_US";
  std::string result(lang);
  result = result.substr(0, result.find_first_of(":.@"));
  return result.empty() ? "en_US" : result;
}

Eina_Bool onUserSignal(void*, int, void* event) {
  auto* info = static_cast<Ecore_Event_Signal_User*>(event);
  if (info->number == 1) {
    LYLOG_I("SIGUSR1: language changed");
    ui_app_raise_event(APP_EVENT_LANGUAGE_CHANGED, nullptr);
  } else if (info->number == 2) {
    LYLOG_I("SIGUSR2: low memory");
    ui_app_raise_event(APP_EVENT_LOW_MEMORY, nullptr);
  }
  return ECORE_CALLBACK_PASS_ON;
}

Eina_Bool onExitPipe(void*, Ecore_Fd_Handler* handler) {
  char buffer[16];
  while (read(ecore_main_fd_handler_fd_get(handler), buffer, sizeof buffer) > 0) {
  }
  elm_exit();
  return ECORE_CALLBACK_RENEW;
}

bool openExitPipe() {
  if (pipe2(gApp.exitPipe, O_CLOEXEC | O_NONBLOCK) != 0) {
    LYLOG_E("pipe failed: %s", strerror(errno));
    return false;
  }
  gApp.exitHandler =
      ecore_main_fd_handler_add(gApp.exitPipe[0], ECORE_FD_READ, onExitPipe, nullptr, nullptr, nullptr);
  return gApp.exitHandler != nullptr;
}

void closeExitPipe() {
  if (gApp.exitHandler) ecore_main_fd_handler_del(gApp.exitHandler);
  gApp.exitHandler = nullptr;
  for (int& fd : gApp.exitPipe) {
    if (fd >= 0) close(fd);
    fd = -1;
  }
}

void finishRun() {
  while (!gApp.windows.empty()) unwatchWindow(gApp.windows.back().window);
  for (auto& posted : gApp.posted) {
    ecore_job_del(posted.job);
    app_control_destroy(posted.request);
  }
  gApp.posted.clear();
  if (gApp.signalHandler) ecore_event_handler_del(gApp.signalHandler);
  gApp.signalHandler = nullptr;
  closeExitPipe();
}

}  // namespace

int ui_app_main(int argc, char** argv, ui_app_lifecycle_callback_s* callback, void* user_data) {
  if (!callback) {
    LYLOG_E("Invalid callbacks");
    return APP_ERROR_INVALID_PARAMETER;
  }
  if (gApp.running) {
    LYLOG_E("An application is already running");
    return APP_ERROR_ALREADY_RUNNING;
  }
  elm_init(argc, argv);
  gApp.running = true;
  gApp.paused = false;
  gApp.created = false;
  gApp.exitRequested = 0;
  gApp.callbacks = *callback;
  gApp.userData = user_data;
  gApp.signalHandler = ecore_event_handler_add(ECORE_EVENT_SIGNAL_USER, onUserSignal, nullptr);
  openExitPipe();

  int result = APP_ERROR_NONE;
  if (callback->create && !callback->create(user_data)) {
    LYLOG_E("create failed");
    result = APP_ERROR_INVALID_CONTEXT;
  } else {
    gApp.created = true;
    watchExistingWindows();
    if (!gApp.exitRequested) {
      if (app_control_h request = app_control_create_launch_request(argc, argv)) postRequest(request);
      elm_run();
    }
    finishRun();
    gApp.created = false;
    if (callback->terminate) callback->terminate(user_data);
  }
  finishRun();
  gApp.running = false;
  gApp.callbacks = ui_app_lifecycle_callback_s{};
  gApp.userData = nullptr;
  elm_shutdown();
  return result;
}

void ui_app_exit(void) {
  gApp.exitRequested = 1;
  if (gApp.exitPipe[1] >= 0) {
    ssize_t written = write(gApp.exitPipe[1], "x", 1);
    (void)written;
  }
}

int ui_app_add_event_handler(app_event_handler_h* event_handler, app_event_type_e event_type,
                             app_event_cb callback, void* user_data) {
  if (!event_handler || !callback || event_type < APP_EVENT_LOW_MEMORY ||
      event_type > APP_EVENT_SUSPENDED_STATE_CHANGED)
    return APP_ERROR_INVALID_PARAMETER;
  auto* handler = new (std::nothrow) app_event_handler{event_type, callback, user_data};
  if (!handler) return APP_ERROR_OUT_OF_MEMORY;
  gHandlers.push_back(handler);
  *event_handler = handler;
  return APP_ERROR_NONE;
}

int ui_app_remove_event_handler(app_event_handler_h event_handler) {
  auto it = std::find(gHandlers.begin(), gHandlers.end(), event_handler);
  if (!event_handler || it == gHandlers.end()) return APP_ERROR_INVALID_PARAMETER;
  gHandlers.erase(it);
  delete event_handler;
  return APP_ERROR_NONE;
}

int app_event_get_low_memory_status(app_event_info_h event_info, app_event_low_memory_status_e* status) {
  if (!event_info || !status || event_info->type != APP_EVENT_LOW_MEMORY) return APP_ERROR_INVALID_PARAMETER;
  *status = event_info->lowMemory;
  return APP_ERROR_NONE;
}

int app_event_get_language(app_event_info_h event_info, char** lang) {
  if (!event_info || !lang || event_info->type != APP_EVENT_LANGUAGE_CHANGED)
    return APP_ERROR_INVALID_PARAMETER;
  *lang = strdup(event_info->language.c_str());
  return *lang ? APP_ERROR_NONE : APP_ERROR_OUT_OF_MEMORY;
}

Evas_Object* app_get_preinitialized_window(const char*) {
  return nullptr;
}
Evas_Object* app_get_preinitialized_background(void) {
  return nullptr;
}
Evas_Object* app_get_preinitialized_conformant(void) {
  return nullptr;
}

void ui_app_raise_event(app_event_type_e type, const char* language) {
  app_event_info info{type, language ? std::string(language) : languageFromEnvironment()};
  // A handler may remove itself or others: walk a snapshot and skip the
  // handlers that are gone by the time their turn comes.
  std::vector<app_event_handler*> snapshot = gHandlers;
  for (app_event_handler* handler : snapshot) {
    if (std::find(gHandlers.begin(), gHandlers.end(), handler) == gHandlers.end()) continue;
    if (handler->type == type) handler->callback(&info, handler->userData);
  }
}

bool ui_app_post_app_control(app_control_h request) {
  if (!gApp.running || !request) return false;
  app_control_h copy = nullptr;
  if (app_control_clone(&copy, request) != APP_CONTROL_ERROR_NONE) return false;
  return postRequest(copy);
}

bool ui_app_is_running(void) {
  return gApp.running;
}

bool ui_app_is_paused(void) {
  return gApp.paused;
}

void ui_app_watch_window(Evas_Object* window) {
  if (!window || !gApp.running || findWatched(window)) return;
  WatchedWindow watched{window};
  watched.iconified = elm_win_iconified_get(window);
  watched.withdrawn = elm_win_withdrawn_get(window);
  gApp.windows.push_back(watched);
  for (const char* signal : kWindowSignals)
    evas_object_smart_callback_add(window, signal, onWindowSignal, signal);
  evas_object_event_callback_add(window, EVAS_CALLBACK_SHOW, onWindowShowHide, nullptr);
  evas_object_event_callback_add(window, EVAS_CALLBACK_HIDE, onWindowShowHide, nullptr);
  // A window may go while its events are frozen; Evas then holds back its
  // DEL callback, the object-level deletion event still comes.
  efl_event_callback_add(window, EFL_EVENT_DEL, onWindowDel, nullptr);
}
