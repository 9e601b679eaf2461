// Resize and strength blends of the effects engine.
#include <cmath>
#include <vector>

#include "common/CLyLog.h"
#include "image-editor/IE_Engine.h"
#include "image-editor/IE_PixelOps.h"

namespace {

// Source coordinate of destination index i: i / scale - 0.5, clamped so that
// the next sample (index + 1) stays inside a side of n pixels.
struct Sample {
  int i0;
  int i1;
  float frac;
};

std::vector<Sample> sampleTable(int dstN, int srcN) {
  std::vector<Sample> table((size_t)dstN);
  const float scale = (float)dstN / (float)srcN;
  for (int i = 0; i < dstN; ++i) {
    float s = ((float)i - (scale * 0.5f + (float)dstN * 0.5f)) / scale + (float)srcN * 0.5f;
    if (s < 0.0f) s = 0.0f;
    if (s >= (float)(srcN - 1)) s = (float)srcN - 1.001f;
    // A one-pixel side clamps to -0.001: both samples are pixel 0.
    int i0 = (int)s;
    if (i0 < 0) i0 = 0;
    const int i1 = i0 + 1 < srcN ? i0 + 1 : i0;
    table[(size_t)i] = Sample{i0, i1, s - (float)i0};
  }
  return table;
}

}  // namespace

int IEL_resize_image(IeImageInfo* src, IeImageInfo* dst) {
  if (!src || !dst || !src->pbBuf || !dst->pbBuf) {
    LYLOG_E("IEL_resize_image: invalid image record");
    return IE_ERROR_INVALID_PARAMETER;
  }
  LYLOG_D("IEL_resize_image ret_val is %d %d %d  %d", src->width, src->height, dst->width, dst->height);
  if (src->width <= 0 || src->height <= 0 || dst->width <= 0 || dst->height <= 0) {
    LYLOG_E("IEL_resize_image: invalid size %dx%d -> %dx%d", src->width, src->height, dst->width,
            dst->height);
    return IE_ERROR_INVALID_SIZE;
  }
  const std::vector<Sample> xs = sampleTable(dst->width, src->width);
  const std::vector<Sample> ys = sampleTable(dst->height, src->height);
  const size_t srcRow = (size_t)src->width * 4;
  for (int y = 0; y < dst->height; ++y) {
    const Sample sy = ys[(size_t)y];
    const unsigned char* r0 = src->pbBuf + (size_t)sy.i0 * srcRow;
    const unsigned char* r1 = src->pbBuf + (size_t)sy.i1 * srcRow;
    unsigned char* out = dst->pbBuf + (size_t)y * (size_t)dst->width * 4;
    for (int x = 0; x < dst->width; ++x, out += 4) {
      const Sample sx = xs[(size_t)x];
      const unsigned char* p00 = r0 + (size_t)sx.i0 * 4;
      const unsigned char* p01 = r0 + (size_t)sx.i1 * 4;
      const unsigned char* p10 = r1 + (size_t)sx.i0 * 4;
      const unsigned char* p11 = r1 + (size_t)sx.i1 * 4;
      for (int c = 0; c < 4; ++c) {
        const float top = (float)p00[c] + (float)(p01[c] - p00[c]) * sx.frac;
        const float bottom = (float)p10[c] + (float)(p11[c] - p10[c]) * sx.frac;
        out[c] = (unsigned char)(int)(top + (bottom - top) * sy.frac + 0.5f);
      }
    }
  }
  return IE_ERROR_NONE;
}

int IEL_Alpha_blending(IeImageInfo* src, IeImageInfo* dst, float alpha) {
  // Written so that NaN fails too.
  if (!(alpha >= 0.0f && alpha <= 100.0f)) {
    LYLOG_E("IEL_Alpha_blending Invalid  alpha val:%d ", std::isnan(alpha) ? -1 : (int)alpha);
    return IE_ERROR_INVALID_PARAMETER;
  }
  if (!dst || !dst->pbBuf) {
    LYLOG_E("IEL_Alpha_blending: invalid destination");
    return IE_ERROR_INVALID_PARAMETER;
  }
  const int check = ie::checkImage(src);
  if (check != IE_ERROR_NONE) {
    LYLOG_E("IEL_Alpha_blending: invalid source (error %d)", check);
    return check;
  }
  const unsigned a = (unsigned char)(alpha / 100.0f * 255.0f);
  const size_t bytes = (size_t)src->width * (size_t)src->height * 4;
  const unsigned char* s = src->pbBuf;
  unsigned char* d = dst->pbBuf;
  for (size_t i = 0; i < bytes; i += 4)
    for (size_t k = 0; k < 3; ++k) d[i + k] = (unsigned char)((d[i + k] * (255u - a) + s[i + k] * a) >> 8);
  return IE_ERROR_NONE;
}

void IEL_Percent_blending(const unsigned char* first, const unsigned char* second, unsigned char* out,
                          int width, int height, int percent) {
  if (!first || !second || !out || width <= 0 || height <= 0) {
    LYLOG_E("IEL_Percent_blending: invalid buffers or size %dx%d", width, height);
    return;
  }
  if (percent < 0 || percent > 100) {
    LYLOG_W("IEL_Percent_blending: percent %d clamped", percent);
    percent = percent < 0 ? 0 : 100;
  }
  const unsigned a = (unsigned char)((float)percent / 100.0f * 255.0f);
  const size_t bytes = (size_t)width * (size_t)height * 4;
  for (size_t i = 0; i < bytes; i += 4)
    for (size_t k = 0; k < 3; ++k)
      out[i + k] = (unsigned char)((second[i + k] * (255u - a) + first[i + k] * a) >> 8);
}
