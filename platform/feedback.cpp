#include "platform/feedback.h"

#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <atomic>
#include <cstdlib>
#include <string>

#include "common/CLyLog.h"

extern char** environ;

namespace {

std::atomic<int> gInitCount{0};
std::atomic<int> gPlayCount{0};

bool pathExists(const char* path) {
  struct stat st;
  return stat(path, &st) == 0;
}

// The desktop's click sound through canberra-gtk-play, when a sound device
// and the player are there. A shell starts the player in the background and
// exits at once, so a slow sound system never holds up the touch.
bool playDesktopClick() {
  if (getenv("PICTAVO_NO_SOUND") || !pathExists("/dev/snd")) return false;
  static const char* kPlayer = "/usr/bin/canberra-gtk-play";
  if (access(kPlayer, X_OK) != 0) return false;
  pid_t shell = 0;
  char* argv[] = {const_cast<char*>("sh"), const_cast<char*>("-c"),
                  const_cast<char*>("\"$0\" -i button-pressed </dev/null >/dev/null 2>&1 &"),
                  const_cast<char*>(kPlayer), nullptr};
  if (posix_spawn(&shell, "/bin/sh", nullptr, nullptr, argv, environ) != 0) return false;
  int status = 0;
  waitpid(shell, &status, 0);
  return true;
}

}  // namespace

extern "C" int feedback_initialize(void) {
  if (gInitCount.fetch_add(1) == 0) LYLOG_I("feedback initialised");
  return FEEDBACK_ERROR_NONE;
}

extern "C" int feedback_deinitialize(void) {
  int count = gInitCount.load();
  while (count > 0 && !gInitCount.compare_exchange_weak(count, count - 1)) {
  }
  if (count <= 0) return FEEDBACK_ERROR_NOT_INITIALIZED;
  if (count == 1) LYLOG_I("feedback deinitialised");
  return FEEDBACK_ERROR_NONE;
}

extern "C" int feedback_play(feedback_pattern_e pattern) {
  if (gInitCount.load() <= 0) return FEEDBACK_ERROR_NOT_INITIALIZED;
  if (pattern != FEEDBACK_PATTERN_TAP && pattern != FEEDBACK_PATTERN_SIP)
    return FEEDBACK_ERROR_INVALID_PARAMETER;
  gPlayCount.fetch_add(1);
  if (!playDesktopClick()) LYLOG_I("feedback: tap (pattern %d)", static_cast<int>(pattern));
  return FEEDBACK_ERROR_NONE;
}

extern "C" int feedback_get_play_count(void) {
  return gPlayCount.load();
}

extern "C" int feedback_is_initialized(void) {
  return gInitCount.load() > 0;
}
