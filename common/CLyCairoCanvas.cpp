#include "common/CLyCairoCanvas.h"

#include <sys/mman.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <vector>

#include "codec/Bitmap.h"
#include "common/CLyLog.h"

#if __has_include(<cairo-evas-gl.h>)
#include <Evas_GL.h>
#include <cairo-evas-gl.h>
#define LY_CAIRO_HAS_EVAS_GL 1
#else
#define LY_CAIRO_HAS_EVAS_GL 0
#endif

struct _CLyCairoCanvasGl {
#if LY_CAIRO_HAS_EVAS_GL
  cairo_device_t* device = nullptr;
  Evas_GL* evasGl = nullptr;
  Evas_GL_Config* config = nullptr;
  Evas_GL_Surface* surface = nullptr;
  Evas_GL_Context* context = nullptr;
#endif
};

namespace {

inline void setColor(cairo_t* cr, const CLyFloatRectangle& c) {
  cairo_set_source_rgba(cr, c.x1, c.y1, c.x2, c.y2);
}

// The part (x, y, w, h) of an ARGB32 image surface averaged over k x k
// boxes (partial boxes at the right and bottom edges average what they
// cover). Null when the part is empty or memory runs out.
cairo_surface_t* boxReduce(cairo_surface_t* surface, int x, int y, int w, int h, int k) {
  cairo_surface_flush(surface);
  const int sw = cairo_image_surface_get_width(surface), sh = cairo_image_surface_get_height(surface);
  const int x0 = std::max(0, x), y0 = std::max(0, y);
  const int x1 = std::min(sw, x + w), y1 = std::min(sh, y + h);
  if (x1 <= x0 || y1 <= y0 || k < 2) return nullptr;
  const int n = x1 - x0;
  const int ow = (n + k - 1) / k, oh = (y1 - y0 + k - 1) / k;
  cairo_surface_t* out = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, ow, oh);
  if (cairo_surface_status(out) != CAIRO_STATUS_SUCCESS) {
    cairo_surface_destroy(out);
    return nullptr;
  }
  const unsigned char* src = cairo_image_surface_get_data(surface);
  const int sstride = cairo_image_surface_get_stride(surface);
  unsigned char* dst = cairo_image_surface_get_data(out);
  const int dstride = cairo_image_surface_get_stride(out);
  std::vector<uint32_t> acc((size_t)ow * 4);
  for (int oy = 0; oy < oh; oy++) {
    std::fill(acc.begin(), acc.end(), 0u);
    const int ry0 = y0 + oy * k, ry1 = std::min(y1, ry0 + k);
    for (int ry = ry0; ry < ry1; ry++) {
      const uint32_t* row = reinterpret_cast<const uint32_t*>(src + (size_t)ry * sstride) + x0;
      uint32_t* a = acc.data();
      int rx = 0;
      for (int ox = 0; ox < ow; ox++, a += 4) {
        const int end = std::min(n, rx + k);
        uint32_t b = 0, g = 0, r = 0, al = 0;
        for (; rx < end; rx++) {
          const uint32_t p = row[rx];
          b += p & 0xFF;
          g += (p >> 8) & 0xFF;
          r += (p >> 16) & 0xFF;
          al += p >> 24;
        }
        a[0] += b;
        a[1] += g;
        a[2] += r;
        a[3] += al;
      }
    }
    const uint32_t rows = (uint32_t)(ry1 - ry0);
    uint32_t* o = reinterpret_cast<uint32_t*>(dst + (size_t)oy * dstride);
    const uint32_t* a = acc.data();
    for (int ox = 0; ox < ow; ox++, a += 4) {
      const uint32_t count = rows * (uint32_t)std::min(k, n - ox * k), half = count / 2;
      o[ox] = ((a[3] + half) / count) << 24 | ((a[2] + half) / count) << 16 | ((a[1] + half) / count) << 8 |
              ((a[0] + half) / count);
    }
  }
  cairo_surface_mark_dirty(out);
  return out;
}

// A large canvas (16 MB for a 2000 x 2000 save) is first written by the
// drawing: asking for transparent huge pages over its 2 MiB-aligned interior
// turns thousands of page faults into a few. Only a hint.
void adviseHugePages(void* data, size_t size) {
  constexpr uintptr_t kHuge = 2u << 20;
  if (size < 4 * kHuge) return;
  const uintptr_t begin = ((uintptr_t)data + kHuge - 1) & ~(kHuge - 1);
  const uintptr_t end = ((uintptr_t)data + size) & ~(kHuge - 1);
  if (end > begin) madvise((void*)begin, end - begin, MADV_HUGEPAGE);
}

}  // namespace

CLyCairoCanvas::CLyCairoCanvas(Evas_Object* image, const CLyRectangle& geometry, bool useGl) {
  _init(image, geometry, useGl);
}

CLyCairoCanvas::CLyCairoCanvas(Evas_Object* image, int width, int height, bool useGl) {
  _init(image, CLyRectangle(0, 0, width, height), useGl);
}

CLyCairoCanvas::~CLyCairoCanvas() {
  _destroySurface();
  if (mUseGl) _releaseGl();
}

void CLyCairoCanvas::_init(Evas_Object* image, const CLyRectangle& geometry, bool useGl) {
  mImage = image;
  mGeometry = geometry;
  if (!mImage) LYLOG_E("Invalid image object: drawing into an off-screen buffer");
  if (useGl) {
    // The GL mode needs cairo's evas-GL device, which only some cairo builds
    // carry (Debian's has none), and an evas with a GL engine. Without either
    // the canvas falls back to software mode here, and draws the same pixels.
    mUseGl = _initGl();
    if (!mUseGl) LYLOG_W("No evas GL device: the canvas draws in software mode");
  }
  _createSurface();
}

bool CLyCairoCanvas::isValid() const {
  return mSurface && mContext && cairo_status(mContext) == CAIRO_STATUS_SUCCESS &&
         cairo_surface_status(mSurface) == CAIRO_STATUS_SUCCESS;
}

// ---------------------------------------------------------------- GL

bool CLyCairoCanvas::_initGl() {
#if LY_CAIRO_HAS_EVAS_GL
  if (!mImage) return false;
  mGl = new (std::nothrow) _CLyCairoCanvasGl();
  if (!mGl) return false;
  mGl->evasGl = evas_gl_new(evas_object_evas_get(mImage));
  if (!mGl->evasGl) {
    _releaseGl();
    return false;
  }
  mGl->config = evas_gl_config_new();
  mGl->config->color_format = EVAS_GL_RGBA_8888;
  mGl->config->stencil_bits = EVAS_GL_STENCIL_BIT_1;
  mGl->config->multisample_bits = EVAS_GL_MULTISAMPLE_MED;
  mGl->context = evas_gl_context_create(mGl->evasGl, nullptr);
  setenv("CAIRO_GL_COMPOSITOR", "msaa", 1);
  mGl->device = cairo_evas_gl_device_create(mGl->evasGl, mGl->context);
  if (!mGl->context || !mGl->device || cairo_device_status(mGl->device) != CAIRO_STATUS_SUCCESS) {
    _releaseGl();
    return false;
  }
  cairo_gl_device_set_thread_aware(mGl->device, 0);
  return true;
#else
  return false;
#endif
}

void CLyCairoCanvas::_releaseGl() {
#if LY_CAIRO_HAS_EVAS_GL
  if (!mGl) return;
  if (mGl->device) cairo_device_destroy(mGl->device);
  if (mGl->context) evas_gl_context_destroy(mGl->evasGl, mGl->context);
  if (mGl->config) evas_gl_config_free(mGl->config);
  if (mGl->evasGl) evas_gl_free(mGl->evasGl);
#endif
  delete mGl;
  mGl = nullptr;
}

void CLyCairoCanvas::_flushGl() {
  if (mUseGl && mSurface) cairo_surface_flush(mSurface);
}

// ---------------------------------------------------------------- surface

void CLyCairoCanvas::_createSurface() {
  int w = mGeometry.w, h = mGeometry.h;
  if (w < 1 || h < 1) {
    LYLOG_E("Invalid canvas size %d x %d", w, h);
    w = std::max(w, 1);
    h = std::max(h, 1);
    mGeometry.w = w;
    mGeometry.h = h;
  }
  if (!mImage) {
    mSurface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, w, h);
    mContext = cairo_create(mSurface);
    return;
  }
  evas_object_image_size_set(mImage, w, h);
  evas_object_resize(mImage, w, h);
  evas_object_move(mImage, mGeometry.x, mGeometry.y);

#if LY_CAIRO_HAS_EVAS_GL
  if (mUseGl) {
    mGl->surface = evas_gl_surface_create(mGl->evasGl, mGl->config, w, h);
    Evas_Native_Surface ns;
    evas_gl_native_surface_get(mGl->evasGl, mGl->surface, &ns);
    evas_object_image_native_surface_set(mImage, &ns);
    mSurface = cairo_gl_surface_create_for_evas_gl(mGl->device, mGl->surface, mGl->config, w, h);
    mContext = cairo_create(mSurface);
    clear();
    return;
  }
#endif

  // Software mode: cairo writes straight into the image object's own pixels.
  auto* data = static_cast<unsigned char*>(evas_object_image_data_get(mImage, EINA_TRUE));
  if (!data) {
    LYLOG_E("Failed to get image data (%d x %d)", w, h);
    mSurface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, w, h);
    mContext = cairo_create(mSurface);
    return;
  }
  int stride = evas_object_image_stride_get(mImage);
  if (stride < cairo_format_stride_for_width(CAIRO_FORMAT_ARGB32, w))
    stride = cairo_format_stride_for_width(CAIRO_FORMAT_ARGB32, w);
  adviseHugePages(data, (size_t)stride * h);
  mSurface = cairo_image_surface_create_for_data(data, CAIRO_FORMAT_ARGB32, w, h, stride);
  mContext = cairo_create(mSurface);
  evas_object_image_data_set(mImage, data);
}

void CLyCairoCanvas::_destroySurface() {
  if (mContext) cairo_destroy(mContext);
  if (mSurface) cairo_surface_destroy(mSurface);
  mContext = nullptr;
  mSurface = nullptr;
#if LY_CAIRO_HAS_EVAS_GL
  if (mUseGl && mGl && mGl->surface) {
    evas_object_image_native_surface_set(mImage, nullptr);
    evas_gl_surface_destroy(mGl->evasGl, mGl->surface);
    mGl->surface = nullptr;
  }
#endif
}

void CLyCairoCanvas::setGeometry(const CLyRectangle& geometry) {
  mGeometry = geometry;
  _destroySurface();
  _createSurface();
}

void CLyCairoCanvas::resize(int w, int h) {
  setGeometry(CLyRectangle(mGeometry.x, mGeometry.y, w, h));
}

// ---------------------------------------------------------------- whole canvas

void CLyCairoCanvas::clear() {
  if (!mContext) return;
  cairo_save(mContext);
  cairo_set_operator(mContext, CAIRO_OPERATOR_CLEAR);
  cairo_paint(mContext);
  cairo_restore(mContext);
  _flushGl();
}

void CLyCairoCanvas::clearRect(const CLyFloatRectangle& rect) {
  if (!mContext) return;
  cairo_save(mContext);
  cairo_set_operator(mContext, CAIRO_OPERATOR_CLEAR);
  cairo_new_path(mContext);
  setRectPath(rect);
  cairo_clip(mContext);
  cairo_paint(mContext);
  _flushGl();
  cairo_restore(mContext);
}

void CLyCairoCanvas::clearRegion(const cairo_region_t* region) {
  if (!mContext || !region || cairo_region_is_empty(region)) return;
  cairo_save(mContext);
  cairo_set_operator(mContext, CAIRO_OPERATOR_CLEAR);
  cairo_new_path(mContext);
  const int n = cairo_region_num_rectangles(region);
  for (int i = 0; i < n; i++) {
    cairo_rectangle_int_t r;
    cairo_region_get_rectangle(region, i, &r);
    cairo_rectangle(mContext, r.x - mGeometry.x, r.y - mGeometry.y, r.width, r.height);
  }
  // Pixel-aligned boxes: cairo fills them straight, no coverage mask.
  cairo_fill(mContext);
  _flushGl();
  cairo_restore(mContext);
}

void CLyCairoCanvas::update() {
  _flushGl();
  if (mSurface && !mUseGl) cairo_surface_flush(mSurface);
  if (mImage) evas_object_image_data_update_add(mImage, 0, 0, mGeometry.w, mGeometry.h);
}

void CLyCairoCanvas::update(const CLyFloatRectangle& rect) {
  _flushGl();
  if (mSurface && !mUseGl) cairo_surface_flush(mSurface);
  if (!mImage || !(rect.x2 > 0) || !(rect.y2 > 0)) return;
  // Every pixel the rectangle touches, also the partly covered edge pixels.
  const double l = rect.x1 - mGeometry.x, t = rect.y1 - mGeometry.y;
  const int x0 = (int)std::floor(l), y0 = (int)std::floor(t);
  const int x1 = (int)std::ceil(l + rect.x2), y1 = (int)std::ceil(t + rect.y2);
  evas_object_image_data_update_add(mImage, x0, y0, x1 - x0, y1 - y0);
}

// ---------------------------------------------------------------- paths

void CLyCairoCanvas::beginPath() {
  if (mContext) cairo_new_path(mContext);
}

void CLyCairoCanvas::setRectPath(const CLyFloatRectangle& rect) {
  if (!mContext) return;
  cairo_rectangle(mContext, rect.x1 - mGeometry.x, rect.y1 - mGeometry.y, rect.x2, rect.y2);
}

void CLyCairoCanvas::setRoundRectPath(const CLyFloatRectangle& rect, double rx, double ry) {
  if (!mContext) return;
  if (rx == 0 || ry == 0) {
    setRectPath(rect);
    return;
  }
  const double width = rect.x2, height = rect.y2;
  // Radii never exceed half the rectangle, so opposite arcs cannot cross.
  const double rxc = std::min(rx, width * 0.5), ryc = std::min(ry, height * 0.5);
  if (rxc <= 0 || ryc <= 0) {
    setRectPath(rect);
    return;
  }
  const double r = std::max(rxc, ryc);
  const double X = rect.x1 - mGeometry.x, Y = rect.y1 - mGeometry.y;
  const double kx = r / rxc, ky = r / ryc;
  cairo_save(mContext);
  cairo_new_sub_path(mContext);
  // Circle arcs of radius r in a system scaled by (rx/r, ry/r) are ellipse
  // arcs with radii rx, ry on the canvas.
  cairo_scale(mContext, rxc / r, ryc / r);
  cairo_arc(mContext, (X + width - rxc) * kx, (Y + ryc) * ky, r, -M_PI / 2, 0);
  cairo_arc(mContext, (X + width - rxc) * kx, (Y + height - ryc) * ky, r, 0, M_PI / 2);
  cairo_arc(mContext, (X + rxc) * kx, (Y + height - ryc) * ky, r, M_PI / 2, M_PI);
  cairo_arc(mContext, (X + rxc) * kx, (Y + ryc) * ky, r, M_PI, 3 * M_PI / 2);
  cairo_close_path(mContext);
  cairo_restore(mContext);
}

// ---------------------------------------------------------------- fill and stroke

void CLyCairoCanvas::fillRect(const CLyFloatRectangle& color, const CLyFloatRectangle& rect) {
  if (!mContext) return;
  cairo_new_path(mContext);
  setRectPath(rect);
  setColor(mContext, color);
  cairo_fill(mContext);
}

void CLyCairoCanvas::fillRoundRect(const CLyFloatRectangle& color, const CLyFloatRectangle& rect, double rx,
                                   double ry) {
  if (rx == 0 || ry == 0) {
    fillRect(color, rect);
    return;
  }
  if (!mContext) return;
  cairo_new_path(mContext);
  setRoundRectPath(rect, rx, ry);
  setColor(mContext, color);
  cairo_fill(mContext);
}

void CLyCairoCanvas::fillFrame(const CLyFloatRectangle& color, const CLyFloatRectangle& outer,
                               const CLyFloatRectangle& inner) {
  if (!mContext) return;
  cairo_save(mContext);
  cairo_new_path(mContext);
  setRectPath(outer);
  setRectPath(inner);
  cairo_set_fill_rule(mContext, CAIRO_FILL_RULE_EVEN_ODD);
  setColor(mContext, color);
  cairo_fill(mContext);
  cairo_restore(mContext);
}

void CLyCairoCanvas::fillRoundFrame(const CLyFloatRectangle& color, const CLyFloatRectangle& outer,
                                    const CLyFloatRectangle& inner, double rx, double ry) {
  if (rx == 0 || ry == 0) {
    fillFrame(color, outer, inner);
    return;
  }
  if (!mContext) return;
  cairo_save(mContext);
  cairo_new_path(mContext);
  setRectPath(outer);
  setRoundRectPath(inner, rx, ry);
  cairo_set_fill_rule(mContext, CAIRO_FILL_RULE_EVEN_ODD);
  setColor(mContext, color);
  cairo_fill(mContext);
  cairo_restore(mContext);
}

void CLyCairoCanvas::strokeRect(const CLyFloatRectangle& color, double lineWidth,
                                const CLyFloatRectangle& rect) {
  if (!mContext) return;
  const double x = rect.x1 - mGeometry.x, y = rect.y1 - mGeometry.y;
  cairo_new_path(mContext);
  cairo_move_to(mContext, x, y);
  cairo_line_to(mContext, x + rect.x2, y);
  cairo_line_to(mContext, x + rect.x2, y + rect.y2);
  cairo_line_to(mContext, x, y + rect.y2);
  cairo_close_path(mContext);
  cairo_set_line_width(mContext, lineWidth);
  setColor(mContext, color);
  cairo_stroke(mContext);
}

void CLyCairoCanvas::strokeRoundRect(const CLyFloatRectangle& color, double lineWidth,
                                     const CLyFloatRectangle& rect, double rx, double ry) {
  if (rx == 0 || ry == 0) {
    strokeRect(color, lineWidth, rect);
    return;
  }
  if (!mContext) return;
  cairo_new_path(mContext);
  setRoundRectPath(rect, rx, ry);
  cairo_set_line_width(mContext, lineWidth);
  setColor(mContext, color);
  cairo_stroke(mContext);
}

void CLyCairoCanvas::drawIcon(const char* pngPath, const CLyFloatRectangle& rect) {
  if (!mContext) return;
  if (!pngPath) {
    LYLOG_E("Invalid icon path");
    return;
  }
  cairo_surface_t* icon = cairo_image_surface_create_from_png(pngPath);
  if (cairo_surface_status(icon) != CAIRO_STATUS_SUCCESS) {
    LYLOG_E("Failed to load icon %s", pngPath);
    cairo_surface_destroy(icon);
    return;
  }
  const int iw = cairo_image_surface_get_width(icon), ih = cairo_image_surface_get_height(icon);
  cairo_save(mContext);
  cairo_new_path(mContext);
  setRectPath(rect);
  cairo_clip(mContext);
  cairo_translate(mContext, (int)std::floor(rect.x1 - mGeometry.x + (rect.x2 - iw) * 0.5 + 0.01),
                  (int)std::floor(rect.y1 - mGeometry.y + (rect.y2 - ih) * 0.5 + 0.01));
  cairo_set_source_surface(mContext, icon, 0, 0);
  cairo_paint(mContext);
  cairo_restore(mContext);
  cairo_surface_destroy(icon);
}

// ---------------------------------------------------------------- bitmaps

cairo_surface_t* CLyCairoCanvas::createSurface(Bitmap* bitmap) {
  if (!bitmap) {
    LYLOG_D("Invalid bitmap");
    return cairo_image_surface_create(CAIRO_FORMAT_ARGB32, 32, 32);
  }
  if (!bitmap->getPixels() || bitmap->getWidth() < 1 || bitmap->getHeight() < 1) {
    LYLOG_E("Invalid bitmap");
    return nullptr;
  }
  if (Bitmap::bytesPerPixel(bitmap->getFormat()) != 4 || bitmap->getFormat() != BITMAP_FORMAT_BGRA) {
    LYLOG_E("Unsupported bitmap format %d", bitmap->getFormat());
    return nullptr;
  }
  const int w = bitmap->getWidth(), h = bitmap->getHeight();
  cairo_surface_t* image = cairo_image_surface_create_for_data(
      bitmap->getPixels(), CAIRO_FORMAT_ARGB32, w, h, cairo_format_stride_for_width(CAIRO_FORMAT_ARGB32, w));
  if (cairo_surface_status(image) != CAIRO_STATUS_SUCCESS) {
    LYLOG_E("Failed to create surface");
    cairo_surface_destroy(image);
    return nullptr;
  }
#if LY_CAIRO_HAS_EVAS_GL
  if (mUseGl) {
    cairo_surface_t* gl = cairo_gl_surface_create(mGl->device, CAIRO_CONTENT_COLOR_ALPHA, w, h);
    cairo_t* cr = cairo_create(gl);
    cairo_set_source_surface(cr, image, 0, 0);
    cairo_rectangle(cr, 0, 0, w, h);
    cairo_fill(cr);
    cairo_destroy(cr);
    cairo_surface_destroy(image);
    return gl;
  }
#endif
  return image;
}

void CLyCairoCanvas::_setSourcePattern(cairo_surface_t* surface, const cairo_matrix_t& matrix) {
  cairo_pattern_t* pattern = cairo_pattern_create_for_surface(surface);
  cairo_pattern_set_matrix(pattern, &matrix);
  // PAD, not NONE: a crop touching the bitmap's edge would otherwise blend
  // transparent texels into the cell's outer pixel row.
  cairo_pattern_set_extend(pattern, CAIRO_EXTEND_PAD);
  cairo_pattern_set_filter(pattern, mFilter);
  cairo_set_source(mContext, pattern);
  cairo_fill(mContext);
  cairo_pattern_destroy(pattern);
}

void CLyCairoCanvas::drawBitmap(cairo_surface_t* surface, const CLyFloatRectangle& dst,
                                const CLyRectangle& src) {
  if (!mContext) return;
  if (!surface || cairo_surface_status(surface) != CAIRO_STATUS_SUCCESS) {
    LYLOG_E("Invalid surface");
    cairo_new_path(mContext);
    return;
  }
  if (dst.x2 <= 0 || dst.y2 <= 0 || src.w <= 0 || src.h <= 0) {
    LYLOG_E("Invalid rectangle dst %f x %f, src %d x %d", dst.x2, dst.y2, src.w, src.h);
    cairo_new_path(mContext);
    return;
  }
  const double sx = src.w / (double)dst.x2, sy = src.h / (double)dst.y2;
  const int k = mSmoothDownscale ? (int)std::floor(std::min(sx, sy)) : 1;
  if (k >= 2 && cairo_surface_get_type(surface) == CAIRO_SURFACE_TYPE_IMAGE &&
      cairo_image_surface_get_format(surface) == CAIRO_FORMAT_ARGB32) {
    // Reduced pixel p stands for the source pixels max(0, src) + p k onwards.
    cairo_surface_t* reduced = boxReduce(surface, src.x, src.y, src.w, src.h, k);
    if (reduced) {
      const int x0 = std::max(0, src.x), y0 = std::max(0, src.y);
      cairo_matrix_t m;
      cairo_matrix_init_translate(&m, (src.x - x0) / (double)k, (src.y - y0) / (double)k);
      cairo_matrix_scale(&m, sx / k, sy / k);
      cairo_matrix_translate(&m, -(dst.x1 - mGeometry.x), -(dst.y1 - mGeometry.y));
      _setSourcePattern(reduced, m);
      cairo_surface_destroy(reduced);
      return;
    }
  }
  cairo_matrix_t m;
  cairo_matrix_init_translate(&m, src.x, src.y);
  cairo_matrix_scale(&m, sx, sy);
  cairo_matrix_translate(&m, -(dst.x1 - mGeometry.x), -(dst.y1 - mGeometry.y));
  _setSourcePattern(surface, m);
}

void CLyCairoCanvas::drawBitmap(Bitmap* bitmap, const CLyFloatRectangle& dst) {
  if (!mContext) return;
  if (!bitmap) {
    LYLOG_E("Invalid bitmap");
    cairo_new_path(mContext);
    return;
  }
  cairo_surface_t* surface = createSurface(bitmap);
  if (!surface) {
    LYLOG_E("Failed to create surface");
    cairo_new_path(mContext);
    return;
  }
  if (dst.x2 <= 0 || dst.y2 <= 0) {
    LYLOG_E("Invalid rectangle dst %f x %f", dst.x2, dst.y2);
    cairo_new_path(mContext);
    cairo_surface_destroy(surface);
    return;
  }
  cairo_matrix_t m;
  cairo_matrix_init_scale(&m, bitmap->getWidth() / (double)dst.x2, bitmap->getHeight() / (double)dst.y2);
  cairo_matrix_translate(&m, -(dst.x1 - mGeometry.x), -(dst.y1 - mGeometry.y));
  _setSourcePattern(surface, m);
  cairo_surface_destroy(surface);
}

// ---------------------------------------------------------------- nearest copy

bool CLyCairoCanvas::canCopyNearest(cairo_surface_t* surface) const {
  if (mUseGl || !mContext || !mSurface || !surface) return false;
  if (mFilter != CAIRO_FILTER_FAST && mFilter != CAIRO_FILTER_NEAREST) return false;
  if (cairo_get_operator(mContext) != CAIRO_OPERATOR_SOURCE) return false;
  if (cairo_surface_get_type(mSurface) != CAIRO_SURFACE_TYPE_IMAGE ||
      cairo_image_surface_get_format(mSurface) != CAIRO_FORMAT_ARGB32 ||
      cairo_surface_get_type(surface) != CAIRO_SURFACE_TYPE_IMAGE ||
      cairo_image_surface_get_format(surface) != CAIRO_FORMAT_ARGB32 ||
      cairo_surface_status(surface) != CAIRO_STATUS_SUCCESS)
    return false;
  cairo_matrix_t ctm;
  cairo_get_matrix(mContext, &ctm);
  if (ctm.xx != 1 || ctm.yy != 1 || ctm.xy != 0 || ctm.yx != 0 || ctm.x0 != 0 || ctm.y0 != 0) return false;
  // A clip set by a caller must be honoured: copy only on an unclipped canvas.
  double cx1 = 0, cy1 = 0, cx2 = 0, cy2 = 0;
  cairo_clip_extents(mContext, &cx1, &cy1, &cx2, &cy2);
  return cx1 <= 0 && cy1 <= 0 && cx2 >= cairo_image_surface_get_width(mSurface) &&
         cy2 >= cairo_image_surface_get_height(mSurface);
}

// Copies the pixels of `area` (canvas coordinates, inside the canvas) from
// the part `src` of the surface stretched onto `dst`, sampling the texel
// under each pixel centre like pixman's nearest filter with PAD extension.
void CLyCairoCanvas::_copyNearest(cairo_surface_t* surface, const CLyFloatRectangle& dst,
                                  const CLyRectangle& src, const cairo_region_t* area) {
  cairo_surface_flush(surface);
  cairo_surface_flush(mSurface);
  const int sw = cairo_image_surface_get_width(surface), sh = cairo_image_surface_get_height(surface);
  const int sstride = cairo_image_surface_get_stride(surface);
  const unsigned char* sdata = cairo_image_surface_get_data(surface);
  unsigned char* ddata = cairo_image_surface_get_data(mSurface);
  const int dstride = cairo_image_surface_get_stride(mSurface);
  if (!sdata || !ddata) return;
  const double sx = src.w / (double)dst.x2, sy = src.h / (double)dst.y2;
  const double ox = dst.x1 - mGeometry.x, oy = dst.y1 - mGeometry.y;
  // pixman rounds a centre lying exactly on a texel edge down.
  const double e = 1.0 / 65536;
  auto texel = [e](double u, int size) {
    const long i = (long)std::floor(u - e);
    return (int)std::min<long>(std::max<long>(i, 0), size - 1);
  };
  cairo_rectangle_int_t ext;
  cairo_region_get_extents(area, &ext);
  if (ext.width <= 0 || ext.height <= 0) return;
  std::vector<int> xmap((size_t)ext.width);
  for (int x = 0; x < ext.width; x++) xmap[(size_t)x] = texel(src.x + sx * (ext.x + x + 0.5 - ox), sw);
  const int n = cairo_region_num_rectangles(area);
  for (int i = 0; i < n; i++) {
    cairo_rectangle_int_t r;
    cairo_region_get_rectangle(area, i, &r);
    const int* xm = xmap.data() + (r.x - ext.x);
    int lastRow = -1;
    const uint32_t* lastDst = nullptr;
    for (int y = r.y; y < r.y + r.height; y++) {
      const int row = texel(src.y + sy * (y + 0.5 - oy), sh);
      uint32_t* d = reinterpret_cast<uint32_t*>(ddata + (size_t)y * dstride) + r.x;
      if (row == lastRow) {
        // Enlarged photo: this row shows the same texels as the one above.
        std::copy(lastDst, lastDst + r.width, d);
      } else {
        const uint32_t* s = reinterpret_cast<const uint32_t*>(sdata + (size_t)row * sstride);
#pragma GCC unroll 4
        for (int x = 0; x < r.width; x++) d[x] = s[xm[x]];
      }
      lastRow = row;
      lastDst = d;
    }
  }
  cairo_surface_mark_dirty_rectangle(mSurface, ext.x, ext.y, ext.width, ext.height);
}

void CLyCairoCanvas::drawBitmapInRoundRect(cairo_surface_t* surface, const CLyFloatRectangle& dst,
                                           const CLyRectangle& src, double radius,
                                           const cairo_region_t* keep) {
  if (!mContext) return;
  if (!canCopyNearest(surface) || dst.x2 <= 0 || dst.y2 <= 0 || src.w <= 0 || src.h <= 0) {
    beginPath();
    setRoundRectPath(dst, radius, radius);
    drawBitmap(surface, dst, src);
    return;
  }
  // Canvas coordinates from here on.
  const double l = dst.x1 - mGeometry.x, t = dst.y1 - mGeometry.y;
  const double r = l + dst.x2, b = t + dst.y2;
  double rx = 0, ry = 0;
  if (radius > 0) {
    rx = std::min(radius, dst.x2 * 0.5);
    ry = std::min(radius, dst.y2 * 0.5);
  }
  const cairo_rectangle_int_t canvas = {0, 0, cairo_image_surface_get_width(mSurface),
                                        cairo_image_surface_get_height(mSurface)};
  // Whole pixels inside the path: the inner pixels without the corners.
  cairo_region_t* inside = cairo_region_create();
  auto addInner = [inside](double x0, double y0, double x1, double y1) {
    const int ix0 = (int)std::ceil(x0), iy0 = (int)std::ceil(y0);
    const int ix1 = (int)std::floor(x1), iy1 = (int)std::floor(y1);
    if (ix1 <= ix0 || iy1 <= iy0) return;
    const cairo_rectangle_int_t c = {ix0, iy0, ix1 - ix0, iy1 - iy0};
    cairo_region_union_rectangle(inside, &c);
  };
  addInner(l, t + ry, r, b - ry);
  if (rx > 0 && ry > 0) addInner(l + rx, t, r - rx, b);
  cairo_region_intersect_rectangle(inside, &canvas);
  // Every pixel the path touches; what is not inside is the edge for cairo.
  const int ox0 = (int)std::floor(l), oy0 = (int)std::floor(t);
  const cairo_rectangle_int_t outer = {ox0, oy0, (int)std::ceil(r) - ox0, (int)std::ceil(b) - oy0};
  cairo_region_t* edge = cairo_region_create_rectangle(&outer);
  cairo_region_intersect_rectangle(edge, &canvas);
  cairo_region_subtract(edge, inside);
  if (keep) {
    cairo_region_t* k = cairo_region_copy(keep);
    cairo_region_translate(k, -mGeometry.x, -mGeometry.y);
    cairo_region_subtract(inside, k);
    cairo_region_subtract(edge, k);
    cairo_region_destroy(k);
  }

  if (!cairo_region_is_empty(inside)) _copyNearest(surface, dst, src, inside);
  if (!cairo_region_is_empty(edge)) {
    cairo_save(mContext);
    cairo_new_path(mContext);
    const int n = cairo_region_num_rectangles(edge);
    for (int i = 0; i < n; i++) {
      cairo_rectangle_int_t e;
      cairo_region_get_rectangle(edge, i, &e);
      cairo_rectangle(mContext, e.x, e.y, e.width, e.height);
    }
    cairo_clip(mContext);
    beginPath();
    setRoundRectPath(dst, radius, radius);
    drawBitmap(surface, dst, src);
    cairo_restore(mContext);
  } else {
    cairo_new_path(mContext);
  }
  cairo_region_destroy(edge);
  cairo_region_destroy(inside);
}
