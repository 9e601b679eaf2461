#pragma once
// Opening the platform's SQLite stores (media database, usage log) so that
// several processes can share them: write-ahead log, a busy timeout, and the
// schema created on first use.

#include <sqlite3.h>

#include <string>

namespace platform_db {

// The file `name` in the application's data folder, unless the environment
// variable `envOverride` names another path.
std::string storePath(const char* envOverride, const char* name);

// Opens (creating) the database at `path` and runs `schema` (statements that
// may be repeated). nullptr on failure, logged.
sqlite3* openStore(const std::string& path, const char* schema);

}  // namespace platform_db
