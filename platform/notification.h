#pragma once
// Status messages: a short toast (about 2 seconds) on the application's
// window, and a log line. Posted texts are kept for tests.

#include <Evas.h>
#include <stddef.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  NOTIFICATION_ERROR_NONE = 0,
  NOTIFICATION_ERROR_INVALID_PARAMETER = -22,
  NOTIFICATION_ERROR_OUT_OF_MEMORY = -12,
} notification_error_e;

// The Evas object name of the toast while it is shown.
#define NOTIFICATION_TOAST_NAME "pictavo-toast"

int notification_status_message_post(const char* message);

// The application's window: toasts appear on it (without one a message is
// only logged) and the applications it launches in group mode belong to it.
// Forgotten when the window is deleted.
void notification_set_window(Evas_Object* window);
Evas_Object* notification_get_window(void);

// For tests: the texts posted so far (oldest first).
size_t notification_get_posted_count(void);
// Heap copy of the index-th posted text (caller frees), NULL when out of range.
char* notification_get_posted(size_t index);
void notification_clear_posted(void);

#ifdef __cplusplus
}
#endif
