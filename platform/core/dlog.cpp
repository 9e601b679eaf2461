#include "platform/core/dlog.h"

#include <unistd.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <string>

namespace {

std::atomic<int> gMinPriority{-1};
std::mutex gSinkMutex;
dlog_sink_cb gSink = nullptr;
void* gSinkData = nullptr;

log_priority parsePriority(const char* text) {
  if (!text || !*text) return DLOG_INFO;
  switch (text[0]) {
    case 'V':
    case 'v':
      return DLOG_VERBOSE;
    case 'D':
    case 'd':
      return DLOG_DEBUG;
    case 'I':
    case 'i':
      return DLOG_INFO;
    case 'W':
    case 'w':
      return DLOG_WARN;
    case 'E':
    case 'e':
      return DLOG_ERROR;
    case 'F':
    case 'f':
      return DLOG_FATAL;
    case 'S':
    case 's':
      return DLOG_SILENT;
    default:
      break;
  }
  int value = atoi(text);
  return (value >= DLOG_VERBOSE && value <= DLOG_SILENT) ? static_cast<log_priority>(value) : DLOG_INFO;
}

char priorityLetter(int prio) {
  static const char kLetters[] = "??VDIWEFS";
  return (prio >= 0 && prio <= DLOG_SILENT) ? kLetters[prio] : '?';
}

// Failures show in red and traces in magenta, but only on a terminal.
const char* colourOf(int prio) {
  static const bool tty = isatty(STDERR_FILENO) == 1;
  if (!tty) return nullptr;
  if (prio >= DLOG_ERROR) return "\033[31m";
  if (prio == DLOG_WARN) return "\033[35m";
  return nullptr;
}

}  // namespace

extern "C" {

log_priority dlog_get_min_priority(void) {
  int value = gMinPriority.load(std::memory_order_relaxed);
  if (value < 0) {
    value = parsePriority(getenv("PICTAVO_LOG_LEVEL"));
    gMinPriority.store(value, std::memory_order_relaxed);
  }
  return static_cast<log_priority>(value);
}

void dlog_set_min_priority(log_priority prio) {
  gMinPriority.store(prio, std::memory_order_relaxed);
}

void dlog_set_sink(dlog_sink_cb sink, void* user_data) {
  std::lock_guard<std::mutex> lock(gSinkMutex);
  gSink = sink;
  gSinkData = user_data;
}

int dlog_vprint(log_priority prio, const char* tag, const char* fmt, va_list ap) {
  if (!tag || !fmt) return DLOG_ERROR_INVALID_PARAMETER;
  {
    std::lock_guard<std::mutex> lock(gSinkMutex);
    if (gSink) {
      va_list copy;
      va_copy(copy, ap);
      char buffer[2048];
      vsnprintf(buffer, sizeof buffer, fmt, copy);
      va_end(copy);
      gSink(prio, tag, buffer, gSinkData);
    }
  }
  if (prio < dlog_get_min_priority()) return DLOG_ERROR_NONE;

  char message[4096];
  int length = vsnprintf(message, sizeof message, fmt, ap);
  if (length < 0) return DLOG_ERROR_INVALID_PARAMETER;

  const char* colour = colourOf(prio);
  // One write per line keeps lines of concurrent threads from interleaving.
  char line[4400];
  snprintf(line, sizeof line, "%s%c/%s: %s%s\n", colour ? colour : "", priorityLetter(prio), tag, message,
           colour ? "\033[0m" : "");
  ssize_t ignored = write(STDERR_FILENO, line, strlen(line));
  (void)ignored;
  return length;
}

int dlog_print(log_priority prio, const char* tag, const char* fmt, ...) {
  va_list ap;
  va_start(ap, fmt);
  int result = dlog_vprint(prio, tag, fmt, ap);
  va_end(ap);
  return result;
}

int __dlog_print(log_id_t, int prio, const char* tag, const char* fmt, ...) {
  va_list ap;
  va_start(ap, fmt);
  int result = dlog_vprint(static_cast<log_priority>(prio), tag, fmt, ap);
  va_end(ap);
  return result;
}

}  // extern "C"
