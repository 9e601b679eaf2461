#include "manager/CLyEventManager.h"

#include <Ecore.h>

#include <map>
#include <memory>
#include <vector>

#include "common/CLyLog.h"

namespace {

constexpr int kSlotCount = 2 * CLyEvent::TYPE_MAX;
constexpr int kFirstInterval = 2;
constexpr int kMaxInterval = 8;

int slotOf(int type, int mode) {
  return 2 * (type - 1) + mode;
}

struct ListenerEntry {
  bool blocked = false;
  std::unique_ptr<CLyEvent> slots[kSlotCount];
  ILyEventListener* listener = nullptr;
};

}  // namespace

struct _CLyEventManagerImpl {
  std::map<ILyEventListener*, std::unique_ptr<ListenerEntry>> listeners;
  Ecore_Timer* throttleTimer = nullptr;
  int interval = 0;
  int maxInterval = kMaxInterval;
  bool pending = false;
  bool suspended = false;
  double timeScale = 1.0;

  ListenerEntry* find(ILyEventListener* listener) {
    auto it = listeners.find(listener);
    return it == listeners.end() ? nullptr : it->second.get();
  }
  std::vector<ILyEventListener*> snapshot() const {
    std::vector<ILyEventListener*> result;
    for (const auto& entry : listeners) result.push_back(entry.first);
    return result;
  }
};

CLyEventManager::CLyEventManager() : _pv(new _CLyEventManagerImpl) {}

CLyEventManager::~CLyEventManager() {
  if (_pv->throttleTimer) ecore_timer_del(_pv->throttleTimer);
  delete _pv;
}

void CLyEventManager::attach(ILyEventListener* listener) {
  if (!listener) {
    LYLOG_E("null");
    return;
  }
  if (_pv->find(listener)) {
    LYLOG_W("Listener is already attached");
    return;
  }
  auto entry = std::make_unique<ListenerEntry>();
  entry->listener = listener;
  _pv->listeners.emplace(listener, std::move(entry));
}

void CLyEventManager::detach(ILyEventListener* listener) {
  auto it = _pv->listeners.find(listener);
  if (it == _pv->listeners.end()) {
    LYLOG_E("null");
    return;
  }
  _pv->listeners.erase(it);
}

bool CLyEventManager::isAttached(const ILyEventListener* listener) const {
  return _pv->find(const_cast<ILyEventListener*>(listener)) != nullptr;
}

void CLyEventManager::block(ILyEventListener* listener) {
  ListenerEntry* entry = _pv->find(listener);
  if (!entry) {
    LYLOG_E("null");
    return;
  }
  entry->blocked = true;
}

void CLyEventManager::unblock(ILyEventListener* listener) {
  ListenerEntry* entry = _pv->find(listener);
  if (!entry) {
    LYLOG_E("null");
    return;
  }
  entry->blocked = false;
  _deliverTable(listener);
}

void CLyEventManager::blockAll() {
  _pv->suspended = true;
  if (_pv->throttleTimer) ecore_timer_del(_pv->throttleTimer);
  _pv->throttleTimer = nullptr;
  _pv->interval = 0;
  _pv->pending = false;
}

void CLyEventManager::unblockAll() {
  _pv->suspended = false;
  for (ILyEventListener* listener : _pv->snapshot()) {
    ListenerEntry* entry = _pv->find(listener);
    if (entry && !entry->blocked) _deliverTable(listener);
  }
}

void CLyEventManager::_store(ILyEventListener* listener, const CLyEvent& event) {
  ListenerEntry* entry = _pv->find(listener);
  if (!entry) return;
  entry->slots[slotOf(event.type, event.mode)] = std::make_unique<CLyEvent>(event);
}

void CLyEventManager::notify(const CLyEvent& event) {
  // Ids and modes index the slot table: anything else is refused.
  if (!event.isValid()) {
    LYLOG_E("Invalid event type=%d mode=%d", event.type, event.mode);
    return;
  }
  if (_pv->suspended) {
    for (ILyEventListener* listener : _pv->snapshot()) _store(listener, event);
    return;
  }
  // Listeners may attach or detach others while being called: walk a
  // snapshot and skip whoever has gone.
  for (ILyEventListener* listener : _pv->snapshot()) {
    ListenerEntry* entry = _pv->find(listener);
    if (!entry) continue;
    if (entry->blocked || _pv->suspended || (event.mode == CLyEvent::MODE_THROTTLED && _pv->interval != 0))
      _store(listener, event);
    else
      listener->onEvent(event);
  }
  if (event.mode == CLyEvent::MODE_THROTTLED && !_pv->suspended) {
    if (!_pv->throttleTimer)
      _startThrottle();
    else
      _pv->pending = true;
  }
}

void CLyEventManager::_deliverTable(ILyEventListener* listener) {
  for (int slot = 0; slot < kSlotCount; ++slot) {
    ListenerEntry* entry = _pv->find(listener);
    if (!entry) {
      LYLOG_E("null");
      return;
    }
    // Blocked again by one of its own handlers: the rest waits.
    if (entry->blocked) return;
    // Taken out before the call, so an event stored meanwhile in the same
    // slot is kept rather than freed under the listener.
    std::unique_ptr<CLyEvent> event = std::move(entry->slots[slot]);
    if (event) listener->onEvent(*event);
  }
}

void CLyEventManager::_startThrottle() {
  if (_pv->interval == 0)
    _pv->interval = kFirstInterval;
  else if (_pv->interval < _pv->maxInterval)
    _pv->interval *= 2;
  else
    _pv->interval = _pv->maxInterval;
  _pv->pending = false;
  _pv->throttleTimer = ecore_timer_add(_pv->interval * _pv->timeScale, __onThrottleTimer, this);
  if (!_pv->throttleTimer) {
    // Without a timer the window could never end: deliver at once instead.
    LYLOG_E("failed to add ecore timer!");
    _pv->interval = 0;
  }
}

unsigned char CLyEventManager::__onThrottleTimer(void* data) {
  auto* self = static_cast<CLyEventManager*>(data);
  self->_pv->throttleTimer = nullptr;
  self->endThrottleWindow();
  return ECORE_CALLBACK_CANCEL;
}

void CLyEventManager::endThrottleWindow() {
  if (_pv->throttleTimer) {
    ecore_timer_del(_pv->throttleTimer);
    _pv->throttleTimer = nullptr;
  }
  for (ILyEventListener* listener : _pv->snapshot()) {
    for (int type = CLyEvent::TYPE_MIN; type <= CLyEvent::TYPE_MAX; ++type) {
      ListenerEntry* entry = _pv->find(listener);
      if (!entry || entry->blocked) break;
      std::unique_ptr<CLyEvent> event = std::move(entry->slots[slotOf(type, CLyEvent::MODE_THROTTLED)]);
      if (event) listener->onEvent(*event);
    }
  }
  // A handler may have suspended the bus or opened a window already.
  if (_pv->suspended || _pv->throttleTimer) return;
  if (_pv->pending) {
    _startThrottle();
  } else {
    _pv->interval = 0;
    _pv->pending = false;
  }
}

int CLyEventManager::getThrottleInterval() const {
  return _pv->interval;
}

void CLyEventManager::setThrottleTimeScale(double scale) {
  _pv->timeScale = scale > 0 ? scale : 1.0;
}
