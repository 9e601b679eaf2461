#include "app-assist/WDeletionHook.h"

#include <Eo.h>

#include <algorithm>
#include <new>
#include <vector>

#include "common/CLyLog.h"

namespace app_assist {
namespace {

struct Hook {
  Evas_Object* obj;
  WDeletionFunc func;
  void* data;
};

// Main-loop only, like every Evas call. Few objects carry hooks at a time.
std::vector<Hook*> gHooks;

void onEvasDel(void* data, Evas*, Evas_Object*, void*);
void onEflDel(void* data, const Efl_Event*);

// Unregisters both halves of the hook and frees it.
void release(Hook* hook) {
  auto it = std::find(gHooks.begin(), gHooks.end(), hook);
  if (it != gHooks.end()) gHooks.erase(it);
  evas_object_event_callback_del_full(hook->obj, EVAS_CALLBACK_DEL, onEvasDel, hook);
  efl_event_callback_del(hook->obj, EFL_EVENT_DEL, onEflDel, hook);
  delete hook;
}

void fire(Hook* hook) {
  Evas_Object* obj = hook->obj;
  WDeletionFunc func = hook->func;
  void* data = hook->data;
  // The function may add or remove other hooks on the same object.
  release(hook);
  func(data, obj);
}

void onEvasDel(void* data, Evas*, Evas_Object*, void*) {
  fire(static_cast<Hook*>(data));
}

void onEflDel(void* data, const Efl_Event*) {
  fire(static_cast<Hook*>(data));
}

}  // namespace

void wevasobject_add_deletion_hook(Evas_Object* obj, WDeletionFunc func, void* data, bool beforeOthers) {
  if (!obj || !func) {
    LYLOG_E("Invalid parameter");
    return;
  }
  auto* hook = new (std::nothrow) Hook{obj, func, data};
  if (!hook) {
    LYLOG_E("Out of memory");
    return;
  }
  gHooks.push_back(hook);
  evas_object_event_callback_priority_add(
      obj, EVAS_CALLBACK_DEL, beforeOthers ? EVAS_CALLBACK_PRIORITY_BEFORE : EVAS_CALLBACK_PRIORITY_DEFAULT,
      onEvasDel, hook);
  efl_event_callback_priority_add(obj, EFL_EVENT_DEL,
                                  beforeOthers ? EFL_CALLBACK_PRIORITY_BEFORE : EFL_CALLBACK_PRIORITY_DEFAULT,
                                  onEflDel, hook);
}

void wevasobject_remove_deletion_hook(Evas_Object* obj, WDeletionFunc func, void* data) {
  auto it = std::find_if(gHooks.begin(), gHooks.end(),
                         [&](const Hook* h) { return h->obj == obj && h->func == func && h->data == data; });
  if (it != gHooks.end()) release(*it);
}

}  // namespace app_assist
