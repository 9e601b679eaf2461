#include "platform/app_control.h"

#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <new>

#include "common/CLyLog.h"
#include "platform/app_control_private.h"

namespace {

constexpr const char kPlatformPrefix[] = "http://tizen.org/";

char* dupOrNull(const std::optional<std::string>& text) {
  return text ? strdup(text->c_str()) : nullptr;
}

int setField(app_control_h app_control, std::optional<std::string> app_control_s::*field, const char* value) {
  if (!app_control) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  if (value)
    app_control->*field = std::string(value);
  else
    (app_control->*field).reset();
  return APP_CONTROL_ERROR_NONE;
}

int getField(app_control_h app_control, std::optional<std::string> app_control_s::*field, char** value) {
  if (!app_control || !value) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  *value = dupOrNull(app_control->*field);
  if ((app_control->*field) && !*value) return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  return APP_CONTROL_ERROR_NONE;
}

int checkKey(app_control_h app_control, const char* key) {
  if (!app_control || !key || !*key) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  if (strncmp(key, "__", 2) == 0) return APP_CONTROL_ERROR_KEY_REJECTED;
  return APP_CONTROL_ERROR_NONE;
}

const app_control_extra* findExtra(app_control_h app_control, const char* key) {
  auto it = app_control->extras.find(app_control_normalize_key(key));
  return it == app_control->extras.end() ? nullptr : &it->second;
}

std::string absolutePath(const char* path) {
  if (path[0] == '/') return path;
  char cwd[PATH_MAX];
  if (!getcwd(cwd, sizeof cwd)) return path;
  std::string result(cwd);
  if (result.back() != '/') result += '/';
  while (strncmp(path, "./", 2) == 0) path += 2;
  return result + path;
}

}  // namespace

std::string app_control_normalize_key(const char* key) {
  if (strncmp(key, kPlatformPrefix, sizeof kPlatformPrefix - 1) == 0) return key + sizeof kPlatformPrefix - 1;
  return key;
}

app_control_h app_control_new_record() {
  return new (std::nothrow) app_control_s();
}

int app_control_create(app_control_h* app_control) {
  if (!app_control) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  *app_control = app_control_new_record();
  if (!*app_control) {
    LYLOG_E("Out of memory");
    return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  }
  return APP_CONTROL_ERROR_NONE;
}

int app_control_destroy(app_control_h app_control) {
  if (!app_control) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  delete app_control;
  return APP_CONTROL_ERROR_NONE;
}

int app_control_clone(app_control_h* clone, app_control_h app_control) {
  if (!clone || !app_control) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  *clone = new (std::nothrow) app_control_s(*app_control);
  if (!*clone) {
    LYLOG_E("Out of memory");
    return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  }
  return APP_CONTROL_ERROR_NONE;
}

int app_control_set_operation(app_control_h app_control, const char* operation) {
  return setField(app_control, &app_control_s::operation, operation);
}
int app_control_get_operation(app_control_h app_control, char** operation) {
  return getField(app_control, &app_control_s::operation, operation);
}
int app_control_set_app_id(app_control_h app_control, const char* app_id) {
  return setField(app_control, &app_control_s::appId, app_id);
}
int app_control_get_app_id(app_control_h app_control, char** app_id) {
  return getField(app_control, &app_control_s::appId, app_id);
}
int app_control_set_uri(app_control_h app_control, const char* uri) {
  return setField(app_control, &app_control_s::uri, uri);
}
int app_control_get_uri(app_control_h app_control, char** uri) {
  return getField(app_control, &app_control_s::uri, uri);
}
int app_control_set_mime(app_control_h app_control, const char* mime) {
  return setField(app_control, &app_control_s::mime, mime);
}
int app_control_get_mime(app_control_h app_control, char** mime) {
  return getField(app_control, &app_control_s::mime, mime);
}
int app_control_get_caller(app_control_h app_control, char** id) {
  return getField(app_control, &app_control_s::caller, id);
}

int app_control_set_launch_mode(app_control_h app_control, app_control_launch_mode_e mode) {
  if (!app_control || (mode != APP_CONTROL_LAUNCH_MODE_SINGLE && mode != APP_CONTROL_LAUNCH_MODE_GROUP))
    return APP_CONTROL_ERROR_INVALID_PARAMETER;
  app_control->launchMode = mode;
  return APP_CONTROL_ERROR_NONE;
}

int app_control_get_launch_mode(app_control_h app_control, app_control_launch_mode_e* mode) {
  if (!app_control || !mode) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  *mode = app_control->launchMode;
  return APP_CONTROL_ERROR_NONE;
}

int app_control_is_reply_requested(app_control_h app_control, bool* requested) {
  if (!app_control || !requested) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  *requested = app_control->replyRequested;
  return APP_CONTROL_ERROR_NONE;
}

int app_control_add_extra_data(app_control_h app_control, const char* key, const char* value) {
  if (int err = checkKey(app_control, key)) return err;
  if (!value) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  app_control_extra extra;
  extra.values.emplace_back(std::string(value));
  app_control->extras[app_control_normalize_key(key)] = std::move(extra);
  return APP_CONTROL_ERROR_NONE;
}

int app_control_add_extra_data_array(app_control_h app_control, const char* key, const char* value[],
                                     int length) {
  if (int err = checkKey(app_control, key)) return err;
  if (length < 0 || (length > 0 && !value)) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  app_control_extra extra;
  extra.isArray = true;
  extra.values.reserve(length);
  for (int i = 0; i < length; ++i) {
    if (value[i])
      extra.values.emplace_back(std::string(value[i]));
    else
      extra.values.emplace_back(std::nullopt);
  }
  app_control->extras[app_control_normalize_key(key)] = std::move(extra);
  return APP_CONTROL_ERROR_NONE;
}

int app_control_remove_extra_data(app_control_h app_control, const char* key) {
  if (int err = checkKey(app_control, key)) return err;
  if (app_control->extras.erase(app_control_normalize_key(key)) == 0) return APP_CONTROL_ERROR_KEY_NOT_FOUND;
  return APP_CONTROL_ERROR_NONE;
}

int app_control_get_extra_data(app_control_h app_control, const char* key, char** value) {
  if (int err = checkKey(app_control, key)) return err;
  if (!value) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  const app_control_extra* extra = findExtra(app_control, key);
  if (!extra) return APP_CONTROL_ERROR_KEY_NOT_FOUND;
  if (extra->isArray) return APP_CONTROL_ERROR_INVALID_DATA_TYPE;
  *value = dupOrNull(extra->values.front());
  return *value ? APP_CONTROL_ERROR_NONE : APP_CONTROL_ERROR_OUT_OF_MEMORY;
}

int app_control_get_extra_data_array(app_control_h app_control, const char* key, char*** value, int* length) {
  if (int err = checkKey(app_control, key)) return err;
  if (!value || !length) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  const app_control_extra* extra = findExtra(app_control, key);
  if (!extra) return APP_CONTROL_ERROR_KEY_NOT_FOUND;
  if (!extra->isArray) return APP_CONTROL_ERROR_INVALID_DATA_TYPE;
  const size_t count = extra->values.size();
  // One extra slot so that an empty array is still a valid allocation.
  char** array = static_cast<char**>(calloc(count + 1, sizeof(char*)));
  if (!array) return APP_CONTROL_ERROR_OUT_OF_MEMORY;
  for (size_t i = 0; i < count; ++i) {
    if (!extra->values[i]) continue;
    array[i] = strdup(extra->values[i]->c_str());
    if (!array[i]) {
      for (size_t j = 0; j < i; ++j) free(array[j]);
      free(array);
      return APP_CONTROL_ERROR_OUT_OF_MEMORY;
    }
  }
  *value = array;
  *length = static_cast<int>(count);
  return APP_CONTROL_ERROR_NONE;
}

int app_control_is_extra_data_array(app_control_h app_control, const char* key, bool* array) {
  if (int err = checkKey(app_control, key)) return err;
  if (!array) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  const app_control_extra* extra = findExtra(app_control, key);
  if (!extra) return APP_CONTROL_ERROR_KEY_NOT_FOUND;
  *array = extra->isArray;
  return APP_CONTROL_ERROR_NONE;
}

int app_control_foreach_extra_data(app_control_h app_control, app_control_extra_data_cb callback,
                                   void* user_data) {
  if (!app_control || !callback) return APP_CONTROL_ERROR_INVALID_PARAMETER;
  // The callback may change the request; walk a snapshot of the keys.
  std::vector<std::string> keys;
  for (const auto& entry : app_control->extras) keys.push_back(entry.first);
  for (const auto& key : keys)
    if (!callback(app_control, key.c_str(), user_data)) break;
  return APP_CONTROL_ERROR_NONE;
}

app_control_h app_control_create_launch_request(int argc, char** argv) {
  app_control_h request = app_control_new_record();
  if (!request) {
    LYLOG_E("Out of memory");
    return nullptr;
  }
  request->operation = APP_CONTROL_OPERATION_DEFAULT;
  std::vector<std::string> paths;
  bool options = true;
  for (int i = 1; i < argc && argv; ++i) {
    const char* arg = argv[i];
    if (!arg || !*arg) continue;
    if (options && strcmp(arg, "--") == 0) {
      options = false;
      continue;
    }
    if (options && arg[0] == '-') continue;
    paths.push_back(absolutePath(arg));
  }
  if (!paths.empty()) {
    app_control_extra extra;
    extra.isArray = true;
    for (const auto& path : paths) extra.values.emplace_back(path);
    request->extras[app_control_normalize_key(APP_CONTROL_DATA_SELECTED)] = std::move(extra);
    request->caller = std::string(APP_CONTROL_GALLERY_APP_ID);
    request->replyRequested = true;
  }
  return request;
}
