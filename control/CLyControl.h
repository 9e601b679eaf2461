#pragma once

#include "app-assist/WViewController.h"
#include "common/ILyEventListener.h"

// The base of every control: a view controller that fills one swallow part
// of its screen's layout (through CLyControlManager) and hears the screen's
// events.
class CLyControl : public app_assist::WViewController, public ILyEventListener {
 public:
  CLyControl() = default;
  const char* getClassName() const override { return "CLyControl"; }
  // Does nothing unless a control overrides it.
  void onEvent(const CLyEvent& event) override { (void)event; }

 protected:
  ~CLyControl() override = default;
};
