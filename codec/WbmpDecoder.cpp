// Wireless bitmaps of type 0: a multi-byte width and height, then rows of
// one bit per pixel, most significant bit first, 1 for white.

#include <cstdlib>
#include <vector>

#include "codec/BitmapFactory.h"
#include "codec/CodecLog.h"
#include "codec/ImageDecoders.h"
#include "codec/Resampler.h"

namespace BitmapFactory {
namespace {

// A multi-byte integer: 7 bits per byte, high bit set on all but the last.
// More than four bytes would exceed any sane size and is refused.
bool readMultiByte(FILE* file, long long& value) {
  value = 0;
  for (int i = 0; i < 4; ++i) {
    const int c = getc(file);
    if (c == EOF) return false;
    value = (value << 7) | (c & 0x7f);
    if (!(c & 0x80)) return true;
  }
  return false;
}

bool readHeader(FILE* file, long long& width, long long& height) {
  const int type = getc(file);
  const int fixHeader = getc(file);
  if (type != 0 || fixHeader == EOF || (fixHeader & 0x80)) return false;  // only type 0, no extension headers
  return readMultiByte(file, width) && readMultiByte(file, height);
}

}  // namespace

bool readWbmpSize(FILE* file, long long& width, long long& height) {
  return readHeader(file, width, height);
}

bool decodeWbmp(FILE* file, int outW, int outH, uint8_t* out) {
  long long width = 0, height = 0;
  if (!readHeader(file, width, height)) return false;
  if (!imageSizeAcceptable(width, height)) return false;
  const int w = static_cast<int>(width), h = static_cast<int>(height);
  Resampler resampler(w, h, outW, outH, out);
  if (!resampler.ok()) return false;
  const size_t stride = (static_cast<size_t>(w) + 7) / 8;
  std::vector<uint8_t> raw(stride), row(static_cast<size_t>(w) * 4);
  for (int y = 0; y < h; ++y) {
    if (fread(raw.data(), 1, stride, file) != stride) {
      IVLOG_E("file ends at row %d of %d", y, h);
      return false;
    }
    for (int x = 0; x < w; ++x) {
      const uint8_t v = ((raw[x / 8] >> (7 - x % 8)) & 1) ? 255 : 0;
      uint8_t* p = &row[static_cast<size_t>(x) * 4];
      p[0] = p[1] = p[2] = v;
      p[3] = 255;
    }
    resampler.pushRow(row.data());
  }
  resampler.finish();
  return true;
}

}  // namespace BitmapFactory
