#pragma once
// The effects engine: photo effects, a bilinear resize and the strength
// blends, all on caller-owned 32-bit pixel buffers. No state is kept between
// calls and the source is never written, so every function may run on any
// thread, also on the same source from several threads at once.

#include <cstdint>

// Pixel format codes. 8 and 9 are the 32-bit formats the effects accept.
enum {
  IE_FORMAT_INVALID = 0,
  IE_FORMAT_BGRA8888 = 8,  // memory order A, R, G, B (the filter's "BA24" surface format)
  IE_FORMAT_ARGB8888 = 9,  // memory order B, G, R, A (evas and cairo ARGB32)
  IE_FORMAT_MAX = 9,
};

// Return codes.
enum {
  IE_ERROR_NONE = 0,
  IE_ERROR_INVALID_PARAMETER = 1,  // null record or buffer; blend strength out of range
  IE_ERROR_FILTER_FAILED = 2,      // the image filter could not run (memory, unknown code)
  IE_ERROR_INVALID_SIZE = 3,       // width or height not positive
  IE_ERROR_INVALID_FORMAT = 4,     // format code outside 1..9, or not 32-bit where 32-bit is needed
};

// A pixel buffer described by the caller, who owns the memory; rows packed.
struct IeImageInfo {
  int width;
  int height;
  uint16_t format;
  unsigned char* pbBuf;
};

// Filter code of an effect number: the table entry for 0..36, 400 above.
int16_t IE_Engine_Filter_Code(int effectNumber);

// Applies an effect from src into dst, whose pbBuf holds src width x height
// x 4 bytes. On success dst takes the source size and format (8, or 9 for a
// source in 9). The source buffer is left untouched.
int IE_Engine_Apply_Effect(IeImageInfo* src, IeImageInfo* dst, int effectNumber);

// Bilinear resize of 32-bit pixels from src into dst (dst width x height);
// the format fields are not read, so channel order is preserved.
int IEL_resize_image(IeImageInfo* src, IeImageInfo* dst);

// dst = dst x (255 - a) + src x a, >> 8, with a = alpha% of 255, over the
// first three bytes of each pixel of src's size; the fourth byte is kept.
int IEL_Alpha_blending(IeImageInfo* src, IeImageInfo* dst, float alpha);

// out = second x (255 - a) + first x a, >> 8, with a = percent% of 255, over
// the first three bytes of each pixel; the fourth byte of out is not written.
// out may be first (or second). A percent outside 0..100 is clamped.
void IEL_Percent_blending(const unsigned char* first, const unsigned char* second, unsigned char* out,
                          int width, int height, int percent);
