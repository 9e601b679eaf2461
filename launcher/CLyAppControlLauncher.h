#pragma once
// Sends one application-control request at a time to another application,
// keeps it until the next one supersedes it (the previous application is
// asked to close first), and freezes input on a screen while the other
// application starts.

#include <Evas.h>

#include "platform/app_control.h"

struct _CLyAppControlLauncherImpl;

class CLyAppControlLauncher {
 public:
  static CLyAppControlLauncher* getInstance();
  static void destroy();

  virtual ~CLyAppControlLauncher();

  // Takes ownership of `request` in every case. `freezeObj` (may be null)
  // ignores input for `freezeSeconds` or until it is deleted.
  bool sendLaunchRequest(app_control_h request, app_control_reply_cb reply, void* userData,
                         Evas_Object* freezeObj, double freezeSeconds);
  // Terminates the current request's application and lifts any freeze.
  void _clearAll();

  // For tests and diagnostics.
  bool hasCurrentRequest() const;
  bool isFreezing() const;

 private:
  CLyAppControlLauncher();
  CLyAppControlLauncher(const CLyAppControlLauncher&) = delete;
  CLyAppControlLauncher& operator=(const CLyAppControlLauncher&) = delete;

  void _releaseFreeze();
  static Eina_Bool __onFreezeTimer(void* data);
  static void __onFrozenObjDel(void* data, const Efl_Event* event);

  _CLyAppControlLauncherImpl* _pv;
};
