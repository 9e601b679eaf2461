#include "tests/touch/CollageHost.h"

#include <Ecore.h>
#include <Elementary.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <string>

#include "app-assist/WWindowController.h"
#include "codec/Bitmap.h"
#include "common/CLyUtil.h"
#include "control/CLyGesture.h"
#include "control/CLyMultiGrid.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "model/style/CLyMultiGridStyleManager.h"
#include "tests/support/TestSupport.h"
#include "tests/touch/TouchTestSupport.h"

namespace pictavo::test::touch {

namespace {

// A photo-like picture: a diagonal gradient in a colour of its own with a
// grid of darker lines, so every crop shows different pixels.
Bitmap* makePhoto(int index, int w, int h) {
  auto* pixels = static_cast<unsigned char*>(malloc((size_t)w * h * 4));
  if (!pixels) return nullptr;
  const int base[6][3] = {{200, 60, 60},  {60, 180, 70},  {60, 90, 210},
                          {210, 190, 60}, {170, 70, 190}, {60, 190, 190}};
  const int* c = base[index % 6];
  for (int y = 0; y < h; ++y) {
    for (int x = 0; x < w; ++x) {
      unsigned char* p = pixels + ((size_t)y * w + x) * 4;
      const int shade = (x + y) * 255 / (w + h);
      const bool line = (x % 64) < 3 || (y % 64) < 3;
      p[0] = (unsigned char)std::min(255, c[2] * shade / 255 + (line ? 0 : 30));
      p[1] = (unsigned char)std::min(255, c[1] * shade / 255 + (line ? 0 : 30));
      p[2] = (unsigned char)std::min(255, c[0] * shade / 255 + (line ? 0 : 30));
      p[3] = 255;
    }
  }
  auto* bitmap = new Bitmap;
  bitmap->adopt(pixels, w, h, BITMAP_FORMAT_BGRA);
  return bitmap;
}

}  // namespace

CollageHost::CollageHost(const HostOptions& options) {
  setUnitScale();
  CLyUtil::initResourceManager();
  CLyMultiGridStyleManager& styles = CLyMultiGridStyleManager::getInstance();
  if (styles.getGridLayoutCount(options.photos) <= 0) styles.initialize();

  // Controls find their window through its controller.
  auto* window = new app_assist::WWindowController("pictavo-touch-test");
  if (!window->create()) return;
  mWin = window->getEvasObj();
  evas_object_resize(mWin, options.width, options.height);
  mList = new CLyMultiGridDrawRectList;
  mItems = new CLyMultiGridSrcItemList;
  for (int i = 0; i < options.photos; ++i) {
    const bool placeholder =
        std::find(options.placeholders.begin(), options.placeholders.end(), i) != options.placeholders.end();
    auto* item = placeholder ? new CLyMultiGridSrcItem(std::string(), true) : new CLyMultiGridSrcItem();
    if (!placeholder) item->setBitmap(makePhoto(i, 1200 - i * 100, 900 + i * 50), true);
    mItems->add(item);
  }
  float rects[6][4] = {};
  if (!styles.getDrawRects(options.photos, 0, options.layout, rects)) return;
  for (int i = 0; i < options.photos; ++i)
    mList->addItem(new CLyFloatRectangle(rects[i][0], rects[i][1], rects[i][2], rects[i][3]));
  mList->setStyleIndex(options.layout);

  mGrid = new CLyMultiGrid(mList, mItems, options.width, options.height);
  mGrid->setUseGl(false);
  mGrid->setSingleImageMode(options.singleImage);
  mGrid->setMouseDownCallback([this](int i, bool p) { mouseDowns.emplace_back(i, p); });
  mGrid->setSelectionCallback([this]() { ++selections; });
  mGrid->setChangeCallback([this](bool c, bool s) { changes.emplace_back(c, s); });
  mGrid->setAddPictureCallback([this]() { ++addPictures; });
  mGrid->setSwapCallback([this](int a, int b) { swaps.emplace_back(a, b); });
  if (!mGrid->prepare(mWin, mWin) || !mGrid->create(mWin, nullptr)) return;
  Evas_Object* layout = mGrid->getEvasObj();
  evas_object_move(layout, 0, 0);
  evas_object_resize(layout, options.width, options.height);
  evas_object_show(layout);
  mGrid->setLayoutIndex(options.layout);
  mGrid->refresh();

  CLyMultiGrid* grid = mGrid;
  mGesture = new CLyGesture(
      [grid](int type, int state, void* info) { grid->__processGestureEvent(type, state, info); });
  mGesture->setLongTapTimeout(options.longTapSeconds);
  if (!mGesture->create(mWin, nullptr)) return;
  mGesture->setTarget(layout);
  spin(0.05);
  changes.clear();
  mOk = true;
}

CollageHost::~CollageHost() {
  // The controllers go with their objects, which go with the window.
  if (mWin) evas_object_del(mWin);
  spin(0.01);
  if (mItems) mItems->clear(true);
  delete mItems;
  if (mList) mList->clear(true);
  delete mList;
}

Evas* CollageHost::evas() const {
  return evas_object_evas_get(mWin);
}

CLyFloatRectangle CollageHost::cell(int index) const {
  return mList->get(index);
}

CLyPoint CollageHost::centre(int index) const {
  CLyFloatRectangle r = cell(index);
  return CLyPoint((int)(r.x1 + r.x2 / 2), (int)(r.y1 + r.y2 / 2));
}

CLyRectangle CollageHost::crop(int index) const {
  CLyMultiGridSrcItem* item = mItems->get(index);
  const CLyRectangle* r = item ? item->getSrcRect() : nullptr;
  return r ? *r : CLyRectangle();
}

unsigned int CollageHost::now() const {
  return (unsigned int)(ecore_time_get() * 1000.0);
}

void CollageHost::down(int x, int y) {
  evas_event_feed_mouse_move(evas(), x, y, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
}

void CollageHost::move(int x, int y) {
  evas_event_feed_mouse_move(evas(), x, y, now(), nullptr);
}

void CollageHost::up(int x, int y) {
  evas_event_feed_mouse_move(evas(), x, y, now(), nullptr);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
}

void CollageHost::multiDown(int x, int y) {
  evas_event_feed_multi_down(evas(), 1, x, y, 1, 1, 1, 1, 0, x, y, EVAS_BUTTON_NONE, now(), nullptr);
}

void CollageHost::multiMove(int x, int y) {
  evas_event_feed_multi_move(evas(), 1, x, y, 1, 1, 1, 1, 0, x, y, now(), nullptr);
}

void CollageHost::multiUp(int x, int y) {
  evas_event_feed_multi_up(evas(), 1, x, y, 1, 1, 1, 1, 0, x, y, EVAS_BUTTON_NONE, now(), nullptr);
}

void CollageHost::tap(int x, int y) {
  down(x, y);
  spin(0.02);
  up(x, y);
  spin(0.02);
}

bool CollageHost::select(int index) {
  const int before = selections;
  CLyPoint p = centre(index);
  tap(p.x, p.y);
  return runMainLoopUntil([&]() { return selections > before; }, 2.0) && mGrid->getCurrentIndex() == index;
}

void CollageHost::spin(double seconds) {
  runMainLoop(seconds);
}

}  // namespace pictavo::test::touch
