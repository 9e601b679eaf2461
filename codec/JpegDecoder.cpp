// JPEG through libjpeg-turbo. The DCT scales the image down by M/8 while
// decoding; the smallest scale still at least the target size is chosen, and
// the Resampler brings it to the exact size. A 12 MP photo for a phone
// screen is thus decoded at a quarter of its size, and the full-size image
// never exists in memory.

#include <sys/stat.h>

#include <csetjmp>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

#include <jpeglib.h>
// After jpeglib.h, which it needs.
#include <jerror.h>

#include "codec/CodecLog.h"
#include "codec/ImageDecoders.h"
#include "codec/Resampler.h"

namespace BitmapFactory {
namespace {

// A corrupt progressive file may carry thousands of tiny scans, each making
// the decoder pass over the whole coefficient buffer; no real encoder writes
// more than a few dozen.
constexpr int kMaxScans = 500;
// Working memory libjpeg may take (the coefficient buffer of a progressive
// image is the large part: about 72 MB for 24 MP at 4:2:0).
constexpr long kMaxDecoderMemory = 400L * 1024 * 1024;
// The file is read in chunks of this size: libjpeg-turbo's fast Huffman
// decoder runs only while a few kilobytes of data lie ahead in its buffer,
// which the 4 KiB of libjpeg's own stdio source allow for a quarter of the
// time and a chunk this large almost always. Reading the whole file instead
// would cost fresh memory as large as the file for every photo decoded at
// once. Read, not mapped: a file cut short by another program while it is
// decoded must give an error, not SIGBUS.
constexpr size_t kChunkBytes = 256 * 1024;

struct ErrorManager {
  jpeg_error_mgr pub;
  jmp_buf jump;
};

void errorExit(j_common_ptr cinfo) {
  char message[JMSG_LENGTH_MAX];
  (*cinfo->err->format_message)(cinfo, message);
  IVLOG_E("libjpeg: %s", message);
  longjmp(reinterpret_cast<ErrorManager*>(cinfo->err)->jump, 1);
}

void outputMessage(j_common_ptr cinfo) {
  char message[JMSG_LENGTH_MAX];
  (*cinfo->err->format_message)(cinfo, message);
  IVLOG_D("libjpeg: %s", message);
}

void progress(j_common_ptr cinfo) {
  if (!cinfo->is_decompressor) return;
  auto* dinfo = reinterpret_cast<j_decompress_ptr>(cinfo);
  if (dinfo->input_scan_number > kMaxScans) {
    IVLOG_E("more than %d scans", kMaxScans);
    longjmp(reinterpret_cast<ErrorManager*>(cinfo->err)->jump, 1);
  }
}

// libjpeg's stdio source with a larger buffer.
struct ChunkSource {
  jpeg_source_mgr pub;
  FILE* file = nullptr;
  JOCTET* buffer = nullptr;
  size_t capacity = 0;
  bool atStart = true;
};

void initSource(j_decompress_ptr) {}
void termSource(j_decompress_ptr) {}

boolean fillInputBuffer(j_decompress_ptr cinfo) {
  auto* src = reinterpret_cast<ChunkSource*>(cinfo->src);
  size_t n = fread(src->buffer, 1, src->capacity, src->file);
  if (n == 0) {
    if (src->atStart) ERREXIT(cinfo, JERR_INPUT_EMPTY);
    // A file cut short: end it with an EOI marker, so the rows missing come
    // out blank instead of the decoder reading on.
    WARNMS(cinfo, JWRN_JPEG_EOF);
    src->buffer[0] = 0xFF;
    src->buffer[1] = JPEG_EOI;
    n = 2;
  }
  src->pub.next_input_byte = src->buffer;
  src->pub.bytes_in_buffer = n;
  src->atStart = false;
  return TRUE;
}

void skipInputData(j_decompress_ptr cinfo, long count) {
  if (count <= 0) return;
  jpeg_source_mgr* src = cinfo->src;
  size_t left = static_cast<size_t>(count);
  while (left > src->bytes_in_buffer) {
    left -= src->bytes_in_buffer;
    fillInputBuffer(cinfo);
  }
  src->next_input_byte += left;
  src->bytes_in_buffer -= left;
}

// Everything that must be released after a longjmp lives here, on the heap,
// so that no C++ object with a destructor is skipped over.
struct JpegJob {
  jpeg_decompress_struct cinfo;
  ErrorManager err;
  jpeg_progress_mgr progress;
  bool created = false;
  Resampler* resampler = nullptr;
  uint8_t* rows = nullptr;
  uint8_t* converted = nullptr;
  ChunkSource source;
  ~JpegJob() {
    if (created) jpeg_destroy_decompress(&cinfo);
    free(source.buffer);
    delete resampler;
    free(rows);
    free(converted);
  }
};

void setUp(JpegJob& job, FILE* file) {
  job.cinfo.err = jpeg_std_error(&job.err.pub);
  job.err.pub.error_exit = errorExit;
  job.err.pub.output_message = outputMessage;
  jpeg_create_decompress(&job.cinfo);
  job.created = true;
  job.cinfo.mem->max_memory_to_use = kMaxDecoderMemory;
  job.progress.progress_monitor = progress;
  job.cinfo.progress = &job.progress;
  ChunkSource& src = job.source;
  if (!src.buffer) {
    jpeg_stdio_src(&job.cinfo, file);
    return;
  }
  src.file = file;
  src.pub.init_source = initSource;
  src.pub.fill_input_buffer = fillInputBuffer;
  src.pub.skip_input_data = skipInputData;
  src.pub.resync_to_restart = jpeg_resync_to_restart;
  src.pub.term_source = termSource;
  src.pub.bytes_in_buffer = 0;
  src.pub.next_input_byte = nullptr;
  job.cinfo.src = &src.pub;
}

// Adobe CMYK/YCCK files store inverted inks; K scales the other three.
void cmykToBgra(const uint8_t* src, uint8_t* dst, int width, bool inverted) {
  for (int x = 0; x < width; ++x, src += 4, dst += 4) {
    int c = src[0], m = src[1], y = src[2], k = src[3];
    if (!inverted) {
      c = 255 - c;
      m = 255 - m;
      y = 255 - y;
      k = 255 - k;
    }
    dst[0] = static_cast<uint8_t>((y * k + 127) / 255);
    dst[1] = static_cast<uint8_t>((m * k + 127) / 255);
    dst[2] = static_cast<uint8_t>((c * k + 127) / 255);
    dst[3] = 255;
  }
}

}  // namespace

bool readJpegSize(FILE* file, long long& width, long long& height) {
  JpegJob* job = new (std::nothrow) JpegJob();
  if (!job) return false;
  volatile bool ok = false;
  if (setjmp(job->err.jump) == 0) {
    setUp(*job, file);
    jpeg_read_header(&job->cinfo, TRUE);
    width = job->cinfo.image_width;
    height = job->cinfo.image_height;
    ok = true;
  }
  delete job;
  return ok;
}

bool decodeJpeg(FILE* file, int outW, int outH, uint8_t* out) {
  JpegJob* job = new (std::nothrow) JpegJob();
  if (!job) return false;
  // A small file needs no buffer larger than itself.
  struct stat st {};
  size_t capacity = kChunkBytes;
  if (fstat(fileno(file), &st) == 0 && st.st_size > 0 && static_cast<size_t>(st.st_size) < capacity)
    capacity = static_cast<size_t>(st.st_size) + 2;  // room for the EOI a short file is given
  job->source.buffer = static_cast<JOCTET*>(malloc(capacity));
  job->source.capacity = capacity;
  if (!job->source.buffer) {
    IVLOG_E("no memory to read the file");
    delete job;
    return false;
  }
  volatile bool ok = false;
  if (setjmp(job->err.jump) == 0) {
    setUp(*job, file);
    jpeg_decompress_struct& cinfo = job->cinfo;
    jpeg_read_header(&cinfo, TRUE);
    if (!imageSizeAcceptable(cinfo.image_width, cinfo.image_height)) {
      IVLOG_E("refused %u x %u", cinfo.image_width, cinfo.image_height);
      delete job;
      return false;
    }
    const bool cmyk = cinfo.jpeg_color_space == JCS_CMYK || cinfo.jpeg_color_space == JCS_YCCK;
    cinfo.out_color_space = cmyk ? JCS_CMYK : JCS_EXT_BGRA;
    // The picture is reduced further after decoding, so the smoother chroma
    // upsampling buys nothing visible; the merged one is cheaper.
    cinfo.do_fancy_upsampling = FALSE;
    cinfo.scale_denom = 8;
    for (unsigned m = 1; m <= 8; ++m) {
      cinfo.scale_num = m;
      jpeg_calc_output_dimensions(&cinfo);
      if (cinfo.output_width >= static_cast<unsigned>(outW) &&
          cinfo.output_height >= static_cast<unsigned>(outH))
        break;
    }
    jpeg_start_decompress(&cinfo);
    const int w = static_cast<int>(cinfo.output_width);
    const int h = static_cast<int>(cinfo.output_height);
    if (!cmyk && w == outW && h == outH) {
      // The DCT scale gives the target size itself: libjpeg writes straight
      // into the output, with no row buffer and no copy. Rows a short file
      // never delivers are made transparent, like the resampler's finish().
      JSAMPROW pointers[16];
      const int batch =
          cinfo.rec_outbuf_height > 0 && cinfo.rec_outbuf_height < 16 ? cinfo.rec_outbuf_height : 1;
      while (cinfo.output_scanline < cinfo.output_height) {
        const int y = static_cast<int>(cinfo.output_scanline);
        const int n = batch < h - y ? batch : h - y;
        for (int i = 0; i < n; ++i) pointers[i] = out + static_cast<size_t>(y + i) * w * 4;
        if (jpeg_read_scanlines(&cinfo, pointers, static_cast<JDIMENSION>(n)) == 0) break;
      }
      const size_t done = cinfo.output_scanline;
      if (done < static_cast<size_t>(h))
        memset(out + done * w * 4, 0, (static_cast<size_t>(h) - done) * w * 4);
      jpeg_abort_decompress(&cinfo);
      delete job;
      return true;
    }
    const int batch = cinfo.rec_outbuf_height > 0 ? cinfo.rec_outbuf_height : 1;
    job->resampler = new (std::nothrow) Resampler(w, h, outW, outH, out);
    job->rows = static_cast<uint8_t*>(malloc(static_cast<size_t>(w) * 4 * batch));
    if (cmyk) job->converted = static_cast<uint8_t*>(malloc(static_cast<size_t>(w) * 4));
    if (!job->resampler || !job->resampler->ok() || !job->rows || (cmyk && !job->converted)) {
      IVLOG_E("no memory for a %d x %d decode", w, h);
      delete job;
      return false;
    }
    JSAMPROW pointers[16];
    for (int i = 0; i < batch && i < 16; ++i) pointers[i] = job->rows + static_cast<size_t>(i) * w * 4;
    while (cinfo.output_scanline < cinfo.output_height) {
      const int got = static_cast<int>(jpeg_read_scanlines(&cinfo, pointers, batch < 16 ? batch : 16));
      if (got <= 0) break;
      for (int i = 0; i < got; ++i) {
        if (cmyk) {
          cmykToBgra(pointers[i], job->converted, w, cinfo.saw_Adobe_marker);
          job->resampler->pushRow(job->converted);
        } else {
          job->resampler->pushRow(pointers[i]);
        }
      }
    }
    job->resampler->finish();
    // The rest of the file (trailing markers) is of no interest.
    jpeg_abort_decompress(&cinfo);
    ok = true;
  }
  delete job;
  return ok;
}

}  // namespace BitmapFactory
