#include "codec/BitmapFactory.h"

#include <sys/mman.h>
#include <sys/stat.h>

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include "codec/CodecLog.h"
#include "codec/ImageDecoders.h"

namespace BitmapFactory {

namespace {
struct FileCloser {
  FILE* file;
  ~FileCloser() {
    if (file) fclose(file);
  }
};

// Opens a regular file for reading (a folder opens too, but cannot be read).
FILE* openRegular(const std::string& path) {
  FILE* file = fopen(path.c_str(), "rb");
  if (!file) return nullptr;
  struct stat st;
  if (fstat(fileno(file), &st) != 0 || !S_ISREG(st.st_mode)) {
    fclose(file);
    return nullptr;
  }
  // Decoders read a few kilobytes at a time; a larger buffer saves system calls.
  setvbuf(file, nullptr, _IOFBF, 64 * 1024);
  return file;
}
// Pixel buffers of a few MiB and more ask for transparent huge pages: the
// first write of a decoded photo then takes one page fault per 2 MiB instead
// of 512, and on a virtual machine those faults cost more than decoding the
// pixels' last step.
unsigned char* allocPixels(size_t size, bool zero) {
  constexpr size_t kHuge = 2u << 20;
  if (size < kHuge) return static_cast<unsigned char*>(zero ? calloc(1, size) : malloc(size));
  // Whole huge pages: the tail of the last one would otherwise fall back to
  // small pages.
  const size_t rounded = (size + kHuge - 1) & ~(kHuge - 1);
  void* p = nullptr;
  if (rounded < size || posix_memalign(&p, kHuge, rounded) != 0) return nullptr;
  madvise(p, rounded, MADV_HUGEPAGE);  // only a hint: no huge pages, no harm
  if (zero) memset(p, 0, size);
  return static_cast<unsigned char*>(p);
}

// A bitmap of the size and format whose pixels are left as they come.
Bitmap* createUnclearedBitmap(int width, int height, int format) {
  const size_t size = Bitmap::bufferSize(width, height, format);
  if (size == 0) {
    IVLOG_E("bad size %d x %d", width, height);
    return nullptr;
  }
  Bitmap* bitmap = new (std::nothrow) Bitmap();
  unsigned char* pixels = bitmap ? allocPixels(size, false) : nullptr;
  if (!pixels) {
    IVLOG_E("bitmap malloc fail");
    delete bitmap;
    return nullptr;
  }
  bitmap->adopt(pixels, width, height, format);
  return bitmap;
}
}  // namespace

bool imageSizeAcceptable(long long width, long long height) {
  return width > 0 && height > 0 && width <= kMaxImageSide && height <= kMaxImageSide &&
         width * height <= kMaxImagePixels;
}

int sniffImageType(const unsigned char* b, size_t n) {
  static const unsigned char kPng[8] = {0x89, 'P', 'N', 'G', 0x0D, 0x0A, 0x1A, 0x0A};
  if (n >= 2 && b[0] == 0xFF && b[1] == 0xD8) return IMAGE_TYPE_JPEG;
  if ((n >= 1 && b[0] == 'B') || (n >= 2 && b[1] == 'M')) return IMAGE_TYPE_BMP;
  if (n >= 8 && memcmp(b, kPng, 8) == 0) return IMAGE_TYPE_PNG;
  if (n >= 3 && b[0] == 'G' && b[1] == 'I' && b[2] == 'F') return IMAGE_TYPE_GIF;
  if (n >= 2 && b[0] == 0 && b[1] < 0x80) return IMAGE_TYPE_WBMP;
  return IMAGE_TYPE_UNKNOWN;
}

bool readImageHeader(const std::string& path, ImageHeader& header) {
  FileCloser f{openRegular(path)};
  if (!f.file) return false;
  unsigned char head[8];
  const size_t n = fread(head, 1, sizeof head, f.file);
  header = ImageHeader();
  header.type = sniffImageType(head, n);
  rewind(f.file);
  long long w = 0, h = 0;
  bool ok = true;
  switch (header.type) {
    case IMAGE_TYPE_JPEG:
      ok = readJpegSize(f.file, w, h);
      break;
    case IMAGE_TYPE_BMP:
      ok = readBmpSize(f.file, w, h);
      break;
    case IMAGE_TYPE_PNG:
      ok = readPngSize(f.file, w, h);
      break;
    case IMAGE_TYPE_GIF:
      ok = readGifSize(f.file, w, h);
      break;
    case IMAGE_TYPE_WBMP:
      ok = readWbmpSize(f.file, w, h);
      break;
    default:
      break;
  }
  header.width = w;
  header.height = h;
  return ok;
}

Bitmap* createBitmap(int width, int height, int format) {
  const size_t size = Bitmap::bufferSize(width, height, format);
  if (size == 0) {
    IVLOG_E("bad size %d x %d", width, height);
    return nullptr;
  }
  Bitmap* bitmap = new (std::nothrow) Bitmap();
  if (!bitmap) {
    IVLOG_E("bitmap malloc fail");
    return nullptr;
  }
  unsigned char* pixels = allocPixels(size, true);
  if (!pixels) {
    IVLOG_E("bitmap malloc fail");
    delete bitmap;
    return nullptr;
  }
  bitmap->adopt(pixels, width, height, format);
  return bitmap;
}

long getFileSize(const std::string& path) {
  FileCloser f{openRegular(path)};
  if (!f.file) {
    IVLOG_E("file open fail");
    return 0;
  }
  struct stat st;
  if (fstat(fileno(f.file), &st) != 0 || st.st_size <= 0) {
    IVLOG_E("file length is zero");
    return 0;
  }
  return static_cast<long>(st.st_size);
}

int parseImage(const std::string& path, DecodeOptions& options) {
  if (getFileSize(path) < 1) return 0;
  if (options.handle != 0) {
    IVLOG_E("handle fail");
    return 0;
  }
  ImageHeader header;
  if (!readImageHeader(path, header)) {
    IVLOG_E("CreateDecInfo fail");
    return 0;
  }
  options.outWidth = static_cast<int32_t>(header.width);
  options.outHeight = static_cast<int32_t>(header.height);
  options.imageType = header.type;
  return 1;
}

bool isSupportedType(int type) {
  return type == IMAGE_TYPE_JPEG || type == IMAGE_TYPE_BMP || type == IMAGE_TYPE_GIF ||
         type == IMAGE_TYPE_WBMP || type == IMAGE_TYPE_GIF2;
}

Bitmap* decodeFile(const std::string& path, DecodeOptions& options, int width, int height, int /*flag*/) {
  if (options.handle != 0) {
    IVLOG_E("getHandle fail");
    return nullptr;
  }
  ImageHeader header;
  if (!readImageHeader(path, header)) {
    IVLOG_E("CreateDecInfo fail");
    return nullptr;
  }
  options.outWidth = static_cast<int32_t>(header.width);
  options.outHeight = static_cast<int32_t>(header.height);
  options.imageType = header.type;
  if (!isSupportedType(header.type)) {
    IVLOG_E("not support file type");
    return nullptr;
  }
  if (header.width <= 0 || header.height <= 0) {
    IVLOG_E("not support image resolution");
    return nullptr;
  }
  if (!imageSizeAcceptable(header.width, header.height)) {
    IVLOG_E("not support image resolution (%lld x %lld is too large)", header.width, header.height);
    return nullptr;
  }
  if (width <= 0 || height <= 0 || width >= kMaxDecodeSide || height >= kMaxDecodeSide) {
    IVLOG_E("not support image resolution");
    return nullptr;
  }
  // The JPEG decoder writes every pixel of a 4-byte output (rows a short
  // file lacks are made transparent), so its bitmap needs no clearing first.
  const bool fillsAll = header.type == IMAGE_TYPE_JPEG && Bitmap::bytesPerPixel(options.colorFormat) == 4;
  Bitmap* bitmap = fillsAll ? createUnclearedBitmap(width, height, options.colorFormat)
                            : createBitmap(width, height, options.colorFormat);
  if (!bitmap) return nullptr;

  // The decoders write premultiplied BGRA; other formats are converted after.
  unsigned char* out = bitmap->getPixels();
  unsigned char* scratch = nullptr;
  if (Bitmap::bytesPerPixel(options.colorFormat) != 4) {
    scratch = static_cast<unsigned char*>(malloc(static_cast<size_t>(width) * height * 4));
    if (!scratch) {
      IVLOG_E("Failed to create memory");
      delete bitmap;
      return nullptr;
    }
    out = scratch;
  }
  FileCloser f{openRegular(path)};
  bool ok = false;
  bool known = true;
  if (f.file) {
    switch (header.type) {
      case IMAGE_TYPE_JPEG:
        ok = decodeJpeg(f.file, width, height, out);
        break;
      case IMAGE_TYPE_BMP:
        ok = decodeBmp(f.file, width, height, out);
        break;
      case IMAGE_TYPE_GIF:
      case IMAGE_TYPE_GIF2:
        ok = decodeGif(f.file, width, height, out);
        break;
      case IMAGE_TYPE_WBMP:
        ok = decodeWbmp(f.file, width, height, out);
        break;
      default:
        known = false;
        break;
    }
  }
  if (!known) {
    IVLOG_E("not support image type");
    free(scratch);
    delete bitmap;
    return nullptr;
  }
  if (!ok) {
    IVLOG_E("decoding fail");
    free(scratch);
    delete bitmap;
    return nullptr;
  }
  convertFromBgra(out, width, height, options.colorFormat, bitmap->getPixels());
  free(scratch);
  return bitmap;
}

void rotate(Bitmap& bitmap, int rotation) {
  if (rotation == 0) return;
  unsigned char* src = bitmap.getPixels();
  if (!src) {
    IVLOG_E("Invalid buffer");
    return;
  }
  if (rotation < 0 || rotation > 3) {
    IVLOG_E("unknown rotation %d", rotation);
    return;
  }
  const int format = bitmap.getFormat();
  if (format == BITMAP_FORMAT_YUV420) {
    IVLOG_E("planar format %d cannot be turned", format);
    return;
  }
  const int w = bitmap.getWidth(), h = bitmap.getHeight();
  const int bpp = Bitmap::bytesPerPixel(format);
  const size_t size = bitmap.getByteSize();
  // Every pixel is written below: no need to zero the buffer first.
  unsigned char* dst = allocPixels(size, false);
  if (!dst) {
    IVLOG_E("Failed to create memory");
    return;
  }
  // Walks the source in small tiles so that both buffers stay in cache.
  constexpr int kTile = 32;
  const int nw = (rotation == 2) ? w : h;
  if (bpp == 4) {
    // The usual case (BGRA): whole-pixel loads and stores, no copy call per pixel.
    const uint32_t* s32 = reinterpret_cast<const uint32_t*>(src);
    uint32_t* d32 = reinterpret_cast<uint32_t*>(dst);
    for (int ty = 0; ty < h; ty += kTile) {
      const int yEnd = ty + kTile < h ? ty + kTile : h;
      for (int tx = 0; tx < w; tx += kTile) {
        const int xEnd = tx + kTile < w ? tx + kTile : w;
        for (int y = ty; y < yEnd; ++y) {
          const uint32_t* s = s32 + static_cast<size_t>(y) * w;
          if (rotation == 1) {
            uint32_t* d = d32 + (h - 1 - y);
            for (int x = tx; x < xEnd; ++x) d[static_cast<size_t>(x) * nw] = s[x];
          } else if (rotation == 2) {
            uint32_t* d = d32 + static_cast<size_t>(h - 1 - y) * nw + (w - 1);
            for (int x = tx; x < xEnd; ++x) *(d - x) = s[x];
          } else {
            uint32_t* d = d32 + y;
            for (int x = tx; x < xEnd; ++x) d[static_cast<size_t>(w - 1 - x) * nw] = s[x];
          }
        }
      }
    }
    if (rotation == 2)
      bitmap.adopt(dst, w, h, format);
    else
      bitmap.adopt(dst, h, w, format);
    return;
  }
  for (int ty = 0; ty < h; ty += kTile) {
    for (int tx = 0; tx < w; tx += kTile) {
      const int yEnd = ty + kTile < h ? ty + kTile : h;
      const int xEnd = tx + kTile < w ? tx + kTile : w;
      for (int y = ty; y < yEnd; ++y) {
        const unsigned char* s = src + (static_cast<size_t>(y) * w + tx) * bpp;
        for (int x = tx; x < xEnd; ++x, s += bpp) {
          int nx, ny;
          if (rotation == 1) {  // clockwise: old column x becomes row x, read bottom up
            nx = h - 1 - y;
            ny = x;
          } else if (rotation == 2) {
            nx = w - 1 - x;
            ny = h - 1 - y;
          } else {  // counter-clockwise: old column w-1-i becomes row i
            nx = y;
            ny = w - 1 - x;
          }
          memcpy(dst + (static_cast<size_t>(ny) * nw + nx) * bpp, s, static_cast<size_t>(bpp));
        }
      }
    }
  }
  if (rotation == 2)
    bitmap.adopt(dst, w, h, format);
  else
    bitmap.adopt(dst, h, w, format);
}

Bitmap* clone(Bitmap& bitmap) {
  if (!bitmap.getPixels()) {
    IVLOG_E("Invalid buffer");
    return nullptr;
  }
  Bitmap* copy = createBitmap(bitmap.getWidth(), bitmap.getHeight(), bitmap.getFormat());
  if (!copy) {
    IVLOG_E("Failed to create bitmap");
    return nullptr;
  }
  if (!copy->getPixels()) {
    IVLOG_E("Failed to create memory");
    delete copy;
    return nullptr;
  }
  memcpy(copy->getPixels(), bitmap.getPixels(), bitmap.getByteSize());
  return copy;
}

}  // namespace BitmapFactory
