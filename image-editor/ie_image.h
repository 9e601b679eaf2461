#pragma once
// The image preview object of the edit view: an evas smart object (class
// "collage-ie-mainimg", named "Image") holding one evas image with the photo
// at screen size. Large photos, and GIF or WBMP files, are scaled through an
// off-screen buffer canvas whose rendered pixels replace the visible ones
// when preloading has finished; the others are scaled directly.
// Main loop only.

#include <Evas.h>

// Called after a resize that changed the object's size.
typedef void (*ie_image_resized_cb)(void* data, Evas_Object* obj);

// The preview object on the parent's canvas. Touch handling is left to the
// edit view: `withGestures` must be false (true is refused with a log line
// and treated as false).
Evas_Object* ie_image_create(Evas_Object* parent, bool withGestures);

// Shows `pixels` (width x height 32-bit evas ARGB pixels, not kept) sized for
// a screen of screenWidth x screenHeight: a photo of at most the screen's
// area at its own size, a larger one with its long side equal to the longer
// screen side. `path` is the photo's file, whose extension picks the
// off-screen path for GIF and WBMP. Loading into a loaded object replaces
// its photo. False when nothing could be shown.
bool ie_image_file_load_copy(Evas_Object* obj, const char* path, const void* pixels, int width, int height,
                             int screenWidth, int screenHeight);

void ie_image_set_resized_callback(Evas_Object* obj, ie_image_resized_cb callback, void* data);
Evas_Object* ie_image_internal_image_get(Evas_Object* obj);
void ie_image_geometry_get(Evas_Object* obj, int* x, int* y, int* w, int* h);
// The visible image's pixels, opened for writing; the caller marks what it
// changed with evas_object_image_data_update_add.
void* ie_image_internal_buffer_get(Evas_Object* obj);
// Drops the pixels, clears the loaded state and hides the object.
void ie_image_file_unload(Evas_Object* obj);

// State for the edit view and tests: pixels present; an off-screen preload
// still running; the size the pixels are shown at (0 x 0 when empty).
bool ie_image_is_loaded(Evas_Object* obj);
bool ie_image_preload_pending(Evas_Object* obj);
void ie_image_shown_size_get(Evas_Object* obj, int* w, int* h);
