#include "common/CLyAppData.h"

#include <Elementary.h>
#include <libintl.h>
#include <pthread.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <string>

#include "app-assist/WWindowController.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "platform/core/app_common.h"
#include "platform/feedback.h"

#define LY_THEME_EDJ "edje/LyTheme.edj"
#define LY_COLOR_TABLE_FILE "code/changeableColorInfo.xml"
#define LY_FONT_TABLE_FILE "code/changeableFontInfo.xml"
#define LY_TEXT_DOMAIN "pictavo"

struct _CLyAppDataImpl {
  app_assist::WWindowController* window = nullptr;
  Uxt_Theme_Color_Table* colorTable = nullptr;
  Uxt_Theme_Font_Table* fontTable = nullptr;
  bool themeExtension = false;
};

CLyAppData::CLyAppData() : _pv(new _CLyAppDataImpl) {
  int ret = feedback_initialize();
  if (ret != 0) LYLOG_E("feedback_initialize error : %d", ret);
  CLyUtil::initResourceManager();
}

CLyAppData::~CLyAppData() {
  if (_pv->themeExtension) {
    if (char* path = CLyUtil::getEdjPath(LY_THEME_EDJ)) {
      elm_theme_extension_del(nullptr, path);
      free(path);
    }
  }
  if (_pv->colorTable) {
    uxt_theme_delete_color_table(_pv->colorTable);
    _pv->colorTable = nullptr;
  }
  if (_pv->fontTable) {
    uxt_theme_delete_font_table(_pv->fontTable);
    _pv->fontTable = nullptr;
  }
  int ret = feedback_deinitialize();
  if (ret != 0) LYLOG_E("feedback_deinitialize error : %d", ret);
  CLyUtil::releaseResourceManager();
  delete _pv;
}

void CLyAppData::setWindowController(app_assist::WWindowController* window) {
  _pv->window = window;
}

app_assist::WWindowController* CLyAppData::getWindowController() const {
  return _pv->window;
}

namespace {
Evas_Object* windowObject(app_assist::WWindowController* window) {
  return window ? window->getEvasObj() : nullptr;
}
}  // namespace

int CLyAppData::getWindowRotation() const {
  Evas_Object* win = windowObject(_pv->window);
  if (!win) {
    LYLOG_E("No window");
    return 0;
  }
  return elm_win_rotation_get(win);
}

void CLyAppData::getScreenSize(int* w, int* h) const {
  if (!w) {
    LYLOG_E("Invalid param w");
    return;
  }
  if (!h) {
    LYLOG_E("Invalid param h");
    return;
  }
  int width = 0;
  int height = 0;
  Evas_Object* win = windowObject(_pv->window);
  if (!win) {
    LYLOG_E("No window");
  } else {
    elm_win_screen_size_get(win, nullptr, nullptr, &width, &height);
  }
  int rotation = getWindowRotation();
  if (rotation == 0 || rotation == 180) {
    *w = width;
    *h = height;
  } else {
    *w = height;
    *h = width;
  }
}

void CLyAppData::setThemeExtension() {
  if (_pv->themeExtension) return;
  if (char* path = CLyUtil::getEdjPath(LY_THEME_EDJ)) {
    elm_theme_extension_add(nullptr, path);
    free(path);
  }
  uxt_theme_set_changeable_ui_enabled(true);
  _pv->themeExtension = true;
}

void CLyAppData::setColorTable() {
  if (_pv->colorTable) return;
  char* path = CLyUtil::getImagePath(LY_COLOR_TABLE_FILE);
  if (!path) {
    LYLOG_E("Invalid path");
    return;
  }
  _pv->colorTable = uxt_theme_add_color_table(path);
  free(path);
  if (!_pv->colorTable) {
    LYLOG_E("Failed to get color table");
    return;
  }
  uxt_theme_set_style(0);
  uxt_theme_set_color_table(_pv->colorTable);
}

Uxt_Theme_Color_Table* CLyAppData::getColorTable() {
  if (!_pv->colorTable) setColorTable();
  return _pv->colorTable;
}

void CLyAppData::setFontTable() {
  if (_pv->fontTable) return;
  char* path = CLyUtil::getImagePath(LY_FONT_TABLE_FILE);
  if (!path) {
    LYLOG_E("Invalid path");
    return;
  }
  _pv->fontTable = uxt_theme_add_font_table(path);
  free(path);
  if (!_pv->fontTable) {
    LYLOG_E("Failed to get font table");
    return;
  }
  uxt_theme_set_font_table(_pv->fontTable);
}

Uxt_Theme_Font_Table* CLyAppData::getFontTable() {
  if (!_pv->fontTable) setFontTable();
  return _pv->fontTable;
}

void CLyAppData::setTextDomain() {
  char* res = app_get_resource_path();
  if (!res) {
    LYLOG_E("Failed to get res path");
    return;
  }
  std::string locale = std::string(res) + "locale";
  bindtextdomain(LY_TEXT_DOMAIN, locale.c_str());
  bind_textdomain_codeset(LY_TEXT_DOMAIN, "UTF-8");
  free(res);
}
