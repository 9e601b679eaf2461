#pragma once
// bundle: a small ordered set of string key/value pairs.

#include <stddef.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef struct _bundle_t bundle;

typedef enum {
  BUNDLE_ERROR_NONE = 0,
  BUNDLE_ERROR_INVALID_PARAMETER = -22,
  BUNDLE_ERROR_OUT_OF_MEMORY = -12,
  BUNDLE_ERROR_KEY_NOT_AVAILABLE = -126,
  BUNDLE_ERROR_KEY_EXISTS = -17,
} bundle_error_e;

bundle* bundle_create(void);
int bundle_free(bundle* b);
// Adds a pair; an existing key is refused (BUNDLE_ERROR_KEY_EXISTS).
int bundle_add_str(bundle* b, const char* key, const char* str);
// *str points into the bundle (valid until the bundle changes or is freed).
int bundle_get_str(bundle* b, const char* key, char** str);
int bundle_get_count(bundle* b);
// Iterates pairs in insertion order.
typedef void (*bundle_str_iterator_cb)(const char* key, const char* value, void* user_data);
void bundle_foreach_str(bundle* b, bundle_str_iterator_cb cb, void* user_data);

#ifdef __cplusplus
}
#endif
