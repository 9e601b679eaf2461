// Draws the collage's small icons at build time, so the images stay in step
// with the code that sizes them and no binary files live in the repository.
//
//   pictavo_make_icons OUTPUT_DIR
//
// writes, into OUTPUT_DIR:
//   pictavo_crop_rectangle.png        handler dot of the focus frame
//   pictavo_crop_rectangle_press.png  the same dot while a finger holds it
//   collage_add_picture.png           the "add a picture" mark of an empty cell
//
// The handler dots are drawn white (with a dark rim so they stay visible on
// white photos): the focus box tints them with the theme colour, and
// tinting multiplies, so white takes the tint exactly.

#include <cairo.h>

#include <cmath>
#include <cstdio>
#include <string>

namespace {

constexpr double kPi = 3.14159265358979323846;

bool writePng(cairo_surface_t* surface, const std::string& path) {
  cairo_surface_flush(surface);
  cairo_status_t status = cairo_surface_write_to_png(surface, path.c_str());
  if (status != CAIRO_STATUS_SUCCESS) {
    std::fprintf(stderr, "pictavo_make_icons: cannot write %s: %s\n", path.c_str(),
                 cairo_status_to_string(status));
    return false;
  }
  return true;
}

// The dot is drawn in an 80 x 80 image: the focus box shows its icons at
// 80 design pixels, so the picture is never scaled up on a device of the
// base scale.
bool drawHandler(const std::string& path, bool pressed) {
  const int size = 80;
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, size, size);
  cairo_t* cr = cairo_create(surface);
  const double c = size * 0.5;

  if (pressed) {
    // A soft halo shows the finger has caught the handler.
    cairo_arc(cr, c, c, size * 0.46, 0, 2 * kPi);
    cairo_set_source_rgba(cr, 1, 1, 1, 0.35);
    cairo_fill(cr);
  }
  const double radius = pressed ? size * 0.30 : size * 0.22;
  // Dark rim.
  cairo_arc(cr, c, c, radius + 3, 0, 2 * kPi);
  cairo_set_source_rgba(cr, 0, 0, 0, 0.45);
  cairo_fill(cr);
  // White body.
  cairo_arc(cr, c, c, radius, 0, 2 * kPi);
  cairo_set_source_rgba(cr, 1, 1, 1, 1);
  cairo_fill(cr);
  if (!pressed) {
    // A hollow centre tells the normal dot from the pressed one at a glance.
    cairo_arc(cr, c, c, radius * 0.45, 0, 2 * kPi);
    cairo_set_source_rgba(cr, 0, 0, 0, 0.25);
    cairo_fill(cr);
  }

  cairo_destroy(cr);
  bool ok = writePng(surface, path);
  cairo_surface_destroy(surface);
  return ok;
}

// A picture frame with a plus sign, light grey on transparent: it sits on
// the black placeholder cell.
bool drawAddPicture(const std::string& path) {
  const int size = 96;
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, size, size);
  cairo_t* cr = cairo_create(surface);
  cairo_set_source_rgba(cr, 0.85, 0.85, 0.85, 1.0);
  cairo_set_line_width(cr, 5);
  cairo_set_line_join(cr, CAIRO_LINE_JOIN_ROUND);
  cairo_set_line_cap(cr, CAIRO_LINE_CAP_ROUND);

  // Frame.
  cairo_rectangle(cr, 10, 18, 64, 52);
  cairo_stroke(cr);
  // Mountains and sun inside the frame.
  cairo_move_to(cr, 16, 62);
  cairo_line_to(cr, 34, 40);
  cairo_line_to(cr, 46, 54);
  cairo_line_to(cr, 54, 46);
  cairo_line_to(cr, 68, 62);
  cairo_stroke(cr);
  cairo_arc(cr, 56, 32, 5, 0, 2 * kPi);
  cairo_fill(cr);
  // Plus badge at the lower right corner.
  cairo_arc(cr, 72, 72, 17, 0, 2 * kPi);
  cairo_fill(cr);
  cairo_set_operator(cr, CAIRO_OPERATOR_CLEAR);
  cairo_set_line_width(cr, 5);
  cairo_move_to(cr, 72, 63);
  cairo_line_to(cr, 72, 81);
  cairo_move_to(cr, 63, 72);
  cairo_line_to(cr, 81, 72);
  cairo_stroke(cr);

  cairo_destroy(cr);
  bool ok = writePng(surface, path);
  cairo_surface_destroy(surface);
  return ok;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc != 2) {
    std::fprintf(stderr, "usage: %s OUTPUT_DIR\n", argv[0]);
    return 2;
  }
  const std::string dir = std::string(argv[1]) + "/";
  bool ok = drawHandler(dir + "pictavo_crop_rectangle.png", false);
  ok = drawHandler(dir + "pictavo_crop_rectangle_press.png", true) && ok;
  ok = drawAddPicture(dir + "collage_add_picture.png") && ok;
  return ok ? 0 : 1;
}
