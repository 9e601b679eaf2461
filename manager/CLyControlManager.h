#pragma once

#include <Evas.h>

#include <functional>
#include <string>

#include "app-assist/WViewController.h"

struct _CLyControlManagerImpl;
class CLyEvent;

// The controls of one screen, by the swallow part they fill. The screen's
// layout owns the controls; the table only holds weak handles, and drops
// controls whose object is gone at the next walk. Destroying the manager
// destroys the controls that are still alive.
class CLyControlManager {
 public:
  using Holder = app_assist::WViewControllerWeakPtr;

  CLyControlManager();
  ~CLyControlManager();
  CLyControlManager(const CLyControlManager&) = delete;
  CLyControlManager& operator=(const CLyControlManager&) = delete;

  // Creates `control` under `parent` and registers it for `part` (replacing
  // and destroying the control that held it); with setContent its object is
  // swallowed into the part. A control that cannot be created is destroyed.
  void attach(Evas_Object* parent, app_assist::WViewController* control, const char* part, bool setContent);
  // Destroys the control of `part`; with unsetContent the part is emptied first.
  void detach(Evas_Object* parent, const char* part, bool unsetContent);
  // The handle of the control of `part`; empty when there is none.
  Holder find(const char* part) const;
  // The live control of `part` if it is a T, else null.
  template <typename T>
  T* findAs(const char* part) const {
    auto control = find(part).lock();
    if (!control || !control->getEvasObj()) return nullptr;
    return dynamic_cast<T*>(app_assist::WViewController::fromEvasObj(control->getEvasObj()));
  }
  // Sends `event` to every live control that listens, in part-name order.
  void notify(const CLyEvent& event);
  void forEach(const std::function<void(const Holder&)>& fn);
  size_t size() const;

 private:
  void _removeExpired();

  _CLyControlManagerImpl* _pv;
};
