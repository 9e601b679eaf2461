#pragma once
// Platform image filter: applies one of the platform's photo looks, given by
// its filter code, from an input image into an output image of the same size.
// A filter handle is created either for tbm surfaces (mode 1) or for plain
// packed buffers (mode 0). Handles are independent: several threads may each
// run their own at the same time. Every look is deterministic.

#include <stdint.h>

#include "platform/image-filter/tbm_surface.h"

#ifdef __cplusplus
extern "C" {
#endif

typedef struct _image_filter_s* image_filter_h;

typedef enum {
  IMAGE_FILTER_ERROR_NONE = 0,
  IMAGE_FILTER_ERROR_OUT_OF_MEMORY = -12,
  IMAGE_FILTER_ERROR_INVALID_PARAMETER = -22,
  IMAGE_FILTER_ERROR_INVALID_OPERATION = -38,
  IMAGE_FILTER_ERROR_NOT_SUPPORTED = -95,
} image_filter_error_e;

typedef enum {
  IMAGE_FILTER_MODE_BUFFER = 0,
  IMAGE_FILTER_MODE_SURFACE = 1,
} image_filter_mode_e;

// Buffer colour format "BGRA": 32-bit words packed B:G:R:A from the high bits
// down, the word layout of the tbm "BA24" format (memory order A, R, G, B).
#define IMAGE_FILTER_FOURCC(a, b, c, d) \
  ((uint32_t)(a) | ((uint32_t)(b) << 8) | ((uint32_t)(c) << 16) | ((uint32_t)(d) << 24))
#define IMAGE_FILTER_FORMAT_BGRA IMAGE_FILTER_FOURCC('B', 'G', 'R', 'A')

int image_filter_create(image_filter_h* filter, int mode);
int image_filter_destroy(image_filter_h filter);

// Surface mode. The surfaces stay owned by the caller and must outlive apply.
int image_filter_set_input_by_tbm_surface(image_filter_h filter, tbm_surface_h surface);
int image_filter_set_output_by_tbm_surface(image_filter_h filter, tbm_surface_h surface);

// Buffer mode: rows packed (stride = width x 4). The output buffer holds as
// many bytes as the input and may be the input buffer itself.
int image_filter_set_input_by_buffer(image_filter_h filter, const unsigned char* buffer, int width,
                                     int height, uint32_t fourcc);
int image_filter_set_output_by_buffer(image_filter_h filter, unsigned char* buffer);

// IMAGE_FILTER_ERROR_NOT_SUPPORTED for a code the library does not know.
int image_filter_set_filter(image_filter_h filter, int code);
// Runs the look. On failure the output is left as it was.
int image_filter_apply(image_filter_h filter);

// True when the library knows the code (for callers that list the looks).
int image_filter_is_supported(int code);

#ifdef __cplusplus
}
#endif
