#include <string>

#include "app-entry/CLyApp.h"
#include "app-entry/CLyRenderCommand.h"
#include "common/CLyLog.h"

int main(int argc, char** argv) {
  // The headless render command never starts the application.
  if (argc > 1 && std::string(argv[1]) == "--render") return runRenderCommand(argc, argv);
  int result;
  {
    CLyApp app;
    result = app.run(argc, argv);
    LYLOG_W("app return=%d", result);
  }
  return result;
}
