#pragma once

#include <functional>

#include "app-assist/WViewController.h"

namespace app_assist {

struct _WPopupControllerImpl;

// A modal popup at the bottom of the window: title, text or content view,
// and up to three buttons. A button or back-key handler may clear the
// destroy flag to keep the popup open; otherwise it closes afterwards.
class WPopupController : public WViewController {
 public:
  using ButtonHandler = std::function<void(bool* destroy)>;
  using ObjectHook = std::function<void(Evas_Object* obj)>;
  using ContentCreator = std::function<Evas_Object*(Evas_Object* popup)>;
  static constexpr int kMaxButtons = 3;

  WPopupController();
  WPopupController(const char* title, const char* content);

  const char* getClassName() const override;

  void setTitle(const char* title);
  void setContent(const char* text);
  // Takes over `content`, created as the popup's content.
  void setContentView(WViewController* content);
  void setContentCreator(ContentCreator creator);
  void setTextDomain(const char* domain);
  void setOnBack(ButtonHandler handler);
  void setOnPopupObject(ObjectHook hook);
  // False (and a log line) once three buttons are there.
  bool addButton(const char* label, ButtonHandler handler, ObjectHook buttonHook = nullptr);
  int getButtonCount() const;

 protected:
  ~WPopupController() override;
  Evas_Object* onCreateView(Evas_Object* parent, void* param) override;

 private:
  static void __onButtonClicked(void* data, Evas_Object* obj, void* event);
  static void __onBackKey(void* data, Evas_Object* obj, void* event);
  void _runHandler(const ButtonHandler& handler);

  _WPopupControllerImpl* _pp;
};

}  // namespace app_assist
