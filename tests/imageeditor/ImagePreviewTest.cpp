// The image preview object: fitted sizes, the direct and off-screen paths,
// resize callback, buffer access, unload and deletion during a preload.
#include <Ecore_Evas.h>
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "image-editor/IE_Engine.h"
#include "image-editor/ie_image.h"
#include "tests/imageeditor/EffectTestImages.h"
#include "tests/support/TestSupport.h"

using namespace pictavo::test;

namespace {

constexpr int kScreenW = 720, kScreenH = 1280;

int canvasCount() {
  Eina_List* l = ecore_evas_ecore_evas_list_get();
  const int n = (int)eina_list_count(l);
  eina_list_free(l);
  return n;
}

std::vector<uint8_t> flat(int w, int h, uint32_t argb) {
  std::vector<uint8_t> px((size_t)w * h * 4);
  for (size_t i = 0; i < px.size(); i += 4) memcpy(&px[i], &argb, 4);
  return px;
}

class ImagePreview : public ::testing::Test {
 protected:
  void SetUp() override {
    ensureElm();
    // Windows of earlier tests are freed on a later loop pass; let them go
    // so that counting canvases sees only this test's.
    runMainLoop(0.05);
    win = createTestWindow(kScreenW, kScreenH);
    obj = ie_image_create(win, false);
    ASSERT_NE(obj, nullptr);
  }
  void TearDown() override {
    if (obj) evas_object_del(obj);
    evas_object_del(win);
  }
  bool load(const std::string& path, const std::vector<uint8_t>& px, int w, int h) {
    return ie_image_file_load_copy(obj, path.c_str(), px.data(), w, h, kScreenW, kScreenH);
  }
  void imageSize(int* w, int* h) { evas_object_image_size_get(ie_image_internal_image_get(obj), w, h); }

  Evas_Object* win = nullptr;
  Evas_Object* obj = nullptr;
};

}  // namespace

TEST_F(ImagePreview, IsASmartObjectOfItsClassNamedImage) {
  EXPECT_STREQ(evas_object_type_get(obj), "collage-ie-mainimg");
  EXPECT_STREQ(evas_object_name_get(obj), "Image");
  EXPECT_STREQ(evas_object_name_get(ie_image_internal_image_get(obj)), "mImage");
  EXPECT_FALSE(ie_image_is_loaded(obj));
}

TEST_F(ImagePreview, PhotoNoLargerThanTheScreenIsShownAtItsOwnSize) {
  const auto px = effects_test::makeImage(600, 400, 2);
  ASSERT_TRUE(load("/photos/a.jpg", px, 600, 400));
  EXPECT_TRUE(ie_image_is_loaded(obj));
  EXPECT_TRUE(evas_object_visible_get(obj));
  int w = 0, h = 0;
  imageSize(&w, &h);
  EXPECT_EQ(w, 600);
  EXPECT_EQ(h, 400);
  const uint8_t* shown = static_cast<const uint8_t*>(ie_image_internal_buffer_get(obj));
  ASSERT_NE(shown, nullptr);
  EXPECT_EQ(memcmp(shown, px.data(), px.size()), 0);
  EXPECT_FALSE(ie_image_preload_pending(obj));
}

TEST_F(ImagePreview, LargerPhotoIsScaledDirectlyToTheLongerScreenSide) {
  // Long side 2000 <= 2 x 1280: direct path, bilinear resize of the pixels.
  const auto px = effects_test::makeImage(2000, 1000, 3);
  LogCapture log;
  ASSERT_TRUE(load("/photos/b.jpg", px, 2000, 1000));
  int w = 0, h = 0;
  imageSize(&w, &h);
  EXPECT_EQ(w, 1280);
  EXPECT_EQ(h, 640);
  EXPECT_FALSE(ie_image_preload_pending(obj));
  EXPECT_TRUE(log.contains("fix size to screen iw: 1280, ih: 640"));
  std::vector<uint8_t> expect((size_t)1280 * 640 * 4);
  std::vector<uint8_t> in = px;
  IeImageInfo s{2000, 1000, 9, in.data()}, d{1280, 640, 9, expect.data()};
  IEL_resize_image(&s, &d);
  EXPECT_EQ(memcmp(ie_image_internal_buffer_get(obj), expect.data(), expect.size()), 0);
  // Portrait, 3000 <= 3 x 1280: still direct.
  const auto tall = flat(1000, 3000, 0xff336699);
  ASSERT_TRUE(load("/photos/c.jpg", tall, 1000, 3000));
  imageSize(&w, &h);
  EXPECT_EQ(w, 426);
  EXPECT_EQ(h, 1280);
  EXPECT_FALSE(ie_image_preload_pending(obj));
}

TEST_F(ImagePreview, PhotoMoreThanThreeTimesTheFittedSideGoesOffScreen) {
  const int before = canvasCount();
  const auto px = flat(4000, 1000, 0xff20a060);
  LogCapture log;
  ASSERT_TRUE(load("/photos/wide.jpg", px, 4000, 1000));
  EXPECT_TRUE(log.contains("iw width: 1280, height: 320, scale_factor: 3"));
  EXPECT_TRUE(ie_image_preload_pending(obj));
  EXPECT_EQ(canvasCount(), before + 1);
  int sw = 0, sh = 0;
  ie_image_shown_size_get(obj, &sw, &sh);
  EXPECT_EQ(sw, 1280);
  EXPECT_EQ(sh, 320);
  ASSERT_TRUE(runMainLoopUntil([&] { return !ie_image_preload_pending(obj); }, 5.0));
  int w = 0, h = 0;
  imageSize(&w, &h);
  EXPECT_EQ(w, 1280);
  EXPECT_EQ(h, 320);
  // The rendered copy of a flat photo is the same colour.
  const uint32_t* shown = static_cast<const uint32_t*>(ie_image_internal_buffer_get(obj));
  ASSERT_NE(shown, nullptr);
  EXPECT_EQ(shown[0], 0xff20a060u);
  EXPECT_EQ(shown[640 + 160 * 1280], 0xff20a060u);
  // The off-screen canvas is freed once its pixels are copied.
  EXPECT_TRUE(runMainLoopUntil([&] { return canvasCount() == before; }, 2.0));
  // More than four times: factor 4.
  log.clear();
  ASSERT_TRUE(load("/photos/wider.jpg", flat(6000, 1000, 0xff000000), 6000, 1000));
  EXPECT_TRUE(log.contains("scale_factor: 4"));
}

TEST_F(ImagePreview, GifAndWbmpAlwaysGoOffScreenWhenLargerThanTheScreen) {
  const auto px = flat(1500, 1000, 0xff808080);
  for (const char* path : {"/p/anim.gif", "/p/ANIM.GIF", "/p/icon.wbmp", "/p/ICON.WBMP"}) {
    LogCapture log;
    ASSERT_TRUE(load(path, px, 1500, 1000)) << path;
    EXPECT_TRUE(log.contains("scale_factor: 5")) << path;
    EXPECT_TRUE(ie_image_preload_pending(obj)) << path;
    ASSERT_TRUE(runMainLoopUntil([&] { return !ie_image_preload_pending(obj); }, 5.0));
  }
  // No larger than the screen: shown at its own size like any photo.
  ASSERT_TRUE(load("/p/small.gif", flat(300, 200, 0xff000000), 300, 200));
  EXPECT_FALSE(ie_image_preload_pending(obj));
}

TEST_F(ImagePreview, DeletingDuringAPreloadFreesTheOffScreenCanvas) {
  const int before = canvasCount();
  ASSERT_TRUE(load("/p/huge.jpg", flat(5000, 1200, 0xff102030), 5000, 1200));
  ASSERT_TRUE(ie_image_preload_pending(obj));
  EXPECT_EQ(canvasCount(), before + 1);
  evas_object_del(obj);
  obj = nullptr;
  EXPECT_EQ(canvasCount(), before);
  runMainLoop(0.1);  // nothing left to fire
  EXPECT_EQ(canvasCount(), before);
}

TEST_F(ImagePreview, ResizeCallbackOnlyWhenTheSizeChanges) {
  int calls = 0;
  ie_image_set_resized_callback(
      obj, [](void* data, Evas_Object*) { ++*static_cast<int*>(data); }, &calls);
  LogCapture log;
  evas_object_resize(obj, 300, 200);
  EXPECT_EQ(calls, 1);
  EXPECT_TRUE(log.contains("Image object resized"));
  evas_object_resize(obj, 300, 200);
  EXPECT_EQ(calls, 1);
  evas_object_resize(obj, 301, 200);
  EXPECT_EQ(calls, 2);
  evas_object_move(obj, 10, 20);
  int x, y, w, h;
  ie_image_geometry_get(obj, &x, &y, &w, &h);
  EXPECT_EQ(x, 10);
  EXPECT_EQ(y, 20);
  EXPECT_EQ(w, 301);
  EXPECT_EQ(h, 200);
}

TEST_F(ImagePreview, UnloadHidesAndClearsAndReloadReplaces) {
  ASSERT_TRUE(load("/p/a.jpg", flat(100, 50, 0xff010203), 100, 50));
  ie_image_file_unload(obj);
  EXPECT_FALSE(ie_image_is_loaded(obj));
  EXPECT_FALSE(evas_object_visible_get(obj));
  ASSERT_TRUE(load("/p/a.jpg", flat(100, 50, 0xff010203), 100, 50));
  ASSERT_TRUE(load("/p/b.jpg", flat(60, 80, 0xff040506), 60, 80));
  int w = 0, h = 0;
  imageSize(&w, &h);
  EXPECT_EQ(w, 60);
  EXPECT_EQ(h, 80);
  EXPECT_EQ(*static_cast<const uint32_t*>(ie_image_internal_buffer_get(obj)), 0xff040506u);
}

TEST_F(ImagePreview, BadInputIsLoggedAndRefused) {
  LogCapture log;
  const auto px = flat(10, 10, 0);
  EXPECT_FALSE(ie_image_file_load_copy(obj, nullptr, px.data(), 10, 10, kScreenW, kScreenH));
  EXPECT_FALSE(ie_image_file_load_copy(obj, "/p/a.jpg", nullptr, 10, 10, kScreenW, kScreenH));
  EXPECT_TRUE(log.contains("Invalid image"));
  EXPECT_FALSE(ie_image_file_load_copy(obj, "/p/a.jpg", px.data(), 0, 10, kScreenW, kScreenH));
  EXPECT_FALSE(ie_image_file_load_copy(obj, "/p/a.jpg", px.data(), 10, 10, 0, 0));
  EXPECT_FALSE(ie_image_is_loaded(obj));
  // Not a preview object.
  Evas_Object* rect = evas_object_rectangle_add(evas_object_evas_get(win));
  log.clear();
  EXPECT_FALSE(ie_image_file_load_copy(rect, "/p/a.jpg", px.data(), 10, 10, kScreenW, kScreenH));
  EXPECT_EQ(ie_image_internal_image_get(rect), nullptr);
  EXPECT_EQ(ie_image_internal_buffer_get(rect), nullptr);
  ie_image_file_unload(rect);
  EXPECT_TRUE(log.contains("Failed get data"));
  evas_object_del(rect);
  EXPECT_EQ(ie_image_create(nullptr, false), nullptr);
}
