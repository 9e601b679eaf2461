#pragma once
// The UI-application life cycle: ui_app_main runs the program between its
// create and terminate callbacks, delivering launch requests, pause/resume
// and system events (language changed, low memory) on the main loop.
//
// Desktop stand-ins for the device's system events:
//   SIGUSR1  language changed (the language is taken from $LANGUAGE or $LANG)
//   SIGUSR2  low memory (soft warning)
// A window of the application that is iconified, withdrawn or hidden pauses
// it; shown again (or restored), it resumes.

#include <Evas.h>
#include <stdbool.h>

#include "platform/app_control.h"

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  APP_ERROR_NONE = 0,
  APP_ERROR_INVALID_PARAMETER = -22,
  APP_ERROR_OUT_OF_MEMORY = -12,
  APP_ERROR_INVALID_CONTEXT = -0x01100000 | 0x01,
  APP_ERROR_NO_SUCH_FILE = -2,
  APP_ERROR_ALREADY_RUNNING = -0x01100000 | 0x03,
} app_error_e;

typedef enum {
  APP_EVENT_LOW_MEMORY = 0,
  APP_EVENT_LOW_BATTERY,
  APP_EVENT_LANGUAGE_CHANGED,
  APP_EVENT_DEVICE_ORIENTATION_CHANGED,
  APP_EVENT_REGION_FORMAT_CHANGED,
  APP_EVENT_SUSPENDED_STATE_CHANGED,
} app_event_type_e;

typedef enum {
  APP_EVENT_LOW_MEMORY_NORMAL = 0x01,
  APP_EVENT_LOW_MEMORY_SOFT_WARNING = 0x02,
  APP_EVENT_LOW_MEMORY_HARD_WARNING = 0x04,
} app_event_low_memory_status_e;

typedef struct app_event_handler* app_event_handler_h;
typedef struct app_event_info* app_event_info_h;
typedef void (*app_event_cb)(app_event_info_h event_info, void* user_data);

typedef bool (*app_create_cb)(void* user_data);
typedef void (*app_terminate_cb)(void* user_data);
typedef void (*app_pause_cb)(void* user_data);
typedef void (*app_resume_cb)(void* user_data);
typedef void (*app_control_cb)(app_control_h app_control, void* user_data);

typedef struct {
  app_create_cb create;
  app_terminate_cb terminate;
  app_pause_cb pause;
  app_resume_cb resume;
  app_control_cb app_control;
} ui_app_lifecycle_callback_s;

// Runs the application: elm init, create (false ends it at once), the launch
// request built from the command line, the main loop, terminate. Returns
// APP_ERROR_NONE, or an error when the callbacks are missing, create failed
// or an application is already running in this process.
int ui_app_main(int argc, char** argv, ui_app_lifecycle_callback_s* callback, void* user_data);
// Asks the running application's main loop to end (terminate follows).
void ui_app_exit(void);

int ui_app_add_event_handler(app_event_handler_h* event_handler, app_event_type_e event_type,
                             app_event_cb callback, void* user_data);
int ui_app_remove_event_handler(app_event_handler_h event_handler);

int app_event_get_low_memory_status(app_event_info_h event_info, app_event_low_memory_status_e* status);
// The new language (heap copy, caller frees) of a language-changed event.
int app_event_get_language(app_event_info_h event_info, char** lang);

// The device preinitialises these to start faster; the desktop has none, so
// each returns NULL and the caller creates its own.
Evas_Object* app_get_preinitialized_window(const char* win_name);
Evas_Object* app_get_preinitialized_background(void);
Evas_Object* app_get_preinitialized_conformant(void);

#ifdef __cplusplus
}
#endif
