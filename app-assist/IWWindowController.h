#pragma once

#include <Evas.h>

namespace app_assist {

class WViewController;

// What a view needs to know of the window it lives in.
class IWWindowController {
 public:
  virtual const char* getClassName() const = 0;
  virtual Evas_Object* getEvasObj() const = 0;
  virtual Evas_Object* getBaseLayout() const = 0;
  virtual Evas_Object* getConformant() const = 0;
  virtual WViewController* getBaseViewController() const = 0;
  virtual ~IWWindowController() = default;
};

}  // namespace app_assist
