// Share: the desktop opens the file with its default application
// (xdg-open when present; $PICTAVO_SHARE_COMMAND names another program).
// Without one the share is a logged stand-in.

#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include "common/CLyLog.h"
#include "platform/app_control.h"
#include "platform/app_control_launch_private.h"

extern char** environ;

namespace {

std::string findInPath(const char* program) {
  if (strchr(program, '/')) return access(program, X_OK) == 0 ? program : "";
  const char* path = getenv("PATH");
  std::string dirs = path && *path ? path : "/usr/local/bin:/usr/bin:/bin";
  size_t start = 0;
  while (start <= dirs.size()) {
    size_t end = dirs.find(':', start);
    if (end == std::string::npos) end = dirs.size();
    std::string candidate = dirs.substr(start, end - start) + "/" + program;
    if (end > start && access(candidate.c_str(), X_OK) == 0) return candidate;
    start = end + 1;
  }
  return "";
}

// Starts `program file` detached: a shell puts it in the background and
// exits at once, so nothing is left to reap and the opener may outlive this
// process. The names go to the shell as positional arguments, never as
// command text. (posix_spawn only: forking a threaded process is not safe.)
bool spawnDetached(const std::string& program, const std::string& file) {
  pid_t shell = 0;
  char* argv[] = {const_cast<char*>("sh"),
                  const_cast<char*>("-c"),
                  const_cast<char*>("\"$0\" \"$1\" </dev/null >/dev/null 2>&1 &"),
                  const_cast<char*>(program.c_str()),
                  const_cast<char*>(file.c_str()),
                  nullptr};
  if (posix_spawn(&shell, "/bin/sh", nullptr, nullptr, argv, environ) != 0) return false;
  int status = 0;
  // The main loop's own child reaper may have collected the shell first.
  if (waitpid(shell, &status, 0) != shell) return errno == ECHILD;
  return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

}  // namespace

int share_service_launch(app_control_h request, const std::shared_ptr<app_control_launch_state>&) {
  char* uri = nullptr;
  app_control_get_uri(request, &uri);
  std::string file = uri ? uri : "";
  free(uri);
  if (file.compare(0, 7, "file://") == 0) file = file.substr(7);
  struct stat st;
  if (file.empty() || stat(file.c_str(), &st) != 0 || !S_ISREG(st.st_mode)) {
    LYLOG_E("share: no such file \"%s\"", file.c_str());
    app_control_destroy(request);
    return APP_CONTROL_ERROR_INVALID_PARAMETER;
  }
  const char* command = getenv("PICTAVO_SHARE_COMMAND");
  std::string program = findInPath(command && *command ? command : "xdg-open");
  bool opened = false;
  if (program.empty()) {
    LYLOG_W("share: no desktop opener, would share %s", file.c_str());
    opened = true;
  } else {
    opened = spawnDetached(program, file);
    if (opened) {
      LYLOG_W("share: %s %s", program.c_str(), file.c_str());
    } else {
      LYLOG_E("share: cannot start %s", program.c_str());
    }
  }
  // The sender learns whether the file went out.
  app_control_h reply = nullptr;
  if (app_control_create(&reply) == APP_CONTROL_ERROR_NONE) {
    app_control_reply_to_launch_request(reply, request,
                                        opened ? APP_CONTROL_RESULT_SUCCEEDED : APP_CONTROL_RESULT_FAILED);
    app_control_destroy(reply);
  }
  app_control_destroy(request);
  return opened ? APP_CONTROL_ERROR_NONE : APP_CONTROL_ERROR_LAUNCH_FAILED;
}
