#include "common/CLyUtil.h"

#include <Ecore_File.h>
#include <Eina.h>
#include <libintl.h>
#include <sys/stat.h>

#include <cstdlib>
#include <cstring>
#include <ctime>

#include "common/CLyLog.h"
#include "platform/app_control_apps.h"
#include "platform/app_resource_manager.h"
#include "platform/feedback.h"
#include "platform/media_content.h"
#include "platform/notification.h"
#include "platform/storage.h"
#include "platform/uxt_theme.h"

namespace {

// Highest suffix tried for a second save within the same second.
constexpr int kMaxSameSecondSaves = 1000;

bool fileExists(const std::string& path) {
  struct stat st;
  return stat(path.c_str(), &st) == 0;
}

char* getResourcePath(app_resource_e type, const char* name) {
  char* path = nullptr;
  int ret = app_resource_manager_get(type, name, &path);
  if (ret != APP_RESOURCE_ERROR_NONE || !path) {
    LYLOG_E("app_resource_manager_get failed[%d]", ret);
    free(path);
    return nullptr;
  }
  return path;
}

// A new request with the launch mode shared by every outgoing request.
app_control_h newRequest(const char* operation, const char* appId) {
  app_control_h request = nullptr;
  int ret = app_control_create(&request);
  if (ret != APP_CONTROL_ERROR_NONE || !request) {
    LYLOG_E("Failed to create service[%d]", ret);
    return nullptr;
  }
  if (operation && (ret = app_control_set_operation(request, operation)) != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_set_operation failed[%d]", ret);
  } else if (appId && (ret = app_control_set_app_id(request, appId)) != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_set_app_id failed[%d]", ret);
  } else if ((ret = app_control_set_launch_mode(request, APP_CONTROL_LAUNCH_MODE_GROUP)) !=
             APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_set_launch_mode failed[%d]", ret);
  } else {
    return request;
  }
  app_control_destroy(request);
  return nullptr;
}

bool addExtra(app_control_h request, const char* key, const char* value) {
  int ret = app_control_add_extra_data(request, key, value);
  if (ret != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_add_extra_data failed[%d] %s", ret, key);
    return false;
  }
  return true;
}

}  // namespace

bool CLyUtil::isStorageLow(int queryResult, const struct statvfs& info) {
  if (queryResult < 0) {
    LYLOG_E("fail to get memory size");
    return true;
  }
  // Available blocks count in fragment units; some file systems leave the
  // fragment size at 0 and mean the block size.
  unsigned long long blockSize = info.f_frsize ? info.f_frsize : info.f_bsize;
  unsigned long long blocks = info.f_bavail;
  // blockSize * blocks < threshold, without overflowing the product.
  bool low = blockSize == 0 || blocks < (LY_LOW_STORAGE_BYTES + blockSize - 1) / blockSize;
  if (low) {
    LYLOG_E("Memory is almost full < 1MB");
    return true;
  }
  return false;
}

bool CLyUtil::isInternalMemoryLow() {
  struct statvfs info = {};
  int ret = storage_get_internal_memory_size(&info);
  return isStorageLow(ret, info);
}

bool CLyUtil::isExternalMemoryLow() {
  struct statvfs info = {};
  int ret = storage_get_external_memory_size(&info);
  return isStorageLow(ret, info);
}

bool CLyUtil::makeDir(const char* path) {
  if (!path) {
    LYLOG_E("Invalid input path");
    return false;
  }
  char* mapped = storage_map_device_path(path);
  if (!mapped) {
    LYLOG_E("No storage for %s", path);
    return false;
  }
  struct stat st;
  bool ok = stat(mapped, &st) == 0 || ecore_file_mkpath(mapped);
  if (!ok) LYLOG_E("Cannot create %s", mapped);
  free(mapped);
  return ok;
}

void CLyUtil::getFileName(std::string& name) {
  time_t now = time(nullptr);
  struct tm local = {};
  localtime_r(&now, &local);
  char ascii[64] = {};
  asctime_r(&local, ascii);
  // asctime ends in a new line; the log line must not.
  if (size_t len = strlen(ascii); len > 0 && ascii[len - 1] == '\n') ascii[len - 1] = '\0';
  LYLOG_W("current time: %s", ascii);
  char buffer[256] = {};
  strftime(buffer, sizeof(buffer), LY_FILE_NAME_FORMAT, &local);
  name = buffer;
}

bool CLyUtil::makeSavePath(const char* deviceRoot, std::string& path) {
  if (!deviceRoot) {
    LYLOG_E("Invalid root");
    return false;
  }
  std::string dir = std::string(deviceRoot) + LY_ALBUM_DIR;
  makeDir(dir.c_str());
  char* mapped = storage_map_device_path(dir.c_str());
  if (!mapped) {
    LYLOG_E("No storage for %s", dir.c_str());
    return false;
  }
  std::string folder = mapped;
  free(mapped);

  std::string name;
  getFileName(name);
  std::string candidate = folder + "/" + name + LY_FILE_EXTENSION;
  // Two saves within one second would otherwise share the name and the second
  // would overwrite the first collage.
  for (int n = 2; fileExists(candidate); ++n) {
    if (n > kMaxSameSecondSaves) {
      LYLOG_E("No free file name for %s", name.c_str());
      return false;
    }
    candidate = folder + "/" + name + " (" + std::to_string(n) + ")" + LY_FILE_EXTENSION;
  }
  LYLOG_W("save path: %s%s/%s%s -> %s", deviceRoot, LY_ALBUM_DIR, name.c_str(), LY_FILE_EXTENSION,
          candidate.c_str());
  path = candidate;
  return true;
}

CLyUtil::SaveLocation CLyUtil::chooseSavePath(std::string& path) {
  const char* root = nullptr;
  SaveLocation location = SaveLocation::NONE;
  if (!isInternalMemoryLow()) {
    root = LY_INTERNAL_STORAGE_ROOT;
    location = SaveLocation::INTERNAL;
  } else if (!isExternalMemoryLow()) {
    notification_status_message_post(dgettext(
        "pictavo", "IDS_IDLE_TPOP_ITEMS_SAVED_TO_SD_CARD_INSTEAD_OF_DEFAULT_LOCATION_HDEVICE_STORAGE"));
    root = LY_EXTERNAL_STORAGE_ROOT;
    location = SaveLocation::EXTERNAL;
  } else {
    LYLOG_W("Low memory");
    return SaveLocation::NONE;
  }
  if (!makeSavePath(root, path)) return SaveLocation::NONE;
  return location;
}

bool CLyUtil::mediaContentScanFile(const char* path) {
  if (!path) {
    LYLOG_E("Invalid input path");
    return false;
  }
  int ret = media_content_connect();
  if (ret != MEDIA_CONTENT_ERROR_NONE) {
    LYLOG_E("Fail to connect DB : %d", ret);
    return false;
  }
  bool scanned = true;
  char* mapped = storage_map_device_path(path);
  ret = mapped ? media_content_scan_file(mapped) : MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
  free(mapped);
  if (ret != MEDIA_CONTENT_ERROR_NONE) {
    LYLOG_E("Fail to scan file into DB : %d", ret);
    scanned = false;
  }
  ret = media_content_disconnect();
  if (ret != MEDIA_CONTENT_ERROR_NONE) LYLOG_E("Fail to disconnect DB : %d", ret);
  return scanned;
}

void CLyUtil::replyToLaunchRequest(app_control_h request, int result) {
  app_control_h reply = nullptr;
  if (app_control_create(&reply) != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("Failed to reply");
    return;
  }
  int ret = app_control_reply_to_launch_request(reply, request, static_cast<app_control_result_e>(result));
  if (ret != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("Failed to reply");
  } else {
    LYLOG_W("Reply: %d", result);
  }
  app_control_destroy(reply);
}

void CLyUtil::getThemeColor(const char* code, int* r, int* g, int* b, int* a, int* outlineR, int* outlineG,
                            int* outlineB, int* outlineA, int* shadowR, int* shadowG, int* shadowB,
                            int* shadowA) {
  int ret = uxt_theme_get_color(code, r, g, b, a, outlineR, outlineG, outlineB, outlineA, shadowR, shadowG,
                                shadowB, shadowA);
  if (ret != UXT_THEME_ERROR_NONE) LYLOG_E("Failed to get theme color[%s]", code ? code : "(null)");
}

void CLyUtil::playTouchSound() {
  int ret = feedback_play(FEEDBACK_PATTERN_TAP);
  if (ret != FEEDBACK_ERROR_NONE) LYLOG_E("feedback_play error : %d", ret);
}

bool CLyUtil::initResourceManager() {
  int ret = app_resource_manager_init();
  if (ret != APP_RESOURCE_ERROR_NONE) {
    LYLOG_E("app_resource_manager_init failed[%d]", ret);
    return false;
  }
  return true;
}

bool CLyUtil::releaseResourceManager() {
  int ret = app_resource_manager_release();
  if (ret != APP_RESOURCE_ERROR_NONE) {
    LYLOG_E("app_resource_manager_release failed[%d]", ret);
    return false;
  }
  return true;
}

char* CLyUtil::getEdjPath(const char* name) {
  if (!name) {
    LYLOG_E("Invalid EDJ name");
    return nullptr;
  }
  return getResourcePath(APP_RESOURCE_TYPE_LAYOUT, name);
}

char* CLyUtil::getImagePath(const char* name) {
  if (!name) {
    LYLOG_E("Invalid Image name");
    return nullptr;
  }
  return getResourcePath(APP_RESOURCE_TYPE_IMAGE, name);
}

app_control_h CLyUtil::createPickImagesRequest(int maxCount) {
  app_control_h request = newRequest(APP_CONTROL_OPERATION_PICK, APP_CONTROL_PICKER_APP_ID);
  if (!request) return nullptr;
  char count[10] = {};
  eina_convert_itoa(maxCount, count);
  if (!addExtra(request, APP_CONTROL_PICKER_LAUNCH_TYPE, "select-multiple") ||
      !addExtra(request, APP_CONTROL_PICKER_FILE_TYPE, "image") ||
      !addExtra(request, APP_CONTROL_PICKER_MAX_COUNT, count)) {
    app_control_destroy(request);
    return nullptr;
  }
  return request;
}

app_control_h CLyUtil::createPickImageRequest() {
  app_control_h request = newRequest(APP_CONTROL_OPERATION_PICK, APP_CONTROL_PICKER_APP_ID);
  if (!request) return nullptr;
  if (!addExtra(request, APP_CONTROL_PICKER_LAUNCH_TYPE, "select-one") ||
      !addExtra(request, APP_CONTROL_PICKER_FILE_TYPE, "image")) {
    app_control_destroy(request);
    return nullptr;
  }
  return request;
}

app_control_h CLyUtil::createShareRequest(const char* path) {
  if (!path || !*path) {
    LYLOG_E("Invalid path");
    return nullptr;
  }
  app_control_h request = nullptr;
  int ret = app_control_create(&request);
  if (ret != APP_CONTROL_ERROR_NONE || !request) {
    LYLOG_E("Failed to create service[%d]", ret);
    return nullptr;
  }
  std::string uri = std::string("file://") + path;
  if ((ret = app_control_set_uri(request, uri.c_str())) != APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_set_uri failed[%d]", ret);
  } else if ((ret = app_control_set_operation(request, APP_CONTROL_OPERATION_SHARE)) !=
             APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_set_operation failed[%d]", ret);
  } else if ((ret = app_control_set_launch_mode(request, APP_CONTROL_LAUNCH_MODE_GROUP)) !=
             APP_CONTROL_ERROR_NONE) {
    LYLOG_E("app_control_set_operation failed[%d]", ret);
  } else {
    return request;
  }
  app_control_destroy(request);
  return nullptr;
}

app_control_h CLyUtil::createStorageSettingsRequest() {
  app_control_h request = newRequest(nullptr, APP_CONTROL_STORAGE_SETTINGS_APP_ID);
  if (!request) return nullptr;
  if (!addExtra(request, APP_CONTROL_SETTINGS_VIEWTYPE, "storage_detail")) {
    app_control_destroy(request);
    return nullptr;
  }
  return request;
}
