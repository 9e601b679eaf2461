#pragma once
// Resource manager: resolves resource names (for example "edje/LyTheme.edj")
// to files inside the application's resource directory.
//
// A name is a relative path inside the resource directory. Layout (edje)
// resources are looked up as given and then under "edje/"; image resources as
// given and then under "images/". Absolute names and names climbing out of the
// directory ("..") are refused. The manager initialises itself on first use;
// init/release are reference counted so every init has its release.

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  APP_RESOURCE_TYPE_IMAGE = 0,
  APP_RESOURCE_TYPE_LAYOUT,
  APP_RESOURCE_TYPE_SOUND,
  APP_RESOURCE_TYPE_BIN,
} app_resource_e;

typedef enum {
  APP_RESOURCE_ERROR_NONE = 0,
  APP_RESOURCE_ERROR_INVALID_PARAMETER = -22,
  APP_RESOURCE_ERROR_OUT_OF_MEMORY = -12,
  APP_RESOURCE_ERROR_IO_ERROR = -5,
} app_resource_error_e;

int app_resource_manager_init(void);
// On success *path is a heap copy of the file's absolute path (caller frees).
int app_resource_manager_get(app_resource_e type, const char* id, char** path);
int app_resource_manager_release(void);

#ifdef __cplusplus
}
#endif
