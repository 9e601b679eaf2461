#include "PlatformTestImages.h"

#include <cairo.h>

#include <sys/stat.h>

#include <cstdlib>
#include <fstream>
#include <string>

namespace pictavo::test {

namespace {
// elementary keeps its run folder under $HOME; the private home of the test
// run may not exist yet on a fresh build tree.
const bool gHomeReady = [] {
  const char* home = getenv("HOME");
  if (!home || !*home) return false;
  std::string path;
  for (const char* p = home; *p; ++p) {
    path += *p;
    if (p[1] == '/' || p[1] == '\0') mkdir(path.c_str(), 0755);
  }
  return true;
}();
}  // namespace

bool writeTestPng(const std::string& path, int w, int h) {
  cairo_surface_t* surface = cairo_image_surface_create(CAIRO_FORMAT_RGB24, w, h);
  cairo_t* cr = cairo_create(surface);
  cairo_set_source_rgb(cr, 0.5, 0.5, 0.5);
  cairo_paint(cr);
  cairo_destroy(cr);
  bool ok = cairo_surface_write_to_png(surface, path.c_str()) == CAIRO_STATUS_SUCCESS;
  cairo_surface_destroy(surface);
  return ok;
}

bool writeBytes(const std::string& path, const std::string& bytes) {
  std::ofstream out(path, std::ios::binary);
  out << bytes;
  return static_cast<bool>(out);
}

}  // namespace pictavo::test
