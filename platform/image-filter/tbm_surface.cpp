#include "platform/image-filter/tbm_surface.h"

#include <atomic>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>

#include "platform/core/dlog.h"

#define TBM_TAG "TBM"

struct _tbm_surface {
  int width = 0;
  int height = 0;
  tbm_format format = 0;
  uint32_t stride = 0;
  unsigned char* pixels = nullptr;
  std::atomic<bool> mapped{false};
};

namespace {

// Freed pixel blocks kept for the next surface of the same size, as the
// platform's buffer manager keeps freed buffer objects: a filter run makes
// two surfaces of one size, and fresh pages would be zeroed by the kernel
// each time (as much work as the filter itself). Two blocks of at most
// 32 MiB are kept, under a lock; surfaces are used from worker threads.
constexpr size_t kPoolBlockMax = 32u << 20;
struct PooledBlock {
  unsigned char* pixels = nullptr;
  size_t size = 0;
};
std::mutex gPoolMutex;
PooledBlock gPool[2];

unsigned char* takeBlock(size_t size) {
  {
    std::lock_guard<std::mutex> lock(gPoolMutex);
    for (PooledBlock& b : gPool)
      if (b.pixels && b.size == size) {
        unsigned char* p = b.pixels;
        b = PooledBlock{};
        return p;
      }
  }
  return static_cast<unsigned char*>(aligned_alloc(64, size));
}

void giveBlock(unsigned char* pixels, size_t size) {
  if (size <= kPoolBlockMax) {
    unsigned char* evicted = nullptr;
    {
      std::lock_guard<std::mutex> lock(gPoolMutex);
      PooledBlock* slot = !gPool[0].pixels ? &gPool[0] : (!gPool[1].pixels ? &gPool[1] : &gPool[0]);
      evicted = slot->pixels;
      *slot = PooledBlock{pixels, size};
    }
    free(evicted);
    return;
  }
  free(pixels);
}

bool supported(tbm_format format) {
  return format == TBM_FORMAT_ARGB8888 || format == TBM_FORMAT_BGRA8888;
}

void fillInfo(const _tbm_surface* s, tbm_surface_info_s* info) {
  memset(info, 0, sizeof(*info));
  info->width = (uint32_t)s->width;
  info->height = (uint32_t)s->height;
  info->format = s->format;
  info->bpp = 32;
  info->size = s->stride * (uint32_t)s->height;
  info->num_planes = 1;
  info->planes[0].ptr = s->pixels;
  info->planes[0].size = info->size;
  info->planes[0].offset = 0;
  info->planes[0].stride = s->stride;
}

}  // namespace

extern "C" {

tbm_surface_h tbm_surface_create(int width, int height, tbm_format format) {
  // 16384 keeps stride * height well inside the 32-bit size fields.
  if (width <= 0 || height <= 0 || width > 16384 || height > 16384 || !supported(format)) {
    dlog_print(DLOG_ERROR, TBM_TAG, "tbm_surface_create: invalid %dx%d format 0x%08x", width, height, format);
    return nullptr;
  }
  _tbm_surface* s = new (std::nothrow) _tbm_surface;
  if (!s) return nullptr;
  s->width = width;
  s->height = height;
  s->format = format;
  s->stride = ((uint32_t)width * 4 + 63) & ~63u;
  // aligned_alloc wants a multiple of the alignment: the stride is one.
  s->pixels = takeBlock((size_t)s->stride * (size_t)height);
  if (!s->pixels) {
    dlog_print(DLOG_ERROR, TBM_TAG, "tbm_surface_create: out of memory for %dx%d", width, height);
    delete s;
    return nullptr;
  }
  return s;
}

int tbm_surface_destroy(tbm_surface_h surface) {
  if (!surface) return TBM_SURFACE_ERROR_INVALID_PARAMETER;
  giveBlock(surface->pixels, (size_t)surface->stride * (size_t)surface->height);
  delete surface;
  return TBM_SURFACE_ERROR_NONE;
}

int tbm_surface_map(tbm_surface_h surface, int opt, tbm_surface_info_s* info) {
  if (!surface || !info || !(opt & (TBM_SURF_OPTION_READ | TBM_SURF_OPTION_WRITE)))
    return TBM_SURFACE_ERROR_INVALID_PARAMETER;
  if (surface->mapped.exchange(true)) return TBM_SURFACE_ERROR_INVALID_OPERATION;
  fillInfo(surface, info);
  return TBM_SURFACE_ERROR_NONE;
}

int tbm_surface_unmap(tbm_surface_h surface) {
  if (!surface) return TBM_SURFACE_ERROR_INVALID_PARAMETER;
  if (!surface->mapped.exchange(false)) return TBM_SURFACE_ERROR_INVALID_OPERATION;
  return TBM_SURFACE_ERROR_NONE;
}

int tbm_surface_get_info(tbm_surface_h surface, tbm_surface_info_s* info) {
  if (!surface || !info) return TBM_SURFACE_ERROR_INVALID_PARAMETER;
  fillInfo(surface, info);
  return TBM_SURFACE_ERROR_NONE;
}

int tbm_surface_get_width(tbm_surface_h surface) {
  return surface ? surface->width : TBM_SURFACE_ERROR_INVALID_PARAMETER;
}

int tbm_surface_get_height(tbm_surface_h surface) {
  return surface ? surface->height : TBM_SURFACE_ERROR_INVALID_PARAMETER;
}

tbm_format tbm_surface_get_format(tbm_surface_h surface) {
  return surface ? surface->format : 0;
}

}  // extern "C"
