#include "platform/sqlite_store.h"

#include <cstdlib>
#include <cstring>

#include "common/CLyLog.h"
#include "platform/core/app_common.h"

namespace platform_db {

namespace {
// Another process holding the write lock normally finishes within
// milliseconds; wait this long before giving up.
constexpr int kBusyTimeoutMs = 5000;
}  // namespace

std::string storePath(const char* envOverride, const char* name) {
  if (const char* path = getenv(envOverride); path && *path) return path;
  char* data = app_get_data_path();
  if (!data) return "";
  std::string path = std::string(data) + name;
  free(data);
  return path;
}

sqlite3* openStore(const std::string& path, const char* schema) {
  if (path.empty()) {
    LYLOG_E("No data folder for the database");
    return nullptr;
  }
  sqlite3* db = nullptr;
  int rc = sqlite3_open_v2(path.c_str(), &db,
                           SQLITE_OPEN_READWRITE | SQLITE_OPEN_CREATE | SQLITE_OPEN_FULLMUTEX, nullptr);
  if (rc != SQLITE_OK) {
    LYLOG_E("Cannot open %s: %s", path.c_str(), db ? sqlite3_errmsg(db) : sqlite3_errstr(rc));
    sqlite3_close(db);
    return nullptr;
  }
  sqlite3_busy_timeout(db, kBusyTimeoutMs);
  char* error = nullptr;
  // WAL lets readers and one writer work at once across processes; the
  // journal mode is a property of the file, so setting it again is harmless.
  rc = sqlite3_exec(db, "PRAGMA journal_mode=WAL; PRAGMA synchronous=NORMAL;", nullptr, nullptr, &error);
  if (rc == SQLITE_OK) rc = sqlite3_exec(db, schema, nullptr, nullptr, &error);
  if (rc != SQLITE_OK) {
    LYLOG_E("Cannot prepare %s: %s", path.c_str(), error ? error : sqlite3_errstr(rc));
    sqlite3_free(error);
    sqlite3_close(db);
    return nullptr;
  }
  return db;
}

char* dupColumn(sqlite3_stmt* stmt, int column) {
  const unsigned char* text = sqlite3_column_text(stmt, column);
  return text ? strdup(reinterpret_cast<const char*>(text)) : nullptr;
}

}  // namespace platform_db
