#pragma once
// Deletion hooks that survive frozen events.
//
// Evas holds back every callback of an object whose events are frozen, its
// DEL callback included, so anything bound to an object's life through
// EVAS_CALLBACK_DEL alone outlives an object deleted while frozen. A hook
// still runs at the DEL callback's usual moment (children and content are
// still there) and falls back to the object-level deletion event, which Eo
// always sends, when that callback was held back.

#include <Evas.h>

namespace app_assist {

using WDeletionFunc = void (*)(void* data, Evas_Object* obj);

// Runs `func(data, obj)` exactly once when `obj` is deleted. `beforeOthers`
// runs it ahead of the object's ordinary deletion callbacks.
void wevasobject_add_deletion_hook(Evas_Object* obj, WDeletionFunc func, void* data,
                                   bool beforeOthers = false);

// Forgets a hook added with the same object, function and data; a no-op if
// there is none (or it has already run).
void wevasobject_remove_deletion_hook(Evas_Object* obj, WDeletionFunc func, void* data);

}  // namespace app_assist
