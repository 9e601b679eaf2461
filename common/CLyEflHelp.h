#pragma once
// Layout creation the way every screen needs it.

#include <Evas.h>

class CLyEflHelp {
 public:
  // An edje layout from `edjFile`/`group`, expanding and filling, named
  // `name`, not shown. nullptr when it cannot be made or the group is missing.
  static Evas_Object* createLayout(Evas_Object* parent, const char* edjFile, const char* group,
                                   const char* name);
  // The default application layout ("layout"/"application"/"default"),
  // expanding, filling, named and shown.
  static Evas_Object* createLayout(Evas_Object* parent, const char* name);
};
