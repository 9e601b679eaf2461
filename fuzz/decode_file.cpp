// Any bytes as an image file: parseImage, then decodeFile at a few target
// sizes. Must never crash, hang or allocate without bound.

#include <unistd.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

#include "codec/BitmapFactory.h"
#include "platform/core/dlog.h"

namespace {
std::string scratchFile() {
  char path[] = "/tmp/fuzz_decode_XXXXXX";
  const int fd = mkstemp(path);
  if (fd >= 0) close(fd);
  return path;
}
}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::string path = [] {
    dlog_set_min_priority(DLOG_SILENT);
    return scratchFile();
  }();
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return 0;
  if (size) fwrite(data, 1, size, f);
  fclose(f);

  DecodeOptions header;
  if (BitmapFactory::parseImage(path, header) != 1) return 0;
  // The first byte picks the target: small, shrinking, enlarging.
  static const int kSizes[][2] = {{1, 1}, {17, 9}, {64, 48}, {300, 200}};
  const int* wh = kSizes[size ? data[size - 1] % 4 : 0];
  DecodeOptions options;
  options.colorFormat = BITMAP_FORMAT_BGRA;
  std::unique_ptr<Bitmap> bitmap(BitmapFactory::decodeFile(path, options, wh[0], wh[1], 0));
  if (bitmap) {
    BitmapFactory::rotate(*bitmap, 1);
    std::unique_ptr<Bitmap> copy(BitmapFactory::clone(*bitmap));
  }
  return 0;
}
