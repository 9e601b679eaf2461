#pragma once
// Application logging: every line goes to the platform log under the tag
// "PICTAVO", prefixed with "source file: function(line) > ".
//
//   LYLOG_D  debug trace
//   LYLOG_I  information
//   LYLOG_W  trace at warning level (magenta on a terminal)
//   LYLOG_E  critical failure at error level (red, "* Critical * ")
//   WASSERT(cond)             logs "WASSERT! cond" and stops the program
//   WASSERT_MSG(cond, fmt..)  logs "WASSERT! <message>" and stops on "(cond)"

#include <cstdlib>

#include "platform/core/dlog.h"

#define LY_LOG_TAG "PICTAVO"

#define LY_FILE_NAME (__builtin_strrchr(__FILE__, '/') ? __builtin_strrchr(__FILE__, '/') + 1 : __FILE__)

#define LY_LOG_AT(prio, prefix, fmt, ...) \
  dlog_print(prio, LY_LOG_TAG, "%s: %s(%d) > " prefix fmt, LY_FILE_NAME, __func__, __LINE__, ##__VA_ARGS__)

#define LYLOG_D(fmt, ...) LY_LOG_AT(DLOG_DEBUG, "", fmt, ##__VA_ARGS__)
#define LYLOG_I(fmt, ...) LY_LOG_AT(DLOG_INFO, "", fmt, ##__VA_ARGS__)
#define LYLOG_W(fmt, ...) LY_LOG_AT(DLOG_WARN, "", fmt, ##__VA_ARGS__)
#define LYLOG_E(fmt, ...) LY_LOG_AT(DLOG_ERROR, "* Critical * ", fmt, ##__VA_ARGS__)

namespace pictavo {
// Stops the program after a failed assertion; tests may install a handler
// that throws instead, to check that an assertion fires.
using AssertHandler = void (*)(const char* condition);
void setAssertHandler(AssertHandler handler);
[[noreturn]] void assertFailed(const char* condition);
}  // namespace pictavo

#define WASSERT_MSG(cond, fmt, ...)            \
  do {                                         \
    if (!(cond)) {                             \
      LYLOG_E("WASSERT! " fmt, ##__VA_ARGS__); \
      ::pictavo::assertFailed("(" #cond ")");  \
    }                                          \
  } while (0)

#define WASSERT(cond) WASSERT_MSG(cond, "%s", #cond)
