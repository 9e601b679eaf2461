// Speed of the two touch steps that run for every finger movement on the
// collage, in a 1080 x 1920 view with six photos at their decoded size:
//   pan step      crop move of the touched photo and the one-cell redraw
//   handler step  a divider drag through the size modifier, the partial
//                 redraw of the cells whose crop changed, and the frame
// Both go through the collage control's real entry points on the buffer
// engine: gesture events for the pan, fed mouse moves on a grip for the
// handler. Prints a table per step (ms): wall-clock minimum, median, 90th
// percentile and maximum, and the minimum, median and 90th percentile of the
// thread's CPU time.
//
//   bench_touch [STEPS]

#include <Ecore.h>
#include <Elementary.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <vector>

#include "app-assist/WWindowController.h"
#include "codec/Bitmap.h"
#include "common/CLyUtil.h"
#include "control/CLyFocusBox.h"
#include "control/CLyGesture.h"
#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridImpl.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "model/style/CLyMultiGridStyleManager.h"

namespace {

const int kWidth = 1080, kHeight = 1920;

Bitmap* makePhoto(int index, int w, int h) {
  auto* pixels = static_cast<unsigned char*>(malloc((size_t)w * h * 4));
  if (!pixels) return nullptr;
  for (int y = 0; y < h; ++y)
    for (int x = 0; x < w; ++x) {
      unsigned char* p = pixels + ((size_t)y * w + x) * 4;
      p[0] = (unsigned char)((x * 3 + index * 40) & 255);
      p[1] = (unsigned char)((y * 2 + index * 70) & 255);
      p[2] = (unsigned char)(((x ^ y) + index * 20) & 255);
      p[3] = 255;
    }
  auto* bitmap = new Bitmap;
  bitmap->adopt(pixels, w, h, BITMAP_FORMAT_BGRA);
  return bitmap;
}

double ms(std::chrono::steady_clock::duration d) {
  return std::chrono::duration<double, std::milli>(d).count();
}

// CPU time of this thread (ms): on a shared, loaded machine the wall time
// also counts the other processes' turns.
double cpuMs() {
  timespec t;
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
  return t.tv_sec * 1e3 + t.tv_nsec / 1e6;
}

void report(const char* name, std::vector<double> wall, std::vector<double> cpu) {
  if (wall.empty()) {
    std::printf("%-14s  no steps measured\n", name);
    return;
  }
  std::sort(wall.begin(), wall.end());
  std::sort(cpu.begin(), cpu.end());
  std::printf("%-14s  %6zu  %8.3f  %8.3f  %8.3f  %8.3f  %8.3f  %8.3f  %8.3f\n", name, wall.size(),
              wall.front(), wall[wall.size() / 2], wall[wall.size() * 9 / 10], wall.back(), cpu.front(),
              cpu[cpu.size() / 2], cpu[cpu.size() * 9 / 10]);
}

void pump() {
  ecore_main_loop_iterate();
}

}  // namespace

int main(int argc, char** argv) {
  const int steps = argc > 1 ? std::max(10, atoi(argv[1])) : 400;
  setenv("ELM_ENGINE", "buffer", 0);
  setenv("ECORE_NO_SYSTEM_MODULES", "1", 0);
  elm_init(argc, argv);
  elm_app_base_scale_set(2.6);
  elm_config_scale_set(2.6);
  CLyUtil::initResourceManager();
  CLyMultiGridStyleManager& styles = CLyMultiGridStyleManager::getInstance();
  styles.initialize();

  // Six photos, layout 0 of six (handlers on its inner dividers).
  const int photos = 6, layout = 0;
  auto* window = new app_assist::WWindowController("bench-touch");
  if (!window->create()) {
    std::fprintf(stderr, "bench_touch: no window\n");
    return 1;
  }
  Evas_Object* win = window->getEvasObj();
  evas_object_resize(win, kWidth, kHeight);
  auto* list = new CLyMultiGridDrawRectList;
  auto* items = new CLyMultiGridSrcItemList;
  for (int i = 0; i < photos; ++i) {
    auto* item = new CLyMultiGridSrcItem();
    item->setBitmap(i % 2 ? makePhoto(i, 810, 1080) : makePhoto(i, 1080, 810), true);
    items->add(item);
  }
  float rects[6][4] = {};
  if (!styles.getDrawRects(photos, 0, layout, rects)) {
    std::fprintf(stderr, "bench_touch: no layout %d for %d photos (style files missing?)\n", layout, photos);
    return 1;
  }
  for (int i = 0; i < photos; ++i)
    list->addItem(new CLyFloatRectangle(rects[i][0], rects[i][1], rects[i][2], rects[i][3]));
  list->setStyleIndex(layout);
  auto* grid = new CLyMultiGrid(list, items, kWidth, kHeight);
  grid->setUseGl(false);
  if (!grid->prepare(win, win) || !grid->create(win, nullptr)) {
    std::fprintf(stderr, "bench_touch: the collage control could not be built\n");
    return 1;
  }
  Evas_Object* layoutObj = grid->getEvasObj();
  evas_object_move(layoutObj, 0, 0);
  evas_object_resize(layoutObj, kWidth, kHeight);
  grid->setLayoutIndex(layout);
  grid->refresh();
  for (int i = 0; i < 5; ++i) pump();

  // ---- pan steps: press on cell 0, start the pan, then alternate the finger.
  const CLyFloatRectangle c0 = list->get(0);
  const int cx = (int)(c0.x1 + c0.x2 / 2), cy = (int)(c0.y1 + c0.y2 / 2);
  auto send = [&](int type, int state, int x, int y) {
    CLyGestureInfo info;
    info.x = x;
    info.y = y;
    grid->__processGestureEvent(type, state, &info);
  };
  send(LY_GESTURE_MOUSE_DOWN, LY_GESTURE_STATE_START, cx, cy);
  send(LY_GESTURE_MOMENTUM, LY_GESTURE_STATE_START, cx, cy);
  send(LY_GESTURE_MOMENTUM, LY_GESTURE_STATE_MOVE, cx + 40, cy);
  std::vector<double> pan, panCpu;
  for (int i = 0; i < steps; ++i) {
    const int dx = (i % 2) ? 40 : -40;  // back and forth: every step moves the crop
    const double c0 = cpuMs();
    auto t0 = std::chrono::steady_clock::now();
    send(LY_GESTURE_MOMENTUM, LY_GESTURE_STATE_MOVE, cx + dx, cy + dx / 2);
    pan.push_back(ms(std::chrono::steady_clock::now() - t0));
    panCpu.push_back(cpuMs() - c0);
  }
  send(LY_GESTURE_MOMENTUM, LY_GESTURE_STATE_END, cx, cy);
  send(LY_GESTURE_MOUSE_UP, LY_GESTURE_STATE_START, cx, cy);

  // ---- handler steps: select cell 0, press its first grip, drag it back and forth.
  send(LY_GESTURE_MOUSE_DOWN, LY_GESTURE_STATE_START, cx, cy);
  send(LY_GESTURE_TAP, LY_GESTURE_STATE_END, cx, cy);
  send(LY_GESTURE_MOUSE_UP, LY_GESTURE_STATE_START, cx, cy);
  for (int i = 0; i < 5; ++i) pump();
  std::vector<double> handler, handlerCpu;
  CLyFocusBox* box = grid->getFocusBox();
  Evas_Object* grip = box ? box->getGrip(0) : nullptr;
  if (grid->getCurrentIndex() != 0 || !grip || !evas_object_visible_get(grip)) {
    std::fprintf(stderr, "bench_touch: no handler shown on the selected cell\n");
  } else {
    int gx = 0, gy = 0, gw = 0, gh = 0;
    evas_object_geometry_get(grip, &gx, &gy, &gw, &gh);
    const int hx = gx + gw / 2, hy = gy + gh / 2;
    Evas* e = evas_object_evas_get(win);
    unsigned int ts = 1000;
    evas_event_feed_mouse_move(e, hx, hy, ts, nullptr);
    evas_event_feed_mouse_down(e, 1, EVAS_BUTTON_NONE, ts, nullptr);
    for (int i = 0; i < steps; ++i) {
      ts += 200;  // slow enough for the plain 5-pixel filter
      const int d = (i % 2) ? 0 : 30;
      const double c0 = cpuMs();
      auto t0 = std::chrono::steady_clock::now();
      evas_event_feed_mouse_move(e, hx + d, hy + d, ts, nullptr);
      handler.push_back(ms(std::chrono::steady_clock::now() - t0));
      handlerCpu.push_back(cpuMs() - c0);
    }
    evas_event_feed_mouse_up(e, 1, EVAS_BUTTON_NONE, ts + 200, nullptr);
  }

  std::printf("touch steps in a %d x %d view, %d photos (ms)\n", kWidth, kHeight, photos);
  std::printf("%-14s  %6s  %8s  %8s  %8s  %8s  %8s  %8s  %8s\n", "step", "count", "min", "median", "p90",
              "max", "cpu min", "cpu med", "cpu p90");
  report("pan", pan, panCpu);
  report("handler drag", handler, handlerCpu);

  evas_object_del(win);
  items->clear(true);
  delete items;
  list->clear(true);
  delete list;
  elm_shutdown();
  return 0;
}
