// Collage canvas timings on the buffer engine:
//   full redraw of a six-cell collage in a 1080 x 1920 view (target <= 16 ms),
//   one-cell partial redraw as during a pan, no new surface (target <= 1 ms),
//   the save-size compose (2000 x 2000) with the bilinear and the GOOD filter.
// Usage: bench_canvas [RUNS]   prints "name: min median max (ms)".

#include <Elementary.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <vector>

#include "app-assist/WWindowController.h"
#include "bench/BenchTiming.h"
#include "codec/BitmapFactory.h"
#include "common/CLyCairoCanvas.h"
#include "control/CLyMultiGrid.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "model/style/CLyMultiGridStyleManager.h"
#include "tests/canvas/MultiGridTestPeer.h"

namespace {

using Clock = std::chrono::steady_clock;

using pictavo::bench::measure;

// A photo-like bitmap: smooth gradients plus a little texture.
Bitmap* photo(int w, int h, int seed) {
  Bitmap* b = BitmapFactory::createBitmap(w, h, BITMAP_FORMAT_BGRA);
  auto* p = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int y = 0; y < h; y++)
    for (int x = 0; x < w; x++) {
      uint32_t r = (x * 255 / w + seed * 40) & 255, g = (y * 255 / h) & 255, bl = ((x ^ y) * 7 + seed) & 255;
      p[(size_t)y * w + x] = 0xFF000000u | r << 16 | g << 8 | bl;
    }
  return b;
}

struct Setup {
  CLyMultiGridDrawRectList cells;
  CLyMultiGridSrcItemList items;
  ~Setup() {
    cells.clear(true);
    items.clear(true);
  }
};

void fillSix(Setup& s, int longSide) {
  float rects[6][4] = {};
  CLyMultiGridStyleManager::getInstance().getDrawRects(6, 0, 0, rects);
  for (auto& r : rects) s.cells.addItem(new CLyFloatRectangle(r[0], r[1], r[2], r[3]));
  const int shortSide = longSide * 3 / 4;
  for (int i = 0; i < 6; i++) {
    auto* item = new CLyMultiGridSrcItem();
    item->setBitmap(i % 3 == 1 ? photo(shortSide, longSide, i) : photo(longSide, shortSide, i), true);
    s.items.add(item);
  }
}

}  // namespace

int main(int argc, char** argv) {
  const int runs = argc > 1 ? std::max(5, atoi(argv[1])) : 101;
  setenv("ELM_ENGINE", "buffer", 1);
  setenv("ECORE_NO_SYSTEM_MODULES", "1", 0);
  elm_init(argc, argv);
  if (!CLyMultiGridStyleManager::getInstance().initialize()) {
    fprintf(stderr, "bench_canvas: layout styles not found (set PICTAVO_RES_DIR)\n");
    return 1;
  }
  auto* window = new app_assist::WWindowController("bench-canvas");
  window->precreate();
  Evas_Object* parent = window->getBaseLayout() ? window->getBaseLayout() : window->getEvasObj();

  {
    // On screen: photos decoded for a 1080 x 1920 screen (a 4000 x 3000 photo becomes 1080 x 810).
    Setup s;
    fillSix(s, 1080);
    for (int ratio : {LY_RATIO_9_16, LY_RATIO_1_1}) {
      auto* g = new CLyMultiGrid(&s.cells, &s.items, 1080, 1920);
      g->setUseGl(false);
      g->prepare(window->getEvasObj(), parent);
      g->setViewRatio(ratio, false);
      g->create(parent, nullptr);
      g->setBorderRoundnessValue(3);
      g->refresh();
      const CLyRectangle* area = g->getCollageRect();
      char name[128];
      snprintf(name, sizeof name, "full_redraw_6cells_%dx%d_in_1080x1920_bilinear_r3", area->w, area->h);
      measure(name, runs, [&](int) { CLyMultiGridTestPeer::draw(g); });
      const CLyFloatRectangle cell = s.cells.get(0);
      snprintf(name, sizeof name, "pan_one_cell_%dx%d_update_no_new_surface", (int)cell.x2, (int)cell.y2);
      measure(name, runs * 10, [&](int i) {
        // a pan step: the crop moves a few pixels, the cell is redrawn
        CLyMultiGridSrcItem* item = s.items.get(0);
        const CLyRectangle* c = item->getSrcRect();
        int dx = (i % 2) ? 3 : -3;
        item->setSrcRect(new CLyRectangle(c->x + dx, c->y, c->w + dx, c->h));
        CLyMultiGridTestPeer::updateImage(g, 0, cell, false);
      });
      // The same two figures with cairo's GOOD filter, the alternative for the screen.
      CLyCairoCanvas* canvas = CLyMultiGridTestPeer::impl(g)->canvas;
      canvas->setFilter(CAIRO_FILTER_GOOD);
      snprintf(name, sizeof name, "full_redraw_6cells_%dx%d_cairo_good", area->w, area->h);
      measure(name, std::max(5, runs / 4), [&](int) { CLyMultiGridTestPeer::draw(g); });
      snprintf(name, sizeof name, "pan_one_cell_%dx%d_cairo_good", (int)cell.x2, (int)cell.y2);
      measure(name, runs, [&](int) { CLyMultiGridTestPeer::updateImage(g, 0, cell, false); });
      canvas->setFilter(CAIRO_FILTER_BILINEAR);
      g->destroy();
    }
  }
  {
    // Save size: photos decoded for a 2000 x 2000 "screen" (2000 x 1500), composed at 2000 x 2000.
    Setup s;
    fillSix(s, 2000);
    auto* g = new CLyMultiGrid(&s.cells, &s.items, 2000, 2000);
    g->setSaveMode(true);
    g->setUseGl(false);
    g->prepare(window->getEvasObj(), parent);
    g->create(parent, nullptr);
    g->setBorderMarginValue(2);
    g->setBorderRoundnessValue(3);
    g->refresh();
    CLyCairoCanvas* canvas = CLyMultiGridTestPeer::impl(g)->canvas;
    struct Variant {
      const char* name;
      cairo_filter_t filter;
      bool smooth;
    };
    for (const Variant& v : {Variant{"bilinear", CAIRO_FILTER_BILINEAR, false},
                             Variant{"box_then_bilinear", CAIRO_FILTER_BILINEAR, true},
                             Variant{"cairo_good", CAIRO_FILTER_GOOD, false}}) {
      canvas->setFilter(v.filter);
      canvas->setSmoothDownscale(v.smooth);
      char name[96];
      snprintf(name, sizeof name, "save_compose_6cells_2000x2000_%s", v.name);
      measure(name, std::max(5, runs / 10), [&](int) { CLyMultiGridTestPeer::draw(g); });
    }
    g->destroy();
  }
  window->destroy();
  elm_shutdown();
  return 0;
}
