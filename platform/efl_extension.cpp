#include "platform/efl_extension.h"

#include <Elementary.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <map>
#include <vector>

#include "common/CLyLog.h"

namespace {

struct Callback {
  Eext_Callback_Type type;
  Eext_Event_Cb func;
  void* data;
};

// The objects with key callbacks; `stamp` orders them by their first
// registration or latest show, the latest one being on top.
struct ObjectRecord {
  Evas_Object* obj;
  uint64_t stamp;
  std::vector<Callback> callbacks;
};

std::vector<ObjectRecord*> gRecords;
// One invisible key catcher per canvas holds the key grabs.
std::map<Evas*, Evas_Object*> gCatchers;
uint64_t gStamp = 0;

const char* const kBackKeys[] = {"Escape", "XF86Back"};
const char* const kMoreKeys[] = {"Menu", "XF86Menu"};

ObjectRecord* findRecord(Evas_Object* obj) {
  for (ObjectRecord* record : gRecords)
    if (record->obj == obj) return record;
  return nullptr;
}

// Shown: the object and every widget above it up to its window are visible.
// (Internal parts of a window, such as its frame, are not looked at.)
bool reallyVisible(Evas_Object* obj) {
  for (Evas_Object* o = obj; o;) {
    if (!evas_object_visible_get(o)) return false;
    if (!elm_object_widget_check(o)) {
      o = evas_object_smart_parent_get(o);
      continue;
    }
    if (elm_win_get(o) == o) return true;
    o = elm_object_parent_widget_get(o);
  }
  return true;
}

bool hasType(const ObjectRecord* record, Eext_Callback_Type type) {
  return std::any_of(record->callbacks.begin(), record->callbacks.end(),
                     [type](const Callback& cb) { return cb.type == type; });
}

bool dispatch(Evas* evas, Eext_Callback_Type type) {
  ObjectRecord* target = nullptr;
  for (ObjectRecord* record : gRecords) {
    if (evas_object_evas_get(record->obj) != evas || !hasType(record, type) || !reallyVisible(record->obj))
      continue;
    if (!target || record->stamp > target->stamp) target = record;
  }
  if (!target) return false;
  Evas_Object* obj = target->obj;
  // A callback may delete the object or change the callbacks: run a
  // snapshot, skipping entries that are gone by their turn.
  std::vector<Callback> snapshot = target->callbacks;
  for (const Callback& cb : snapshot) {
    if (cb.type != type) continue;
    ObjectRecord* record = findRecord(obj);
    if (!record) break;
    bool present = std::any_of(record->callbacks.begin(), record->callbacks.end(), [&cb](const Callback& c) {
      return c.type == cb.type && c.func == cb.func && c.data == cb.data;
    });
    if (present) cb.func(cb.data, obj, nullptr);
  }
  return true;
}

bool matches(const char* key, const char* const* names, size_t count) {
  for (size_t i = 0; i < count; ++i)
    if (strcmp(key, names[i]) == 0) return true;
  return false;
}

void onKeyDown(void*, Evas* evas, Evas_Object*, void* event_info) {
  auto* ev = static_cast<Evas_Event_Key_Down*>(event_info);
  if (!ev || !ev->keyname || (ev->event_flags & EVAS_EVENT_FLAG_ON_HOLD)) return;
  bool handled = false;
  if (matches(ev->keyname, kBackKeys, 2))
    handled = dispatch(evas, EEXT_CALLBACK_BACK);
  else if (matches(ev->keyname, kMoreKeys, 2))
    handled = dispatch(evas, EEXT_CALLBACK_MORE);
  // Widgets bind Escape to their own actions (a naviframe pops, a ctxpopup
  // dismisses): a key handled here must not act a second time.
  if (handled) ev->event_flags = static_cast<Evas_Event_Flags>(ev->event_flags | EVAS_EVENT_FLAG_ON_HOLD);
}

// The canvas is passed as data: while a canvas is torn down the object's
// own canvas cannot be relied on. Deletion is watched through the object-level
// event because Evas holds back the DEL callback of objects with frozen events.
void onCatcherDel(void* data, const Efl_Event* ev) {
  auto it = gCatchers.find(static_cast<Evas*>(data));
  if (it != gCatchers.end() && it->second == ev->object) gCatchers.erase(it);
}

void ensureCatcher(Evas* evas) {
  if (!evas) return;
  auto it = gCatchers.find(evas);
  if (it != gCatchers.end()) {
    // A new canvas may reuse the address of a freed one.
    if (evas_object_evas_get(it->second) == evas) return;
    gCatchers.erase(it);
  }
  Evas_Object* catcher = evas_object_rectangle_add(evas);
  if (!catcher) {
    LYLOG_E("Cannot create the key catcher");
    return;
  }
  evas_object_name_set(catcher, "eext-key-catcher");
  evas_object_pass_events_set(catcher, EINA_TRUE);
  for (const char* const* keys : {kBackKeys, kMoreKeys})
    for (size_t i = 0; i < 2; ++i)
      if (!evas_object_key_grab(catcher, keys[i], 0, 0, EINA_FALSE)) LYLOG_W("Cannot grab %s", keys[i]);
  evas_object_event_callback_add(catcher, EVAS_CALLBACK_KEY_DOWN, onKeyDown, nullptr);
  efl_event_callback_add(catcher, EFL_EVENT_DEL, onCatcherDel, evas);
  gCatchers[evas] = catcher;
}

void onObjectShow(void*, Evas*, Evas_Object* obj, void*) {
  if (ObjectRecord* record = findRecord(obj)) record->stamp = ++gStamp;
}

void removeRecord(Evas_Object* obj);

void onObjectDel(void*, const Efl_Event* ev) {
  removeRecord(ev->object);
}

void removeRecord(Evas_Object* obj) {
  auto it = std::find_if(gRecords.begin(), gRecords.end(), [obj](ObjectRecord* r) { return r->obj == obj; });
  if (it == gRecords.end()) return;
  delete *it;
  gRecords.erase(it);
  evas_object_event_callback_del(obj, EVAS_CALLBACK_SHOW, onObjectShow);
  efl_event_callback_del(obj, EFL_EVENT_DEL, onObjectDel, nullptr);
}

}  // namespace

void eext_object_event_callback_add(Evas_Object* obj, Eext_Callback_Type type, Eext_Event_Cb func,
                                    void* data) {
  if (!obj || !func || type < EEXT_CALLBACK_BACK || type >= EEXT_CALLBACK_LAST) {
    LYLOG_E("Invalid parameter");
    return;
  }
  ensureCatcher(evas_object_evas_get(obj));
  ObjectRecord* record = findRecord(obj);
  if (!record) {
    record = new ObjectRecord{obj, ++gStamp, {}};
    gRecords.push_back(record);
    evas_object_event_callback_add(obj, EVAS_CALLBACK_SHOW, onObjectShow, nullptr);
    // A record must go even when the object dies with its events frozen
    // (Evas then holds back its DEL callback): its callbacks would be
    // dispatched to a deleted object.
    efl_event_callback_add(obj, EFL_EVENT_DEL, onObjectDel, nullptr);
  }
  record->callbacks.push_back({type, func, data});
}

void* eext_object_event_callback_del(Evas_Object* obj, Eext_Callback_Type type, Eext_Event_Cb func) {
  ObjectRecord* record = obj ? findRecord(obj) : nullptr;
  if (!record) return nullptr;
  auto it = std::find_if(record->callbacks.begin(), record->callbacks.end(),
                         [type, func](const Callback& cb) { return cb.type == type && cb.func == func; });
  if (it == record->callbacks.end()) return nullptr;
  void* data = it->data;
  record->callbacks.erase(it);
  if (record->callbacks.empty()) removeRecord(obj);
  return data;
}

void eext_naviframe_back_cb(void*, Evas_Object* obj, void*) {
  if (obj) elm_naviframe_item_pop(obj);
}

void eext_naviframe_more_cb(void*, Evas_Object* obj, void*) {
  Elm_Object_Item* top = obj ? elm_naviframe_top_item_get(obj) : nullptr;
  if (!top) return;
  if (Evas_Object* more = elm_object_item_part_content_get(top, "toolbar_more_btn"))
    evas_object_smart_callback_call(more, "clicked", nullptr);
}

void eext_ctxpopup_back_cb(void*, Evas_Object* obj, void*) {
  if (obj) elm_ctxpopup_dismiss(obj);
}

void eext_popup_back_cb(void*, Evas_Object* obj, void*) {
  if (obj) evas_object_del(obj);
}
