#include "platform/media_content.h"

#include <sqlite3.h>
#include <sys/stat.h>

#include <cstdlib>
#include <cstring>
#include <ctime>
#include <mutex>
#include <new>
#include <string>
#include <vector>

#include "common/CLyLog.h"
#include "platform/image_probe.h"
#include "platform/sqlite_store.h"

namespace {

const char* const kSchema =
    "CREATE TABLE IF NOT EXISTS media ("
    "  path TEXT PRIMARY KEY NOT NULL,"
    "  mime_type TEXT NOT NULL,"
    "  size INTEGER NOT NULL,"
    "  width INTEGER NOT NULL,"
    "  height INTEGER NOT NULL,"
    "  modified_time INTEGER NOT NULL,"
    "  added_time INTEGER NOT NULL);";

std::mutex gMutex;
sqlite3* gDb = nullptr;
int gConnections = 0;

std::string dbPath() {
  return platform_db::storePath("PICTAVO_MEDIA_DB", "media.db");
}

void freeStrings(media_info_s& row) {
  free(row.path);
  free(row.mime_type);
  row.path = nullptr;
  row.mime_type = nullptr;
}

}  // namespace

extern "C" int media_content_connect(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  if (gConnections == 0) {
    gDb = platform_db::openStore(dbPath(), kSchema);
    if (!gDb) return MEDIA_CONTENT_ERROR_DB_FAILED;
  }
  ++gConnections;
  return MEDIA_CONTENT_ERROR_NONE;
}

extern "C" int media_content_disconnect(void) {
  std::lock_guard<std::mutex> lock(gMutex);
  if (gConnections == 0) return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
  if (--gConnections == 0) {
    sqlite3_close(gDb);
    gDb = nullptr;
  }
  return MEDIA_CONTENT_ERROR_NONE;
}

extern "C" int media_content_scan_file(const char* path) {
  if (!path || !*path) return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
  struct stat st;
  if (stat(path, &st) != 0 || !S_ISREG(st.st_mode)) {
    LYLOG_E("Not a file: %s", path);
    return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
  }
  platform_image::ProbeResult image;
  if (!platform_image::probe(path, image)) {
    LYLOG_E("Not an image: %s", path);
    return MEDIA_CONTENT_ERROR_NOT_SUPPORTED;
  }
  std::lock_guard<std::mutex> lock(gMutex);
  if (!gDb) return MEDIA_CONTENT_ERROR_INVALID_OPERATION;
  // A rescan refreshes everything but the time the file was first added.
  const char* sql =
      "INSERT INTO media (path, mime_type, size, width, height, modified_time, added_time)"
      " VALUES (?1, ?2, ?3, ?4, ?5, ?6, ?7)"
      " ON CONFLICT(path) DO UPDATE SET mime_type = excluded.mime_type, size = excluded.size,"
      " width = excluded.width, height = excluded.height, modified_time = excluded.modified_time;";
  sqlite3_stmt* stmt = nullptr;
  int rc = sqlite3_prepare_v2(gDb, sql, -1, &stmt, nullptr);
  if (rc == SQLITE_OK) {
    sqlite3_bind_text(stmt, 1, path, -1, SQLITE_TRANSIENT);
    sqlite3_bind_text(stmt, 2, image.mimeType.c_str(), -1, SQLITE_TRANSIENT);
    sqlite3_bind_int64(stmt, 3, st.st_size);
    sqlite3_bind_int(stmt, 4, image.width);
    sqlite3_bind_int(stmt, 5, image.height);
    sqlite3_bind_int64(stmt, 6, st.st_mtime);
    sqlite3_bind_int64(stmt, 7, time(nullptr));
    rc = sqlite3_step(stmt);
  }
  sqlite3_finalize(stmt);
  if (rc != SQLITE_DONE) {
    LYLOG_E("Cannot record %s: %s", path, sqlite3_errmsg(gDb));
    return rc == SQLITE_BUSY ? MEDIA_CONTENT_ERROR_DB_BUSY : MEDIA_CONTENT_ERROR_DB_FAILED;
  }
  LYLOG_I("scanned %s (%s %dx%d)", path, image.mimeType.c_str(), image.width, image.height);
  return MEDIA_CONTENT_ERROR_NONE;
}

extern "C" int media_content_list(const char* path, media_info_s** rows, size_t* count) {
  if (!rows || !count) return MEDIA_CONTENT_ERROR_INVALID_PARAMETER;
  *rows = nullptr;
  *count = 0;
  std::lock_guard<std::mutex> lock(gMutex);
  // Readers without a connection of their own get a short-lived one.
  sqlite3* db = gDb ? gDb : platform_db::openStore(dbPath(), kSchema);
  if (!db) return MEDIA_CONTENT_ERROR_DB_FAILED;
  const char* sql = path ? "SELECT path, mime_type, size, width, height, modified_time, added_time FROM media"
                           " WHERE path = ?1"
                         : "SELECT path, mime_type, size, width, height, modified_time, added_time FROM media"
                           " ORDER BY path";
  sqlite3_stmt* stmt = nullptr;
  std::vector<media_info_s> found;
  int rc = sqlite3_prepare_v2(db, sql, -1, &stmt, nullptr);
  if (rc == SQLITE_OK && path) sqlite3_bind_text(stmt, 1, path, -1, SQLITE_TRANSIENT);
  rc = platform_db::readRows(stmt, rc, found, [](sqlite3_stmt* columns) {
    media_info_s row = {};
    row.path = platform_db::dupColumn(columns, 0);
    row.mime_type = platform_db::dupColumn(columns, 1);
    row.size = sqlite3_column_int64(columns, 2);
    row.width = sqlite3_column_int(columns, 3);
    row.height = sqlite3_column_int(columns, 4);
    row.modified_time = sqlite3_column_int64(columns, 5);
    row.added_time = sqlite3_column_int64(columns, 6);
    return row;
  });
  sqlite3_finalize(stmt);
  if (db != gDb) sqlite3_close(db);
  int result = rc == SQLITE_DONE ? MEDIA_CONTENT_ERROR_NONE : MEDIA_CONTENT_ERROR_DB_FAILED;
  if (result == MEDIA_CONTENT_ERROR_NONE && !found.empty()) {
    if (platform_db::toCArray(found, rows, count)) return result;
    result = MEDIA_CONTENT_ERROR_OUT_OF_MEMORY;
  }
  for (media_info_s& row : found) freeStrings(row);
  return result;
}

extern "C" void media_content_free_rows(media_info_s* rows, size_t count) {
  if (!rows) return;
  for (size_t i = 0; i < count; ++i) freeStrings(rows[i]);
  free(rows);
}
