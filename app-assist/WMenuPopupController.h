#pragma once

#include <functional>

#include "app-assist/WViewController.h"

namespace app_assist {

struct _WMenuPopupControllerImpl;

// The "more" menu: a context popup at the bottom centre of the screen. Only
// one menu is open in the process at a time; it closes on dismissal, on a
// chosen item and when the application pauses.
class WMenuPopupController : public WViewController {
 public:
  WMenuPopupController();

  const char* getClassName() const override;
  // Remembers the window and the layout whose resize moves the menu, and
  // creates the menu.
  bool createMenu(Evas_Object* window, Evas_Object* layout);
  // The callback runs, then the menu closes.
  Elm_Object_Item* appendItem(const char* label, std::function<void()> cb);
  bool showMenu();

  // Closes the menu that is open now, if any.
  static void destroyCurrentMenu();
  static Evas_Object* getCurrentMenu();

 protected:
  ~WMenuPopupController() override;
  Evas_Object* onCreateView(Evas_Object* parent, void* param) override;

 private:
  void _move();
  static void __onItemSelected(void* data, Evas_Object* obj, void* event);
  static void __onDismissed(void* data, Evas_Object* obj, void* event);
  static void __onBackKey(void* data, Evas_Object* obj, void* event);
  static void __onLayoutResize(void* data, Evas* evas, Evas_Object* obj, void* event);
  static void __onRotationChanged(void* data, Evas_Object* obj, void* event);
  static void __onMenuDel(void* data, Evas_Object* obj);

  _WMenuPopupControllerImpl* _mp;
};

}  // namespace app_assist
