#include <string>

#include "app-assist/WApp.h"
#include "app-assist/WContentViewController.h"
#include "app-assist/WNaviframeController.h"
#include "app-assist/WWindowController.h"
#include "app-entry/CLyRenderCommand.h"
#include "common/CLyLog.h"
#include "platform/app.h"

namespace {

// Until the collage screens exist: the "pictavo" window with a naviframe
// holding one placeholder page; backing out of the last page ends the
// program.
class PlaceholderApp : public app_assist::WApp {
 protected:
  bool onCreate() override {
    auto* window = new app_assist::WWindowController("pictavo", ELM_WIN_BASIC);
    if (!attachWindowController(window)) {
      LYLOG_E("Failed to create the window");
      return false;
    }
    auto* naviframe = new app_assist::WNaviframeController();
    naviframe->setOnLastItemPop([](bool* popOut) {
      *popOut = false;
      ui_app_exit();
    });
    if (!window->attachBaseViewController(naviframe)) return false;
    auto* page = new app_assist::WContentViewController("pictavo");
    page->setTitle("Pictavo");
    return naviframe->push(page);
  }
};

}  // namespace

int main(int argc, char** argv) {
  // The headless render command never starts the application.
  if (argc > 1 && std::string(argv[1]) == "--render") return runRenderCommand(argc, argv);
  int result;
  {
    PlaceholderApp app;
    result = app.run(argc, argv);
  }
  LYLOG_W("app return=%d", result);
  return result;
}
