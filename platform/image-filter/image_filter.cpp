#include "platform/image-filter/image_filter.h"

#include <new>

#include "platform/core/dlog.h"
#include "platform/core/pixel_order.h"
#include "platform/image-filter/filter_looks.h"

#define IF_TAG "IMAGE_FILTER"

namespace {

// Largest side accepted; keeps every size computation inside 32 bits per row
// and the pixel count far from overflow.
constexpr int kMaxSide = 16384;

}  // namespace

struct _image_filter_s {
  int mode = IMAGE_FILTER_MODE_BUFFER;
  tbm_surface_h inSurface = nullptr;
  tbm_surface_h outSurface = nullptr;
  const unsigned char* inBuffer = nullptr;
  unsigned char* outBuffer = nullptr;
  int width = 0;
  int height = 0;
  int code = -1;
};

namespace imgfilter {

bool isKnownCode(int code) {
  switch (code) {
    case 201:
    case 202:
    case 203:
    case 204:
    case 205:
    case 206:
    case 207:
    case 208:
    case 209:
    case 210:
    case 211:
    case 212:
    case 213:
    case 214:
    case 215:
    case 216:
    case 217:
    case 218:
    case 400:
    case 410:
    case 412:
    case 417:
    case 418:
    case 419:
    case 420:
    case 421:
    case 422:
    case 423:
    case 602:
    case 603:
    case 604:
    case 605:
    case 606:
    case 607:
    case 608:
    case 609:
    case 610:
    case 611:
      return true;
    default:
      return false;
  }
}

bool runLook(int code, const Frame& f) {
  if (!isKnownCode(code)) return false;
  chooseSimd();
  switch (code) {
    case 422:
      lookPastel(f);
      break;
    case 419:
      lookDeep(f);
      break;
    case 412:
      lookRetro(f);
      break;
    case 421:
      lookFilm(f);
      break;
    case 417:
      lookCalm(f);
      break;
    case 418:
      lookDawn(f);
      break;
    case 205:
      lookGreyscale(f);
      break;
    case 420:
      lookEvergreen(f);
      break;
    case 206:
      lookFaded(f);
      break;
    case 410:
      lookOldPhoto(f);
      break;
    case 602:
      lookBlur(f);
      break;
    case 603:
      lookNostalgia(f);
      break;
    case 212:
      lookSunshine(f);
      break;
    case 203:
      lookVintage(f);
      break;
    case 211:
      lookSharpen(f);
      break;
    case 210:
      lookSoftGlow(f);
      break;
    case 608:
      lookStardust(f);
      break;
    case 609:
      lookLightFlare(f);
      break;
    case 201:
      lookCartoon(f);
      break;
    // Codes the editor does not offer: a few simple tones, the rest unchanged.
    case 202:
      lookSepia(f);
      break;
    case 204:
      lookWarm(f);
      break;
    case 207:
      lookCool(f);
      break;
    default:
      lookIdentity(f);
      break;
  }
  return true;
}

}  // namespace imgfilter

namespace {

bool channelsOf(tbm_format format, imgfilter::Channels* ch) {
  if (format == TBM_FORMAT_BGRA8888) {
    *ch = imgfilter::kOrderARGB;
    return true;
  }
  if (format == TBM_FORMAT_ARGB8888) {
    *ch = imgfilter::kOrderBGRA;
    return true;
  }
  return false;
}

int applySurfaces(_image_filter_s* h) {
  if (!h->inSurface || !h->outSurface) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: input or output surface missing");
    return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  }
  const int w = tbm_surface_get_width(h->inSurface), hgt = tbm_surface_get_height(h->inSurface);
  if (w != tbm_surface_get_width(h->outSurface) || hgt != tbm_surface_get_height(h->outSurface)) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: surfaces differ in size");
    return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  }
  imgfilter::Channels inCh, outCh;
  if (!channelsOf(tbm_surface_get_format(h->inSurface), &inCh) ||
      !channelsOf(tbm_surface_get_format(h->outSurface), &outCh)) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: unsupported surface format");
    return IMAGE_FILTER_ERROR_NOT_SUPPORTED;
  }
  const bool same = h->inSurface == h->outSurface;
  tbm_surface_info_s in, out;
  if (tbm_surface_map(h->inSurface,
                      same ? (TBM_SURF_OPTION_READ | TBM_SURF_OPTION_WRITE) : TBM_SURF_OPTION_READ,
                      &in) != TBM_SURFACE_ERROR_NONE) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: cannot map the input surface");
    return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  }
  if (same) {
    out = in;
  } else if (tbm_surface_map(h->outSurface, TBM_SURF_OPTION_WRITE, &out) != TBM_SURFACE_ERROR_NONE) {
    tbm_surface_unmap(h->inSurface);
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: cannot map the output surface");
    return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  }
  imgfilter::Frame f{
      in.planes[0].ptr, (int)in.planes[0].stride, out.planes[0].ptr, (int)out.planes[0].stride, w, hgt, inCh};
  imgfilter::runLook(h->code, f);
  // The looks write in the input's channel order; turn it into the output's.
  if (inCh.a != outCh.a)
    for (int y = 0; y < hgt; ++y) pixel_order::copyReversed(f.dstRow(y), f.dstRow(y), (size_t)w);
  if (!same) tbm_surface_unmap(h->outSurface);
  tbm_surface_unmap(h->inSurface);
  return IMAGE_FILTER_ERROR_NONE;
}

int applyBuffers(_image_filter_s* h) {
  if (!h->inBuffer || !h->outBuffer) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: input or output buffer missing");
    return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  }
  imgfilter::Frame f{h->inBuffer, h->width * 4, h->outBuffer,         h->width * 4,
                     h->width,    h->height,    imgfilter::kOrderARGB};
  imgfilter::runLook(h->code, f);
  return IMAGE_FILTER_ERROR_NONE;
}

}  // namespace

extern "C" {

int image_filter_create(image_filter_h* filter, int mode) {
  if (!filter || (mode != IMAGE_FILTER_MODE_BUFFER && mode != IMAGE_FILTER_MODE_SURFACE)) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_create: invalid parameter (mode %d)", mode);
    return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  }
  _image_filter_s* h = new (std::nothrow) _image_filter_s;
  if (!h) return IMAGE_FILTER_ERROR_OUT_OF_MEMORY;
  h->mode = mode;
  *filter = h;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_destroy(image_filter_h filter) {
  if (!filter) return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  delete filter;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_set_input_by_tbm_surface(image_filter_h filter, tbm_surface_h surface) {
  if (!filter || !surface) return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  if (filter->mode != IMAGE_FILTER_MODE_SURFACE) return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  filter->inSurface = surface;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_set_output_by_tbm_surface(image_filter_h filter, tbm_surface_h surface) {
  if (!filter || !surface) return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  if (filter->mode != IMAGE_FILTER_MODE_SURFACE) return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  filter->outSurface = surface;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_set_input_by_buffer(image_filter_h filter, const unsigned char* buffer, int width,
                                     int height, uint32_t fourcc) {
  if (!filter || !buffer || width <= 0 || height <= 0 || width > kMaxSide || height > kMaxSide) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_set_input_by_buffer: invalid parameter (%dx%d)", width,
               height);
    return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  }
  if (filter->mode != IMAGE_FILTER_MODE_BUFFER) return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  if (fourcc != IMAGE_FILTER_FORMAT_BGRA) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_set_input_by_buffer: unsupported format 0x%08x", fourcc);
    return IMAGE_FILTER_ERROR_NOT_SUPPORTED;
  }
  filter->inBuffer = buffer;
  filter->width = width;
  filter->height = height;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_set_output_by_buffer(image_filter_h filter, unsigned char* buffer) {
  if (!filter || !buffer) return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  if (filter->mode != IMAGE_FILTER_MODE_BUFFER) return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  filter->outBuffer = buffer;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_set_filter(image_filter_h filter, int code) {
  if (!filter) return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  if (!imgfilter::isKnownCode(code)) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_set_filter: unknown filter code %d", code);
    return IMAGE_FILTER_ERROR_NOT_SUPPORTED;
  }
  filter->code = code;
  return IMAGE_FILTER_ERROR_NONE;
}

int image_filter_apply(image_filter_h filter) {
  if (!filter) return IMAGE_FILTER_ERROR_INVALID_PARAMETER;
  if (filter->code < 0) {
    dlog_print(DLOG_ERROR, IF_TAG, "image_filter_apply: no filter set");
    return IMAGE_FILTER_ERROR_INVALID_OPERATION;
  }
  return filter->mode == IMAGE_FILTER_MODE_SURFACE ? applySurfaces(filter) : applyBuffers(filter);
}

int image_filter_is_supported(int code) {
  return imgfilter::isKnownCode(code) ? 1 : 0;
}

}  // extern "C"
