#include "platform/core/app_common.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include "common/CLyLog.h"

namespace {

bool isDirectory(const std::string& path) {
  struct stat st;
  return stat(path.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

char* withSlash(std::string path) {
  if (path.empty() || path.back() != '/') path += '/';
  return strdup(path.c_str());
}

bool makeDirs(const std::string& path) {
  for (size_t pos = 1; pos <= path.size(); ++pos) {
    if (pos == path.size() || path[pos] == '/') {
      std::string part = path.substr(0, pos);
      if (mkdir(part.c_str(), 0755) != 0 && errno != EEXIST) return false;
    }
  }
  return isDirectory(path);
}

}  // namespace

extern "C" char* app_get_resource_path(void) {
  if (const char* env = getenv("PICTAVO_RES_DIR"); env && *env) {
    if (isDirectory(env)) return withSlash(env);
    LYLOG_E("PICTAVO_RES_DIR is not a folder: %s", env);
    return nullptr;
  }
#ifdef PICTAVO_RES_BUILD_DIR
  if (isDirectory(PICTAVO_RES_BUILD_DIR)) return withSlash(PICTAVO_RES_BUILD_DIR);
#endif
#ifdef PICTAVO_RES_INSTALL_DIR
  if (isDirectory(PICTAVO_RES_INSTALL_DIR)) return withSlash(PICTAVO_RES_INSTALL_DIR);
#endif
  LYLOG_E("No resource directory found");
  return nullptr;
}

extern "C" char* app_get_data_path(void) {
  std::string base;
  if (const char* xdg = getenv("XDG_DATA_HOME"); xdg && *xdg) {
    base = xdg;
  } else if (const char* home = getenv("HOME"); home && *home) {
    base = std::string(home) + "/.local/share";
  } else {
    base = "/tmp";
  }
  std::string path = base + "/pictavo";
  if (!makeDirs(path)) {
    LYLOG_E("Cannot create data folder %s: %s", path.c_str(), strerror(errno));
    return nullptr;
  }
  return withSlash(path);
}
