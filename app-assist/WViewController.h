#pragma once

#include <Elementary.h>

#include <functional>
#include <memory>

namespace app_assist {

class IWWindowController;
class WViewController;
struct WViewControllerImpl;

using WViewControllerWeakPtr = std::weak_ptr<WViewController>;

// A controller that owns exactly one Evas object. It is created under a
// parent on demand and deletes itself when its object is deleted (by
// destroy(), its parent or a naviframe pop); nobody deletes it directly.
class WViewController {
 public:
  using CreateViewFunc = std::function<Evas_Object*(Evas_Object* parent, void* param)>;

  WViewController();
  WViewController(const WViewController&) = delete;
  WViewController& operator=(const WViewController&) = delete;

  virtual const char* getClassName() const;
  // Creates the view object under `parent` (once). False when onCreate
  // refuses or no object was made.
  virtual bool create(Evas_Object* parent, void* param);
  // Deletes the object, and with it this controller; an uncreated
  // controller is deleted at once.
  virtual void destroy();

  Evas_Object* getEvasObj() const;
  void setName(const char* name);
  const char* getName() const;
  IWWindowController* getWindowController() const;
  // Expires when this controller is deleted.
  WViewControllerWeakPtr getWeakPtr();
  Evas_Object* getWindowBaseLayoutEvasObj() const;

  void setOnCreateView(CreateViewFunc func);

  // Creates `child` in this view and sets it as the content of `part`.
  bool setPartContent(const char* part, WViewController* child);
  WViewController* getPartContent(const char* part) const;

  // Shows `popup` on behalf of this view (on the window's base layout); a
  // popup attached earlier is closed. The popup closes with this view.
  void attachPopup(WViewController* popup);
  void destroyPopup();

  // The controller of a view object, or null.
  static WViewController* fromEvasObj(Evas_Object* obj);

 protected:
  virtual ~WViewController();

  virtual bool onCreate(void* param);
  virtual Evas_Object* onCreateView(Evas_Object* parent, void* param);
  virtual void onCreated();
  virtual void onDestroy();

 private:
  static void __onViewDel(void* data, Evas_Object* obj);

  WViewControllerImpl* _pv;
};

}  // namespace app_assist
