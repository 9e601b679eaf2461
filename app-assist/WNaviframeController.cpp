#include "app-assist/WNaviframeController.h"

#include "app-assist/IWWindowController.h"
#include "app-assist/WContentViewController.h"
#include "app-assist/WDefine.h"
#include "common/CLyLog.h"
#include "platform/efl_extension.h"

namespace app_assist {

struct _WNaviframeControllerImpl {
  WNaviframeController::LastItemPopHandler _lastItemPopHandler;
};

WNaviframeController::WNaviframeController() : _nv(new _WNaviframeControllerImpl) {}

WNaviframeController::~WNaviframeController() {
  delete _nv;
}

const char* WNaviframeController::getClassName() const {
  return "WNaviframeController";
}

bool WNaviframeController::create(Evas_Object* parent, void* param) {
  if (!WViewController::create(parent, param)) return false;
  evas_object_data_set(getEvasObj(), kNaviframeInstanceKey, this);
  return true;
}

void WNaviframeController::destroy() {
  Evas_Object* naviframe = getEvasObj();
  if (!naviframe) {
    WViewController::destroy();
    return;
  }
  // Top first, so no page below becomes top while the stack is cleared.
  Eina_List* items = elm_naviframe_items_get(naviframe);
  Eina_List* last = eina_list_last(items);
  for (Eina_List* l = last; l; l = eina_list_prev(l))
    elm_object_item_del(static_cast<Elm_Object_Item*>(l->data));
  eina_list_free(items);
  evas_object_del(naviframe);
}

Evas_Object* WNaviframeController::onCreateView(Evas_Object* parent, void*) {
  Evas_Object* naviframe = elm_naviframe_add(parent);
  if (!naviframe) return nullptr;
  eext_object_event_callback_add(naviframe, EEXT_CALLBACK_BACK, __onBackKey, this);
  eext_object_event_callback_add(naviframe, EEXT_CALLBACK_MORE, __onMoreKey, this);
  evas_object_size_hint_weight_set(naviframe, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_show(naviframe);
  return naviframe;
}

void WNaviframeController::__onBackKey(void*, Evas_Object* obj, void*) {
  if (elm_naviframe_top_item_get(obj)) elm_naviframe_item_pop(obj);
}

void WNaviframeController::__onMoreKey(void*, Evas_Object* obj, void*) {
  Elm_Object_Item* top = elm_naviframe_top_item_get(obj);
  if (!top) return;
  Evas_Object* more = elm_object_item_part_content_get(top, "toolbar_more_btn");
  if (!more) {
    Evas_Object* content = elm_object_item_content_get(top);
    more = content ? static_cast<Evas_Object*>(evas_object_data_get(content, kMoreButtonKey)) : nullptr;
  }
  if (more) evas_object_smart_callback_call(more, "clicked", nullptr);
}

bool WNaviframeController::push(WContentViewController* vc, const char* name, void* param) {
  if (!vc) {
    LYLOG_E("Invalid view controller");
    return false;
  }
  if (name) vc->setName(name);
  return onPush(vc, param);
}

bool WNaviframeController::onPush(WContentViewController* vc, void* param) {
  Evas_Object* naviframe = getEvasObj();
  WASSERT_MSG(naviframe != nullptr, "getEvasObj() != nullptr");
  if (!vc->create(naviframe, param)) {
    LYLOG_E("Failed to create a vc!");
    return false;
  }
  vc->_setNaviframe(this, nullptr);
  Elm_Object_Item* item = vc->onPushToNaviframe(naviframe);
  if (!item)
    item = elm_naviframe_item_push(naviframe, vc->getTitle(), nullptr, nullptr, vc->getEvasObj(), nullptr);
  if (!item) {
    LYLOG_E("Failed to push the view");
    vc->destroy();
    return false;
  }
  elm_object_item_data_set(item, vc);
  vc->_setNaviframe(this, item);
  vc->onAttachedToNaviframe(this, item);
  vc->_notifyPushed(item);
  elm_naviframe_item_pop_cb_set(item, __onItemPopCb, nullptr);
  return true;
}

Eina_Bool WNaviframeController::__onItemPopCb(void*, Elm_Object_Item* item) {
  Evas_Object* naviframe = elm_object_item_widget_get(item);
  auto* self = static_cast<WNaviframeController*>(evas_object_data_get(naviframe, kNaviframeInstanceKey));
  auto* vc = static_cast<WContentViewController*>(elm_object_item_data_get(item));
  if (!self || !vc) return EINA_TRUE;
  return self->onItemPop(vc, item) ? EINA_TRUE : EINA_FALSE;
}

bool WNaviframeController::onItemPop(WContentViewController* vc, Elm_Object_Item* item) {
  Evas_Object* naviframe = getEvasObj();
  if (item == elm_naviframe_bottom_item_get(naviframe)) {
    if (!vc->onPop()) return false;
    bool popOut = true;
    if (_nv->_lastItemPopHandler)
      _nv->_lastItemPopHandler(&popOut);
    else
      onLastItemPop(&popOut);
    return popOut;
  }
  if (!vc->onPop()) return false;
  Eina_List* items = elm_naviframe_items_get(naviframe);
  Eina_List* below = eina_list_prev(eina_list_last(items));
  auto* target = below ? static_cast<Elm_Object_Item*>(below->data) : nullptr;
  eina_list_free(items);
  auto* targetView =
      target ? static_cast<WContentViewController*>(elm_object_item_data_get(target)) : nullptr;
  WASSERT_MSG(targetView, "targetView");
  targetView->onBecomeTop();
  return true;
}

void WNaviframeController::onLastItemPop(bool* popOut) {
  *popOut = false;
  IWWindowController* window = getWindowController();
  if (window && window->getEvasObj()) elm_win_lower(window->getEvasObj());
}

void WNaviframeController::setOnLastItemPop(LastItemPopHandler handler) {
  _nv->_lastItemPopHandler = std::move(handler);
}

bool WNaviframeController::isTop(const WContentViewController* vc) const {
  Evas_Object* naviframe = getEvasObj();
  if (!naviframe || !vc) return false;
  Elm_Object_Item* top = elm_naviframe_top_item_get(naviframe);
  return top && elm_object_item_data_get(top) == vc;
}

WContentViewController* WNaviframeController::getTopViewController() const {
  Evas_Object* naviframe = getEvasObj();
  Elm_Object_Item* top = naviframe ? elm_naviframe_top_item_get(naviframe) : nullptr;
  return top ? static_cast<WContentViewController*>(elm_object_item_data_get(top)) : nullptr;
}

}  // namespace app_assist
