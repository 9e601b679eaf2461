// The image picker: a window with an elementary file selector limited to
// images, in single or multiple selection, that answers the request with the
// chosen paths in APP_CONTROL_DATA_SELECTED (or with nothing when cancelled)
// and closes on a terminate request.

#include <Elementary.h>
#include <libintl.h>
#include <sys/stat.h>

#include <algorithm>
#include <cctype>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "common/CLyLog.h"
#include "platform/app_control.h"
#include "platform/app_control_apps.h"
#include "platform/app_control_launch_private.h"
#include "platform/image_probe.h"
#include "platform/notification.h"
#include "platform/storage.h"

namespace {

// A picker opened without "max-count" in multiple mode allows this many.
constexpr int kDefaultMaxCount = 100;

struct PickerSession {
  app_control_h request = nullptr;  // the copy this picker received, owned
  std::shared_ptr<app_control_launch_state> state;
  Evas_Object* window = nullptr;
  Evas_Object* selector = nullptr;
  bool multiple = false;
  int maxCount = 1;
  bool finished = false;
};

PickerSession* gOpen = nullptr;
int gOpenCount = 0;

// The translation of `id`, or the English text when the catalogue has none.
std::string tr(const char* id, const char* english) {
  const char* text = dgettext("pictavo", id);
  return text && strcmp(text, id) != 0 ? text : english;
}

// The "maximum reached" text with the count in place of its "%d" (the
// translation is never used as a format string).
std::string maximumText(int count) {
  std::string text =
      tr("IDS_PICTAVO_TPOP_MAXIMUM_NUMBER_OF_IMAGES_PD_REACHED", "Maximum number of images (%d) reached.");
  size_t pos = text.find("%d");
  if (pos != std::string::npos) text.replace(pos, 2, std::to_string(count));
  return text;
}

bool hasImageExtension(const char* path) {
  const char* dot = strrchr(path, '.');
  if (!dot) return false;
  std::string ext(dot + 1);
  std::transform(ext.begin(), ext.end(), ext.begin(), [](unsigned char c) { return std::tolower(c); });
  return ext == "jpg" || ext == "jpeg" || ext == "png" || ext == "gif" || ext == "bmp" || ext == "wbmp";
}

Eina_Bool imageFilter(const char* path, Eina_Bool dir, void*) {
  return dir || hasImageExtension(path);
}

std::string startFolder() {
  if (const char* dir = getenv("PICTAVO_PICKER_DIR"); dir && *dir) return dir;
  std::string folder;
  if (char* pictures = storage_get_internal_root()) {
    folder = pictures;
    free(pictures);
  }
  struct stat st;
  if (!folder.empty() && stat(folder.c_str(), &st) == 0 && S_ISDIR(st.st_mode)) return folder;
  const char* home = getenv("HOME");
  return home && *home ? home : "/";
}

void deleteWindowJob(void* data) {
  evas_object_del(static_cast<Evas_Object*>(data));
}

// Ends the session: no more answers, the window goes (from the main loop, as
// this may run inside one of the window's own callbacks).
void closeSession(PickerSession* session) {
  if (session->finished) return;
  session->finished = true;
  session->state->terminate = nullptr;
  if (session->window) ecore_job_add(deleteWindowJob, session->window);
}

void reply(PickerSession* session, const std::vector<std::string>& paths) {
  app_control_h answer = nullptr;
  if (app_control_create(&answer) != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("Cannot create the picker reply");
    return;
  }
  app_control_result_e result = APP_CONTROL_RESULT_CANCELED;
  if (!paths.empty()) {
    std::vector<const char*> values;
    for (const std::string& path : paths) values.push_back(path.c_str());
    app_control_add_extra_data_array(answer, APP_CONTROL_DATA_SELECTED, values.data(),
                                     static_cast<int>(values.size()));
    result = APP_CONTROL_RESULT_SUCCEEDED;
  }
  LYLOG_I("picker answers with %zu image(s)", paths.size());
  int ret = app_control_reply_to_launch_request(answer, session->request, result);
  if (ret != APP_CONTROL_ERROR_NONE) LYLOG_E("picker reply failed[%d]", ret);
  app_control_destroy(answer);
}

// Validates and answers a choice; false keeps the picker open.
bool submit(PickerSession* session, const std::vector<std::string>& chosen) {
  std::vector<std::string> images;
  for (const std::string& path : chosen) {
    platform_image::ProbeResult probe;
    if (platform_image::probe(path.c_str(), probe)) {
      images.push_back(path);
    } else {
      LYLOG_W("picker: not an image, skipped: %s", path.c_str());
    }
  }
  if (images.empty()) {
    LYLOG_W("picker: nothing usable chosen");
    return false;
  }
  if (static_cast<int>(images.size()) > session->maxCount) {
    notification_status_message_post(maximumText(session->maxCount).c_str());
    return false;
  }
  reply(session, images);
  closeSession(session);
  return true;
}

void cancel(PickerSession* session) {
  reply(session, {});
  closeSession(session);
}

std::vector<std::string> selectedPaths(PickerSession* session) {
  std::vector<std::string> paths;
  if (session->multiple) {
    const Eina_List* list = elm_fileselector_selected_paths_get(session->selector);
    const Eina_List* l;
    void* data;
    EINA_LIST_FOREACH(list, l, data) {
      if (data) paths.emplace_back(static_cast<const char*>(data));
    }
  } else if (const char* path = elm_fileselector_selected_get(session->selector)) {
    paths.emplace_back(path);
  }
  return paths;
}

void onDone(void* data, Evas_Object*, void* event) {
  auto* session = static_cast<PickerSession*>(data);
  if (session->finished) return;
  if (!event) {
    cancel(session);
    return;
  }
  std::vector<std::string> paths = selectedPaths(session);
  if (paths.empty()) paths.emplace_back(static_cast<const char*>(event));
  submit(session, paths);
}

void onActivated(void* data, Evas_Object*, void* event) {
  auto* session = static_cast<PickerSession*>(data);
  if (session->finished || session->multiple || !event) return;
  submit(session, {static_cast<const char*>(event)});
}

void onSelected(void* data, Evas_Object*, void*) {
  auto* session = static_cast<PickerSession*>(data);
  if (!session->multiple) return;
  size_t count = eina_list_count(elm_fileselector_selected_paths_get(session->selector));
  if (static_cast<int>(count) > session->maxCount)
    notification_status_message_post(maximumText(session->maxCount).c_str());
}

void onDeleteRequest(void* data, Evas_Object*, void*) {
  auto* session = static_cast<PickerSession*>(data);
  if (!session->finished) cancel(session);
}

void onWindowDel(void* data, Evas*, Evas_Object*, void*) {
  auto* session = static_cast<PickerSession*>(data);
  if (gOpen == session) gOpen = nullptr;
  session->window = nullptr;
  session->selector = nullptr;
  if (!session->finished) {
    // Closed from outside (the window went away): the caller hears a cancel.
    session->finished = true;
    session->state->terminate = nullptr;
    if (!session->state->terminated) reply(session, {});
  }
  app_control_destroy(session->request);
  delete session;
}

bool buildWindow(PickerSession* session, app_control_launch_mode_e mode) {
  std::string title = session->multiple ? tr("IDS_PICTAVO_HEADER_SELECT_IMAGES", "Select images")
                                        : tr("IDS_PICTAVO_HEADER_SELECT_IMAGE", "Select an image");
  // In group mode the picker belongs to this application's window.
  Evas_Object* parent = mode == APP_CONTROL_LAUNCH_MODE_GROUP ? notification_get_window() : nullptr;
  Evas_Object* win = elm_win_add(parent, "pictavo-picker", parent ? ELM_WIN_DIALOG_BASIC : ELM_WIN_BASIC);
  if (!win) return false;
  elm_win_title_set(win, title.c_str());
  elm_win_autodel_set(win, EINA_FALSE);
  session->window = win;

  Evas_Object* bg = elm_bg_add(win);
  evas_object_size_hint_weight_set(bg, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_win_resize_object_add(win, bg);
  evas_object_show(bg);

  Evas_Object* box = elm_box_add(win);
  evas_object_size_hint_weight_set(box, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_win_resize_object_add(win, box);
  evas_object_show(box);

  Evas_Object* label = elm_label_add(box);
  std::string header = title;
  if (session->multiple) {
    std::string most = tr("IDS_PICTAVO_BODY_UP_TO_PD", "up to %d");
    size_t pos = most.find("%d");
    if (pos != std::string::npos) most.replace(pos, 2, std::to_string(session->maxCount));
    header += " (" + most + ")";
  }
  elm_object_text_set(label, header.c_str());
  evas_object_size_hint_align_set(label, 0.5, 0.5);
  elm_box_pack_end(box, label);
  evas_object_show(label);

  Evas_Object* fs = elm_fileselector_add(box);
  elm_fileselector_is_save_set(fs, EINA_FALSE);
  elm_fileselector_expandable_set(fs, EINA_FALSE);
  elm_fileselector_mode_set(fs, ELM_FILESELECTOR_LIST);
  elm_fileselector_buttons_ok_cancel_set(fs, EINA_TRUE);
  elm_fileselector_multi_select_set(fs, session->multiple ? EINA_TRUE : EINA_FALSE);
  elm_fileselector_custom_filter_append(fs, imageFilter, nullptr, "Images");
  elm_fileselector_path_set(fs, startFolder().c_str());
  evas_object_size_hint_weight_set(fs, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_size_hint_align_set(fs, EVAS_HINT_FILL, EVAS_HINT_FILL);
  elm_box_pack_end(box, fs);
  evas_object_show(fs);
  session->selector = fs;

  evas_object_smart_callback_add(fs, "done", onDone, session);
  evas_object_smart_callback_add(fs, "activated", onActivated, session);
  evas_object_smart_callback_add(fs, "selected", onSelected, session);
  evas_object_smart_callback_add(win, "delete,request", onDeleteRequest, session);
  evas_object_event_callback_add(win, EVAS_CALLBACK_DEL, onWindowDel, session);

  evas_object_resize(win, 720, 1000);
  evas_object_show(win);
  return true;
}

}  // namespace

int image_picker_launch(app_control_h request, const std::shared_ptr<app_control_launch_state>& state) {
  auto* session = new (std::nothrow) PickerSession;
  if (!session) {
    app_control_destroy(request);
    return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  }
  session->request = request;
  session->state = state;

  char* launchType = nullptr;
  char* fileType = nullptr;
  char* maxCount = nullptr;
  app_control_get_extra_data(request, APP_CONTROL_PICKER_LAUNCH_TYPE, &launchType);
  app_control_get_extra_data(request, APP_CONTROL_PICKER_FILE_TYPE, &fileType);
  app_control_get_extra_data(request, APP_CONTROL_PICKER_MAX_COUNT, &maxCount);
  session->multiple = launchType && strcmp(launchType, "select-multiple") == 0;
  if (fileType && strcmp(fileType, "image") != 0) LYLOG_W("picker shows images only, not %s", fileType);
  if (session->multiple) {
    session->maxCount = kDefaultMaxCount;
    if (maxCount) {
      char* end = nullptr;
      long value = strtol(maxCount, &end, 10);
      if (end != maxCount && *end == '\0' && value > 0 && value <= kDefaultMaxCount) {
        session->maxCount = static_cast<int>(value);
      } else {
        LYLOG_E("Invalid max-count \"%s\"", maxCount);
      }
    }
  }
  free(launchType);
  free(fileType);
  free(maxCount);

  app_control_launch_mode_e mode = APP_CONTROL_LAUNCH_MODE_SINGLE;
  app_control_get_launch_mode(request, &mode);
  if (!buildWindow(session, mode)) {
    // Only the window itself can fail, before anything refers to the session.
    LYLOG_E("Cannot open the picker window");
    app_control_destroy(request);
    delete session;
    return APP_CONTROL_ERROR_LAUNCH_FAILED;
  }
  if (gOpen && gOpen != session) LYLOG_W("a second picker opens while one is open");
  gOpen = session;
  ++gOpenCount;
  state->terminate = [session] {
    LYLOG_I("picker closes on request");
    closeSession(session);
  };
  LYLOG_I("picker open: %s, max %d", session->multiple ? "multiple" : "single", session->maxCount);
  return APP_CONTROL_ERROR_NONE;
}

Evas_Object* image_picker_get_window(void) {
  return gOpen && !gOpen->finished ? gOpen->window : nullptr;
}

Evas_Object* image_picker_get_fileselector(void) {
  return gOpen && !gOpen->finished ? gOpen->selector : nullptr;
}

bool image_picker_submit(const std::vector<std::string>& paths) {
  if (!gOpen || gOpen->finished) return false;
  return submit(gOpen, paths);
}

bool image_picker_cancel(void) {
  if (!gOpen || gOpen->finished) return false;
  cancel(gOpen);
  return true;
}

int image_picker_get_open_count(void) {
  return gOpenCount;
}
