#include "app-assist/WPopupController.h"

#include <cstdio>
#include <string>

#include "common/CLyLog.h"
#include "platform/efl_extension.h"

namespace app_assist {

namespace {
constexpr const char kButtonIndexKey[] = "__@WPopupButtonIndex";
}

struct _WPopupControllerImpl {
  std::string _title;
  std::string _content;
  std::string _textDomain;
  std::string _buttonLabels[WPopupController::kMaxButtons];
  int _buttonCount = 0;
  WViewController* _contentView = nullptr;
  WPopupController::ContentCreator _contentCreator;
  WPopupController::ButtonHandler _backHandler;
  WPopupController::ObjectHook _popupHook;
  WPopupController::ButtonHandler _buttonHandlers[WPopupController::kMaxButtons];
  WPopupController::ObjectHook _buttonHooks[WPopupController::kMaxButtons];
};

WPopupController::WPopupController() : _pp(new _WPopupControllerImpl) {}

WPopupController::WPopupController(const char* title, const char* content) : WPopupController() {
  setTitle(title);
  setContent(content);
}

WPopupController::~WPopupController() {
  // A content view that never got created is still ours to free.
  if (_pp->_contentView && !_pp->_contentView->getEvasObj()) _pp->_contentView->destroy();
  delete _pp;
}

const char* WPopupController::getClassName() const {
  return "WPopupController";
}

void WPopupController::setTitle(const char* title) {
  _pp->_title = title ? title : "";
}

void WPopupController::setContent(const char* text) {
  _pp->_content = text ? text : "";
  if (_pp->_contentView && !_pp->_contentView->getEvasObj()) _pp->_contentView->destroy();
  _pp->_contentView = nullptr;
}

void WPopupController::setContentView(WViewController* content) {
  if (_pp->_contentView && _pp->_contentView != content && !_pp->_contentView->getEvasObj())
    _pp->_contentView->destroy();
  _pp->_contentView = content;
}

void WPopupController::setContentCreator(ContentCreator creator) {
  _pp->_contentCreator = std::move(creator);
}

void WPopupController::setTextDomain(const char* domain) {
  _pp->_textDomain = domain ? domain : "";
}

void WPopupController::setOnBack(ButtonHandler handler) {
  _pp->_backHandler = std::move(handler);
}

void WPopupController::setOnPopupObject(ObjectHook hook) {
  _pp->_popupHook = std::move(hook);
}

bool WPopupController::addButton(const char* label, ButtonHandler handler, ObjectHook buttonHook) {
  if (_pp->_buttonCount >= kMaxButtons) {
    LYLOG_E("Over the max button number! =%d", _pp->_buttonCount);
    return false;
  }
  int index = _pp->_buttonCount++;
  _pp->_buttonLabels[index] = label ? label : "";
  _pp->_buttonHandlers[index] = std::move(handler);
  _pp->_buttonHooks[index] = std::move(buttonHook);
  return true;
}

int WPopupController::getButtonCount() const {
  return _pp->_buttonCount;
}

Evas_Object* WPopupController::onCreateView(Evas_Object* parent, void*) {
  Evas_Object* popup = elm_popup_add(parent);
  if (!popup) {
    LYLOG_E("Cannot create popup");
    return nullptr;
  }
  elm_popup_align_set(popup, ELM_NOTIFY_ALIGN_FILL, 1.0);
  eext_object_event_callback_add(popup, EEXT_CALLBACK_BACK, __onBackKey, this);
  if (_pp->_popupHook) _pp->_popupHook(popup);

  const char* domain = _pp->_textDomain.empty() ? nullptr : _pp->_textDomain.c_str();
  auto setText = [domain](Evas_Object* obj, const char* part, const std::string& text) {
    if (domain)
      elm_object_domain_translatable_part_text_set(obj, part, domain, text.c_str());
    else
      elm_object_part_text_set(obj, part, text.c_str());
  };
  if (!_pp->_title.empty()) setText(popup, "title,text", _pp->_title);
  if (!_pp->_content.empty()) {
    setText(popup, nullptr, _pp->_content);
  } else if (_pp->_contentView) {
    WViewController* content = _pp->_contentView;
    _pp->_contentView = nullptr;
    if (content->create(popup, nullptr))
      elm_object_content_set(popup, content->getEvasObj());
    else
      content->destroy();
  } else if (_pp->_contentCreator) {
    if (Evas_Object* content = _pp->_contentCreator(popup)) elm_object_content_set(popup, content);
  }
  for (int i = 0; i < _pp->_buttonCount; ++i) {
    Evas_Object* button = elm_button_add(popup);
    elm_object_style_set(button, "popup");
    setText(button, nullptr, _pp->_buttonLabels[i]);
    evas_object_data_set(button, kButtonIndexKey, reinterpret_cast<void*>(static_cast<intptr_t>(i)));
    char part[24];
    snprintf(part, sizeof part, "button%d", i + 1);
    elm_object_part_content_set(popup, part, button);
    evas_object_smart_callback_add(button, "clicked", __onButtonClicked, this);
    if (_pp->_buttonHooks[i]) _pp->_buttonHooks[i](button);
  }
  evas_object_show(popup);
  return popup;
}

void WPopupController::_runHandler(const ButtonHandler& handler) {
  WViewControllerWeakPtr weak = getWeakPtr();
  bool destroyFlag = true;
  // A copy: the handler may destroy this popup and with it the handler.
  ButtonHandler run = handler;
  if (run) run(&destroyFlag);
  if (destroyFlag) {
    if (auto alive = weak.lock()) alive->destroy();
  }
}

void WPopupController::__onButtonClicked(void* data, Evas_Object* obj, void*) {
  auto* self = static_cast<WPopupController*>(data);
  int index = static_cast<int>(reinterpret_cast<intptr_t>(evas_object_data_get(obj, kButtonIndexKey)));
  if (index < 0 || index >= self->_pp->_buttonCount) return;
  self->_runHandler(self->_pp->_buttonHandlers[index]);
}

void WPopupController::__onBackKey(void* data, Evas_Object* obj, void*) {
  auto* self = static_cast<WPopupController*>(data);
  if (!self->_pp->_backHandler) {
    evas_object_del(obj);
    return;
  }
  self->_runHandler(self->_pp->_backHandler);
}

}  // namespace app_assist
