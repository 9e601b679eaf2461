#include "model/CLyMultiGridSrcItem.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <new>

#include "codec/BitmapFactory.h"
#include "common/CLyLog.h"
#include "common/CLyRectangle.h"

struct _CLyMultiGridSrcItemImpl {
  bool isFake = false;
  bool checked = false;
  int32_t width = 0;
  int32_t height = 0;
  Bitmap* bitmap = nullptr;
  CLyRectangle* orgRect = nullptr;
  CLyRectangle* srcRect = nullptr;  // left, top, right, bottom
  float minScale = 1.0f;
  float maxScale = 3.0f;
  float zoomSpeed = 1.0f;
  std::string path;
  float initialCropRatio = 0.5f;
};

namespace {
inline int floorInt(double v) {
  return static_cast<int>(std::floor(v));
}
}  // namespace

CLyMultiGridSrcItem::CLyMultiGridSrcItem() : _pv(new _CLyMultiGridSrcItemImpl) {}

CLyMultiGridSrcItem::CLyMultiGridSrcItem(const std::string& path, bool fake)
    : _pv(new _CLyMultiGridSrcItemImpl) {
  _pv->path = path;
  _pv->isFake = fake;
}

CLyMultiGridSrcItem::~CLyMultiGridSrcItem() {
  release();
  delete _pv->orgRect;
  delete _pv;
}

void CLyMultiGridSrcItem::setBitmap(Bitmap* bitmap, bool deleteOld) {
  if (deleteOld && _pv->bitmap != bitmap) delete _pv->bitmap;
  _pv->bitmap = bitmap;
  refresh();
}

void CLyMultiGridSrcItem::refresh() {
  _pv->width = _pv->bitmap ? _pv->bitmap->getWidth() : 0;
  _pv->height = _pv->bitmap ? _pv->bitmap->getHeight() : 0;
  if (!_pv->orgRect) _pv->orgRect = new (std::nothrow) CLyRectangle();
  if (_pv->orgRect) _pv->orgRect->set(0, 0, _pv->width, _pv->height);
  _resetCrop();
}

void CLyMultiGridSrcItem::release() {
  delete _pv->bitmap;
  _pv->bitmap = nullptr;
  delete _pv->srcRect;
  _pv->srcRect = nullptr;
}

void CLyMultiGridSrcItem::_resetCrop() {
  const int cw = static_cast<int>(_pv->width * _pv->initialCropRatio);
  const int ch = static_cast<int>(_pv->height * _pv->initialCropRatio);
  const int x = (_pv->width - cw) / 2;
  const int y = (_pv->height - ch) / 2;
  if (!_pv->srcRect) _pv->srcRect = new (std::nothrow) CLyRectangle();
  if (!_pv->srcRect) {
    LYLOG_E("Failed to create memory");
    return;
  }
  _pv->srcRect->set(x, y, x + cw, y + ch);
}

Bitmap* CLyMultiGridSrcItem::getBitmap() const {
  return _pv->bitmap;
}
const std::string& CLyMultiGridSrcItem::getPath() const {
  return _pv->path;
}
void CLyMultiGridSrcItem::setPath(const std::string& path) {
  _pv->path = path;
}
bool CLyMultiGridSrcItem::isFake() const {
  return _pv->isFake;
}
void CLyMultiGridSrcItem::setFake(bool fake) {
  _pv->isFake = fake;
}
bool CLyMultiGridSrcItem::isChecked() const {
  return _pv->checked;
}
void CLyMultiGridSrcItem::setChecked(bool checked) {
  _pv->checked = checked;
}
int CLyMultiGridSrcItem::getWidth() const {
  return _pv->width;
}
int CLyMultiGridSrcItem::getHeight() const {
  return _pv->height;
}
int64_t CLyMultiGridSrcItem::getPixelCount() const {
  return static_cast<int64_t>(_pv->width) * _pv->height;
}
const CLyRectangle* CLyMultiGridSrcItem::getSrcRect() const {
  return _pv->srcRect;
}
float CLyMultiGridSrcItem::getMinScale() const {
  return _pv->minScale;
}
float CLyMultiGridSrcItem::getMaxScale() const {
  return _pv->maxScale;
}
float CLyMultiGridSrcItem::getInitialCropRatio() const {
  return _pv->initialCropRatio;
}

void CLyMultiGridSrcItem::setSrcRect(CLyRectangle* rect) {
  if (!rect) return;
  checkRectInOrg(rect);
  if (rect != _pv->srcRect) delete _pv->srcRect;
  _pv->srcRect = rect;
}

CLyRectangle* CLyMultiGridSrcItem::checkRectInOrg(CLyRectangle* rect) const {
  if (!rect) return rect;
  const int64_t W = _pv->width, H = _pv->height;
  int64_t l = rect->x, t = rect->y, r = rect->w, b = rect->h;
  const int64_t entryW = r - l, entryH = b - t;
  // A crop larger than the bitmap shrinks to fit, keeping its shape. (Only
  // a larger one: a crop that merely overhangs an edge is moved back below,
  // not blown up to the bitmap's width, which would jump the zoom.)
  if (r > W && entryW > W) {
    r = l + W;
    b = t + entryH * W / entryW;
  }
  if (b > H && b - t > H && entryH > 0) {
    r = l + entryW * H / entryH;
    b = t + H;
  }
  CLyRectangle org(0, 0, static_cast<int32_t>(W), static_cast<int32_t>(H));
  if (!(org.contains(static_cast<float>(l), static_cast<float>(t)) &&
        org.contains(static_cast<float>(r), static_cast<float>(b)))) {
    if (l < 0) {
      r -= l;
      l = 0;
    }
    if (r > W) {
      l -= r - W;
      r = W;
      if (l < 0) {
        LYLOG_D("Negative x[%lld]", static_cast<long long>(l));
        l = 0;
      }
    }
    if (t < 0) t = 0;
    if (b > H) {
      t -= b - H;
      b = H;
      if (t < 0) {
        LYLOG_D("Negative y[%lld]", static_cast<long long>(t));
        t = 0;
      }
    }
  }
  rect->set(static_cast<int32_t>(l), static_cast<int32_t>(t), static_cast<int32_t>(r),
            static_cast<int32_t>(b));
  return rect;
}

float CLyMultiGridSrcItem::getScaleFor(int left, int top, int right, int bottom) const {
  const int cw = right - left, ch = bottom - top;
  // A crop without area would be an infinite zoom.
  if (cw <= 0 || ch <= 0) return std::numeric_limits<float>::infinity();
  const float sx = static_cast<float>(_pv->width) / cw;
  const float sy = static_cast<float>(_pv->height) / ch;
  return std::min(sx, sy);
}

float CLyMultiGridSrcItem::getScale() const {
  if (!_pv->srcRect) return 1.0f;
  const CLyRectangle& c = *_pv->srcRect;
  return getScaleFor(c.x, c.y, c.w, c.h);
}

bool CLyMultiGridSrcItem::pan(int dx, int dy) {
  if (!_pv->srcRect) return false;
  const float s = getScale();
  if (s > 1.0f && std::isfinite(s)) {
    dx = floorInt(dx / s + 0.01);
    dy = floorInt(dy / s + 0.01);
  }
  const CLyRectangle& c = *_pv->srcRect;
  int64_t l = static_cast<int64_t>(c.x) - dx, t = static_cast<int64_t>(c.y) - dy;
  int64_t r = static_cast<int64_t>(c.w) - dx, b = static_cast<int64_t>(c.h) - dy;
  // Shift back inside the bitmap without resizing.
  if (r > _pv->width) {
    l -= r - _pv->width;
    r = _pv->width;
  }
  if (b > _pv->height) {
    t -= b - _pv->height;
    b = _pv->height;
  }
  if (l < 0) {
    r -= l;
    l = 0;
  }
  if (t < 0) {
    b -= t;
    t = 0;
  }
  if (l == c.x && t == c.y && r == c.w && b == c.h) return false;
  _pv->srcRect->set(static_cast<int32_t>(l), static_cast<int32_t>(t), static_cast<int32_t>(r),
                    static_cast<int32_t>(b));
  return true;
}

bool CLyMultiGridSrcItem::pinchZoom(float distance) {
  if (!_pv->srcRect || _pv->width <= 0 || _pv->height <= 0) return false;
  const float ratio = getScale();
  LYLOG_D("ratio: %f, dist: %f", ratio, distance);
  if ((ratio >= _pv->maxScale && distance > 0) || (ratio <= _pv->minScale && distance < 0)) return false;

  const CLyRectangle& c = *_pv->srcRect;
  const double l = c.x, t = c.y, r = c.w, b = c.h;
  const double cw = r - l, ch = b - t;
  if (cw <= 0 || ch <= 0) return false;
  const double zs = _pv->zoomSpeed;
  const double dx = cw * distance * zs, dy = ch * distance * zs;
  const int nl = floorInt(l + dx + 0.01), nt = floorInt(t + dy + 0.01);
  const int nr = floorInt(r - dx + 0.01), nb = floorInt(b - dy + 0.01);
  float s = getScaleFor(nl, nt, nr, nb);
  if (s >= _pv->minScale && s <= _pv->maxScale) {
    setSrcRect(new (std::nothrow) CLyRectangle(nl, nt, nr, nb));
    return true;
  }

  // Past a limit: the crop of exactly the limit's zoom, same aspect, same centre.
  s = s > _pv->maxScale ? _pv->maxScale : _pv->minScale;
  const int candW = nr - nl, candH = nb - nt;
  const double W = _pv->width, H = _pv->height;
  const bool heightBounds = (candW > 0 && candH > 0) ? (W / candW > H / candH) : (W / cw > H / ch);
  int left, top, right, bottom;
  if (heightBounds) {
    const int nh = std::max(1, static_cast<int>(H / s + 0.01));
    const int hv = (static_cast<int>(ch) - nh) / 2;
    const double hh = cw * hv / ch;
    left = floorInt(l + hh * zs + 0.01);
    top = floorInt(t + hv * zs + 0.01);
    right = floorInt(r - hh * zs + 0.01);
    bottom = top + nh;
  } else {
    const int nw = std::max(1, static_cast<int>(W / s + 0.01));
    const int hh = (static_cast<int>(cw) - nw) / 2;
    const double hv = ch * hh / cw;
    left = floorInt(l + hh * zs + 0.01);
    top = floorInt(t + hv * zs + 0.01);
    right = left + nw;
    bottom = floorInt(b - hv * zs + 0.01);
  }
  const float clamped = getScaleFor(left, top, right, bottom);
  if (clamped >= _pv->minScale && clamped <= _pv->maxScale) {
    setSrcRect(new (std::nothrow) CLyRectangle(left, top, right, bottom));
    return true;
  }
  return false;
}

void CLyMultiGridSrcItem::rotate(int code) {
  if (code != 0 && _pv->bitmap) BitmapFactory::rotate(*_pv->bitmap, code);
  // Also when the bitmap could not be turned: size and origin follow the bitmap.
  _pv->width = _pv->bitmap ? _pv->bitmap->getWidth() : 0;
  _pv->height = _pv->bitmap ? _pv->bitmap->getHeight() : 0;
  if (_pv->orgRect) _pv->orgRect->set(0, 0, _pv->width, _pv->height);
  _rotateDrawRect(code);
}

void CLyMultiGridSrcItem::_rotateDrawRect(int code) {
  if (code == 0 || !_pv->srcRect) return;
  const CLyRectangle& c = *_pv->srcRect;
  const int cx = (c.x + c.w) / 2, cy = (c.y + c.h) / 2;
  const int cropW = c.w - c.x, cropH = c.h - c.y;
  const int hw = cropW / 2, hh = cropH / 2;
  const int W = _pv->width, H = _pv->height;
  int ncx = cx, ncy = cy;
  if (code == 1) {
    ncx = W - cy;
    ncy = cx;
  } else if (code == 2) {
    ncx = W - cx;
    ncy = H - cy;
  } else if (code == 3) {
    ncx = cy;
    ncy = H - cx;
  }
  LYLOG_D("new center point: %d, %d", ncx, ncy);
  const int left = std::max(0, ncx - hw), top = std::max(0, ncy - hh);
  _pv->srcRect->set(left, top, left + cropW, top + cropH);
  // The cell's crop keeps its shape; keep it inside the turned bitmap too.
  checkRectInOrg(_pv->srcRect);
}
