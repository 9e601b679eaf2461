#pragma once
// Tizen buffer manager surfaces: CPU-mapped pixel surfaces that the image
// filter reads from and writes into. Desktop stand-in with the platform's
// names and values; planes are plain heap memory with a 64-byte aligned stride.

#include <stdint.h>

#ifdef __cplusplus
extern "C" {
#endif

typedef struct _tbm_surface* tbm_surface_h;
typedef uint32_t tbm_format;

#define TBM_SURF_PLANE_MAX 4
#define TBM_SURF_OPTION_READ (1 << 0)
#define TBM_SURF_OPTION_WRITE (1 << 1)

// Formats are DRM four-character codes of a packed little-endian word:
// "AR24" is A:R:G:B from the high bits down (memory B, G, R, A) and
// "BA24" is B:G:R:A (memory A, R, G, B).
#define __tbm_fourcc_code(a, b, c, d) \
  ((uint32_t)(a) | ((uint32_t)(b) << 8) | ((uint32_t)(c) << 16) | ((uint32_t)(d) << 24))
#define TBM_FORMAT_ARGB8888 __tbm_fourcc_code('A', 'R', '2', '4')
#define TBM_FORMAT_BGRA8888 __tbm_fourcc_code('B', 'A', '2', '4')

typedef enum {
  TBM_SURFACE_ERROR_NONE = 0,
  TBM_SURFACE_ERROR_INVALID_PARAMETER = -22,
  TBM_SURFACE_ERROR_INVALID_OPERATION = -38,
} tbm_surface_error_e;

typedef struct _tbm_surface_plane {
  unsigned char* ptr;
  uint32_t size;
  uint32_t offset;
  uint32_t stride;
  int reserved1;
  int reserved2;
  int reserved3;
} tbm_surface_plane_s;

typedef struct _tbm_surface_info {
  uint32_t width;
  uint32_t height;
  tbm_format format;
  uint32_t bpp;
  uint32_t size;
  uint32_t num_planes;
  tbm_surface_plane_s planes[TBM_SURF_PLANE_MAX];
  int reserved4;
  int reserved5;
  int reserved6;
} tbm_surface_info_s;

// NULL for a non-positive size, an unsupported format or no memory.
tbm_surface_h tbm_surface_create(int width, int height, tbm_format format);
int tbm_surface_destroy(tbm_surface_h surface);
// Maps for reading and/or writing; a surface maps once at a time.
int tbm_surface_map(tbm_surface_h surface, int opt, tbm_surface_info_s* info);
int tbm_surface_unmap(tbm_surface_h surface);
// The layout without mapping (plane pointers are still filled in).
int tbm_surface_get_info(tbm_surface_h surface, tbm_surface_info_s* info);
int tbm_surface_get_width(tbm_surface_h surface);
int tbm_surface_get_height(tbm_surface_h surface);
tbm_format tbm_surface_get_format(tbm_surface_h surface);

#ifdef __cplusplus
}
#endif
