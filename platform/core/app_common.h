#pragma once
// Application paths. The resource directory is, in this order: $PICTAVO_RES_DIR,
// the res/ folder staged in the build tree, or the installed one.

#ifdef __cplusplus
extern "C" {
#endif

// Returns a heap copy ending in '/', which the caller frees; NULL if none exists.
char* app_get_resource_path(void);
// The application's own data folder ($XDG_DATA_HOME/pictavo/), created on demand.
char* app_get_data_path(void);

#ifdef __cplusplus
}
#endif
