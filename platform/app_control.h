#pragma once
// Application control: the request record through which applications launch
// one another, hand data over (extra data: strings and string arrays) and
// answer (replies). The names, codes and constants are the platform's.
//
// Strings handed out through char** are heap copies that the caller frees
// with free(); string arrays are a malloc'ed array of such copies (an entry
// may be NULL when the sender put a NULL there), freed entry by entry and
// then as a whole.

#include <stdbool.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef struct app_control_s* app_control_h;

typedef enum {
  APP_CONTROL_ERROR_NONE = 0,
  APP_CONTROL_ERROR_INVALID_PARAMETER = -22,
  APP_CONTROL_ERROR_OUT_OF_MEMORY = -12,
  APP_CONTROL_ERROR_APP_NOT_FOUND = -0x01100000 | 0x21,
  APP_CONTROL_ERROR_KEY_NOT_FOUND = -126,
  APP_CONTROL_ERROR_KEY_REJECTED = -129,
  APP_CONTROL_ERROR_INVALID_DATA_TYPE = -0x01100000 | 0x22,
  APP_CONTROL_ERROR_LAUNCH_REJECTED = -0x01100000 | 0x23,
  APP_CONTROL_ERROR_PERMISSION_DENIED = -13,
  APP_CONTROL_ERROR_LAUNCH_FAILED = -0x01100000 | 0x24,
  APP_CONTROL_ERROR_TIMED_OUT = -2147483647,
  APP_CONTROL_ERROR_IO_ERROR = -5,
} app_control_error_e;

typedef enum {
  APP_CONTROL_RESULT_APP_STARTED = 1,
  APP_CONTROL_RESULT_SUCCEEDED = 0,
  APP_CONTROL_RESULT_FAILED = -1,
  APP_CONTROL_RESULT_CANCELED = -2,
} app_control_result_e;

typedef enum {
  APP_CONTROL_LAUNCH_MODE_SINGLE = 0,
  APP_CONTROL_LAUNCH_MODE_GROUP,
} app_control_launch_mode_e;

// Operations.
#define APP_CONTROL_OPERATION_MAIN "http://tizen.org/appcontrol/operation/main"
#define APP_CONTROL_OPERATION_DEFAULT "http://tizen.org/appcontrol/operation/default"
#define APP_CONTROL_OPERATION_VIEW "http://tizen.org/appcontrol/operation/view"
#define APP_CONTROL_OPERATION_PICK "http://tizen.org/appcontrol/operation/pick"
#define APP_CONTROL_OPERATION_SHARE "http://tizen.org/appcontrol/operation/share"
#define APP_CONTROL_OPERATION_MULTI_SHARE "http://tizen.org/appcontrol/operation/multi_share"
#define APP_CONTROL_OPERATION_SETTING "http://tizen.org/appcontrol/operation/setting"
#define APP_CONTROL_OPERATION_SETTING_STORAGE "http://tizen.org/appcontrol/operation/setting/storage"

// Standard extra-data keys. A key is also found under its short form without
// the "http://tizen.org/" prefix ("appcontrol/data/selected" and
// APP_CONTROL_DATA_SELECTED name the same entry).
#define APP_CONTROL_DATA_SELECTED "http://tizen.org/appcontrol/data/selected"
#define APP_CONTROL_DATA_PATH "http://tizen.org/appcontrol/data/path"
#define APP_CONTROL_DATA_TOTAL_COUNT "http://tizen.org/appcontrol/data/total_count"
#define APP_CONTROL_DATA_SELECTION_MODE "http://tizen.org/appcontrol/data/selection_mode"

// The caller id of requests that hand images over from the gallery. On the
// desktop a command line naming image files stands for the gallery.
#define APP_CONTROL_GALLERY_APP_ID "org.tizen.gallery"

typedef void (*app_control_reply_cb)(app_control_h request, app_control_h reply, app_control_result_e result,
                                     void* user_data);
typedef bool (*app_control_extra_data_cb)(app_control_h app_control, const char* key, void* user_data);

int app_control_create(app_control_h* app_control);
int app_control_destroy(app_control_h app_control);
int app_control_clone(app_control_h* clone, app_control_h app_control);

// A NULL value clears the field; getters give NULL for an unset field.
int app_control_set_operation(app_control_h app_control, const char* operation);
int app_control_get_operation(app_control_h app_control, char** operation);
int app_control_set_app_id(app_control_h app_control, const char* app_id);
int app_control_get_app_id(app_control_h app_control, char** app_id);
int app_control_set_uri(app_control_h app_control, const char* uri);
int app_control_get_uri(app_control_h app_control, char** uri);
int app_control_set_mime(app_control_h app_control, const char* mime);
int app_control_get_mime(app_control_h app_control, char** mime);
int app_control_set_launch_mode(app_control_h app_control, app_control_launch_mode_e mode);
int app_control_get_launch_mode(app_control_h app_control, app_control_launch_mode_e* mode);

// Extra data. Adding under an existing key replaces it. Keys beginning with
// "__" are reserved (APP_CONTROL_ERROR_KEY_REJECTED).
int app_control_add_extra_data(app_control_h app_control, const char* key, const char* value);
int app_control_add_extra_data_array(app_control_h app_control, const char* key, const char* value[],
                                     int length);
int app_control_remove_extra_data(app_control_h app_control, const char* key);
// APP_CONTROL_ERROR_KEY_NOT_FOUND for a missing key; APP_CONTROL_ERROR_INVALID_DATA_TYPE
// when the entry is an array (get_extra_data) or a single string (get_extra_data_array).
int app_control_get_extra_data(app_control_h app_control, const char* key, char** value);
int app_control_get_extra_data_array(app_control_h app_control, const char* key, char*** value, int* length);
int app_control_is_extra_data_array(app_control_h app_control, const char* key, bool* array);
int app_control_foreach_extra_data(app_control_h app_control, app_control_extra_data_cb callback,
                                   void* user_data);

// The id of the application that sent this request; NULL when it came from
// no application (the home screen).
int app_control_get_caller(app_control_h app_control, char** id);
int app_control_is_reply_requested(app_control_h app_control, bool* requested);

// Launching and replies.
int app_control_send_launch_request(app_control_h app_control, app_control_reply_cb callback,
                                    void* user_data);
int app_control_send_terminate_request(app_control_h app_control);
int app_control_reply_to_launch_request(app_control_h reply, app_control_h request,
                                        app_control_result_e result);

#ifdef __cplusplus
}
#endif
