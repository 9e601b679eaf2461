#pragma once

#include "common/CLyEvent.h"

// Receives events on the main loop; the event is valid only during the call.
// A listener attached to the event bus must detach before it is deleted.
class ILyEventListener {
 public:
  virtual ~ILyEventListener() = default;
  virtual void onEvent(const CLyEvent& event) = 0;
};
