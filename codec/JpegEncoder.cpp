// JPEG writing through libjpeg-turbo, straight from a 32-bit B, G, R, X
// buffer (cairo's ARGB32 on a little-endian machine): libjpeg-turbo reads
// that layout itself, with its vector colour conversion, so no row is
// converted to RGB by hand and nothing is copied.

#include <csetjmp>
#include <cstdio>
#include <new>

#include <jpeglib.h>

#include "codec/BitmapFactory.h"
#include "codec/CodecLog.h"

namespace BitmapFactory {
namespace {

struct EncodeError {
  jpeg_error_mgr pub;
  jmp_buf jump;
};

void encodeErrorExit(j_common_ptr cinfo) {
  char message[JMSG_LENGTH_MAX];
  (*cinfo->err->format_message)(cinfo, message);
  IVLOG_E("libjpeg: %s", message);
  longjmp(reinterpret_cast<EncodeError*>(cinfo->err)->jump, 1);
}

// On the heap, so that a longjmp skips no destructor.
struct EncodeJob {
  jpeg_compress_struct cinfo;
  EncodeError err;
  bool created = false;
  ~EncodeJob() {
    if (created) jpeg_destroy_compress(&cinfo);
  }
};

}  // namespace

bool writeJpegBgrx(const unsigned char* pixels, int width, int height, int stride, int quality,
                   const std::string& path) {
  if (!pixels || width < 1 || height < 1 || width > kMaxImageSide || height > kMaxImageSide ||
      stride < width * 4 || quality < 1 || quality > 100) {
    IVLOG_E("bad JPEG request %d x %d, stride %d, quality %d", width, height, stride, quality);
    return false;
  }
  FILE* file = fopen(path.c_str(), "wb");
  if (!file) {
    IVLOG_E("cannot create %s", path.c_str());
    return false;
  }
  EncodeJob* job = new (std::nothrow) EncodeJob();
  if (!job) {
    fclose(file);
    return false;
  }
  volatile bool ok = false;
  if (setjmp(job->err.jump) == 0) {
    jpeg_compress_struct& c = job->cinfo;
    c.err = jpeg_std_error(&job->err.pub);
    job->err.pub.error_exit = encodeErrorExit;
    jpeg_create_compress(&c);
    job->created = true;
    jpeg_stdio_dest(&c, file);
    c.image_width = static_cast<JDIMENSION>(width);
    c.image_height = static_cast<JDIMENSION>(height);
    c.input_components = 4;
    c.in_color_space = JCS_EXT_BGRX;
    jpeg_set_defaults(&c);  // YCbCr, 2 x 2 luma sampling (4:2:0), Huffman tables as given
    jpeg_set_quality(&c, quality, TRUE);
    jpeg_start_compress(&c, TRUE);
    while (c.next_scanline < c.image_height) {
      JSAMPROW row = const_cast<JSAMPROW>(pixels + static_cast<size_t>(c.next_scanline) * stride);
      jpeg_write_scanlines(&c, &row, 1);
    }
    jpeg_finish_compress(&c);
    ok = true;
  }
  delete job;
  // A full disk shows here, at the latest.
  const bool written = fflush(file) == 0 && !ferror(file);
  if (fclose(file) != 0 || !written) ok = false;
  if (!ok) IVLOG_E("writing %s failed", path.c_str());
  return ok;
}

}  // namespace BitmapFactory
