#include <Elementary.h>

#include "common/CLyLog.h"

// Placeholder entry point until the application object exists: opens the
// "pictavo" window with a naviframe and quits on window close.
int main(int argc, char** argv) {
  elm_init(argc, argv);
  elm_policy_set(ELM_POLICY_QUIT, ELM_POLICY_QUIT_LAST_WINDOW_CLOSED);
  Evas_Object* win = elm_win_util_standard_add("pictavo", "pictavo");
  Evas_Object* navi = elm_naviframe_add(win);
  evas_object_size_hint_weight_set(navi, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  elm_win_resize_object_add(win, navi);
  evas_object_show(navi);
  Evas_Object* label = elm_label_add(navi);
  elm_object_text_set(label, "Pictavo");
  elm_naviframe_item_push(navi, "Pictavo", nullptr, nullptr, label, nullptr);
  evas_object_resize(win, 720, 1280);
  evas_object_show(win);
  LYLOG_I("window opened");
  elm_run();
  elm_shutdown();
  return 0;
}
