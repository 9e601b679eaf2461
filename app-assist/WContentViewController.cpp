#include "app-assist/WContentViewController.h"

#include <cstdlib>
#include <cstring>
#include <random>
#include <string>

#include "app-assist/WDefine.h"
#include "app-assist/WNaviframeController.h"
#include "common/CLyLog.h"
#include "platform/core/app_common.h"

namespace app_assist {

struct _WContentViewControllerImpl {
  char* _title = nullptr;
  Elm_Object_Item* _naviItem = nullptr;
  bool _pushed = false;
  WNaviframeController* _naviframe = nullptr;
  WContentViewController::PushedHandler _pushedHandler;
};

WContentViewController::WContentViewController() : _cv(new _WContentViewControllerImpl) {}

WContentViewController::WContentViewController(const char* name) : WContentViewController() {
  setName(name);
}

WContentViewController::~WContentViewController() {
  free(_cv->_title);
  delete _cv;
}

const char* WContentViewController::getClassName() const {
  return "WContentViewController";
}

void WContentViewController::destroy() {
  if (!getEvasObj()) {
    WViewController::destroy();
    return;
  }
  if (_cv->_pushed && _cv->_naviItem) {
    // Deleting the item deletes the view object, which deletes this.
    elm_object_item_del(_cv->_naviItem);
    return;
  }
  evas_object_del(getEvasObj());
}

WNaviframeController* WContentViewController::getNaviframeController() const {
  if (!_cv->_naviframe) LYLOG_W("naviframe does not exist!");
  return _cv->_naviframe;
}

Elm_Object_Item* WContentViewController::getNaviItem() const {
  if (!_cv->_naviItem) LYLOG_W("naviItem does not exist!");
  return _cv->_naviItem;
}

void WContentViewController::setTitle(const char* title) {
  free(_cv->_title);
  _cv->_title = title ? strdup(title) : nullptr;
}

const char* WContentViewController::getTitle() const {
  return _cv->_title;
}

void WContentViewController::setOnPushed(PushedHandler handler) {
  _cv->_pushedHandler = std::move(handler);
}

bool WContentViewController::isPushed() const {
  return _cv->_pushed;
}

void WContentViewController::_setNaviframe(WNaviframeController* naviframe, Elm_Object_Item* item) {
  _cv->_naviframe = naviframe;
  _cv->_naviItem = item;
  _cv->_pushed = item != nullptr;
}

void WContentViewController::_notifyPushed(Elm_Object_Item* item) {
  if (_cv->_pushedHandler)
    _cv->_pushedHandler(item);
  else
    onPushed(item);
}

bool WContentViewController::popOut() {
  if (!getEvasObj()) {
    LYLOG_W("Not created view! No Evas Object!");
    return false;
  }
  if (!_cv->_naviframe || !_cv->_naviframe->getEvasObj()) {
    LYLOG_W("Not pushed to naviframe!");
    return false;
  }
  Evas_Object* naviframe = _cv->_naviframe->getEvasObj();
  WASSERT_MSG(elm_naviframe_top_item_get(naviframe) == _cv->_naviItem,
              "This view is not on Top of Naviframe!");
  destroyPopup();
  elm_naviframe_item_pop(naviframe);
  return true;
}

bool WContentViewController::addMoreButton(Elm_Object_Item* item, Evas_Smart_Cb clickedCb, void* data) {
  createMoreButton(item, clickedCb, data);
  return true;
}

void WContentViewController::createMoreButton(Elm_Object_Item* item, Evas_Smart_Cb clickedCb, void* data) {
  if (!item || !_cv->_naviframe || !_cv->_naviframe->getEvasObj()) {
    LYLOG_E("No naviframe item");
    return;
  }
  Evas_Object* button = elm_button_add(_cv->_naviframe->getEvasObj());
  elm_object_style_set(button, "naviframe/more/default");
  evas_object_show(button);
  if (clickedCb) evas_object_smart_callback_add(button, "clicked", clickedCb, data);
  elm_object_item_part_content_set(item, "toolbar_more_btn", button);
  // Themes without the device's toolbar part show it as the title's right
  // button; the more key finds it through the page either way.
  if (elm_object_item_part_content_get(item, "toolbar_more_btn") != button)
    elm_object_item_part_content_set(item, "title_right_btn", button);
  if (Evas_Object* content = elm_object_item_content_get(item))
    evas_object_data_set(content, kMoreButtonKey, button);
}

Evas_Object* WContentViewController::onCreateView(Evas_Object* parent, void*) {
  char* res = app_get_resource_path();
  if (!res) {
    LYLOG_E("Failed to get resource path=nullptr");
    return nullptr;
  }
  std::string edj = std::string(res) + "edje/WDefaultView.edj";
  free(res);
  Evas_Object* layout = elm_layout_add(parent);
  if (!layout) return nullptr;
  if (!elm_layout_file_set(layout, edj.c_str(), "default-view")) LYLOG_E("Cannot load %s", edj.c_str());
  static std::minstd_rand random(std::random_device{}());
  std::uniform_int_distribution<int> channel(40, 200);
  Evas_Object* rect = evas_object_rectangle_add(evas_object_evas_get(layout));
  evas_object_color_set(rect, channel(random), channel(random), channel(random), 255);
  elm_object_part_content_set(layout, "rect", rect);
  const char* name = getName();
  elm_object_part_text_set(layout, "name", name ? name : "");
  evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_show(layout);
  return layout;
}

void WContentViewController::onAttachedToNaviframe(WNaviframeController*, Elm_Object_Item*) {}
Elm_Object_Item* WContentViewController::onPushToNaviframe(Evas_Object*) {
  return nullptr;
}
void WContentViewController::onPushed(Elm_Object_Item*) {}
bool WContentViewController::onPop() {
  return true;
}
void WContentViewController::onBecomeTop() {}

}  // namespace app_assist
