#include <gtest/gtest.h>
#include <sqlite3.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "PlatformTestImages.h"
#include "platform/media_content.h"
#include "tests/support/TestSupport.h"

using pictavo::test::TempDir;
using pictavo::test::writeFileBytes;
using pictavo::test::writeTestPng;

namespace {

// Every test works on its own database file.
class MediaContentTest : public ::testing::Test {
 protected:
  void SetUp() override { setenv("PICTAVO_MEDIA_DB", mDir.file("media.db").c_str(), 1); }
  void TearDown() override { unsetenv("PICTAVO_MEDIA_DB"); }

  // The row of `path`, or an empty optional-like struct with path "".
  bool row(const std::string& path, media_info_s& out) {
    media_info_s* rows = nullptr;
    size_t count = 0;
    if (media_content_list(path.c_str(), &rows, &count) != MEDIA_CONTENT_ERROR_NONE || count != 1) {
      media_content_free_rows(rows, count);
      return false;
    }
    out = rows[0];
    out.path = strdup(rows[0].path);
    out.mime_type = strdup(rows[0].mime_type);
    media_content_free_rows(rows, count);
    mKeep.push_back(out.path);
    mKeep.push_back(out.mime_type);
    return true;
  }

  ~MediaContentTest() override {
    for (char* s : mKeep) free(s);
  }

  TempDir mDir;
  std::vector<char*> mKeep;
};

}  // namespace

TEST_F(MediaContentTest, ScanRecordsAndRefreshesTheRow) {
  std::string png = mDir.file("one.png");
  ASSERT_TRUE(writeTestPng(png, 40, 30));
  ASSERT_EQ(media_content_connect(), MEDIA_CONTENT_ERROR_NONE);
  ASSERT_EQ(media_content_scan_file(png.c_str()), MEDIA_CONTENT_ERROR_NONE);

  media_info_s first = {};
  ASSERT_TRUE(row(png, first));
  struct stat st;
  ASSERT_EQ(stat(png.c_str(), &st), 0);
  EXPECT_STREQ(first.mime_type, "image/png");
  EXPECT_EQ(first.width, 40);
  EXPECT_EQ(first.height, 30);
  EXPECT_EQ(first.size, st.st_size);
  EXPECT_EQ(first.modified_time, st.st_mtime);
  EXPECT_GT(first.added_time, 0);

  // The file changes: a rescan refreshes the row, keeps one row and the time
  // it was first added.
  ASSERT_TRUE(writeTestPng(png, 64, 48));
  ASSERT_EQ(media_content_scan_file(png.c_str()), MEDIA_CONTENT_ERROR_NONE);
  media_info_s second = {};
  ASSERT_TRUE(row(png, second));
  EXPECT_EQ(second.width, 64);
  EXPECT_EQ(second.height, 48);
  EXPECT_EQ(second.added_time, first.added_time);
  media_info_s* rows = nullptr;
  size_t count = 0;
  ASSERT_EQ(media_content_list(nullptr, &rows, &count), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(count, 1u);
  media_content_free_rows(rows, count);
  EXPECT_EQ(media_content_disconnect(), MEDIA_CONTENT_ERROR_NONE);
}

TEST_F(MediaContentTest, RefusesWhatIsNotAnImageFile) {
  ASSERT_EQ(media_content_connect(), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_NE(media_content_scan_file(mDir.file("missing.jpg").c_str()), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_NE(media_content_scan_file(mDir.path().c_str()), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_NE(media_content_scan_file(nullptr), MEDIA_CONTENT_ERROR_NONE);
  ASSERT_TRUE(writeFileBytes(mDir.file("notes.jpg"), "plain text, not a picture"));
  EXPECT_NE(media_content_scan_file(mDir.file("notes.jpg").c_str()), MEDIA_CONTENT_ERROR_NONE);
  // A PNG cut short before its header ends.
  ASSERT_TRUE(writeFileBytes(mDir.file("cut.png"), std::string("\x89PNG\r\n\x1a\n\0\0\0\rIH", 14)));
  EXPECT_NE(media_content_scan_file(mDir.file("cut.png").c_str()), MEDIA_CONTENT_ERROR_NONE);
  // A JPEG whose segments run past the end of the file.
  ASSERT_TRUE(writeFileBytes(mDir.file("cut.jpg"), std::string("\xFF\xD8\xFF\xE0\x7F\xFF", 6)));
  EXPECT_NE(media_content_scan_file(mDir.file("cut.jpg").c_str()), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(media_content_disconnect(), MEDIA_CONTENT_ERROR_NONE);

  media_info_s* rows = nullptr;
  size_t count = 0;
  ASSERT_EQ(media_content_list(nullptr, &rows, &count), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(count, 0u);
}

TEST_F(MediaContentTest, ScanNeedsAConnection) {
  std::string png = mDir.file("a.png");
  ASSERT_TRUE(writeTestPng(png, 4, 4));
  EXPECT_EQ(media_content_scan_file(png.c_str()), MEDIA_CONTENT_ERROR_INVALID_OPERATION);
  EXPECT_EQ(media_content_disconnect(), MEDIA_CONTENT_ERROR_INVALID_OPERATION);
  // Connections nest: the database stays open until the last disconnect.
  ASSERT_EQ(media_content_connect(), MEDIA_CONTENT_ERROR_NONE);
  ASSERT_EQ(media_content_connect(), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(media_content_disconnect(), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(media_content_scan_file(png.c_str()), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(media_content_disconnect(), MEDIA_CONTENT_ERROR_NONE);
}

TEST_F(MediaContentTest, TwoProcessesWritingAtOnceKeepTheDatabaseWhole) {
  constexpr int kFilesPerProcess = 40;
  for (int p = 0; p < 2; ++p) {
    for (int i = 0; i < kFilesPerProcess; ++i) {
      ASSERT_TRUE(
          writeTestPng(mDir.file("p" + std::to_string(p) + "_" + std::to_string(i) + ".png"), 8 + i, 8));
    }
  }
  pid_t children[2];
  for (int p = 0; p < 2; ++p) {
    children[p] = fork();
    ASSERT_GE(children[p], 0);
    if (children[p] == 0) {
      int failures = 0;
      // Each scan connects and disconnects, as the application does.
      for (int i = 0; i < kFilesPerProcess; ++i) {
        std::string file = mDir.file("p" + std::to_string(p) + "_" + std::to_string(i) + ".png");
        if (media_content_connect() != MEDIA_CONTENT_ERROR_NONE) ++failures;
        if (media_content_scan_file(file.c_str()) != MEDIA_CONTENT_ERROR_NONE) ++failures;
        if (media_content_disconnect() != MEDIA_CONTENT_ERROR_NONE) ++failures;
      }
      _exit(failures == 0 ? 0 : 1);
    }
  }
  for (pid_t child : children) {
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);
  }
  media_info_s* rows = nullptr;
  size_t count = 0;
  ASSERT_EQ(media_content_list(nullptr, &rows, &count), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(count, 2u * kFilesPerProcess);
  media_content_free_rows(rows, count);

  sqlite3* db = nullptr;
  ASSERT_EQ(sqlite3_open(mDir.file("media.db").c_str(), &db), SQLITE_OK);
  sqlite3_stmt* stmt = nullptr;
  ASSERT_EQ(sqlite3_prepare_v2(db, "PRAGMA integrity_check", -1, &stmt, nullptr), SQLITE_OK);
  ASSERT_EQ(sqlite3_step(stmt), SQLITE_ROW);
  EXPECT_STREQ(reinterpret_cast<const char*>(sqlite3_column_text(stmt, 0)), "ok");
  sqlite3_finalize(stmt);
  sqlite3_close(db);
}
