#include <atomic>
#include <cstdio>
#include <cstdlib>

#include "common/CLyLog.h"

namespace pictavo {

namespace {
std::atomic<AssertHandler> gHandler{nullptr};
}

void setAssertHandler(AssertHandler handler) {
  gHandler.store(handler);
}

void assertFailed(const char* condition) {
  if (AssertHandler handler = gHandler.load()) handler(condition);
  dlog_print(DLOG_FATAL, LY_LOG_TAG, "assertion failed: %s", condition);
  abort();
}

}  // namespace pictavo
