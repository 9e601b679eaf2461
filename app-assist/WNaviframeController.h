#pragma once

#include <functional>

#include "app-assist/WViewController.h"

namespace app_assist {

class WContentViewController;
struct _WNaviframeControllerImpl;

// The naviframe: a stack of content views. The back key pops the top view
// (if its onPop agrees); popping the last one asks the last-item-pop handler.
class WNaviframeController : public WViewController {
 public:
  // Sets *popOut to whether the last item may go.
  using LastItemPopHandler = std::function<void(bool* popOut)>;

  WNaviframeController();

  const char* getClassName() const override;
  bool create(Evas_Object* parent, void* param) override;
  void destroy() override;

  bool push(WContentViewController* vc, const char* name = nullptr, void* param = nullptr);
  void setOnLastItemPop(LastItemPopHandler handler);
  bool isTop(const WContentViewController* vc) const;
  WContentViewController* getTopViewController() const;

 protected:
  ~WNaviframeController() override;

  Evas_Object* onCreateView(Evas_Object* parent, void* param) override;
  virtual bool onPush(WContentViewController* vc, void* param);
  virtual bool onItemPop(WContentViewController* vc, Elm_Object_Item* item);
  virtual void onLastItemPop(bool* popOut);

 private:
  static Eina_Bool __onItemPopCb(void* data, Elm_Object_Item* item);
  static void __onBackKey(void* data, Evas_Object* obj, void* event);
  static void __onMoreKey(void* data, Evas_Object* obj, void* event);

  _WNaviframeControllerImpl* _nv;
};

}  // namespace app_assist
