#pragma once
// Application-wide data: the window controller (so any screen reaches the
// window), the screen size for the current rotation, the theme resources
// (theme extension, changeable colour and font tables), the text domain, the
// feedback service, and one process-wide mutex (held around PNG decoding by
// the decoder threads).

#include "common/CLySingleton.h"
#include "platform/uxt_theme.h"

namespace app_assist {
class WWindowController;
}

struct _CLyAppDataImpl;

class CLyAppData : public CLySingleton<CLyAppData> {
 public:
  ~CLyAppData() override;

  void setWindowController(app_assist::WWindowController* window);
  app_assist::WWindowController* getWindowController() const;

  // Window rotation in degrees (0 without a window).
  int getWindowRotation() const;
  // Screen size as seen in the current rotation (width and height swapped at
  // 90 and 270 degrees). Null out-parameters are logged and nothing is written.
  void getScreenSize(int* w, int* h) const;

  void setThemeExtension();
  void setColorTable();
  Uxt_Theme_Color_Table* getColorTable();
  void setFontTable();
  Uxt_Theme_Font_Table* getFontTable();
  void setTextDomain();

  // The process-wide mutex; not recursive. It needs none of the other data,
  // so taking it never builds the instance (common/CLyAppDataLock.cpp).
  static void lock();
  static void unlock();

 private:
  friend class CLySingleton<CLyAppData>;
  CLyAppData();

  _CLyAppDataImpl* _pv;
};
