#include "platform/brelmo_log.h"

#include <sqlite3.h>

#include <cstdlib>
#include <cstring>
#include <ctime>
#include <mutex>
#include <new>
#include <string>
#include <vector>

#include "common/CLyLog.h"
#include "platform/sqlite_store.h"

struct _brelmo_log_manager_s {
  std::mutex mutex;
  sqlite3* db = nullptr;
};

namespace {

const char* const kSchema =
    "CREATE TABLE IF NOT EXISTS usage_log ("
    "  id INTEGER PRIMARY KEY AUTOINCREMENT,"
    "  uri TEXT NOT NULL,"
    "  app_id TEXT NOT NULL,"
    "  feature TEXT NOT NULL,"
    "  extra TEXT,"
    "  value TEXT,"
    "  time INTEGER NOT NULL);";

std::string dbPath() {
  return platform_db::storePath("PICTAVO_USAGE_LOG_DB", "usage_log.db");
}

const char* bundleValue(bundle* data, const char* key) {
  char* value = nullptr;
  return bundle_get_str(data, key, &value) == BUNDLE_ERROR_NONE ? value : nullptr;
}

}  // namespace

extern "C" int brelmo_log_manager_create(brelmo_log_manager_h* handle) {
  if (!handle) return BRELMO_LOG_ERROR_INVALID_PARAMETER;
  *handle = nullptr;
  auto* manager = new (std::nothrow) _brelmo_log_manager_s;
  if (!manager) return BRELMO_LOG_ERROR_OUT_OF_MEMORY;
  manager->db = platform_db::openStore(dbPath(), kSchema);
  if (!manager->db) {
    delete manager;
    return BRELMO_LOG_ERROR_DB_FAILED;
  }
  *handle = manager;
  return BRELMO_LOG_ERROR_NONE;
}

extern "C" int brelmo_log_manager_destroy(brelmo_log_manager_h handle) {
  if (!handle) return BRELMO_LOG_ERROR_INVALID_PARAMETER;
  sqlite3_close(handle->db);
  delete handle;
  return BRELMO_LOG_ERROR_NONE;
}

extern "C" int brelmo_log_manager_insert(brelmo_log_manager_h handle, const char* uri, bundle* data,
                                         brelmo_log_insert_cb callback, void* user_data) {
  if (!handle || !uri || !data || strncmp(uri, "content://", 10) != 0)
    return BRELMO_LOG_ERROR_INVALID_PARAMETER;
  const char* appId = bundleValue(data, "app_id");
  const char* feature = bundleValue(data, "feature");
  if (!appId || !feature) return BRELMO_LOG_ERROR_INVALID_PARAMETER;
  const char* extra = bundleValue(data, "extra");
  const char* value = bundleValue(data, "value");

  int result = BRELMO_LOG_ERROR_NONE;
  {
    std::lock_guard<std::mutex> lock(handle->mutex);
    sqlite3_stmt* stmt = nullptr;
    int rc = sqlite3_prepare_v2(handle->db,
                                "INSERT INTO usage_log (uri, app_id, feature, extra, value, time)"
                                " VALUES (?1, ?2, ?3, ?4, ?5, ?6);",
                                -1, &stmt, nullptr);
    if (rc == SQLITE_OK) {
      sqlite3_bind_text(stmt, 1, uri, -1, SQLITE_TRANSIENT);
      sqlite3_bind_text(stmt, 2, appId, -1, SQLITE_TRANSIENT);
      sqlite3_bind_text(stmt, 3, feature, -1, SQLITE_TRANSIENT);
      if (extra) sqlite3_bind_text(stmt, 4, extra, -1, SQLITE_TRANSIENT);
      if (value) sqlite3_bind_text(stmt, 5, value, -1, SQLITE_TRANSIENT);
      sqlite3_bind_int64(stmt, 6, time(nullptr));
      rc = sqlite3_step(stmt);
    }
    sqlite3_finalize(stmt);
    if (rc != SQLITE_DONE) {
      LYLOG_E("usage log insert failed: %s", sqlite3_errmsg(handle->db));
      result = BRELMO_LOG_ERROR_DB_FAILED;
    }
  }
  if (callback) callback(result, user_data);
  return result;
}

extern "C" int brelmo_log_list(brelmo_log_record_s** records, size_t* count) {
  if (!records || !count) return BRELMO_LOG_ERROR_INVALID_PARAMETER;
  *records = nullptr;
  *count = 0;
  sqlite3* db = platform_db::openStore(dbPath(), kSchema);
  if (!db) return BRELMO_LOG_ERROR_DB_FAILED;
  sqlite3_stmt* stmt = nullptr;
  std::vector<brelmo_log_record_s> found;
  int rc =
      sqlite3_prepare_v2(db, "SELECT id, uri, app_id, feature, extra, value, time FROM usage_log ORDER BY id",
                         -1, &stmt, nullptr);
  rc = platform_db::readRows(stmt, rc, found, [](sqlite3_stmt* row) {
    brelmo_log_record_s record = {};
    record.id = sqlite3_column_int64(row, 0);
    record.uri = platform_db::dupColumn(row, 1);
    record.app_id = platform_db::dupColumn(row, 2);
    record.feature = platform_db::dupColumn(row, 3);
    record.extra = platform_db::dupColumn(row, 4);
    record.value = platform_db::dupColumn(row, 5);
    record.time = sqlite3_column_int64(row, 6);
    return record;
  });
  sqlite3_finalize(stmt);
  sqlite3_close(db);
  if (rc == SQLITE_DONE && !found.empty() && platform_db::toCArray(found, records, count))
    return BRELMO_LOG_ERROR_NONE;
  for (brelmo_log_record_s& record : found) {
    free(record.uri);
    free(record.app_id);
    free(record.feature);
    free(record.extra);
    free(record.value);
  }
  if (rc != SQLITE_DONE) return BRELMO_LOG_ERROR_DB_FAILED;
  return found.empty() ? BRELMO_LOG_ERROR_NONE : BRELMO_LOG_ERROR_OUT_OF_MEMORY;
}

extern "C" void brelmo_log_free_records(brelmo_log_record_s* records, size_t count) {
  if (!records) return;
  for (size_t i = 0; i < count; ++i) {
    free(records[i].uri);
    free(records[i].app_id);
    free(records[i].feature);
    free(records[i].extra);
    free(records[i].value);
  }
  free(records);
}
