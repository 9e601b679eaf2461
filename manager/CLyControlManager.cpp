#include "manager/CLyControlManager.h"

#include <Elementary.h>

#include <map>
#include <vector>

#include "common/CLyEvent.h"
#include "common/CLyLog.h"
#include "common/ILyEventListener.h"

struct _CLyControlManagerImpl {
  std::map<std::string, CLyControlManager::Holder> controls;
  // Nesting depth of walks: entries are only removed outside of them.
  int iterating = 0;

  std::vector<std::string> keys() const {
    std::vector<std::string> result;
    for (const auto& entry : controls) result.push_back(entry.first);
    return result;
  }
};

CLyControlManager::CLyControlManager() : _pv(new _CLyControlManagerImpl) {}

CLyControlManager::~CLyControlManager() {
  LYLOG_D("size :%d", static_cast<int>(_pv->controls.size()));
  ++_pv->iterating;
  std::vector<Holder> holders;
  for (const auto& entry : _pv->controls) holders.push_back(entry.second);
  for (const Holder& holder : holders)
    if (auto control = holder.lock()) control->destroy();
  delete _pv;
}

void CLyControlManager::attach(Evas_Object* parent, app_assist::WViewController* control, const char* part,
                               bool setContent) {
  if (!parent) {
    LYLOG_E("Parent is nullptr! Fail to attach control");
    return;
  }
  if (!control || !part) {
    LYLOG_E("Invalid control or part");
    return;
  }
  detach(parent, part, true);
  if (!control->create(parent, nullptr)) {
    LYLOG_E("Failed to create control for %s", part);
    control->destroy();
    return;
  }
  if (setContent) elm_object_part_content_set(parent, part, control->getEvasObj());
  LYLOG_D("Insert a control");
  auto result = _pv->controls.emplace(part, Holder());
  if (!result.second) {
    // Left over while a walk is in progress: its control goes first.
    Holder old = result.first->second;
    result.first->second.reset();
    if (auto oldControl = old.lock())
      if (oldControl.get() != control) oldControl->destroy();
  }
  _pv->controls[part] = control->getWeakPtr();
}

void CLyControlManager::detach(Evas_Object* parent, const char* part, bool unsetContent) {
  if (!parent) {
    LYLOG_E("Parent is nullptr! Fail to detach control");
    return;
  }
  if (!part) return;
  if (unsetContent && elm_object_part_content_get(parent, part)) {
    elm_object_part_content_unset(parent, part);
    LYLOG_D("Evas Object unset");
  }
  auto it = _pv->controls.find(part);
  if (it == _pv->controls.end()) return;
  Holder holder = it->second;
  it->second.reset();
  if (auto control = holder.lock()) control->destroy();
  if (_pv->iterating == 0) {
    _pv->controls.erase(part);
    LYLOG_D("Remove control");
  }
}

CLyControlManager::Holder CLyControlManager::find(const char* part) const {
  auto it = part ? _pv->controls.find(part) : _pv->controls.end();
  if (it == _pv->controls.end()) {
    LYLOG_W("Failed to get control");
    return {};
  }
  return it->second;
}

void CLyControlManager::notify(const CLyEvent& event) {
  ++_pv->iterating;
  for (const std::string& key : _pv->keys()) {
    auto it = _pv->controls.find(key);
    if (it == _pv->controls.end()) continue;
    auto control = it->second.lock();
    if (!control) continue;
    if (auto* listener = dynamic_cast<ILyEventListener*>(control.get())) listener->onEvent(event);
  }
  --_pv->iterating;
  _removeExpired();
}

void CLyControlManager::forEach(const std::function<void(const Holder&)>& fn) {
  if (!fn) return;
  ++_pv->iterating;
  for (const std::string& key : _pv->keys()) {
    auto it = _pv->controls.find(key);
    if (it == _pv->controls.end()) continue;
    Holder holder = it->second;
    fn(holder);
  }
  --_pv->iterating;
  _removeExpired();
}

size_t CLyControlManager::size() const {
  return _pv->controls.size();
}

void CLyControlManager::_removeExpired() {
  if (_pv->iterating != 0) return;
  for (auto it = _pv->controls.begin(); it != _pv->controls.end();) {
    if (it->second.expired()) {
      LYLOG_D("Remove expired control");
      it = _pv->controls.erase(it);
    } else {
      ++it;
    }
  }
}
