#pragma once
// Test pictures made on the fly: JPEG through libjpeg-turbo (with an EXIF
// orientation written by libexif, or raw EXIF bytes for broken cases), PNG
// through libpng row by row (so large ones cost no memory), GIF through
// giflib, BMP and WBMP by hand. Pixels come from a function of (x, y) so
// tests can check where each part of the picture ended up.

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

// jpeglib.h needs size_t and FILE declared first.
#include <gif_lib.h>
#include <jpeglib.h>
#include <libexif/exif-data.h>
#include <png.h>

namespace pictavo::test {

struct Rgba {
  uint8_t r, g, b, a;
};
using PixelFn = std::function<Rgba(int x, int y)>;

// Four flat quadrants (red, green, blue, white): after any turn or mirror
// the corners tell where the picture went.
inline PixelFn quadrants(int w, int h) {
  return [w, h](int x, int y) -> Rgba {
    const bool right = x >= w / 2, bottom = y >= h / 2;
    if (!right && !bottom) return {255, 0, 0, 255};
    if (right && !bottom) return {0, 255, 0, 255};
    if (!right && bottom) return {0, 0, 255, 255};
    return {255, 255, 255, 255};
  };
}

// Smooth colour waves plus pseudo-random noise, about what a camera gives.
inline PixelFn photoLike(unsigned seed) {
  return [seed](int x, int y) -> Rgba {
    uint32_t n =
        (static_cast<uint32_t>(x) * 374761393u + static_cast<uint32_t>(y) * 668265263u + seed * 2246822519u);
    n = (n ^ (n >> 13)) * 1274126177u;
    const int noise = static_cast<int>((n >> 24) & 31) - 16;
    auto clamp = [](int v) { return static_cast<uint8_t>(v < 0 ? 0 : (v > 255 ? 255 : v)); };
    const int r = 128 + ((x / 7 + y / 13 + static_cast<int>(seed) * 17) % 100) + noise;
    const int g = 100 + ((x / 11 + static_cast<int>(seed) * 5) % 120) - noise;
    const int b = 60 + ((y / 5) % 150) + noise / 2;
    return {clamp(r - 50), clamp(g), clamp(b), 255};
  };
}

// An EXIF block (starting "Exif\0\0") holding just the orientation, made by libexif.
inline std::vector<uint8_t> exifWithOrientation(int orientation) {
  ExifData* exif = exif_data_new();
  exif_data_set_byte_order(exif, EXIF_BYTE_ORDER_INTEL);
  ExifEntry* entry = exif_entry_new();
  exif_content_add_entry(exif->ifd[EXIF_IFD_0], entry);
  exif_entry_initialize(entry, EXIF_TAG_ORIENTATION);
  exif_set_short(entry->data, EXIF_BYTE_ORDER_INTEL, static_cast<ExifShort>(orientation));
  exif_entry_unref(entry);
  unsigned char* data = nullptr;
  unsigned int size = 0;
  exif_data_save_data(exif, &data, &size);
  std::vector<uint8_t> out(data, data + size);
  free(data);
  exif_data_unref(exif);
  if (out.size() < 6 || memcmp(out.data(), "Exif\0\0", 6) != 0) {
    static const uint8_t kHeader[6] = {'E', 'x', 'i', 'f', 0, 0};
    out.insert(out.begin(), kHeader, kHeader + 6);
  }
  return out;
}

struct JpegOptions {
  int quality = 92;
  bool progressive = false;
  bool grayscale = false;
  bool cmyk = false;          // r, g, b, a of the pixel are written as C, M, Y, K (Adobe, inverted)
  std::vector<uint8_t> app1;  // EXIF block, written as APP1 when not empty
};

inline bool writeJpeg(const std::string& path, int w, int h, const PixelFn& pixel,
                      const JpegOptions& o = {}) {
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return false;
  jpeg_compress_struct c;
  jpeg_error_mgr err;
  c.err = jpeg_std_error(&err);
  jpeg_create_compress(&c);
  jpeg_stdio_dest(&c, f);
  c.image_width = static_cast<JDIMENSION>(w);
  c.image_height = static_cast<JDIMENSION>(h);
  c.input_components = o.grayscale ? 1 : (o.cmyk ? 4 : 3);
  c.in_color_space = o.grayscale ? JCS_GRAYSCALE : (o.cmyk ? JCS_CMYK : JCS_RGB);
  jpeg_set_defaults(&c);
  jpeg_set_quality(&c, o.quality, TRUE);
  if (o.progressive) jpeg_simple_progression(&c);
  jpeg_start_compress(&c, TRUE);
  if (!o.app1.empty())
    jpeg_write_marker(&c, JPEG_APP0 + 1, o.app1.data(), static_cast<unsigned>(o.app1.size()));
  std::vector<uint8_t> row(static_cast<size_t>(w) * 4);
  while (c.next_scanline < c.image_height) {
    const int y = static_cast<int>(c.next_scanline);
    for (int x = 0; x < w; ++x) {
      const Rgba p = pixel(x, y);
      if (o.grayscale) {
        row[x] = p.g;
      } else if (o.cmyk) {
        row[x * 4] = p.r;
        row[x * 4 + 1] = p.g;
        row[x * 4 + 2] = p.b;
        row[x * 4 + 3] = p.a;
      } else {
        row[x * 3] = p.r;
        row[x * 3 + 1] = p.g;
        row[x * 3 + 2] = p.b;
      }
    }
    JSAMPROW r = row.data();
    jpeg_write_scanlines(&c, &r, 1);
  }
  jpeg_finish_compress(&c);
  jpeg_destroy_compress(&c);
  fclose(f);
  return true;
}

struct PngOptions {
  bool alpha = false;
  bool interlaced = false;
  bool palette = false;  // 8-bit palette of the first 256 colours met (tests use few colours)
};

inline bool writePng(const std::string& path, int w, int h, const PixelFn& pixel, const PngOptions& o = {}) {
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return false;
  png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
  png_infop info = png_create_info_struct(png);
  if (setjmp(png_jmpbuf(png))) {
    png_destroy_write_struct(&png, &info);
    fclose(f);
    return false;
  }
  png_init_io(png, f);
  png_set_compression_level(png, 1);
  const int type = o.alpha ? PNG_COLOR_TYPE_RGB_ALPHA : PNG_COLOR_TYPE_RGB;
  png_set_IHDR(png, info, static_cast<png_uint_32>(w), static_cast<png_uint_32>(h), 8, type,
               o.interlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_DEFAULT,
               PNG_FILTER_TYPE_DEFAULT);
  png_write_info(png, info);
  const int channels = o.alpha ? 4 : 3;
  const int passes = o.interlaced ? png_set_interlace_handling(png) : 1;
  std::vector<uint8_t> row(static_cast<size_t>(w) * channels);
  for (int pass = 0; pass < passes; ++pass) {
    for (int y = 0; y < h; ++y) {
      for (int x = 0; x < w; ++x) {
        const Rgba p = pixel(x, y);
        uint8_t* d = &row[static_cast<size_t>(x) * channels];
        d[0] = p.r;
        d[1] = p.g;
        d[2] = p.b;
        if (o.alpha) d[3] = p.a;
      }
      png_write_row(png, row.data());
    }
  }
  png_write_end(png, info);
  png_destroy_write_struct(&png, &info);
  fclose(f);
  return true;
}

inline bool writeBytes(const std::string& path, const std::vector<uint8_t>& bytes) {
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return false;
  const bool ok = bytes.empty() || fwrite(bytes.data(), 1, bytes.size(), f) == bytes.size();
  fclose(f);
  return ok;
}

inline std::vector<uint8_t> readBytes(const std::string& path) {
  std::vector<uint8_t> out;
  FILE* f = fopen(path.c_str(), "rb");
  if (!f) return out;
  uint8_t buf[65536];
  size_t n;
  while ((n = fread(buf, 1, sizeof buf, f)) > 0) out.insert(out.end(), buf, buf + n);
  fclose(f);
  return out;
}

inline void put16(std::vector<uint8_t>& v, uint32_t x) {
  v.push_back(x & 0xff);
  v.push_back((x >> 8) & 0xff);
}
inline void put32(std::vector<uint8_t>& v, uint32_t x) {
  put16(v, x & 0xffff);
  put16(v, x >> 16);
}

// A BITMAPINFOHEADER file: 24 or 32 bits per pixel, or 8 bits with a palette
// of `paletteSize` grey levels (pixel = index function). Negative height
// gives top-down rows.
inline std::vector<uint8_t> makeBmp(int w, int h, int bpp, const PixelFn& pixel, int paletteSize = 256,
                                    const std::function<int(int, int)>& index = nullptr) {
  const int absH = h < 0 ? -h : h;
  const size_t stride = ((static_cast<size_t>(w) * bpp + 31) / 32) * 4;
  const uint32_t paletteBytes = bpp <= 8 ? static_cast<uint32_t>(paletteSize) * 4 : 0;
  const uint32_t offset = 14 + 40 + paletteBytes;
  std::vector<uint8_t> v;
  v.push_back('B');
  v.push_back('M');
  put32(v, offset + static_cast<uint32_t>(stride * absH));
  put32(v, 0);
  put32(v, offset);
  put32(v, 40);
  put32(v, static_cast<uint32_t>(w));
  put32(v, static_cast<uint32_t>(h));
  put16(v, 1);
  put16(v, static_cast<uint32_t>(bpp));
  put32(v, 0);
  put32(v, static_cast<uint32_t>(stride * absH));
  put32(v, 2835);
  put32(v, 2835);
  put32(v, bpp <= 8 ? static_cast<uint32_t>(paletteSize) : 0);
  put32(v, 0);
  for (uint32_t i = 0; i < paletteBytes / 4; ++i) {
    v.push_back(static_cast<uint8_t>(i));
    v.push_back(static_cast<uint8_t>(i));
    v.push_back(static_cast<uint8_t>(i));
    v.push_back(0);
  }
  for (int fileRow = 0; fileRow < absH; ++fileRow) {
    const int y = h < 0 ? fileRow : absH - 1 - fileRow;
    std::vector<uint8_t> row(stride, 0);
    for (int x = 0; x < w; ++x) {
      if (bpp == 8) {
        row[x] = static_cast<uint8_t>(index ? index(x, y) : pixel(x, y).g);
      } else {
        const Rgba p = pixel(x, y);
        uint8_t* d = &row[static_cast<size_t>(x) * (bpp / 8)];
        d[0] = p.b;
        d[1] = p.g;
        d[2] = p.r;
        if (bpp == 32) d[3] = 0;
      }
    }
    v.insert(v.end(), row.begin(), row.end());
  }
  return v;
}

inline std::vector<uint8_t> makeWbmp(int w, int h, const std::function<bool(int, int)>& white) {
  std::vector<uint8_t> v = {0, 0};
  auto mbi = [&v](uint32_t x) {
    uint8_t tmp[5];
    int n = 0;
    do {
      tmp[n++] = x & 0x7f;
      x >>= 7;
    } while (x);
    while (n > 1) v.push_back(tmp[--n] | 0x80);
    v.push_back(tmp[0]);
  };
  mbi(static_cast<uint32_t>(w));
  mbi(static_cast<uint32_t>(h));
  for (int y = 0; y < h; ++y) {
    std::vector<uint8_t> row((w + 7) / 8, 0);
    for (int x = 0; x < w; ++x)
      if (white(x, y)) row[x / 8] |= static_cast<uint8_t>(0x80 >> (x % 8));
    v.insert(v.end(), row.begin(), row.end());
  }
  return v;
}

// A GIF of w x h with a 4-colour table (red, green, blue, black); colour 3
// transparent when `transparent` is set. `images` = 0 writes none.
inline bool writeGif(const std::string& path, int w, int h, const std::function<int(int, int)>& index,
                     bool transparent = false, int images = 1, bool interlaced = false) {
  int error = 0;
  GifFileType* gif = EGifOpenFileName(path.c_str(), false, &error);
  if (!gif) return false;
  GifColorType colours[4] = {{255, 0, 0}, {0, 255, 0}, {0, 0, 255}, {0, 0, 0}};
  ColorMapObject* map = GifMakeMapObject(4, colours);
  EGifSetGifVersion(gif, true);
  bool ok = EGifPutScreenDesc(gif, w, h, 2, 0, map) == GIF_OK;
  for (int i = 0; ok && i < images; ++i) {
    if (transparent) {
      GraphicsControlBlock gcb = {0, false, 0, 3};
      GifByteType ext[4];
      const size_t len = EGifGCBToExtension(&gcb, ext);
      ok = EGifPutExtension(gif, GRAPHICS_EXT_FUNC_CODE, static_cast<int>(len), ext) == GIF_OK;
    }
    ok = ok && EGifPutImageDesc(gif, 0, 0, w, h, interlaced, nullptr) == GIF_OK;
    std::vector<GifPixelType> line(w);
    if (!interlaced) {
      for (int y = 0; ok && y < h; ++y) {
        for (int x = 0; x < w; ++x) line[x] = static_cast<GifPixelType>(index(x, y));
        ok = EGifPutLine(gif, line.data(), w) == GIF_OK;
      }
    } else {
      static const int kStart[4] = {0, 4, 2, 1}, kStep[4] = {8, 8, 4, 2};
      for (int p = 0; ok && p < 4; ++p) {
        for (int y = kStart[p]; ok && y < h; y += kStep[p]) {
          for (int x = 0; x < w; ++x) line[x] = static_cast<GifPixelType>(index(x, y));
          ok = EGifPutLine(gif, line.data(), w) == GIF_OK;
        }
      }
    }
  }
  GifFreeMapObject(map);
  EGifCloseFile(gif, &error);
  return ok;
}

}  // namespace pictavo::test
