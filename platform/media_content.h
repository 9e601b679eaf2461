#pragma once
// Media database: an SQLite file "media.db" in the application's data folder
// ($XDG_DATA_HOME/pictavo/, or $PICTAVO_MEDIA_DB when set). Scanning an image
// file records or refreshes its row; several processes may use the database at
// once (write-ahead log, busy timeout).

#include <stddef.h>
#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  MEDIA_CONTENT_ERROR_NONE = 0,
  MEDIA_CONTENT_ERROR_INVALID_PARAMETER = -22,
  MEDIA_CONTENT_ERROR_OUT_OF_MEMORY = -12,
  MEDIA_CONTENT_ERROR_INVALID_OPERATION = -38,
  MEDIA_CONTENT_ERROR_DB_FAILED = -0x01990000 | 0x21,
  MEDIA_CONTENT_ERROR_DB_BUSY = -0x01990000 | 0x22,
  MEDIA_CONTENT_ERROR_NOT_SUPPORTED = -0x01990000 | 0x23,
} media_content_error_e;

// Connections are counted: every connect needs its disconnect.
int media_content_connect(void);
int media_content_disconnect(void);

// Records (or refreshes) the image at `path`. A missing file, a folder or a
// file that is not a JPEG, PNG, GIF, BMP or WBMP image fails with
// MEDIA_CONTENT_ERROR_INVALID_PARAMETER / _NOT_SUPPORTED. Needs a connection.
int media_content_scan_file(const char* path);

// One row of the database.
typedef struct {
  char* path;
  char* mime_type;
  int64_t size;
  int width;
  int height;
  int64_t modified_time;  // seconds since the epoch (file modification time)
  int64_t added_time;     // seconds since the epoch (first scan)
} media_info_s;

// Reads every row (ordered by path), or only the row of `path` when it is not
// NULL. *rows is a malloc'ed array freed with media_content_free_rows.
int media_content_list(const char* path, media_info_s** rows, size_t* count);
void media_content_free_rows(media_info_s* rows, size_t count);

#ifdef __cplusplus
}
#endif
