#include <new>

#include "app-assist/IWEvasObject.h"
#include "app-assist/WDeletionHook.h"
#include "common/CLyLog.h"

namespace app_assist {

// Lives until its object is deleted; weak pointers are the only handles.
class _WEvasObjectImpl : public IWEvasObject {
 public:
  explicit _WEvasObjectImpl(Evas_Object* obj) : _obj(obj) {}
  Evas_Object* getEvasObj() const override { return _obj; }

  static void onDel(void* data, Evas_Object*) {
    auto* self = static_cast<_WEvasObjectImpl*>(data);
    std::shared_ptr<IWEvasObject> last = std::move(self->_self);
  }

  Evas_Object* _obj;
  std::shared_ptr<IWEvasObject> _self;
};

std::weak_ptr<IWEvasObject> wevasobject_get_weak_ptr(Evas_Object* obj) {
  if (!obj) {
    LYLOG_E("Invalid object");
    return {};
  }
  auto* impl = new (std::nothrow) _WEvasObjectImpl(obj);
  if (!impl) {
    LYLOG_E("Out of memory");
    return {};
  }
  impl->_self = std::shared_ptr<IWEvasObject>(impl);
  wevasobject_add_deletion_hook(obj, _WEvasObjectImpl::onDel, impl);
  return impl->_self;
}

}  // namespace app_assist
