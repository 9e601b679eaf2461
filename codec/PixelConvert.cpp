#include <algorithm>

#include "codec/Bitmap.h"
#include "codec/ImageDecoders.h"

namespace BitmapFactory {

void premultiplyRow(uint8_t* p, int width) {
  for (int x = 0; x < width; ++x, p += 4) {
    const unsigned a = p[3];
    if (a == 255) continue;
    if (a == 0) {
      p[0] = p[1] = p[2] = 0;
      continue;
    }
    for (int c = 0; c < 3; ++c) {
      const unsigned v = p[c] * a + 128;
      p[c] = static_cast<uint8_t>((v + (v >> 8)) >> 8);
    }
  }
}

namespace {
inline uint8_t unpremultiply(unsigned v, unsigned a) {
  return a == 0 ? 0 : static_cast<uint8_t>(std::min(255u, (v * 255 + a / 2) / a));
}
inline int clampByte(int v) {
  return v < 0 ? 0 : (v > 255 ? 255 : v);
}
}  // namespace

void convertFromBgra(const uint8_t* src, int width, int height, int format, uint8_t* dst) {
  const size_t n = static_cast<size_t>(width) * height;
  switch (format) {
    case BITMAP_FORMAT_BGRA:
      if (dst != src) std::copy(src, src + n * 4, dst);
      return;
    case BITMAP_FORMAT_RGBA:
    case BITMAP_FORMAT_ARGB_PNG:
      // Straight alpha, in the PNG decoder's order (format 5: bytes 0 and 3 exchanged).
      for (size_t i = 0; i < n; ++i) {
        const uint8_t b = src[i * 4], g = src[i * 4 + 1], r = src[i * 4 + 2], a = src[i * 4 + 3];
        uint8_t* d = dst + i * 4;
        d[0] = unpremultiply(r, a);
        d[1] = unpremultiply(g, a);
        d[2] = unpremultiply(b, a);
        d[3] = a;
        if (format == BITMAP_FORMAT_ARGB_PNG) std::swap(d[0], d[3]);
      }
      return;
    case BITMAP_FORMAT_YUV420: {
      // BT.601 limited range; chroma averaged over each 2 x 2 block.
      uint8_t* yPlane = dst;
      const int cw = (width + 1) / 2, ch = (height + 1) / 2;
      uint8_t* uPlane = dst + n;
      uint8_t* vPlane = uPlane + static_cast<size_t>(cw) * ch;
      for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
          const uint8_t* p = src + (static_cast<size_t>(y) * width + x) * 4;
          yPlane[static_cast<size_t>(y) * width + x] =
              static_cast<uint8_t>(clampByte(((66 * p[2] + 129 * p[1] + 25 * p[0] + 128) >> 8) + 16));
        }
      }
      for (int cy = 0; cy < ch; ++cy) {
        for (int cx = 0; cx < cw; ++cx) {
          int r = 0, g = 0, b = 0, count = 0;
          for (int dy = 0; dy < 2; ++dy) {
            for (int dx = 0; dx < 2; ++dx) {
              const int x = cx * 2 + dx, y = cy * 2 + dy;
              if (x >= width || y >= height) continue;
              const uint8_t* p = src + (static_cast<size_t>(y) * width + x) * 4;
              b += p[0];
              g += p[1];
              r += p[2];
              ++count;
            }
          }
          r /= count;
          g /= count;
          b /= count;
          const size_t i = static_cast<size_t>(cy) * cw + cx;
          uPlane[i] = static_cast<uint8_t>(clampByte(((-38 * r - 74 * g + 112 * b + 128) >> 8) + 128));
          vPlane[i] = static_cast<uint8_t>(clampByte(((112 * r - 94 * g - 18 * b + 128) >> 8) + 128));
        }
      }
      return;
    }
    default: {
      // Two bytes per pixel: RGB 565, little-endian.
      for (size_t i = 0; i < n; ++i) {
        const uint8_t* p = src + i * 4;
        const unsigned v = ((p[2] >> 3) << 11) | ((p[1] >> 2) << 5) | (p[0] >> 3);
        dst[i * 2] = static_cast<uint8_t>(v & 0xff);
        dst[i * 2 + 1] = static_cast<uint8_t>(v >> 8);
      }
      return;
    }
  }
}

}  // namespace BitmapFactory
