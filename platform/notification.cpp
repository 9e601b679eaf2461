#include "platform/notification.h"

#include <Elementary.h>

#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>
#include <vector>

#include "common/CLyLog.h"

namespace {

constexpr double kToastSeconds = 2.0;

std::mutex gMutex;
std::vector<std::string> gPosted;
Evas_Object* gWindow = nullptr;

// Watched at the object level: evas holds back the DEL callback of an object
// whose events are frozen (as while another application starts).
void onWindowDel(void*, const Efl_Event* event) {
  if (gWindow == event->object) gWindow = nullptr;
}

void onToastTimeout(void*, Evas_Object* popup, void*) {
  evas_object_del(popup);
}

void showToast(Evas_Object* window, const char* message) {
  Evas_Object* popup = elm_popup_add(window);
  if (!popup) {
    LYLOG_E("Cannot create toast");
    return;
  }
  evas_object_name_set(popup, NOTIFICATION_TOAST_NAME);
  // Like a toast: the user keeps working while it shows.
  elm_popup_allow_events_set(popup, EINA_TRUE);
  elm_popup_orient_set(popup, ELM_POPUP_ORIENT_BOTTOM);
  evas_object_size_hint_weight_set(popup, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_object_text_set(popup, message);
  elm_popup_timeout_set(popup, kToastSeconds);
  evas_object_smart_callback_add(popup, "timeout", onToastTimeout, nullptr);
  evas_object_smart_callback_add(popup, "block,clicked", onToastTimeout, nullptr);
  evas_object_show(popup);
}

}  // namespace

extern "C" void notification_set_window(Evas_Object* window) {
  if (gWindow) efl_event_callback_del(gWindow, EFL_EVENT_DEL, onWindowDel, nullptr);
  gWindow = window;
  if (gWindow) efl_event_callback_add(gWindow, EFL_EVENT_DEL, onWindowDel, nullptr);
}

extern "C" Evas_Object* notification_get_window(void) {
  return gWindow;
}

extern "C" int notification_status_message_post(const char* message) {
  if (!message) return NOTIFICATION_ERROR_INVALID_PARAMETER;
  LYLOG_W("notification: %s", message);
  {
    std::lock_guard<std::mutex> lock(gMutex);
    gPosted.emplace_back(message);
  }
  if (Evas_Object* window = gWindow) showToast(window, message);
  return NOTIFICATION_ERROR_NONE;
}

extern "C" size_t notification_get_posted_count(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  return gPosted.size();
}

extern "C" char* notification_get_posted(size_t index) {
  std::lock_guard<std::mutex> lock(gMutex);
  if (index >= gPosted.size()) return nullptr;
  return strdup(gPosted[index].c_str());
}

extern "C" void notification_clear_posted(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  gPosted.clear();
}
