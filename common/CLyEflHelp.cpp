#include "common/CLyEflHelp.h"

#include <Elementary.h>

#include <cstdlib>

#include "common/CLyLog.h"
#include "common/CLyUtil.h"

Evas_Object* CLyEflHelp::createLayout(Evas_Object* parent, const char* edjFile, const char* group,
                                      const char* name) {
  Evas_Object* layout = elm_layout_add(parent);
  if (!layout) {
    LYLOG_E("Cannot create layout");
    return nullptr;
  }
  if (!elm_layout_file_set(layout, edjFile, group)) {
    LYLOG_E("Cannot load %s from %s", group ? group : "(null)", edjFile ? edjFile : "(null)");
    evas_object_del(layout);
    return nullptr;
  }
  evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_size_hint_align_set(layout, EVAS_HINT_FILL, EVAS_HINT_FILL);
  evas_object_name_set(layout, name);
  return layout;
}

Evas_Object* CLyEflHelp::createLayout(Evas_Object* parent, const char* name) {
  Evas_Object* layout = elm_layout_add(parent);
  if (!layout) {
    LYLOG_E("Cannot create layout");
    return nullptr;
  }
  if (!elm_layout_theme_set(layout, "layout", "application", "default")) {
    // Without the theme extension loaded the theme may lack the group; the
    // framework's own copy stands in.
    char* edj = CLyUtil::getEdjPath("edje/WDefaultView.edj");
    if (!edj || !elm_layout_file_set(layout, edj, "application"))
      LYLOG_E("No application layout in the theme");
    free(edj);
  }
  evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_size_hint_align_set(layout, EVAS_HINT_FILL, EVAS_HINT_FILL);
  evas_object_name_set(layout, name);
  evas_object_show(layout);
  return layout;
}
