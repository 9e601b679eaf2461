// The platform image filter and tbm surfaces the engine runs on.
#include <gtest/gtest.h>

#include <cstring>

#include "platform/image-filter/image_filter.h"
#include "platform/image-filter/tbm_surface.h"
#include "tests/imageeditor/EffectTestImages.h"

using effects_test::makeImage;
using effects_test::reversed;

namespace {

const int kAllCodes[] = {201, 202, 203, 204, 205, 206, 207, 208, 209, 210, 211, 212, 213,
                         214, 215, 216, 217, 218, 400, 410, 412, 417, 418, 419, 420, 421,
                         422, 423, 602, 603, 604, 605, 606, 607, 608, 609, 610, 611};

// Runs a code in buffer mode (format "BGRA": memory A, R, G, B).
std::vector<uint8_t> runBuffer(const std::vector<uint8_t>& argb, int w, int h, int code,
                               bool inPlace = false) {
  std::vector<uint8_t> in = argb, out(argb.size(), 0);
  image_filter_h f = nullptr;
  EXPECT_EQ(image_filter_create(&f, IMAGE_FILTER_MODE_BUFFER), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_set_input_by_buffer(f, in.data(), w, h, IMAGE_FILTER_FORMAT_BGRA),
            IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_set_output_by_buffer(f, inPlace ? in.data() : out.data()), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_set_filter(f, code), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_apply(f), IMAGE_FILTER_ERROR_NONE);
  image_filter_destroy(f);
  return inPlace ? in : out;
}

tbm_surface_h surfaceWith(const std::vector<uint8_t>& px, int w, int h, tbm_format format) {
  tbm_surface_h s = tbm_surface_create(w, h, format);
  tbm_surface_info_s info;
  EXPECT_EQ(tbm_surface_map(s, TBM_SURF_OPTION_WRITE, &info), TBM_SURFACE_ERROR_NONE);
  for (int y = 0; y < h; ++y)
    memcpy(info.planes[0].ptr + (size_t)y * info.planes[0].stride, &px[(size_t)y * w * 4], (size_t)w * 4);
  tbm_surface_unmap(s);
  return s;
}

std::vector<uint8_t> surfacePixels(tbm_surface_h s) {
  tbm_surface_info_s info;
  EXPECT_EQ(tbm_surface_map(s, TBM_SURF_OPTION_READ, &info), TBM_SURFACE_ERROR_NONE);
  std::vector<uint8_t> px;
  for (uint32_t y = 0; y < info.height; ++y)
    px.insert(px.end(), info.planes[0].ptr + (size_t)y * info.planes[0].stride,
              info.planes[0].ptr + (size_t)y * info.planes[0].stride + (size_t)info.width * 4);
  tbm_surface_unmap(s);
  return px;
}

}  // namespace

TEST(TbmSurface, CreatesMapsOnceAndReportsItsLayout) {
  EXPECT_EQ(TBM_FORMAT_ARGB8888, (uint32_t)('A' | 'R' << 8 | '2' << 16 | '4' << 24));
  EXPECT_EQ(TBM_FORMAT_BGRA8888, (uint32_t)('B' | 'A' << 8 | '2' << 16 | '4' << 24));
  EXPECT_EQ(tbm_surface_create(0, 4, TBM_FORMAT_ARGB8888), nullptr);
  EXPECT_EQ(tbm_surface_create(4, -1, TBM_FORMAT_ARGB8888), nullptr);
  EXPECT_EQ(tbm_surface_create(4, 4, 0x12345678), nullptr);
  tbm_surface_h s = tbm_surface_create(33, 5, TBM_FORMAT_BGRA8888);
  ASSERT_NE(s, nullptr);
  EXPECT_EQ(tbm_surface_get_width(s), 33);
  EXPECT_EQ(tbm_surface_get_height(s), 5);
  EXPECT_EQ(tbm_surface_get_format(s), TBM_FORMAT_BGRA8888);
  tbm_surface_info_s info;
  ASSERT_EQ(tbm_surface_map(s, TBM_SURF_OPTION_READ | TBM_SURF_OPTION_WRITE, &info), TBM_SURFACE_ERROR_NONE);
  EXPECT_GE(info.planes[0].stride, 33u * 4);
  EXPECT_EQ(info.num_planes, 1u);
  EXPECT_EQ(tbm_surface_map(s, TBM_SURF_OPTION_READ, &info), TBM_SURFACE_ERROR_INVALID_OPERATION);
  EXPECT_EQ(tbm_surface_unmap(s), TBM_SURFACE_ERROR_NONE);
  EXPECT_EQ(tbm_surface_unmap(s), TBM_SURFACE_ERROR_INVALID_OPERATION);
  EXPECT_EQ(tbm_surface_destroy(s), TBM_SURFACE_ERROR_NONE);
  EXPECT_EQ(tbm_surface_destroy(nullptr), TBM_SURFACE_ERROR_INVALID_PARAMETER);
}

TEST(ImageFilter, RefusesWrongModesUnknownCodesAndMissingImages) {
  EXPECT_EQ(image_filter_create(nullptr, 0), IMAGE_FILTER_ERROR_INVALID_PARAMETER);
  image_filter_h f = nullptr;
  EXPECT_EQ(image_filter_create(&f, 7), IMAGE_FILTER_ERROR_INVALID_PARAMETER);
  ASSERT_EQ(image_filter_create(&f, IMAGE_FILTER_MODE_BUFFER), IMAGE_FILTER_ERROR_NONE);
  tbm_surface_h s = tbm_surface_create(2, 2, TBM_FORMAT_BGRA8888);
  EXPECT_EQ(image_filter_set_input_by_tbm_surface(f, s), IMAGE_FILTER_ERROR_INVALID_OPERATION);
  EXPECT_EQ(image_filter_set_filter(f, 999), IMAGE_FILTER_ERROR_NOT_SUPPORTED);
  EXPECT_EQ(image_filter_apply(f), IMAGE_FILTER_ERROR_INVALID_OPERATION);  // no filter yet
  EXPECT_EQ(image_filter_set_filter(f, 205), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_apply(f), IMAGE_FILTER_ERROR_INVALID_OPERATION);  // no buffers
  unsigned char px[16] = {};
  EXPECT_EQ(image_filter_set_input_by_buffer(f, px, 2, 2, 0x41424344), IMAGE_FILTER_ERROR_NOT_SUPPORTED);
  EXPECT_EQ(image_filter_set_input_by_buffer(f, px, 0, 2, IMAGE_FILTER_FORMAT_BGRA),
            IMAGE_FILTER_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(image_filter_set_input_by_buffer(f, px, 100000, 2, IMAGE_FILTER_FORMAT_BGRA),
            IMAGE_FILTER_ERROR_INVALID_PARAMETER);
  image_filter_destroy(f);

  ASSERT_EQ(image_filter_create(&f, IMAGE_FILTER_MODE_SURFACE), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_set_input_by_buffer(f, px, 2, 2, IMAGE_FILTER_FORMAT_BGRA),
            IMAGE_FILTER_ERROR_INVALID_OPERATION);
  EXPECT_EQ(image_filter_set_input_by_tbm_surface(f, s), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_set_filter(f, 205), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_apply(f), IMAGE_FILTER_ERROR_INVALID_OPERATION);  // no output
  tbm_surface_h other = tbm_surface_create(3, 2, TBM_FORMAT_BGRA8888);
  EXPECT_EQ(image_filter_set_output_by_tbm_surface(f, other), IMAGE_FILTER_ERROR_NONE);
  EXPECT_EQ(image_filter_apply(f), IMAGE_FILTER_ERROR_INVALID_PARAMETER);  // sizes differ
  image_filter_destroy(f);
  tbm_surface_destroy(other);
  tbm_surface_destroy(s);
}

TEST(ImageFilter, EveryCodeRunsInPlaceAsWellAsIntoAnotherBuffer) {
  const int w = 37, h = 23;
  const auto argb = reversed(makeImage(w, h, 21));
  for (int code : kAllCodes) {
    EXPECT_EQ(image_filter_is_supported(code), 1);
    EXPECT_EQ(runBuffer(argb, w, h, code, true), runBuffer(argb, w, h, code, false)) << code;
  }
  EXPECT_EQ(image_filter_is_supported(200), 0);
  EXPECT_EQ(image_filter_is_supported(601), 0);
}

TEST(ImageFilter, SurfacesInEitherByteOrderGiveTheSameLook) {
  const int w = 29, h = 19;
  const auto bgra = makeImage(w, h, 8);  // memory B, G, R, A = "AR24"
  const auto argb = reversed(bgra);      // memory A, R, G, B = "BA24"
  for (int code : {205, 410, 201, 211, 422}) {
    std::vector<uint8_t> results[2];
    int i = 0;
    for (auto [px, format] : {std::pair{&argb, TBM_FORMAT_BGRA8888}, {&bgra, TBM_FORMAT_ARGB8888}}) {
      tbm_surface_h in = surfaceWith(*px, w, h, format), out = tbm_surface_create(w, h, TBM_FORMAT_BGRA8888);
      image_filter_h f = nullptr;
      image_filter_create(&f, IMAGE_FILTER_MODE_SURFACE);
      image_filter_set_input_by_tbm_surface(f, in);
      image_filter_set_output_by_tbm_surface(f, out);
      image_filter_set_filter(f, code);
      EXPECT_EQ(image_filter_apply(f), IMAGE_FILTER_ERROR_NONE);
      results[i++] = surfacePixels(out);
      image_filter_destroy(f);
      tbm_surface_destroy(in);
      tbm_surface_destroy(out);
    }
    EXPECT_EQ(results[0], results[1]) << code;
    EXPECT_EQ(results[0], runBuffer(argb, w, h, code)) << code;
  }
}
