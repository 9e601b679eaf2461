#pragma once
// The platform log (dlog): priorities, tags and the print calls the whole
// program logs through. On the desktop it writes to standard error.

#include <stdarg.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  DLOG_UNKNOWN = 0,
  DLOG_DEFAULT,
  DLOG_VERBOSE,
  DLOG_DEBUG,
  DLOG_INFO,
  DLOG_WARN,
  DLOG_ERROR,
  DLOG_FATAL,
  DLOG_SILENT,
} log_priority;

typedef enum {
  LOG_ID_MAIN = 0,
  LOG_ID_RADIO,
  LOG_ID_SYSTEM,
  LOG_ID_APPS,
} log_id_t;

enum { DLOG_ERROR_NONE = 0, DLOG_ERROR_INVALID_PARAMETER = -22 };

int dlog_print(log_priority prio, const char* tag, const char* fmt, ...)
    __attribute__((format(printf, 3, 4)));
int dlog_vprint(log_priority prio, const char* tag, const char* fmt, va_list ap);
int __dlog_print(log_id_t log_id, int prio, const char* tag, const char* fmt, ...)
    __attribute__((format(printf, 4, 5)));

// Desktop additions. The minimum priority comes from PICTAVO_LOG_LEVEL
// (V, D, I, W, E, F, S or 2..8); the default is I.
log_priority dlog_get_min_priority(void);
void dlog_set_min_priority(log_priority prio);

// A sink sees every line that passes the priority filter, before it is
// written; tests use it to read what was logged. Pass NULL to remove it.
typedef void (*dlog_sink_cb)(int prio, const char* tag, const char* msg, void* user_data);
void dlog_set_sink(dlog_sink_cb sink, void* user_data);

#ifdef __cplusplus
}
#endif
