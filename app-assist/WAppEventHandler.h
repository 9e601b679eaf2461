#pragma once

#include <functional>

#include "platform/app.h"

namespace app_assist {

struct _WAppEventHandlerImpl;

// One registration of a system event handler (language changed, low memory,
// ...); removed again by removeEventHandler or the destructor.
class WAppEventHandler {
 public:
  using Handler = std::function<void(app_event_info_h event, void* userData)>;

  WAppEventHandler();
  virtual ~WAppEventHandler();
  WAppEventHandler(const WAppEventHandler&) = delete;
  WAppEventHandler& operator=(const WAppEventHandler&) = delete;

  // Replaces any earlier registration of this object. False when the
  // platform refuses the registration.
  bool addEventHandler(app_event_type_e type, Handler handler, void* userData);
  void removeEventHandler();
  bool isRegistered() const;

 private:
  static void __dispatch(app_event_info_h event, void* data);

  _WAppEventHandlerImpl* _pv;
};

}  // namespace app_assist
