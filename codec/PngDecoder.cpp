// PNG through libpng, one row at a time: every row goes straight into the
// Resampler, so a large PNG never sits in memory at full size. An
// interlaced PNG cannot be read that way (its rows arrive in seven passes):
// up to 16 MP it is read whole, beyond that only its last pass, which holds
// every odd row at full width.

#include <csetjmp>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include <png.h>

#include "codec/BitmapFactory.h"
#include "codec/CodecLog.h"
#include "codec/ImageDecoders.h"
#include "codec/Resampler.h"

namespace BitmapFactory {

namespace {
constexpr long long kMaxWholeInterlacedPixels = 16LL * 1000 * 1000;

void pngError(png_structp png, png_const_charp message) {
  IVLOG_E("libpng: %s", message);
  png_longjmp(png, 1);
}

void pngWarning(png_structp, png_const_charp message) {
  IVLOG_D("libpng: %s", message);
}
}  // namespace

// The open PNG decoder between initPNGFile and decodePNG; closes itself.
struct PngReader {
  FILE* file = nullptr;
  png_structp png = nullptr;
  png_infop info = nullptr;
  int width = 0;
  int height = 0;
  bool interlaced = false;
  bool hasAlpha = false;
  // Working buffers, released with the reader (also after a longjmp).
  Resampler* resampler = nullptr;
  uint8_t* row = nullptr;
  uint8_t* whole = nullptr;
  uint8_t** rowPointers = nullptr;
  uint8_t* converted = nullptr;

  ~PngReader() {
    if (png) png_destroy_read_struct(&png, info ? &info : nullptr, nullptr);
    if (file) fclose(file);
    delete resampler;
    free(row);
    free(whole);
    free(rowPointers);
    free(converted);
  }
};

namespace {
// Opens the file and reads the header; the reader is left with libpng
// ready to deliver rows (B, G, R, A, 8 bits) when `transforms` is set.
bool openPng(PngReader& r, FILE* file, bool transforms) {
  r.png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, pngError, pngWarning);
  if (!r.png) return false;
  r.info = png_create_info_struct(r.png);
  if (!r.info) return false;
  if (setjmp(png_jmpbuf(r.png))) return false;
  png_set_user_limits(r.png, 1000000, 1000000);
  png_set_chunk_malloc_max(r.png, 16 * 1024 * 1024);
  png_init_io(r.png, file);
  png_read_info(r.png, r.info);
  png_uint_32 w = 0, h = 0;
  int depth = 0, colorType = 0, interlace = 0;
  png_get_IHDR(r.png, r.info, &w, &h, &depth, &colorType, &interlace, nullptr, nullptr);
  r.width = static_cast<int>(w);
  r.height = static_cast<int>(h);
  r.interlaced = interlace != PNG_INTERLACE_NONE;
  if (!transforms) return true;
  r.hasAlpha = (colorType & PNG_COLOR_MASK_ALPHA) || png_get_valid(r.png, r.info, PNG_INFO_tRNS);
  png_set_expand(r.png);
  if (depth == 16) png_set_strip_16(r.png);
  if (!(colorType & PNG_COLOR_MASK_COLOR)) png_set_gray_to_rgb(r.png);
  png_set_bgr(r.png);
  if (!r.hasAlpha) png_set_filler(r.png, 0xff, PNG_FILLER_AFTER);
  if (r.interlaced && static_cast<long long>(w) * h <= kMaxWholeInterlacedPixels)
    png_set_interlace_handling(r.png);
  png_read_update_info(r.png, r.info);
  if (png_get_rowbytes(r.png, r.info) != static_cast<size_t>(r.width) * 4) {
    IVLOG_E("unexpected row size %zu for width %d", png_get_rowbytes(r.png, r.info), r.width);
    return false;
  }
  return true;
}

// Reads every row into the resampler. Returns false after a libpng error.
bool readRows(PngReader& r, int outW, int outH, uint8_t* out) {
  if (setjmp(png_jmpbuf(r.png))) return false;
  const size_t rowBytes = static_cast<size_t>(r.width) * 4;
  const long long pixels = static_cast<long long>(r.width) * r.height;
  if (!r.interlaced) {
    r.resampler = new (std::nothrow) Resampler(r.width, r.height, outW, outH, out);
    r.row = static_cast<uint8_t*>(malloc(rowBytes));
    if (!r.resampler || !r.resampler->ok() || !r.row) return false;
    for (int y = 0; y < r.height; ++y) {
      png_read_row(r.png, r.row, nullptr);
      if (r.hasAlpha) premultiplyRow(r.row, r.width);
      r.resampler->pushRow(r.row);
    }
    return true;
  }
  if (pixels <= kMaxWholeInterlacedPixels) {
    // libpng merges the seven passes into the whole image (interlace
    // handling was turned on when the file was opened).
    r.whole = static_cast<uint8_t*>(malloc(rowBytes * r.height));
    r.rowPointers = static_cast<uint8_t**>(malloc(sizeof(uint8_t*) * r.height));
    r.resampler = new (std::nothrow) Resampler(r.width, r.height, outW, outH, out);
    if (!r.whole || !r.rowPointers || !r.resampler || !r.resampler->ok()) return false;
    for (int y = 0; y < r.height; ++y) r.rowPointers[y] = r.whole + rowBytes * y;
    png_read_image(r.png, r.rowPointers);
    for (int y = 0; y < r.height; ++y) {
      if (r.hasAlpha) premultiplyRow(r.rowPointers[y], r.width);
      r.resampler->pushRow(r.rowPointers[y]);
    }
    return true;
  }
  // Large and interlaced: without interlace handling libpng hands out each
  // pass as its own small image; the last pass is every odd row, full width.
  const int lastRows = static_cast<int>(PNG_PASS_ROWS(r.height, 6));
  if (lastRows == 0) {
    IVLOG_E("interlaced %d x %d image too large", r.width, r.height);
    return false;
  }
  r.resampler = new (std::nothrow) Resampler(r.width, lastRows, outW, outH, out);
  r.row = static_cast<uint8_t*>(malloc(rowBytes));
  if (!r.resampler || !r.resampler->ok() || !r.row) return false;
  for (int pass = 0; pass < 7; ++pass) {
    const int rows = static_cast<int>(PNG_PASS_ROWS(r.height, pass));
    const int cols = static_cast<int>(PNG_PASS_COLS(r.width, pass));
    if (rows == 0 || cols == 0) continue;
    for (int y = 0; y < rows; ++y) {
      png_read_row(r.png, r.row, nullptr);
      if (pass != 6) continue;
      if (r.hasAlpha) premultiplyRow(r.row, r.width);
      r.resampler->pushRow(r.row);
    }
  }
  return true;
}
}  // namespace

bool readPngSize(FILE* file, long long& width, long long& height) {
  PngReader* r = new (std::nothrow) PngReader();
  if (!r) return false;
  const bool ok = openPng(*r, file, false);
  if (ok) {
    width = r->width;
    height = r->height;
  }
  delete r;
  return ok;
}

int initPNGFile(DecodeOptions& options, const std::string& path) {
  if (options.handle != 0) {
    IVLOG_E("getHandle fail");
    return 0;
  }
  options.png.reset();
  std::shared_ptr<PngReader> r(new (std::nothrow) PngReader());
  if (!r) return 0;
  r->file = fopen(path.c_str(), "rb");
  if (!r->file) {
    IVLOG_E("file open fail");
    return 0;
  }
  if (!openPng(*r, r->file, true)) {
    IVLOG_E("CreateDecInfo fail");
    return 0;
  }
  if (!imageSizeAcceptable(r->width, r->height)) {
    IVLOG_E("not support image resolution %d x %d", r->width, r->height);
    return 0;
  }
  options.outWidth = r->width;
  options.outHeight = r->height;
  options.imageType = IMAGE_TYPE_PNG;
  options.pngWidth = r->width;
  options.pngHeight = r->height;
  options.pngPasses = r->interlaced ? 7 : 1;
  options.png = r;
  return 1;
}

int decodePNG(DecodeOptions& options, Bitmap& bitmap, int width, int height) {
  std::shared_ptr<PngReader> r = std::move(options.png);
  options.png.reset();
  options.pngWidth = options.pngHeight = options.pngPasses = 0;
  if (!r) {
    IVLOG_E("no PNG opened");
    return 0;
  }
  if (!bitmap.getPixels() || width <= 0 || height <= 0 || bitmap.getWidth() != width ||
      bitmap.getHeight() != height) {
    IVLOG_E("bitmap %d x %d does not fit %d x %d", bitmap.getWidth(), bitmap.getHeight(), width, height);
    return 0;
  }
  if (bitmap.getFormat() != options.colorFormat) {
    IVLOG_E("bitmap format %d, asked for %d", bitmap.getFormat(), options.colorFormat);
    return 0;
  }
  uint8_t* out = bitmap.getPixels();
  if (Bitmap::bytesPerPixel(bitmap.getFormat()) != 4) {
    r->converted = static_cast<uint8_t*>(malloc(static_cast<size_t>(width) * height * 4));
    if (!r->converted) {
      IVLOG_E("Failed to create memory");
      return 0;
    }
    out = r->converted;
  }
  if (!readRows(*r, width, height, out)) {
    IVLOG_E("decoding fail");
    return 0;
  }
  r->resampler->finish();
  convertFromBgra(out, width, height, bitmap.getFormat(), bitmap.getPixels());
  return 1;
}

}  // namespace BitmapFactory
