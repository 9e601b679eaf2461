// Draws the thumbnail of every collage layout from the shipped style files,
// so the pictures always show the arrangements the catalogue loads.
//
//   pictavo_make_layout_thumbnails RESOURCE_DIR OUTPUT_DIR
//
// reads RESOURCE_DIR/styles/grid/styleimage<N>.json and writes, for every
// layout, the normal and pressed icons the catalogue names
// ("pictavo_ic_2depth_0N_i.png", "pictavo_ic_2depth_0N_i_press.png") into
// OUTPUT_DIR. Normal icons are outlined cells on a transparent ground;
// pressed ones fill the cells with the selection accent.

#include <cairo.h>

#include <cstdio>
#include <string>

#include "model/style/CLyMultiGridStyleManager.h"
#include "platform/core/dlog.h"

namespace {

constexpr int kSize = 96;      // design pixels of the option grid's icon
constexpr double kInset = 10;  // empty margin around the collage outline
constexpr double kGap = 4;     // space between neighbouring cells

bool drawThumbnail(const float (*cells)[4], int count, bool pressed, const std::string& path) {
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, kSize, kSize);
  cairo_t* cr = cairo_create(surface);
  const double area = kSize - 2 * kInset;
  for (int k = 0; k < count; ++k) {
    const double l = kInset + cells[k][0] * area + kGap / 2;
    const double t = kInset + cells[k][1] * area + kGap / 2;
    const double r = kInset + cells[k][2] * area - kGap / 2;
    const double b = kInset + cells[k][3] * area - kGap / 2;
    cairo_rectangle(cr, l + 1, t + 1, r - l - 2, b - t - 2);
    if (pressed) {
      cairo_set_source_rgba(cr, 0.18, 0.61, 0.86, 1.0);  // the selection accent
      cairo_fill_preserve(cr);
    }
    // A dark rim under a light line keeps the outline visible on light and
    // dark toolbars alike.
    cairo_set_source_rgba(cr, 0.0, 0.0, 0.0, 0.35);
    cairo_set_line_width(cr, 4.5);
    cairo_stroke_preserve(cr);
    cairo_set_source_rgba(cr, 0.93, 0.93, 0.93, 1.0);
    cairo_set_line_width(cr, 2.5);
    cairo_stroke(cr);
  }
  cairo_destroy(cr);
  cairo_surface_flush(surface);
  const cairo_status_t status = cairo_surface_write_to_png(surface, path.c_str());
  cairo_surface_destroy(surface);
  if (status != CAIRO_STATUS_SUCCESS) {
    std::fprintf(stderr, "pictavo_make_layout_thumbnails: cannot write %s: %s\n", path.c_str(),
                 cairo_status_to_string(status));
    return false;
  }
  return true;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 3) {
    std::fprintf(stderr, "usage: %s RESOURCE_DIR OUTPUT_DIR\n", argv[0]);
    return 2;
  }
  dlog_set_min_priority(DLOG_ERROR);
  std::string resourceDir = argv[1];
  if (resourceDir.empty() || resourceDir.back() != '/') resourceDir += '/';
  const std::string outDir = argv[2];
  CLyMultiGridStyleManager& catalogue = CLyMultiGridStyleManager::getInstance();
  if (!catalogue.initialize(resourceDir)) {
    std::fprintf(stderr, "pictavo_make_layout_thumbnails: cannot load the style files of %s\n", argv[1]);
    return 1;
  }
  int written = 0;
  for (int count = CLyMultiGridStyleManager::kMinImageCount;
       count <= CLyMultiGridStyleManager::kMaxImageCount; ++count) {
    if (catalogue.getLayoutCount(count) != CLyMultiGridStyleManager::getThumbnailCount(count)) {
      std::fprintf(stderr, "pictavo_make_layout_thumbnails: %d layouts for %d photos, %d thumbnails\n",
                   catalogue.getLayoutCount(count), count,
                   CLyMultiGridStyleManager::getThumbnailCount(count));
      return 1;
    }
    for (int index = 0; index < catalogue.getLayoutCount(count); ++index) {
      float cells[6][4] = {};
      catalogue.getDrawRects(count, 0, index, cells);
      for (bool pressed : {false, true}) {
        const std::string name = catalogue.getLayoutThumbnailPath(count, index, pressed);
        if (!drawThumbnail(cells, count, pressed, outDir + "/" + name)) return 1;
        ++written;
      }
    }
  }
  catalogue.clear();
  std::printf("pictavo_make_layout_thumbnails: %d icons\n", written);
  return 0;
}
