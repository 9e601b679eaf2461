#pragma once

#include <functional>

#include "app-assist/WViewController.h"

namespace app_assist {

class WNaviframeController;
struct _WContentViewControllerImpl;

// A screen: a view that lives in a naviframe page.
class WContentViewController : public WViewController {
 public:
  using PushedHandler = std::function<void(Elm_Object_Item* item)>;

  WContentViewController();
  explicit WContentViewController(const char* name);

  const char* getClassName() const override;
  void destroy() override;

  WNaviframeController* getNaviframeController() const;
  Elm_Object_Item* getNaviItem() const;
  void setTitle(const char* title);
  const char* getTitle() const;
  void setOnPushed(PushedHandler handler);
  bool isPushed() const;

  // Pops this view, which must be the naviframe's top.
  bool popOut();
  // Puts a "more" button into the item's toolbar part.
  bool addMoreButton(Elm_Object_Item* item, Evas_Smart_Cb clickedCb, void* data);

 protected:
  ~WContentViewController() override;

  Evas_Object* onCreateView(Evas_Object* parent, void* param) override;
  virtual void onAttachedToNaviframe(WNaviframeController* naviframe, Elm_Object_Item* item);
  // A custom naviframe item for this view, or null for the standard push.
  virtual Elm_Object_Item* onPushToNaviframe(Evas_Object* naviframe);
  virtual void onPushed(Elm_Object_Item* item);
  // False keeps the view (vetoes the pop).
  virtual bool onPop();
  virtual void onBecomeTop();
  virtual void createMoreButton(Elm_Object_Item* item, Evas_Smart_Cb clickedCb, void* data);

 private:
  friend class WNaviframeController;
  void _setNaviframe(WNaviframeController* naviframe, Elm_Object_Item* item);
  void _notifyPushed(Elm_Object_Item* item);

  _WContentViewControllerImpl* _cv;
};

}  // namespace app_assist
