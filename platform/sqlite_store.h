#pragma once
// Opening the platform's SQLite stores (media database, usage log) so that
// several processes can share them: write-ahead log, a busy timeout, and the
// schema created on first use.

#include <sqlite3.h>

#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

namespace platform_db {

// The file `name` in the application's data folder, unless the environment
// variable `envOverride` names another path.
std::string storePath(const char* envOverride, const char* name);

// Opens (creating) the database at `path` and runs `schema` (statements that
// may be repeated). nullptr on failure, logged.
sqlite3* openStore(const std::string& path, const char* schema);

// A malloc'd copy of the text in `column`; nullptr for NULL.
char* dupColumn(sqlite3_stmt* stmt, int column);

// Steps a query prepared with result `rc` to its end, turning each row into
// a Row with `read`. SQLITE_DONE when every row was read, else the error.
template <typename Row, typename Read>
int readRows(sqlite3_stmt* stmt, int rc, std::vector<Row>& rows, Read read) {
  while (rc == SQLITE_OK || rc == SQLITE_ROW) {
    rc = sqlite3_step(stmt);
    if (rc != SQLITE_ROW) break;
    rows.push_back(read(stmt));
  }
  return rc;
}

// Hands `rows` (not empty) to a C caller as one calloc'd array. False when
// out of memory; the rows then still belong to the caller.
template <typename Row>
bool toCArray(const std::vector<Row>& rows, Row** out, size_t* count) {
  *out = static_cast<Row*>(calloc(rows.size(), sizeof(Row)));
  if (!*out) return false;
  memcpy(*out, rows.data(), rows.size() * sizeof(Row));
  *count = rows.size();
  return true;
}

}  // namespace platform_db
