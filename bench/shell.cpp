// Application-shell timings, each beside a plain peer doing the same job:
//   exif_orientation   CLyUtil::getOrientation on a 4000 x 3000 JPEG with EXIF
//     peer_exif_new_from_file   libexif's own file entry point and a tag lookup
//     peer_read_whole_file      reading the file into memory (what a naive reader costs)
//   media_scan         CLyUtil::mediaContentScanFile (connect, scan, disconnect)
//     peer_sqlite_upsert        open the database, one upsert, close (no header probe)
//   usage_log_insert   CLyLogManager::insertLog
//     peer_sqlite_insert        one INSERT on a kept connection
//   storage_check      CLyUtil::isInternalMemoryLow
//     peer_statvfs              statvfs of the same folder
// Usage: bench_shell [RUNS]   prints "name: min median max (ms)". Works in a
// temporary folder; the user's own databases and pictures are not touched.

// jpeglib.h needs size_t and FILE declared first.
#include <cstddef>
#include <cstdio>

#include <jpeglib.h>
#include <libexif/exif-data.h>
#include <sqlite3.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "bench/BenchTiming.h"
#include "common/CLyUtil.h"
#include "misc/CLyLogManager.h"
#include "platform/core/dlog.h"

namespace {

using Clock = std::chrono::steady_clock;

using pictavo::bench::measure;

// A photo-sized JPEG with EXIF orientation 6 in IFD 0.
bool writePhoto(const std::string& path, int w, int h) {
  ExifData* exif = exif_data_new();
  exif_data_set_byte_order(exif, EXIF_BYTE_ORDER_INTEL);
  ExifEntry* entry = exif_entry_new();
  exif_content_add_entry(exif->ifd[EXIF_IFD_0], entry);
  exif_entry_initialize(entry, EXIF_TAG_ORIENTATION);
  exif_set_short(entry->data, EXIF_BYTE_ORDER_INTEL, 6);
  exif_entry_unref(entry);
  unsigned char* app1 = nullptr;
  unsigned int app1Size = 0;
  exif_data_save_data(exif, &app1, &app1Size);
  exif_data_unref(exif);

  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return false;
  jpeg_compress_struct cinfo;
  jpeg_error_mgr jerr;
  cinfo.err = jpeg_std_error(&jerr);
  jpeg_create_compress(&cinfo);
  jpeg_stdio_dest(&cinfo, f);
  cinfo.image_width = w;
  cinfo.image_height = h;
  cinfo.input_components = 3;
  cinfo.in_color_space = JCS_RGB;
  jpeg_set_defaults(&cinfo);
  jpeg_set_quality(&cinfo, 90, TRUE);
  jpeg_start_compress(&cinfo, TRUE);
  jpeg_write_marker(&cinfo, JPEG_APP0 + 1, app1, app1Size);
  std::vector<unsigned char> row(w * 3);
  while (cinfo.next_scanline < cinfo.image_height) {
    for (int x = 0; x < w; ++x) {
      row[x * 3] = static_cast<unsigned char>(x * 7 + cinfo.next_scanline);
      row[x * 3 + 1] = static_cast<unsigned char>(x ^ cinfo.next_scanline);
      row[x * 3 + 2] = static_cast<unsigned char>(cinfo.next_scanline * 3);
    }
    JSAMPROW rows[1] = {row.data()};
    jpeg_write_scanlines(&cinfo, rows, 1);
  }
  jpeg_finish_compress(&cinfo);
  jpeg_destroy_compress(&cinfo);
  fclose(f);
  free(app1);
  return true;
}

int peerOrientation(const std::string& path) {
  ExifData* data = exif_data_new_from_file(path.c_str());
  if (!data) return -1;
  ExifEntry* entry = exif_data_get_entry(data, EXIF_TAG_ORIENTATION);
  int value = entry ? exif_get_short(entry->data, exif_data_get_byte_order(data)) : -1;
  exif_data_unref(data);
  return value;
}

void sqliteExec(sqlite3* db, const char* sql) {
  char* error = nullptr;
  if (sqlite3_exec(db, sql, nullptr, nullptr, &error) != SQLITE_OK) {
    fprintf(stderr, "sqlite: %s\n", error ? error : "?");
    sqlite3_free(error);
  }
}

}  // namespace

int main(int argc, char** argv) {
  int runs = argc > 1 ? atoi(argv[1]) : 50;
  if (runs <= 0) runs = 50;
  dlog_set_min_priority(DLOG_ERROR);
  char tmpl[] = "/tmp/pictavo-bench-shell-XXXXXX";
  if (!mkdtemp(tmpl)) return 1;
  std::string dir = tmpl;
  setenv("PICTAVO_STORAGE_ROOT", dir.c_str(), 1);
  setenv("PICTAVO_MEDIA_DB", (dir + "/media.db").c_str(), 1);
  setenv("PICTAVO_USAGE_LOG_DB", (dir + "/usage.db").c_str(), 1);
  std::string photo = dir + "/photo.jpg";
  if (!writePhoto(photo, 4000, 3000)) return 1;

  measure("exif_orientation", runs, [&](int) { CLyUtil::getOrientation(photo); });
  measure("peer_exif_new_from_file", runs, [&](int) { peerOrientation(photo); });
  measure("peer_read_whole_file", runs, [&](int) {
    std::ifstream in(photo, std::ios::binary);
    std::vector<char> bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  });

  measure("media_scan", runs, [&](int) { CLyUtil::mediaContentScanFile(photo.c_str()); });
  measure("peer_sqlite_upsert", runs, [&](int) {
    sqlite3* db = nullptr;
    sqlite3_open((dir + "/peer.db").c_str(), &db);
    sqliteExec(
        db,
        "PRAGMA journal_mode=WAL; CREATE TABLE IF NOT EXISTS media (path TEXT PRIMARY KEY, size INTEGER);"
        "INSERT INTO media VALUES ('/x/photo.jpg', 1) ON CONFLICT(path) DO UPDATE SET size = 2;");
    sqlite3_close(db);
  });

  CLyLogManager* logs = CLyLogManager::getInstance();
  measure("usage_log_insert", runs, [&](int) { logs->insertLog("CLAY", "6-3", nullptr); });
  sqlite3* peer = nullptr;
  sqlite3_open((dir + "/peer_log.db").c_str(), &peer);
  sqliteExec(peer,
             "PRAGMA journal_mode=WAL; PRAGMA synchronous=NORMAL;"
             "CREATE TABLE IF NOT EXISTS log (feature TEXT, extra TEXT, time INTEGER);");
  measure("peer_sqlite_insert", runs,
          [&](int) { sqliteExec(peer, "INSERT INTO log VALUES ('CLAY', '6-3', strftime('%s'));"); });
  sqlite3_close(peer);
  CLyLogManager::destroyInstance();

  std::string internal = dir + "/internal";
  measure("storage_check", runs, [&](int) { CLyUtil::isInternalMemoryLow(); });
  measure("peer_statvfs", runs, [&](int) {
    struct statvfs info;
    statvfs(dir.c_str(), &info);
  });

  std::string cleanup = "rm -rf '" + dir + "'";
  if (system(cleanup.c_str()) != 0) fprintf(stderr, "cannot remove %s\n", dir.c_str());
  return 0;
}
