// Any bytes as a PNG file through initPNGFile and decodePNG, the way the
// decoder threads call them.

#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>

#include "codec/BitmapFactory.h"
#include "platform/core/dlog.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::string path = [] {
    dlog_set_min_priority(DLOG_SILENT);
    char name[] = "/tmp/fuzz_png_XXXXXX";
    const int fd = mkstemp(name);
    if (fd >= 0) close(fd);
    return std::string(name);
  }();
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return 0;
  if (size) fwrite(data, 1, size, f);
  fclose(f);

  DecodeOptions options;
  options.colorFormat = (size && (data[size - 1] & 1)) ? BITMAP_FORMAT_RGBA : BITMAP_FORMAT_BGRA;
  if (BitmapFactory::initPNGFile(options, path) != 1) return 0;
  // Shrink to at most 64 pixels a side, as a screen decode would.
  int w = options.outWidth, h = options.outHeight;
  while (w > 64 || h > 64) {
    w = (w + 1) / 2;
    h = (h + 1) / 2;
  }
  std::unique_ptr<Bitmap> bitmap(BitmapFactory::createBitmap(w, h, options.colorFormat));
  if (bitmap) BitmapFactory::decodePNG(options, *bitmap, w, h);
  return 0;
}
