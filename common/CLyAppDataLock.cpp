// The process-wide mutex of CLyAppData, kept apart from the rest of the
// application data: the decoder threads take it around PNG decoding, and a
// program that only decodes photos need not link the toolkit for it.
#include <pthread.h>

#include <cstring>

#include "common/CLyAppData.h"
#include "common/CLyLog.h"

namespace {
pthread_mutex_t gMutex = PTHREAD_MUTEX_INITIALIZER;
}  // namespace

void CLyAppData::lock() {
  int ret = pthread_mutex_lock(&gMutex);
  if (ret != 0) LYLOG_E("Mutex error occur [%d],[%s]", ret, strerror(ret));
}

void CLyAppData::unlock() {
  int ret = pthread_mutex_unlock(&gMutex);
  if (ret != 0) LYLOG_E("Mutex error occur [%d],[%s]", ret, strerror(ret));
}
