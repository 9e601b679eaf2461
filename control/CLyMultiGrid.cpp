#include "control/CLyMultiGrid.h"

#include <Elementary.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <new>
#include <utility>
#include <vector>

#include "codec/Bitmap.h"
#include "codec/BitmapFactory.h"
#include "common/CLyAppData.h"
#include "common/CLyCairoCanvas.h"
#include "common/CLyEvent.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "control/CLyMultiGridImpl.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridModel.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"

namespace {

// Aspect ratios, width : height, indexed by CLyMultiGridRatio.
const int kRatios[LY_RATIO_COUNT][2] = {{1, 1}, {2, 3}, {3, 4}, {9, 16}, {16, 9}, {4, 3}, {3, 2}};

const char* const kLayoutFile = "edje/LyLayoutHover.edj";
const char* const kLayoutGroup = "LyLayoutHover";
const char* const kAddPictureIcon = "images/collage_add_picture.png";
const int kWindowRotatedEvent = 4;

void ratioOf(int ratio, int& w, int& h) {
  if (ratio < 0 || ratio >= LY_RATIO_COUNT) {
    LYLOG_E("Invalid ratio %d, using 1:1", ratio);
    ratio = 0;
  }
  w = kRatios[ratio][0];
  h = kRatios[ratio][1];
}

bool sameRect(const CLyFloatRectangle& a, const CLyFloatRectangle& b) {
  return a.x1 == b.x1 && a.y1 == b.y1 && a.x2 == b.x2 && a.y2 == b.y2;
}

// How far (screen pixels, across a cell) the content of a cell's kept
// pixels may drift from where a fresh drawing puts it during a handler drag.
const double kMaxDriftPixels = 1.0;

// The whole pixels r (x, y, w, h) touches at all. Empty for an empty r.
cairo_rectangle_int_t outerPixels(const CLyFloatRectangle& r) {
  if (!(r.x2 > 0) || !(r.y2 > 0)) return {0, 0, 0, 0};
  const int x0 = (int)std::floor(r.x1), y0 = (int)std::floor(r.y1);
  const int x1 = (int)std::ceil((double)r.x1 + r.x2), y1 = (int)std::ceil((double)r.y1 + r.y2);
  return {x0, y0, x1 - x0, y1 - y0};
}

// Adds the whole pixels a fill of the cell's path covers completely: the
// inner pixels of r without its rounded corners (corner radii as the canvas
// clamps them, at most half the side).
void addCoveredPixels(cairo_region_t* region, const CLyFloatRectangle& r, double radius) {
  if (!(r.x2 > 0) || !(r.y2 > 0)) return;
  double rx = 0, ry = 0;
  if (radius > 0) {
    rx = std::min(radius, r.x2 * 0.5);
    ry = std::min(radius, r.y2 * 0.5);
  }
  auto add = [region](double l, double t, double rr, double b) {
    const int x0 = (int)std::ceil(l), y0 = (int)std::ceil(t);
    const int x1 = (int)std::floor(rr), y1 = (int)std::floor(b);
    if (x1 <= x0 || y1 <= y0) return;
    const cairo_rectangle_int_t inner = {x0, y0, x1 - x0, y1 - y0};
    cairo_region_union_rectangle(region, &inner);
  };
  const double l = r.x1, t = r.y1, rr = (double)r.x1 + r.x2, b = (double)r.y1 + r.y2;
  add(l, t + ry, rr, b - ry);
  if (rx > 0 && ry > 0) add(l + rx, t, rr - rx, b);
}

// A JPEG is complete when it starts with SOI and its last marker is EOI;
// a write cut short (full disk, I/O error) fails this test.
bool isCompleteJpeg(const char* path) {
  int fd = open(path, O_RDONLY | O_CLOEXEC);
  if (fd < 0) return false;
  unsigned char head[2] = {0, 0}, tail[2] = {0, 0};
  struct stat st {};
  bool ok = fstat(fd, &st) == 0 && st.st_size > 4 && pread(fd, head, 2, 0) == 2 &&
            pread(fd, tail, 2, st.st_size - 2) == 2 && head[0] == 0xFF && head[1] == 0xD8 &&
            tail[0] == 0xFF && tail[1] == 0xD9;
  // The data must be on the disk before the file takes its final name.
  ok = ok && fsync(fd) == 0;
  close(fd);
  return ok;
}

// The picture's pixels go to libjpeg-turbo as they are (B, G, R, X rows),
// at the quality and 4:2:0 sampling evas_object_image_save uses without
// flags, but without its copy of every row into RGB on the way.
constexpr int kSaveQuality = 80;

bool writeObjectJpeg(Evas_Object* object, const std::string& path) {
  int w = 0, h = 0;
  evas_object_image_size_get(object, &w, &h);
  const int stride = evas_object_image_stride_get(object);
  void* data = evas_object_image_data_get(object, EINA_FALSE);
  if (!data) return false;
  const bool ok =
      BitmapFactory::writeJpegBgrx(static_cast<const unsigned char*>(data), w, h, stride, kSaveQuality, path);
  evas_object_image_data_set(object, data);
  return ok;
}

std::string temporaryPathFor(const std::string& path) {
  static std::atomic<unsigned> counter{0};
  std::string dir = ".", name = path;
  size_t slash = path.rfind('/');
  if (slash != std::string::npos) {
    dir = path.substr(0, slash);
    name = path.substr(slash + 1);
  }
  char suffix[64];
  // Ends in ".jpg" so the image saver picks the JPEG encoder.
  snprintf(suffix, sizeof suffix, ".part-%d-%u.jpg", (int)getpid(), counter++);
  return dir + "/." + name + suffix;
}

}  // namespace

// ---------------------------------------------------------------- construction

CLyMultiGrid::CLyMultiGrid(CLyMultiGridDrawRectList* drawRectList, CLyMultiGridSrcItemList* srcItemList,
                           int width, int height) {
  _pImpl = new (std::nothrow) _CLyMultiGridImpl();
  if (!_pImpl) {
    LYLOG_E("Failed to create implement");
    return;
  }
  _pImpl->drawRectList = drawRectList;
  _pImpl->srcItemList = srcItemList;
  _pImpl->viewWidth = width;
  _pImpl->viewHeight = height;
}

CLyMultiGrid::~CLyMultiGrid() {
  if (!_pImpl) return;
  __destroySurfaces();
  delete _pImpl->canvas;
  delete _pImpl->bgDrawRoi;
  delete _pImpl;
  _pImpl = nullptr;
}

bool CLyMultiGrid::prepare(Evas_Object* win, Evas_Object* parent) {
  if (!_pImpl) return false;
  if (!win) {
    LYLOG_E("Invalid win");
    return false;
  }
  if (!parent) {
    LYLOG_E("Invalid parent");
    return false;
  }
  char* path = CLyUtil::getEdjPath(kLayoutFile);
  Evas_Object* layout = elm_layout_add(parent);
  if (!path || !layout || !elm_layout_file_set(layout, path, kLayoutGroup)) {
    LYLOG_E("Invalid EDJ");
    free(path);
    if (layout) evas_object_del(layout);
    return false;
  }
  free(path);
  evas_object_size_hint_weight_set(layout, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_size_hint_align_set(layout, EVAS_HINT_FILL, EVAS_HINT_FILL);
  Evas_Object* box = elm_box_add(layout);
  elm_object_part_content_set(layout, "elm.swallow.content", box);
  _pImpl->layout = layout;
  _pImpl->box = box;
  _pImpl->controlObj = layout;
  return true;
}

Evas_Object* CLyMultiGrid::onCreateView(Evas_Object* /*parent*/, void* /*param*/) {
  if (!_pImpl || !_pImpl->layout) {
    LYLOG_E("Not initialized!");
    return nullptr;
  }
  if (_pImpl->saveMode) {
    evas_object_hide(_pImpl->layout);
    evas_object_hide(_pImpl->controlObj);
  } else {
    evas_object_show(_pImpl->layout);
  }
  return _pImpl->layout;
}

void CLyMultiGrid::onCreated() {
  if (!_pImpl) return;
  setViewSize(_pImpl->ratio, _pImpl->viewWidth, _pImpl->viewHeight);
  if (!_pImpl->saveMode) __setDefaultBorderMargin();
  __createBgObject();
  __createCanvas();
  if (!_pImpl->saveMode) __setupTouch();
}

void CLyMultiGrid::onDestroy() {
  if (!_pImpl) return;
  __teardownTouch();
  __destroySurfaces();
  delete _pImpl->canvas;
  _pImpl->canvas = nullptr;
  if (_pImpl->canvasImage) evas_object_del(_pImpl->canvasImage);
  if (_pImpl->bgObj) evas_object_del(_pImpl->bgObj);
  _pImpl->canvasImage = nullptr;
  _pImpl->bgObj = nullptr;
  _pImpl->layout = nullptr;
  _pImpl->box = nullptr;
  _pImpl->controlObj = nullptr;
}

void CLyMultiGrid::onEvent(const CLyEvent& event) {
  LYLOG_D("CLyMultiGrid event %d", event.type);
  if (!_pImpl || event.type != kWindowRotatedEvent) return;
  __abortPressEffect();
  int w = 0, h = 0;
  CLyAppData::getInstance()->getScreenSize(&w, &h);
  LYLOG_D("win size: %d %d", w, h);
  if (w <= 0 || h <= 0) {
    // No screen size (no window, or an engine without a screen): a 1 x 1
    // collage would be useless, so keep the current size.
    w = _pImpl->viewWidth;
    h = _pImpl->viewHeight;
  }
  setViewSize(_pImpl->ratio, w, h);
  __relayout();
  __updateFocusRect();
}

// ---------------------------------------------------------------- setters

void CLyMultiGrid::setSaveMode(bool saveMode) {
  if (_pImpl) _pImpl->saveMode = saveMode;
}

void CLyMultiGrid::setUseGl(bool useGl) {
  if (_pImpl) _pImpl->useGl = useGl;
}

void CLyMultiGrid::setSingleImageMode(bool singleImageMode) {
  if (_pImpl) _pImpl->singleImageMode = singleImageMode;
}

void CLyMultiGrid::setBackgroundColor(const CLyRectangle& color) {
  if (!_pImpl || color == _pImpl->bgColor) return;
  _pImpl->bgColor = color;
  if (_pImpl->bgObj) {
    const CLyRectangle& c = _pImpl->bgColor;
    // evas colours are premultiplied by alpha
    evas_object_color_set(_pImpl->bgObj, c.x * c.h / 255, c.y * c.h / 255, c.w * c.h / 255, c.h);
  }
  notifyChanged(true);
}

void CLyMultiGrid::setBorderMarginValue(double value) {
  if (!_pImpl || value == _pImpl->marginValue) return;
  LYLOG_D("marginValue %f", value);
  _pImpl->marginValue = value;
  if (_pImpl->drawRectList) _pImpl->drawRectList->setSpacingStep((int)value);
  __draw();
  notifyChanged(true);
}

void CLyMultiGrid::setBorderRoundnessValue(double value) {
  if (!_pImpl || value == _pImpl->roundnessValue) return;
  LYLOG_D("roundnessValue %f", value);
  _pImpl->roundnessValue = value;
  if (_pImpl->drawRectList) _pImpl->drawRectList->setRoundStep((int)value);
  __updateGridImages();
  notifyChanged(true);
}

void CLyMultiGrid::setViewRatio(int ratio, bool apply) {
  if (!_pImpl) return;
  LYLOG_D("ratio %d", ratio);
  if (ratio < 0 || ratio >= LY_RATIO_COUNT) {
    LYLOG_E("Invalid ratio %d", ratio);
    return;
  }
  _pImpl->ratio = ratio;
  if (!apply) return;
  setViewSize(ratio, _pImpl->viewWidth, _pImpl->viewHeight);
  __relayout();
  notifyChanged(true);
}

void CLyMultiGrid::setViewSize(int ratio, int width, int height) {
  if (!_pImpl) return;
  LYLOG_D("ratio: %d, width: %d, height: %d", ratio, width, height);
  if (ratio < 0 || ratio >= LY_RATIO_COUNT) {
    LYLOG_E("Invalid ratio %d", ratio);
    ratio = 0;
  }
  _pImpl->ratio = ratio;
  _pImpl->viewWidth = width;
  _pImpl->viewHeight = height;
  int left = 0, right = 0, top = 0, bottom = 0;
  if (!_pImpl->saveMode) __getProportionPadding(ratio, left, right, top, bottom);
  __calculateViewSize(ratio, width, height, left, right, top, bottom);
  __updateBgDrawRoi();
}

void CLyMultiGrid::setLayoutIndex(int index) {
  LYLOG_D("setLayoutIndex %d", index);
  __draw();
  notifyChanged(true);
}

// ---------------------------------------------------------------- queries

int CLyMultiGrid::getCurrentIndex() const {
  return _pImpl ? _pImpl->currentIndex : -1;
}
int CLyMultiGrid::getRatio() const {
  return _pImpl ? _pImpl->ratio : 0;
}

const CLyRectangle& CLyMultiGrid::getBackgroundColor() const {
  static const CLyRectangle white(255, 255, 255, 255);
  return _pImpl ? _pImpl->bgColor : white;
}

double CLyMultiGrid::getRoundnessValue() const {
  return _pImpl ? _pImpl->roundnessValue : 0.0;
}
double CLyMultiGrid::getMarginValue() const {
  return _pImpl ? _pImpl->marginValue : 0.0;
}
const CLyRectangle* CLyMultiGrid::getCollageRect() const {
  return _pImpl ? _pImpl->bgDrawRoi : nullptr;
}
bool CLyMultiGrid::isChanged() const {
  return _pImpl && _pImpl->changed;
}

bool CLyMultiGrid::computeSaveSize(CLyMultiGridSrcItemList* srcItemList, int ratio, int limit, int& width,
                                   int& height) {
  int index = srcItemList ? srcItemList->indexOfLargest() : -1;
  if (index < 0) {
    LYLOG_E("Invalid index[%d]", index);
    return false;
  }
  CLyMultiGridSrcItem* item = srcItemList->get(index);
  if (!item || !item->getBitmap()) {
    LYLOG_E("Invalid srcItem");
    return false;
  }
  const Bitmap* bitmap = item->getBitmap();
  return computeSaveSize(std::max(bitmap->getWidth(), bitmap->getHeight()), ratio, limit, width, height);
}

bool CLyMultiGrid::computeSaveSize(int longestSide, int ratio, int limit, int& width, int& height) {
  int rw = 1, rh = 1;
  ratioOf(ratio, rw, rh);
  width = std::min(limit, longestSide);
  height = (int)((float)width * rh / rw);
  return width > 0 && height > 0;
}

bool CLyMultiGrid::getSaveSize(int limit, int& width, int& height) const {
  if (!_pImpl) return false;
  return computeSaveSize(_pImpl->srcItemList, _pImpl->ratio, limit, width, height);
}

Bitmap* CLyMultiGrid::clone(int index) const {
  if (!_pImpl || !_pImpl->srcItemList) return nullptr;
  if (index == -1 || index == -2) index = _pImpl->currentIndex;
  CLyMultiGridSrcItem* item = _pImpl->srcItemList->get(index);
  if (!item) return nullptr;
  Bitmap* bitmap = item->getBitmap();
  if (!bitmap || !bitmap->getPixels()) {
    LYLOG_E("Invalid buffer");
    return nullptr;
  }
  return BitmapFactory::clone(*bitmap);
}

void CLyMultiGrid::notifyChanged(bool value) {
  if (!_pImpl || _pImpl->saveMode) return;
  _pImpl->changed = value;
  if (_pImpl->changeCb) _pImpl->changeCb(value, __isValidItemIndex(_pImpl->currentIndex));
}

bool CLyMultiGrid::__isValidItemIndex(int index) const {
  return _pImpl && _pImpl->srcItemList && index >= 0 && _pImpl->srcItemList->get(index) != nullptr;
}

// ---------------------------------------------------------------- view size

bool CLyMultiGrid::__getProportionPadding(int ratio, int& left, int& right, int& top, int& bottom) {
  left = right = top = bottom = 0;
  int entry;
  switch (ratio) {
    case LY_RATIO_1_1:
      entry = 0;
      break;
    case LY_RATIO_3_4:
      entry = 1;
      break;
    case LY_RATIO_9_16:
      entry = 2;
      break;
    default:
      LYLOG_E("Invalid count");
      return false;
  }
  if (_pImpl->margins.empty()) {
    // A missing or broken margins file costs the paddings, not the program.
    try {
      CLyMultiGridModel model;
      for (int i = 0; i < model.getMarginsCount(); i++) _pImpl->margins.push_back(model.getMargins(i));
    } catch (const std::exception& e) {
      LYLOG_E("Failed to load margins: %s", e.what());
    }
  }
  if ((size_t)entry >= _pImpl->margins.size() || _pImpl->margins[entry].size() < 4) {
    LYLOG_E("Invalid count");
    return false;
  }
  const std::vector<int>& m = _pImpl->margins[entry];
  int rotation = CLyAppData::getInstance()->getWindowRotation();
  if (rotation == 0 || rotation == 180) {
    top = m[0];
    bottom = m[1];
    LYLOG_D("padding: %d  %d", top, bottom);
  } else {
    left = m[2];
    right = m[3];
    LYLOG_D("padding: %d  %d", left, right);
  }
  return true;
}

void CLyMultiGrid::__calculateViewSize(int ratio, int width, int height, int left, int right, int top,
                                       int bottom) {
  if (width == 0) width = 1;
  if (height == 0) height = 1;
  int rw = 1, rh = 1;
  ratioOf(ratio, rw, rh);
  float availW = (float)(width - left - right), availH = (float)(height - top - bottom);
  if (availW < 1) availW = 1;
  if (availH < 1) availH = 1;
  float w = availW, h = availW * rh / rw;
  if (h > availH && h - availH < 1.0f) {
    // Less than a pixel too tall only because the height was truncated to
    // whole pixels (a 3:4 save of width 500 is 500 x 666): keep the width.
    h = availH;
  } else if (h > availH) {
    w = w * availH / h;
    h = availH;
  }
  float x = left + (availW - w) * 0.5f, y = top + (availH - h) * 0.5f;
  LYLOG_D("size: %f %f, pad: %f %f", w, h, x, y);
  if (!_pImpl->drawRectList) return;
  _pImpl->drawRectList->setSize((int)w, (int)h);
  _pImpl->drawRectList->setOffsetY((int)y);
  _pImpl->drawRectList->setOffsetX((int)x);
}

void CLyMultiGrid::__updateBgDrawRoi() {
  if (!_pImpl->drawRectList) return;
  if (!_pImpl->bgDrawRoi) {
    _pImpl->bgDrawRoi = new (std::nothrow) CLyRectangle();
    if (!_pImpl->bgDrawRoi) {
      LYLOG_E("Failed to create bgDrawRoi");
      return;
    }
  }
  CLyMultiGridDrawRectList* list = _pImpl->drawRectList;
  _pImpl->bgDrawRoi->set(list->getOffsetX(), list->getOffsetY(), list->getWidth(), list->getHeight());
}

void CLyMultiGrid::__relayout() {
  const CLyRectangle* roi = _pImpl->bgDrawRoi;
  if (!roi) return;
  if (_pImpl->bgObj) {
    evas_object_move(_pImpl->bgObj, roi->x, roi->y);
    evas_object_resize(_pImpl->bgObj, roi->w, roi->h);
  }
  if (_pImpl->canvas) _pImpl->canvas->setGeometry(*roi);
  __resizeFocusBox();
  __draw();
}

// ---------------------------------------------------------------- objects

void CLyMultiGrid::__createBgObject() {
  if (!_pImpl->controlObj) return;
  if (!_pImpl->bgDrawRoi) {
    LYLOG_E("Bg size info is wrong");
    return;
  }
  Evas_Object* bg = evas_object_rectangle_add(evas_object_evas_get(_pImpl->controlObj));
  if (!bg) return;
  evas_object_size_hint_weight_set(bg, EVAS_HINT_EXPAND, EVAS_HINT_EXPAND);
  evas_object_size_hint_align_set(bg, EVAS_HINT_FILL, EVAS_HINT_FILL);
  evas_object_resize(bg, _pImpl->bgDrawRoi->w, _pImpl->bgDrawRoi->h);
  evas_object_move(bg, _pImpl->bgDrawRoi->x, _pImpl->bgDrawRoi->y);
  evas_object_smart_member_add(bg, _pImpl->controlObj);
  evas_object_color_set(bg, 0, 0, 0, 255);
  evas_object_show(bg);
  _pImpl->bgObj = bg;
}

bool CLyMultiGrid::__createCanvas() {
  if (!_pImpl->controlObj || !_pImpl->bgDrawRoi) return false;
  Evas_Object* image = evas_object_image_filled_add(evas_object_evas_get(_pImpl->controlObj));
  if (!image) {
    LYLOG_E("Failed to add canvas");
    return false;
  }
  evas_object_image_colorspace_set(image, EVAS_COLORSPACE_ARGB8888);
  evas_object_image_alpha_set(image, EINA_TRUE);
  evas_object_pass_events_set(image, EINA_TRUE);
  CLyCairoCanvas* canvas = new (std::nothrow) CLyCairoCanvas(image, *_pImpl->bgDrawRoi, _pImpl->useGl);
  if (!canvas || !canvas->isValid()) {
    LYLOG_E("Failed to add canvas");
    delete canvas;
    evas_object_del(image);
    return false;
  }
  // The screen canvas is redrawn on every pan step and keeps the cheap
  // bilinear filter; the saved picture must not alias when a large crop
  // shrinks into a small cell, so it averages boxes first (cairo's GOOD
  // filter does the same job about five times slower).
  canvas->setFilter(CAIRO_FILTER_BILINEAR);
  canvas->setSmoothDownscale(_pImpl->saveMode);
  evas_object_smart_member_add(image, _pImpl->controlObj);
  evas_object_show(image);
  _pImpl->canvasImage = image;
  _pImpl->canvas = canvas;
  return true;
}

void CLyMultiGrid::__setDefaultBorderMargin() {
  if (_pImpl->drawRectList) _pImpl->drawRectList->setSpacingStep(1);
  _pImpl->marginValue = 1.0;
  LYLOG_D("marginValue: %f", _pImpl->marginValue);
}

// ---------------------------------------------------------------- surfaces

void CLyMultiGrid::__destroySurfaces() {
  if (!_pImpl) return;
  for (cairo_surface_t* s : _pImpl->surfaces)
    if (s) cairo_surface_destroy(s);
  _pImpl->surfaces.clear();
  _pImpl->drawnRects.clear();
}

cairo_surface_t* CLyMultiGrid::__createSurface(int index) {
  CLyMultiGridSrcItem* item = _pImpl->srcItemList ? _pImpl->srcItemList->get(index) : nullptr;
  if (!item || !item->getBitmap() || !_pImpl->canvas) return nullptr;
  return _pImpl->canvas->createSurface(item->getBitmap());
}

void CLyMultiGrid::__createSurfaces() {
  if (!_pImpl->srcItemList) return;
  int count = _pImpl->srcItemList->count();
  for (int i = 0; i < count; i++) {
    cairo_surface_t* s = __createSurface(i);
    if (!s) {
      CLyMultiGridSrcItem* item = _pImpl->srcItemList->get(i);
      if (!(item && item->isFake())) LYLOG_E("Invalid surface");
    }
    // A slot per item, also an empty one, so that surface i always shows item i.
    _pImpl->surfaces.push_back(s);
  }
  _pImpl->drawnRects.assign(count, CLyFloatRectangle());
}

void CLyMultiGrid::refresh() {
  if (!_pImpl) return;
  if (!_pImpl->bgColorApplied && _pImpl->bgObj) {
    const CLyRectangle& c = _pImpl->bgColor;
    evas_object_color_set(_pImpl->bgObj, c.x * c.h / 255, c.y * c.h / 255, c.w * c.h / 255, c.h);
    _pImpl->bgColorApplied = true;
  }
  __destroySurfaces();
  __createSurfaces();
  __draw();
}

// ---------------------------------------------------------------- drawing

bool CLyMultiGrid::__calculateRectSize(const CLyRectangle& crop, const CLyFloatRectangle& cell,
                                       CLyRectangle& result) const {
  const int cw = crop.w - crop.x, ch = crop.h - crop.y;
  LYLOG_D("drawRect %f %f %f %f", cell.x1, cell.y1, cell.x2, cell.y2);
  LYLOG_D("srcRect %d %d %d %d", crop.x, crop.y, crop.w, crop.h);
  if (cw <= 0 || ch <= 0 || cell.x2 <= 0 || cell.y2 <= 0) return false;
  int nw, nh;
  if (cw < ch) {
    nh = ch;
    nw = (int)((float)ch * cell.x2 / cell.y2);
  } else {
    nw = cw;
    nh = (int)((float)cw * cell.y2 / cell.x2);
  }
  if (nw < 1 || nh < 1) return false;
  result.set(crop.x, crop.y, crop.x + nw, crop.y + nh);
  LYLOG_D("returnRect %d %d %d %d", result.x, result.y, result.w, result.h);
  return true;
}

void CLyMultiGrid::__createGridImage(int index, const CLyFloatRectangle& cell, const cairo_region_t* keep) {
  CLyMultiGridSrcItem* item = _pImpl->srcItemList ? _pImpl->srcItemList->get(index) : nullptr;
  if (!item) {
    LYLOG_E("Invalid src item");
    return;
  }
  CLyCairoCanvas* canvas = _pImpl->canvas;
  if (!canvas) return;
  const double r = _pImpl->drawRectList ? _pImpl->drawRectList->getRoundness() : 0;
  if (_pImpl->singleImageMode && item->isFake()) {
    LYLOG_D("Fake image");
    canvas->fillRoundRect(CLyFloatRectangle(0, 0, 0, 1.0f), cell, r, r);
    char* icon = CLyUtil::getImagePath(kAddPictureIcon);
    if (!icon) {
      LYLOG_E("Invalid res path");
      return;
    }
    canvas->drawIcon(icon, cell);
    free(icon);
    return;
  }
  cairo_surface_t* surface = (size_t)index < _pImpl->surfaces.size() ? _pImpl->surfaces[index] : nullptr;
  const CLyRectangle* crop = item->getSrcRect();
  if (!crop) {
    LYLOG_E("Invalid src rect");
    return;
  }
  canvas->drawBitmapInRoundRect(
      surface, cell, CLyRectangle(crop->x, crop->y, crop->w - crop->x, crop->h - crop->y), r, keep);
}

// Wipes the old and the new place of every changed cell before any of them is
// drawn again (a cell growing into its neighbour's old place must not be
// wiped by that neighbour). Whole pixels: a partly covered edge pixel is
// wiped entirely, so no trace of the old edge stays behind. When the canvas
// copies (SOURCE), the pixels a redrawn photo covers completely are left
// alone: the copy replaces them anyway, and wiping them first doubled the
// memory traffic of a divider drag. `dirty` gets each changed cell's old and
// new place (x, y, w, h in evas coordinates).
void CLyMultiGrid::__wipeChangedCells(const std::vector<std::pair<int, CLyFloatRectangle>>& cells,
                                      std::vector<CLyRectangle>* dirty) {
  CLyCairoCanvas* canvas = _pImpl->canvas;
  cairo_region_t* wipe = cairo_region_create();
  cairo_region_t* covered = cairo_region_create();
  const bool copies =
      canvas->getContext() && cairo_get_operator(canvas->getContext()) == CAIRO_OPERATOR_SOURCE;
  const double radius = _pImpl->drawRectList ? _pImpl->drawRectList->getRoundness() : 0;
  for (const auto& cell : cells) {
    const cairo_rectangle_int_t before = outerPixels(_pImpl->drawnRects[cell.first]);
    const cairo_rectangle_int_t after = outerPixels(cell.second);
    cairo_region_union_rectangle(wipe, &before);
    cairo_region_union_rectangle(wipe, &after);
    if (dirty) {
      cairo_region_t* place = cairo_region_create_rectangle(&before);
      cairo_region_union_rectangle(place, &after);
      cairo_rectangle_int_t box;
      cairo_region_get_extents(place, &box);
      cairo_region_destroy(place);
      if (box.width > 0 && box.height > 0) dirty->emplace_back(box.x, box.y, box.width, box.height);
    }
    if (copies && __paintsWholeCell(cell.first)) addCoveredPixels(covered, cell.second, radius);
  }
  cairo_region_subtract(wipe, covered);
  canvas->clearRegion(wipe);
  cairo_region_destroy(covered);
  cairo_region_destroy(wipe);
}

// Whether drawing cell i paints every pixel its path covers: a photo with a
// usable surface and crop (placeholders and failed cells draw less or nothing).
bool CLyMultiGrid::__paintsWholeCell(int index) const {
  CLyMultiGridSrcItem* item = _pImpl->srcItemList ? _pImpl->srcItemList->get(index) : nullptr;
  if (!item || !item->getBitmap() || (_pImpl->singleImageMode && item->isFake())) return false;
  if (index < 0 || (size_t)index >= _pImpl->surfaces.size()) return false;
  cairo_surface_t* surface = _pImpl->surfaces[index];
  if (!surface || cairo_surface_status(surface) != CAIRO_STATUS_SUCCESS) return false;
  const CLyRectangle* crop = item->getSrcRect();
  return crop && crop->w > crop->x && crop->h > crop->y;
}

// Draws the cells in order. newCrops: give every item the crop fitted to its
// cell; skipUnchanged: leave cells whose crop and rectangle are unchanged, and
// wipe the old and the new place of all changed cells before drawing any of
// them (a cell growing into its neighbour's old place must not be wiped by
// that neighbour). False when drawing stopped at a missing item or bitmap.
bool CLyMultiGrid::__drawCells(bool clearFirst, bool newCrops, bool skipUnchanged,
                               std::vector<CLyRectangle>* dirty) {
  CLyMultiGridSrcItemList* items = _pImpl->srcItemList;
  CLyMultiGridDrawRectList* rects = _pImpl->drawRectList;
  CLyCairoCanvas* canvas = _pImpl->canvas;
  if (clearFirst) canvas->clear();
  const int count = items->count();
  if ((int)_pImpl->drawnRects.size() < count) _pImpl->drawnRects.resize(count);
  std::vector<std::pair<int, CLyFloatRectangle>> toDraw;
  bool complete = true;
  for (int i = 0; i < count; i++) {
    LYLOG_D("count: %d", i);
    CLyMultiGridSrcItem* item = items->get(i);
    if (!item) {
      LYLOG_E("Invalid src item");
      complete = false;
      break;
    }
    const CLyFloatRectangle d = rects->get(i);
    if (!item->getBitmap()) {
      if (!(_pImpl->singleImageMode && item->isFake())) {
        LYLOG_E("Invalid src item image data");
        complete = false;
        break;
      }
      if (skipUnchanged && sameRect(d, _pImpl->drawnRects[i])) continue;
      toDraw.emplace_back(i, d);
      continue;
    }
    if (newCrops) {
      const CLyRectangle* old = item->getSrcRect();
      CLyRectangle crop;
      if (!old || !__calculateRectSize(*old, d, crop)) {
        LYLOG_E("Failed to get new Rect");
        continue;
      }
      if (skipUnchanged && crop == *old && sameRect(d, _pImpl->drawnRects[i])) {
        LYLOG_D("Same Rect");
        continue;
      }
      CLyRectangle* owned = new (std::nothrow) CLyRectangle(crop);
      if (!owned) {
        LYLOG_E("Failed to get new Rect");
        continue;
      }
      item->setSrcRect(owned);
    }
    toDraw.emplace_back(i, d);
  }
  // Pixels to reuse: planned and saved before anything is wiped or drawn (a
  // cell's old pixels may lie where another cell is drawn now).
  struct Moved {
    cairo_region_t* keep;  // destination, evas coordinates
    int dx, dy;
    std::vector<uint32_t> pixels;
  };
  std::vector<Moved> moved(toDraw.size(), Moved{nullptr, 0, 0, {}});
  const bool reuse = skipUnchanged && _pImpl->reusePixels;
  if (!reuse) __forgetDrawnPixels();
  if (reuse) {
    if ((int)_pImpl->drawnCrops.size() < count) _pImpl->drawnCrops.resize(count, CLyRectangle(0, 0, 0, 0));
    if ((int)_pImpl->sampledScales.size() < count) _pImpl->sampledScales.resize(count, {0.0, 0.0});
    for (size_t k = 0; k < toDraw.size(); k++) {
      Moved& m = moved[k];
      m.keep = __planReuse(toDraw[k].first, toDraw[k].second, m.dx, m.dy);
      if (m.keep && (m.dx || m.dy)) __copyCanvasPixels(m.keep, m.dx, m.dy, &m.pixels, true);
    }
  }
  if (skipUnchanged) __wipeChangedCells(toDraw, dirty);
  for (size_t k = 0; k < toDraw.size(); k++) {
    const int i = toDraw[k].first;
    Moved& m = moved[k];
    if (m.keep && (m.dx || m.dy)) __copyCanvasPixels(m.keep, m.dx, m.dy, &m.pixels, false);
    __createGridImage(i, toDraw[k].second, m.keep);
    if (m.keep) cairo_region_destroy(m.keep);
    _pImpl->drawnRects[i] = toDraw[k].second;
    if ((size_t)i < _pImpl->drawnCrops.size()) {
      CLyMultiGridSrcItem* item = items->get(i);
      const CLyRectangle* crop = item ? item->getSrcRect() : nullptr;
      const bool photo = reuse && crop && __paintsWholeCell(i);
      _pImpl->drawnCrops[i] = photo ? *crop : CLyRectangle(0, 0, 0, 0);
      if (photo && !m.keep)
        _pImpl->sampledScales[i] = {(crop->w - crop->x) / (double)toDraw[k].second.x2,
                                    (crop->h - crop->y) / (double)toDraw[k].second.y2};
    }
  }
  return complete;
}

// The pixels of cell i that a step can keep instead of drawing them again
// (evas coordinates; null: draw the whole cell). They are the pixels the
// cell's last drawing covered completely, moved by the whole-pixel shift
// (dx, dy) of its corner, and covered completely now. Only when the canvas
// copies with the cheap filter, the crop's corner stayed, and the scale
// drifted by at most one screen pixel across the cell since those pixels
// were sampled (crops are whole texels, so a crop fitted to a changing cell
// wobbles by a texel anyway): a kept pixel then shows what a new drawing
// shows at most one pixel away, and the full redraw on release puts every
// texel back.
cairo_region_t* CLyMultiGrid::__planReuse(int index, const CLyFloatRectangle& cell, int& dx, int& dy) {
  dx = dy = 0;
  if (index < 0 || (size_t)index >= _pImpl->drawnCrops.size() || (size_t)index >= _pImpl->drawnRects.size())
    return nullptr;
  if (!__paintsWholeCell(index) || !_pImpl->canvas->canCopyNearest(_pImpl->surfaces[index])) return nullptr;
  const CLyRectangle& before = _pImpl->drawnCrops[index];
  const CLyRectangle* now = _pImpl->srcItemList->get(index)->getSrcRect();
  const CLyFloatRectangle& was = _pImpl->drawnRects[index];
  if (before.w <= before.x || before.h <= before.y || !(was.x2 > 0) || !(was.y2 > 0)) return nullptr;
  if (before.x != now->x || before.y != now->y) return nullptr;
  const double sx = _pImpl->sampledScales[index].first, sy = _pImpl->sampledScales[index].second;
  const double nx = (now->w - now->x) / (double)cell.x2, ny = (now->h - now->y) / (double)cell.y2;
  // The drift across the cell, in texels, over the texels per screen pixel.
  if (std::fabs(nx - sx) * std::max(was.x2, cell.x2) / nx > kMaxDriftPixels ||
      std::fabs(ny - sy) * std::max(was.y2, cell.y2) / ny > kMaxDriftPixels)
    return nullptr;
  const double fx = (double)cell.x1 - was.x1, fy = (double)cell.y1 - was.y1;
  if (fx != std::floor(fx) || fy != std::floor(fy)) return nullptr;
  dx = (int)fx;
  dy = (int)fy;
  const double radius = _pImpl->drawRectList ? _pImpl->drawRectList->getRoundness() : 0;
  cairo_region_t* keep = cairo_region_create();
  addCoveredPixels(keep, was, radius);
  cairo_region_translate(keep, dx, dy);
  cairo_region_t* covered = cairo_region_create();
  addCoveredPixels(covered, cell, radius);
  cairo_region_intersect(keep, covered);
  cairo_region_destroy(covered);
  const CLyRectangle& g = _pImpl->canvas->getGeometry();
  const cairo_rectangle_int_t area = {g.x, g.y, g.w, g.h};
  cairo_region_intersect_rectangle(keep, &area);
  cairo_region_t* source = cairo_region_copy(keep);  // the old pixels must lie on the canvas too
  cairo_region_translate(source, -dx, -dy);
  cairo_region_intersect_rectangle(source, &area);
  cairo_region_translate(source, dx, dy);
  cairo_region_intersect(keep, source);
  cairo_region_destroy(source);
  if (cairo_region_is_empty(keep)) {
    cairo_region_destroy(keep);
    return nullptr;
  }
  LYLOG_D("Reuse pixels of cell %d, moved %d %d", index, dx, dy);
  return keep;
}

// save: copies the canvas pixels that will land on `keep` (they lie at
// keep − (dx, dy)) into `pixels`; otherwise writes them back onto `keep`.
void CLyMultiGrid::__copyCanvasPixels(const cairo_region_t* keep, int dx, int dy,
                                      std::vector<uint32_t>* pixels, bool save) {
  cairo_surface_t* surface = _pImpl->canvas->getSurface();
  cairo_surface_flush(surface);
  unsigned char* data = cairo_image_surface_get_data(surface);
  if (!data) return;
  const int stride = cairo_image_surface_get_stride(surface);
  const CLyRectangle& g = _pImpl->canvas->getGeometry();
  if (save) pixels->clear();
  size_t at = 0;
  const int n = cairo_region_num_rectangles(keep);
  for (int i = 0; i < n; i++) {
    cairo_rectangle_int_t r;
    cairo_region_get_rectangle(keep, i, &r);
    for (int y = r.y; y < r.y + r.height; y++) {
      if (save) {
        const auto* row =
            reinterpret_cast<const uint32_t*>(data + (size_t)(y - dy - g.y) * stride) + (r.x - dx - g.x);
        pixels->insert(pixels->end(), row, row + r.width);
      } else {
        auto* row = reinterpret_cast<uint32_t*>(data + (size_t)(y - g.y) * stride) + (r.x - g.x);
        std::copy(pixels->begin() + at, pixels->begin() + at + r.width, row);
        at += r.width;
      }
    }
  }
  if (!save) cairo_surface_mark_dirty(surface);
}

// Nothing drawn so far may be reused (the canvas was drawn on by others).
void CLyMultiGrid::__forgetDrawnPixels() {
  _pImpl->drawnCrops.clear();
  _pImpl->sampledScales.clear();
}

void CLyMultiGrid::__draw() {
  if (!_pImpl || !_pImpl->drawRectList || !_pImpl->srcItemList || !_pImpl->canvas) return;
  if (_pImpl->surfaces.empty()) {
    LYLOG_D("Surfaces are not created yet");
    return;
  }
  __drawCells(true, true, false);
  _pImpl->canvas->update();
}

void CLyMultiGrid::__drawGridImages() {
  if (!_pImpl || !_pImpl->drawRectList || !_pImpl->srcItemList || !_pImpl->canvas) return;
  if (_pImpl->surfaces.empty()) {
    LYLOG_D("Surfaces are not created yet");
    return;
  }
  // Only the changed cells' old and new places reach the screen again.
  std::vector<CLyRectangle> dirty;
  __drawCells(false, true, true, &dirty);
  for (const CLyRectangle& r : dirty) _pImpl->canvas->update(CLyFloatRectangle(r.x, r.y, r.w, r.h));
}

void CLyMultiGrid::__updateGridImages() {
  if (!_pImpl || !_pImpl->drawRectList || !_pImpl->srcItemList || !_pImpl->canvas) return;
  if (_pImpl->surfaces.empty()) {
    LYLOG_D("Surfaces are not created yet");
    return;
  }
  __drawCells(true, false, false);
  _pImpl->canvas->update();
}

void CLyMultiGrid::__updateImage(int index, const CLyFloatRectangle& cell, bool recreate) {
  if (!_pImpl || !_pImpl->canvas) return;
  LYLOG_D("Clean previous image");
  _pImpl->canvas->clearRect(cell);
  if (_pImpl->surfaces.empty()) {
    LYLOG_D("Surfaces are not created yet");
    return;
  }
  if (index < 0 || (size_t)index >= _pImpl->surfaces.size()) {
    LYLOG_E("Invalid index [%d]", index);
    return;
  }
  if (recreate) {
    if (_pImpl->surfaces[index]) cairo_surface_destroy(_pImpl->surfaces[index]);
    _pImpl->surfaces[index] = __createSurface(index);
  }
  __createGridImage(index, cell);
  if ((size_t)index < _pImpl->drawnRects.size()) _pImpl->drawnRects[index] = cell;
  if ((size_t)index < _pImpl->drawnCrops.size()) _pImpl->drawnCrops[index] = CLyRectangle(0, 0, 0, 0);
  _pImpl->canvas->update(cell);
}

// Fits the item's crop to its cell (the crop of a new or turned photo has
// the photo's proportions, not the cell's) and redraws the cell with a new
// surface.
void CLyMultiGrid::__updateGridImage(int index) {
  if (!__isValidItemIndex(index) || !_pImpl->drawRectList) {
    LYLOG_E("Invalid index [%d]", index);
    return;
  }
  CLyMultiGridSrcItem* item = _pImpl->srcItemList->get(index);
  const CLyFloatRectangle d = _pImpl->drawRectList->get(index);
  const CLyRectangle* old = item->getSrcRect();
  CLyRectangle crop;
  if (item->getBitmap() && old && __calculateRectSize(*old, d, crop)) {
    CLyRectangle* owned = new (std::nothrow) CLyRectangle(crop);
    if (owned) item->setSrcRect(owned);
  }
  __updateImage(index, d, true);
}

void CLyMultiGrid::updateBitmap(Bitmap* bitmap, int index, bool adoptPixels) {
  if (!_pImpl) return;
  if (!bitmap) {
    LYLOG_E("Invalid buffer");
    return;
  }
  if (index == -1) index = _pImpl->currentIndex;
  if (!__isValidItemIndex(index)) {
    LYLOG_E("Invalid index [%d]", index);
    delete bitmap;  // ours to keep or drop: nobody else holds it
    return;
  }
  // The cell's surface wraps the pixels about to be replaced: drop it first.
  if ((size_t)index < _pImpl->surfaces.size() && _pImpl->surfaces[index]) {
    cairo_surface_destroy(_pImpl->surfaces[index]);
    _pImpl->surfaces[index] = nullptr;
  }
  CLyMultiGridSrcItem* item = _pImpl->srcItemList->get(index);
  Bitmap* current = item->getBitmap();
  if (!adoptPixels || !current) {
    item->setBitmap(bitmap, true);
  } else {
    const bool sameSize =
        current->getWidth() == bitmap->getWidth() && current->getHeight() == bitmap->getHeight();
    const int w = bitmap->getWidth(), h = bitmap->getHeight(), format = bitmap->getFormat();
    current->adopt(bitmap->release(), w, h, format);
    delete bitmap;
    if (!sameSize) item->refresh();
  }
  __updateGridImage(index);
}

void CLyMultiGrid::rotate() {
  if (!_pImpl) return;
  __rotateGridImage(_pImpl->currentIndex, -M_PI / 2);
  notifyChanged(true);
}

void CLyMultiGrid::__rotateGridImage(int index, double angle) {
  if (!__isValidItemIndex(index) || !_pImpl->drawRectList) {
    LYLOG_E("Invalid index [%d]", index);
    return;
  }
  LYLOG_D("degrees: %f", angle * 180.0 / M_PI);
  if (std::fabs(angle + M_PI / 2) > 1e-9) return;
  CLyMultiGridSrcItem* item = _pImpl->srcItemList->get(index);
  if (!item->getBitmap()) {
    LYLOG_E("Invalid buffer");
    return;
  }
  if ((size_t)index < _pImpl->surfaces.size() && _pImpl->surfaces[index]) {
    cairo_surface_destroy(_pImpl->surfaces[index]);
    _pImpl->surfaces[index] = nullptr;
  }
  item->rotate(3);
  __updateGridImage(index);
}

// ---------------------------------------------------------------- saving

bool CLyMultiGrid::save(const std::string& path) {
  if (!_pImpl || !_pImpl->canvas || !_pImpl->canvasImage || !_pImpl->bgDrawRoi) {
    LYLOG_E("Not initialized!");
    return false;
  }
  if (path.empty()) {
    LYLOG_E("Invalid path");
    return false;
  }
  const CLyRectangle roi = *_pImpl->bgDrawRoi;
  const CLyRectangle& c = _pImpl->bgColor;
  const CLyFloatRectangle color(c.x / 255.0f, c.y / 255.0f, c.w / 255.0f, c.h / 255.0f);
  LYLOG_D("size: %d", roi.w * roi.h * 4);
  Evas_Object* image = nullptr;
  if (_pImpl->saveMode) {
    // The hidden save control's canvas is drawn for this save only: the
    // background goes under the collage in place, no second 4-byte buffer.
    cairo_t* cr = _pImpl->canvas->getContext();
    cairo_save(cr);
    cairo_set_operator(cr, CAIRO_OPERATOR_DEST_OVER);
    cairo_set_source_rgba(cr, color.x1, color.y1, color.x2, color.y2);
    cairo_paint(cr);
    cairo_restore(cr);
    _pImpl->canvas->update();
  } else {
    // On screen the picture must stay as it is: compose into a new object.
    image = evas_object_image_filled_add(evas_object_evas_get(_pImpl->canvasImage));
    if (!image) return false;
    evas_object_image_colorspace_set(image, EVAS_COLORSPACE_ARGB8888);
    evas_object_image_alpha_set(image, EINA_FALSE);
    CLyCairoCanvas* canvas = new (std::nothrow) CLyCairoCanvas(image, roi, false);
    if (!canvas || !canvas->isValid()) {
      LYLOG_E("Failed to add canvas");
      delete canvas;
      evas_object_del(image);
      return false;
    }
    const CLyFloatRectangle area((float)roi.x, (float)roi.y, (float)roi.w, (float)roi.h);
    canvas->fillRect(color, area);
    // The drawn collage over the background: its transparent gaps show the
    // colour. The collage pixels are read in place rather than copied.
    cairo_surface_t* drawn = _pImpl->canvas->getSurface();
    cairo_surface_flush(drawn);
    canvas->setFilter(CAIRO_FILTER_NEAREST);  // same size: a straight copy
    canvas->beginPath();
    canvas->setRectPath(area);
    canvas->drawBitmap(drawn, area, CLyRectangle(0, 0, roi.w, roi.h));
    canvas->update();
    delete canvas;
  }

  // Written under a temporary name next to the target and renamed only when
  // complete, so a failure never leaves a partial file under the real name.
  const std::string temporary = temporaryPathFor(path);
  const bool written = writeObjectJpeg(image ? image : _pImpl->canvasImage, temporary);
  if (image) evas_object_del(image);
  if (!written || !isCompleteJpeg(temporary.c_str())) {
    LYLOG_E("evas_object_image_save failed");
    unlink(temporary.c_str());
    return false;
  }
  if (rename(temporary.c_str(), path.c_str()) != 0) {
    LYLOG_E("evas_object_image_save failed");
    unlink(temporary.c_str());
    return false;
  }
  LYLOG_I("evas_object_image_save success");
  if (!CLyUtil::mediaContentScanFile(path.c_str())) {
    // Reported as failed, so leave nothing behind for the user to find.
    unlink(path.c_str());
    return false;
  }
  return true;
}
