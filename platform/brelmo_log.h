#pragma once
// Usage-log client: inserts feature-usage records into the usage-log
// provider. On the desktop the provider is an SQLite file "usage_log.db" in
// the application's data folder ($PICTAVO_USAGE_LOG_DB overrides the path),
// table "usage_log" (id, uri, app_id, feature, extra, value, time).

#include <stddef.h>
#include <stdint.h>

#include "platform/bundle.h"

#ifdef __cplusplus
extern "C" {
#endif

typedef struct _brelmo_log_manager_s* brelmo_log_manager_h;

typedef enum {
  BRELMO_LOG_ERROR_NONE = 0,
  BRELMO_LOG_ERROR_INVALID_PARAMETER = -22,
  BRELMO_LOG_ERROR_OUT_OF_MEMORY = -12,
  BRELMO_LOG_ERROR_DB_FAILED = -0x7A000000 | 0x01,
} brelmo_log_error_e;

// Called when an asynchronous insert finishes; the desktop insert is
// synchronous and calls it (when given) before returning.
typedef void (*brelmo_log_insert_cb)(int result, void* user_data);

int brelmo_log_manager_create(brelmo_log_manager_h* handle);
// Inserts one record: the pairs "app_id", "feature", "extra", "value" of the
// bundle ("app_id" and "feature" required). Only "content://" URIs are taken.
int brelmo_log_manager_insert(brelmo_log_manager_h handle, const char* uri, bundle* data,
                              brelmo_log_insert_cb callback, void* user_data);
int brelmo_log_manager_destroy(brelmo_log_manager_h handle);

// Read side, for tests and diagnostics.
typedef struct {
  int64_t id;
  char* uri;
  char* app_id;
  char* feature;
  char* extra;  // NULL when the record carries none
  char* value;  // NULL when the record carries none
  int64_t time;
} brelmo_log_record_s;

// All records, oldest first; *records is freed with brelmo_log_free_records.
int brelmo_log_list(brelmo_log_record_s** records, size_t* count);
void brelmo_log_free_records(brelmo_log_record_s* records, size_t count);

#ifdef __cplusplus
}
#endif
