#include "platform/storage.h"

#include <sys/stat.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <string>

#include "common/CLyLog.h"

namespace {

bool isDirectory(const std::string& path) {
  struct stat st;
  return stat(path.c_str(), &st) == 0 && S_ISDIR(st.st_mode);
}

std::string homeDir() {
  const char* home = getenv("HOME");
  return home && *home ? home : "/tmp";
}

std::string stripSlashes(std::string path) {
  while (path.size() > 1 && path.back() == '/') path.pop_back();
  return path;
}

// XDG_PICTURES_DIR from ~/.config/user-dirs.dirs: XDG_PICTURES_DIR="$HOME/Pictures".
std::string picturesFromUserDirs() {
  const char* config = getenv("XDG_CONFIG_HOME");
  std::string file = (config && *config ? std::string(config) : homeDir() + "/.config") + "/user-dirs.dirs";
  std::ifstream in(file);
  std::string line;
  const std::string key = "XDG_PICTURES_DIR=";
  while (std::getline(in, line)) {
    if (line.compare(0, key.size(), key) != 0) continue;
    std::string value = line.substr(key.size());
    if (value.size() >= 2 && value.front() == '"' && value.back() == '"')
      value = value.substr(1, value.size() - 2);
    if (value.compare(0, 5, "$HOME") == 0) value = homeDir() + value.substr(5);
    if (!value.empty() && value[0] == '/') return value;
  }
  return "";
}

std::string internalRoot() {
  if (const char* root = getenv("PICTAVO_STORAGE_ROOT"); root && *root) {
    return stripSlashes(root) + "/internal";
  }
  if (const char* pictures = getenv("XDG_PICTURES_DIR"); pictures && *pictures) return stripSlashes(pictures);
  std::string fromFile = picturesFromUserDirs();
  if (!fromFile.empty()) return stripSlashes(fromFile);
  return homeDir() + "/Pictures";
}

// Empty when no SD card is there.
std::string externalRoot() {
  std::string root;
  if (const char* base = getenv("PICTAVO_STORAGE_ROOT"); base && *base) {
    root = stripSlashes(base) + "/sdcard";
  } else if (const char* sd = getenv("PICTAVO_SDCARD_DIR"); sd && *sd) {
    root = stripSlashes(sd);
  }
  if (root.empty() || !isDirectory(root)) return "";
  return root;
}

// statvfs of the folder, or of its nearest existing ancestor while the folder
// has not been made yet (the pictures folder may appear with the first save).
int statFolder(std::string path, struct statvfs* buf) {
  while (!path.empty()) {
    if (statvfs(path.c_str(), buf) == 0) return STORAGE_ERROR_NONE;
    if (errno != ENOENT && errno != ENOTDIR) break;
    size_t slash = path.find_last_of('/');
    if (slash == std::string::npos) break;
    path = slash == 0 ? "/" : path.substr(0, slash);
    if (path == "/") return statvfs("/", buf) == 0 ? STORAGE_ERROR_NONE : STORAGE_ERROR_OPERATION_FAILED;
  }
  LYLOG_E("statvfs failed: %s", strerror(errno));
  return STORAGE_ERROR_OPERATION_FAILED;
}

bool hasPrefix(const std::string& path, const char* root) {
  size_t len = strlen(root);
  return path.compare(0, len, root) == 0 && (path.size() == len || path[len] == '/');
}

}  // namespace

extern "C" int storage_get_internal_memory_size(struct statvfs* buf) {
  if (!buf) return STORAGE_ERROR_INVALID_PARAMETER;
  return statFolder(internalRoot(), buf);
}

extern "C" int storage_get_external_memory_size(struct statvfs* buf) {
  if (!buf) return STORAGE_ERROR_INVALID_PARAMETER;
  std::string root = externalRoot();
  if (root.empty()) return STORAGE_ERROR_NOT_SUPPORTED;
  if (statvfs(root.c_str(), buf) != 0) {
    LYLOG_E("statvfs %s failed: %s", root.c_str(), strerror(errno));
    return STORAGE_ERROR_OPERATION_FAILED;
  }
  return STORAGE_ERROR_NONE;
}

extern "C" char* storage_get_internal_root(void) {
  return strdup(internalRoot().c_str());
}

extern "C" char* storage_get_external_root(void) {
  std::string root = externalRoot();
  return root.empty() ? nullptr : strdup(root.c_str());
}

extern "C" char* storage_map_device_path(const char* device_path) {
  if (!device_path) return nullptr;
  std::string path(device_path);
  if (hasPrefix(path, STORAGE_INTERNAL_DEVICE_ROOT)) {
    return strdup((internalRoot() + path.substr(strlen(STORAGE_INTERNAL_DEVICE_ROOT))).c_str());
  }
  if (hasPrefix(path, STORAGE_EXTERNAL_DEVICE_ROOT)) {
    std::string root = externalRoot();
    if (root.empty()) return nullptr;
    return strdup((root + path.substr(strlen(STORAGE_EXTERNAL_DEVICE_ROOT))).c_str());
  }
  return strdup(device_path);
}
