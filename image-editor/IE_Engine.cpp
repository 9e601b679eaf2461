#include "image-editor/IE_Engine.h"

#include "common/CLyLog.h"
#include "image-editor/IE_PixelOps.h"
#include "platform/image-filter/image_filter.h"
#include "platform/image-filter/tbm_surface.h"

namespace {

// Filter code of every effect number 0..36; any higher number uses 400.
const int16_t kFilterCodes[37] = {203, 410, 204, 205, 202, 206, 213, 201, 211, 210, 207, 605, 208,
                                  606, 602, 412, 212, 603, 604, 209, 607, 214, 608, 609, 610, 611,
                                  215, 218, 217, 216, 417, 418, 419, 420, 421, 422, 423};
constexpr int16_t kCodeAbove = 400;

size_t pixelCount(const IeImageInfo* image) {
  return (size_t)image->width * (size_t)image->height;
}

// Fills a new surface with the source; the surface keeps the source's byte
// order ("BA24" for format 8, "AR24" for format 9).
tbm_surface_h makeSourceSurface(const IeImageInfo* src) {
  const tbm_format fourcc = src->format == IE_FORMAT_ARGB8888 ? TBM_FORMAT_ARGB8888 : TBM_FORMAT_BGRA8888;
  tbm_surface_h surface = tbm_surface_create(src->width, src->height, fourcc);
  if (!surface) return nullptr;
  tbm_surface_info_s info;
  if (tbm_surface_map(surface, TBM_SURF_OPTION_WRITE, &info) != TBM_SURFACE_ERROR_NONE) {
    tbm_surface_destroy(surface);
    return nullptr;
  }
  const size_t rowBytes = (size_t)src->width * 4;
  for (int y = 0; y < src->height; ++y)
    memcpy(info.planes[0].ptr + (size_t)y * info.planes[0].stride, src->pbBuf + (size_t)y * rowBytes,
           rowBytes);
  tbm_surface_unmap(surface);
  return surface;
}

// Copies the filtered surface out; a format-9 caller gets its own byte order back.
bool readResult(tbm_surface_h surface, IeImageInfo* dst, bool reverse) {
  tbm_surface_info_s info;
  if (tbm_surface_map(surface, TBM_SURF_OPTION_READ, &info) != TBM_SURFACE_ERROR_NONE) return false;
  const int w = tbm_surface_get_width(surface), h = tbm_surface_get_height(surface);
  const tbm_format format = tbm_surface_get_format(surface);
  const size_t bpp = (format == TBM_FORMAT_BGRA8888 || format == TBM_FORMAT_ARGB8888) ? 4 : 0;
  const size_t rowBytes = (size_t)w * bpp;
  for (int y = 0; y < h && rowBytes > 0; ++y) {
    const unsigned char* from = info.planes[0].ptr + (size_t)y * info.planes[0].stride;
    unsigned char* to = dst->pbBuf + (size_t)y * rowBytes;
    if (reverse)
      ie::copyReversed(from, to, (size_t)w);
    else
      memcpy(to, from, rowBytes);
  }
  tbm_surface_unmap(surface);
  return true;
}

int runOnSurfaces(const IeImageInfo* src, IeImageInfo* dst, int code) {
  tbm_surface_h in = makeSourceSurface(src);
  tbm_surface_h out = in ? tbm_surface_create(src->width, src->height, TBM_FORMAT_BGRA8888) : nullptr;
  image_filter_h filter = nullptr;
  bool ok = in && out && image_filter_create(&filter, IMAGE_FILTER_MODE_SURFACE) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_set_input_by_tbm_surface(filter, in) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_set_output_by_tbm_surface(filter, out) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_set_filter(filter, code) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_apply(filter) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && readResult(out, dst, src->format == IE_FORMAT_ARGB8888);
  if (filter) image_filter_destroy(filter);
  if (out) tbm_surface_destroy(out);
  if (in) tbm_surface_destroy(in);
  return ok ? IE_ERROR_NONE : IE_ERROR_FILTER_FAILED;
}

int runOnBuffers(const IeImageInfo* src, IeImageInfo* dst, int code) {
  // The buffer filter reads "BGRA" words (format 8). A format-9 source is
  // turned round into the destination and filtered there in place, so the
  // caller's source is never written.
  const bool reverse = src->format == IE_FORMAT_ARGB8888;
  const unsigned char* input = src->pbBuf;
  if (reverse) {
    ie::copyReversed(src->pbBuf, dst->pbBuf, pixelCount(src));
    input = dst->pbBuf;
  }
  image_filter_h filter = nullptr;
  bool ok = image_filter_create(&filter, IMAGE_FILTER_MODE_BUFFER) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_set_input_by_buffer(filter, input, src->width, src->height,
                                              IMAGE_FILTER_FORMAT_BGRA) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_set_output_by_buffer(filter, dst->pbBuf) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_set_filter(filter, code) == IMAGE_FILTER_ERROR_NONE;
  ok = ok && image_filter_apply(filter) == IMAGE_FILTER_ERROR_NONE;
  if (filter) image_filter_destroy(filter);
  if (reverse) ie::copyReversed(dst->pbBuf, dst->pbBuf, pixelCount(src));
  return ok ? IE_ERROR_NONE : IE_ERROR_FILTER_FAILED;
}

}  // namespace

namespace ie {

int checkImage(const IeImageInfo* image) {
  if (!image || !image->pbBuf) return IE_ERROR_INVALID_PARAMETER;
  if (image->width <= 0 || image->height <= 0) return IE_ERROR_INVALID_SIZE;
  if (image->format == IE_FORMAT_INVALID || image->format > IE_FORMAT_MAX) return IE_ERROR_INVALID_FORMAT;
  return IE_ERROR_NONE;
}

}  // namespace ie

int16_t IE_Engine_Filter_Code(int effectNumber) {
  return effectNumber >= 0 && effectNumber <= 36 ? kFilterCodes[effectNumber] : kCodeAbove;
}

int IE_Engine_Apply_Effect(IeImageInfo* src, IeImageInfo* dst, int effectNumber) {
  LYLOG_D("Here");
  if (!src || !dst || !src->pbBuf || !dst->pbBuf) {
    LYLOG_E("invalid image record");
    return IE_ERROR_INVALID_PARAMETER;
  }
  const int check = ie::checkImage(src);
  if (check != IE_ERROR_NONE) {
    LYLOG_E("invalid source: %dx%d format %d (error %d)", src->width, src->height, src->format, check);
    return check;
  }
  // The filter works on 32-bit pixels only; other formats cannot be filtered.
  if (src->format != IE_FORMAT_BGRA8888 && src->format != IE_FORMAT_ARGB8888) {
    LYLOG_E("effects need 32-bit pixels, source format is %d", src->format);
    return IE_ERROR_INVALID_FORMAT;
  }
  if (effectNumber < 0) LYLOG_W("negative effect number %d uses filter code %d", effectNumber, kCodeAbove);
  const int code = IE_Engine_Filter_Code(effectNumber);
  // Codes 201..600 run on tbm surfaces, the others on plain buffers.
  const int result =
      code >= 201 && code <= 600 ? runOnSurfaces(src, dst, code) : runOnBuffers(src, dst, code);
  if (result != IE_ERROR_NONE) {
    LYLOG_E("filter %d failed on %dx%d", code, src->width, src->height);
    return result;
  }
  dst->width = src->width;
  dst->height = src->height;
  dst->format = src->format == IE_FORMAT_ARGB8888 ? IE_FORMAT_ARGB8888 : IE_FORMAT_BGRA8888;
  return IE_ERROR_NONE;
}
