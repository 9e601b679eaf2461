#include "platform/app_resource_manager.h"

#include <sys/stat.h>

#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>

#include "common/CLyLog.h"
#include "platform/core/app_common.h"

namespace {

std::mutex gMutex;
int gInitCount = 0;
std::string gResDir;  // ends in '/' while initialised

bool isRegularFile(const std::string& path) {
  struct stat st;
  return stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode);
}

// Only plain relative names inside the resource directory.
bool isSafeName(const char* id) {
  if (!id || !*id || id[0] == '/') return false;
  std::string name(id);
  size_t start = 0;
  while (start <= name.size()) {
    size_t end = name.find('/', start);
    if (end == std::string::npos) end = name.size();
    if (name.compare(start, end - start, "..") == 0 && end - start == 2) return false;
    start = end + 1;
  }
  return true;
}

// Call with gMutex held.
int initLocked() {
  if (gInitCount == 0) {
    char* res = app_get_resource_path();
    if (!res) return APP_RESOURCE_ERROR_IO_ERROR;
    gResDir = res;
    free(res);
  }
  ++gInitCount;
  return APP_RESOURCE_ERROR_NONE;
}

const char* typeFolder(app_resource_e type) {
  switch (type) {
    case APP_RESOURCE_TYPE_IMAGE:
      return "images/";
    case APP_RESOURCE_TYPE_LAYOUT:
      return "edje/";
    case APP_RESOURCE_TYPE_SOUND:
      return "sounds/";
    case APP_RESOURCE_TYPE_BIN:
      return "bin/";
  }
  return nullptr;
}

}  // namespace

extern "C" int app_resource_manager_init(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  int ret = initLocked();
  if (ret != APP_RESOURCE_ERROR_NONE) LYLOG_E("No resource directory");
  return ret;
}

extern "C" int app_resource_manager_release(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  if (gInitCount == 0) return APP_RESOURCE_ERROR_INVALID_PARAMETER;
  if (--gInitCount == 0) gResDir.clear();
  return APP_RESOURCE_ERROR_NONE;
}

extern "C" int app_resource_manager_get(app_resource_e type, const char* id, char** path) {
  if (!path) return APP_RESOURCE_ERROR_INVALID_PARAMETER;
  *path = nullptr;
  const char* folder = typeFolder(type);
  if (!folder || !isSafeName(id)) {
    LYLOG_E("Invalid resource name %s", id ? id : "(null)");
    return APP_RESOURCE_ERROR_INVALID_PARAMETER;
  }
  std::string dir;
  {
    std::lock_guard<std::mutex> lock(gMutex);
    if (gInitCount == 0) {
      // Used before anybody initialised it: initialise for the process.
      int ret = initLocked();
      if (ret != APP_RESOURCE_ERROR_NONE) return ret;
    }
    dir = gResDir;
  }
  std::string candidates[2] = {dir + id, dir + folder + id};
  for (const std::string& candidate : candidates) {
    if (isRegularFile(candidate)) {
      *path = strdup(candidate.c_str());
      return *path ? APP_RESOURCE_ERROR_NONE : APP_RESOURCE_ERROR_OUT_OF_MEMORY;
    }
  }
  LYLOG_W("Resource not found: %s", id);
  return APP_RESOURCE_ERROR_IO_ERROR;
}
