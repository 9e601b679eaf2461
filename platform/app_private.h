#pragma once
// Hooks of the application life cycle for the rest of the platform layer and
// for tests; application code uses platform/app.h only.

#include "platform/app.h"

// Delivers an event to the registered handlers now, as the desktop triggers
// (signals) do. `language` is used for language-changed events (NULL: $LANG).
void ui_app_raise_event(app_event_type_e type, const char* language);

// Hands a request to the running application's app-control callback from the
// main loop (a copy is delivered; the caller keeps `request`). False when no
// application is running.
bool ui_app_post_app_control(app_control_h request);

// Whether ui_app_main is running, and whether the application is paused now.
bool ui_app_is_running(void);
bool ui_app_is_paused(void);

// Watches a window for iconify/hide (pause) and restore/show (resume). The
// windows existing after create are watched automatically; windows made
// later are watched from the next launch request on, or through this call.
void ui_app_watch_window(Evas_Object* window);
