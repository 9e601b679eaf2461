// Contact sheet of the editor's effects: the generated sample photo and each
// of the 19 effects on it, labelled, in one PNG.
//
//   bench_effects_contact_sheet [out.png]   (default docs/images/effects-contact-sheet.png)
#include <cairo.h>

#include <cstdio>
#include <cstring>
#include <string>
#include <vector>

#include "bench/effects_sample.h"
#include "image-editor/IE_Effects.h"
#include "image-editor/IE_Engine.h"

namespace {

constexpr int kTileW = 420, kTileH = 280, kCols = 5, kGap = 10, kLabelH = 32;

const char* englishLabel(const char* id) {
  static const char* const kNames[][2] = {
      {"IDS_IMGE_BUTTON_PASTEL_M_EFFECT_ABB", "Pastel"},
      {"IDS_IMGE_BUTTON_DEEP_M_EFFECT_ABB", "Deep"},
      {"IDS_IV_OPT_RETRO_M_EFFECT", "Retro"},
      {"IDS_IMGE_BUTTON_FILM_M_EFFECT_ABB", "Film"},
      {"IDS_IMGE_BUTTON_CALM_M_EFFECT_ABB", "Calm"},
      {"IDS_IMGE_BUTTON_DAWN_M_EFFECT_ABB", "Dawn"},
      {"IDS_IV_OPT_GREYSCALE_M_EFFECT", "Greyscale"},
      {"IDS_IMGE_BUTTON_EVERGREEN_M_EFFECT_ABB", "Evergreen"},
      {"IDS_IV_OPT_FADED_COLOURS_M_EFFECT", "Faded colours"},
      {"IDS_IV_OPT_OLD_PHOTO_M_EFFECT", "Old photo"},
      {"IDS_IV_OPT_BLUR_M_EFFECT", "Blur"},
      {"IDS_IV_OPT_NOSTALGIA_M_EFFECT", "Nostalgia"},
      {"IDS_IV_OPT_SUNSHINE_M_EFFECT", "Sunshine"},
      {"IDS_IV_OPT_VINTAGE_M_EFFECT", "Vintage"},
      {"IDS_IV_OPT_SHARPEN_M_EFFECT", "Sharpen"},
      {"IDS_IV_OPT_SOFT_GLOW_M_EFFECT", "Soft glow"},
      {"IDS_IMGE_BUTTON_STARDUST_M_EFFECT_ABB", "Stardust"},
      {"IDS_IMGE_BUTTON_LIGHT_FLARE_M_EFFECT", "Light flare"},
      {"IDS_IV_OPT_CARTOON_M_EFFECT", "Cartoon"},
  };
  for (const auto& n : kNames)
    if (strcmp(n[0], id) == 0) return n[1];
  return id;
}

void drawTile(cairo_t* cr, int index, std::vector<uint8_t>& pixels, const std::string& label) {
  const int col = index % kCols, row = index / kCols;
  const int x = kGap + col * (kTileW + kGap), y = kGap + row * (kTileH + kLabelH + kGap);
  cairo_surface_t* tile =
      cairo_image_surface_create_for_data(pixels.data(), CAIRO_FORMAT_ARGB32, kTileW, kTileH, kTileW * 4);
  cairo_set_source_surface(cr, tile, x, y);
  cairo_paint(cr);
  cairo_surface_destroy(tile);
  cairo_set_source_rgb(cr, 0.92, 0.92, 0.92);
  cairo_select_font_face(cr, "sans-serif", CAIRO_FONT_SLANT_NORMAL, CAIRO_FONT_WEIGHT_NORMAL);
  cairo_set_font_size(cr, 20);
  cairo_move_to(cr, x + 4, y + kTileH + 24);
  cairo_show_text(cr, label.c_str());
}

}  // namespace

int main(int argc, char** argv) {
  const char* out = argc > 1 ? argv[1] : "docs/images/effects-contact-sheet.png";
  const int count = IE_Engine_Effect_Count();
  const int rows = (count + 1 + kCols - 1) / kCols;
  const int sheetW = kGap + kCols * (kTileW + kGap), sheetH = kGap + rows * (kTileH + kLabelH + kGap);
  cairo_surface_t* sheet = cairo_image_surface_create(CAIRO_FORMAT_RGB24, sheetW, sheetH);
  cairo_t* cr = cairo_create(sheet);
  cairo_set_source_rgb(cr, 0.13, 0.13, 0.14);
  cairo_paint(cr);

  // Evas/cairo byte order: format 9.
  std::vector<uint8_t> photo = effects_sample::makePhoto(kTileW, kTileH);
  drawTile(cr, 0, photo, "Original");
  for (int i = 0; i < count; ++i) {
    const IeEffect* e = IE_Engine_Effect_Get(i);
    std::vector<uint8_t> result(photo.size(), 0);
    IeImageInfo src{kTileW, kTileH, IE_FORMAT_ARGB8888, photo.data()};
    IeImageInfo dst{kTileW, kTileH, IE_FORMAT_ARGB8888, result.data()};
    const int rc = IE_Engine_Apply_Effect(&src, &dst, e->effectNumber);
    if (rc != IE_ERROR_NONE) {
      fprintf(stderr, "effect %d failed: %d\n", e->effectNumber, rc);
      return 1;
    }
    drawTile(cr, i + 1, result, std::to_string(i + 1) + ". " + englishLabel(e->labelId));
  }
  cairo_destroy(cr);
  const cairo_status_t st = cairo_surface_write_to_png(sheet, out);
  cairo_surface_destroy(sheet);
  if (st != CAIRO_STATUS_SUCCESS) {
    fprintf(stderr, "cannot write %s: %s\n", out, cairo_status_to_string(st));
    return 1;
  }
  printf("wrote %s (%dx%d)\n", out, sheetW, sheetH);
  return 0;
}
