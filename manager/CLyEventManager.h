#pragma once

#include "common/CLyEvent.h"
#include "common/CLySingleton.h"
#include "common/ILyEventListener.h"

struct _CLyEventManagerImpl;

// The application-wide event bus. Immediate events reach every listener at
// once. Throttled events are coalesced: the first one after a quiet spell
// goes out at once and opens a throttle window (2 s, then 4 s, then 8 s
// while events keep coming); later ones are kept per id and delivered when
// the window ends. A blocked listener keeps the latest event of each
// (id, mode) until it is unblocked.
class CLyEventManager : public CLySingleton<CLyEventManager> {
 public:
  void attach(ILyEventListener* listener);
  void detach(ILyEventListener* listener);
  void notify(const CLyEvent& event);
  void block(ILyEventListener* listener);
  void unblock(ILyEventListener* listener);
  void blockAll();
  void unblockAll();

  bool isAttached(const ILyEventListener* listener) const;
  // The length of the open throttle window in seconds; 0 when none is open.
  int getThrottleInterval() const;
  // Scales the real duration of throttle windows (1 = seconds as named);
  // lets tests run windows in milliseconds.
  void setThrottleTimeScale(double scale);
  // Ends the open throttle window now, as its timer would.
  void endThrottleWindow();

 private:
  friend class CLySingleton<CLyEventManager>;
  CLyEventManager();
  ~CLyEventManager() override;

  void _store(ILyEventListener* listener, const CLyEvent& event);
  void _deliverTable(ILyEventListener* listener);
  void _startThrottle();
  static unsigned char __onThrottleTimer(void* data);

  _CLyEventManagerImpl* _pv;
};
