#include "misc/CLyLogManager.h"

#include "common/CLyLog.h"
#include "platform/bundle.h"

CLyLogManager::CLyLogManager() {
  int ret = brelmo_log_manager_create(&_handle);
  if (ret == 0) {
    LYLOG_W("log handle created");
  } else {
    LYLOG_E("brelmo_log_manager_create failed! [0x%x]", static_cast<unsigned>(ret));
    _handle = nullptr;
  }
}

CLyLogManager::~CLyLogManager() {
  if (!_handle) {
    LYLOG_E("log handle is nullptr!");
    return;
  }
  brelmo_log_manager_destroy(_handle);
  _handle = nullptr;
  LYLOG_W("log handle destroyed");
}

bool CLyLogManager::insertLog(const char* feature, const char* extra, const char* value) {
  return __insert_log(LY_LOG_URI, feature, extra, value);
}

bool CLyLogManager::__insert_log(const char* uri, const char* feature, const char* extra, const char* value) {
  if (!_handle) {
    LYLOG_E("LogManager is nullptr");
    return false;
  }
  if (!uri) {
    LYLOG_E("uri is nullptr");
    return false;
  }
  if (!feature) {
    LYLOG_E("feature is nullptr");
    return false;
  }
  bundle* record = bundle_create();
  if (!record) {
    LYLOG_E("bundle_create failed!");
    return false;
  }
  bundle_add_str(record, "app_id", LY_LOG_APP_ID);
  bundle_add_str(record, "feature", feature);
  if (extra) bundle_add_str(record, "extra", extra);
  if (value) bundle_add_str(record, "value", value);
  int ret = brelmo_log_manager_insert(_handle, uri, record, nullptr, nullptr);
  if (ret != 0) LYLOG_E("brelmo_log_manager_insert failed! [0x%x]", static_cast<unsigned>(ret));
  bundle_free(record);
  return ret == 0;
}
