#pragma once

#include "platform/app.h"

namespace app_assist {

class WWindowController;
struct _WAppImpl;

// The application: runs the platform life cycle and dispatches it to the
// virtual hooks below. Subclasses build their window in onCreate.
class WApp {
 public:
  WApp();
  virtual ~WApp();
  WApp(const WApp&) = delete;
  WApp& operator=(const WApp&) = delete;

  // Runs the main loop until the application ends; the platform's result.
  virtual int run(int argc, char** argv);

  // Creates the window of `window`; only one window controller per application.
  bool attachWindowController(WWindowController* window);
  // The attached window controller; null before attaching and once its window is gone.
  WWindowController* getWindowController() const;

  // The framework version, "2.1.9".
  static const char* getVersion();

 protected:
  virtual bool onCreate() { return true; }
  virtual void onTerminate() {}
  virtual void onPause() {}
  virtual void onResume() {}
  virtual void onAppControl(app_control_h request, bool firstLaunch) {
    (void)request;
    (void)firstLaunch;
  }

 private:
  static bool __onCreate(void* data);
  static void __onTerminate(void* data);
  static void __onPause(void* data);
  static void __onResume(void* data);
  static void __onAppControl(app_control_h request, void* data);
  static void __onWindowDel(void* data, Evas_Object* obj);

  _WAppImpl* _pv;
};

}  // namespace app_assist
