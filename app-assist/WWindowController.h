#pragma once

#include <Elementary.h>

#include <functional>

#include "app-assist/IWWindowController.h"

namespace app_assist {

struct _WWindowControllerImpl;

// Owns the application window, its background, conformant and base layout,
// and the one view controller shown in the base layout. It deletes itself
// when its window is deleted; nobody deletes it directly.
class WWindowController : public IWWindowController {
 public:
  using CreateWinHandler = std::function<Evas_Object*()>;
  using CreateBaseLayoutHandler = std::function<Evas_Object*(Evas_Object* win, Evas_Object** conformant)>;
  using BackKeyHandler = std::function<void(Evas_Object* obj, void* event)>;

  WWindowController(const char* name, Elm_Win_Type type = ELM_WIN_BASIC);

  const char* getClassName() const override;
  Evas_Object* getEvasObj() const override;
  Evas_Object* getBaseLayout() const override;
  Evas_Object* getConformant() const override;
  WViewController* getBaseViewController() const override;
  const char* getName() const;

  // Creates the window (once) and shows it.
  bool create();
  // Creates the window, base layout and key handling without showing.
  bool precreate();
  bool attachBaseViewController(WViewController* vc, void* param = nullptr);
  WViewController* detachBaseViewController();
  void destroyBaseViewController();
  // Deletes the window, which deletes this controller.
  void destroy();

  void setOnCreateWin(CreateWinHandler handler);
  void setOnCreateBaseLayout(CreateBaseLayoutHandler handler);
  // Registered for the back key on the window at creation.
  void setOnBackKey(BackKeyHandler handler);

 protected:
  ~WWindowController() override;

  virtual Evas_Object* onCreateWin();
  virtual Evas_Object* onCreateBaseLayout(Evas_Object* win, Evas_Object** conformant);
  virtual void onAttachBaseViewController(WViewController* vc);
  virtual void onDetachBaseViewController(WViewController* vc);
  virtual void onDestroy();

 private:
  static void __onWindowDel(void* data, Evas_Object* obj);
  static void __onBackKey(void* data, Evas_Object* obj, void* event);

  _WWindowControllerImpl* _pv;
};

}  // namespace app_assist
