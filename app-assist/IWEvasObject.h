#pragma once

#include <Evas.h>

#include <memory>

namespace app_assist {

// A bare Evas object seen through a weak pointer.
class IWEvasObject {
 public:
  virtual ~IWEvasObject() = default;
  virtual Evas_Object* getEvasObj() const = 0;
};

// A new weak pointer to `obj` that expires when `obj` is deleted; each call
// gives an independent one. Null `obj` gives an expired pointer.
std::weak_ptr<IWEvasObject> wevasobject_get_weak_ptr(Evas_Object* obj);

}  // namespace app_assist
