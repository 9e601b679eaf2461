// The headless render command: arguments, exit statuses and the picture it writes.

#include <gtest/gtest.h>
#include <unistd.h>

#include <cairo.h>

#include <cstdio>
#include <string>
#include <vector>

#include "app-entry/CLyRenderCommand.h"
#include "codec/BitmapFactory.h"
#include "tests/codec/TestImages.h"
#include "tests/support/TestSupport.h"

using pictavo::test::TempDir;

namespace {

void writePng(const std::string& path, int w, int h, double r, double g, double b) {
  cairo_surface_t* s = cairo_image_surface_create(CAIRO_FORMAT_ARGB32, w, h);
  cairo_t* cr = cairo_create(s);
  cairo_set_source_rgb(cr, r, g, b);
  cairo_paint(cr);
  cairo_destroy(cr);
  cairo_surface_write_to_png(s, path.c_str());
  cairo_surface_destroy(s);
}

int run(std::vector<std::string> args) {
  args.insert(args.begin(), {"pictavo", "--render"});
  std::vector<char*> argv;
  for (auto& a : args) argv.push_back(a.data());
  argv.push_back(nullptr);
  return runRenderCommand((int)args.size(), argv.data());
}

class RenderCommandTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    a = dir.file("a.png");
    b = dir.file("b.png");
    c = dir.file("c.png");
    writePng(a, 400, 300, 1, 0, 0);
    writePng(b, 300, 400, 0, 0, 1);
    writePng(c, 500, 500, 0, 1, 0);
    FILE* f = fopen(dir.file("text.jpg").c_str(), "w");
    fputs("not a picture", f);
    fclose(f);
  }
  TempDir dir;
  std::string a, b, c;
};

}  // namespace

TEST_F(RenderCommandTest, BadArgumentsExitWithUsageStatus) {
  const std::string out = dir.file("out.jpg");
  EXPECT_EQ(LY_RENDER_USAGE, run({}));
  EXPECT_EQ(LY_RENDER_USAGE, run({"--layout", "0", out, a, b}));  // output first
  EXPECT_EQ(LY_RENDER_USAGE, run({out, a}));                      // one photo
  EXPECT_EQ(LY_RENDER_USAGE, run({out, a, b, a, b, a, b, a}));    // seven
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--ratio", "4:3", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--margin", "11", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--roundness", "-1", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--background", "red", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--background", "#12345", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--screen", "100", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--bogus", "1", a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, a, b, "--layout"}));
  EXPECT_EQ(LY_RENDER_USAGE, run({dir.file("out.png"), a, b}));
  EXPECT_EQ(LY_RENDER_USAGE, run({out, "--layout", "2", a, b}));  // two photos have layouts 0 and 1
  EXPECT_NE(0, access(out.c_str(), F_OK));
}

TEST_F(RenderCommandTest, UnusablePhotosAreSkippedAndTooFewFail) {
  const std::string out = dir.file("out.jpg");
  EXPECT_EQ(LY_RENDER_NO_PHOTOS, run({out, a, dir.file("text.jpg")}));
  EXPECT_EQ(LY_RENDER_NO_PHOTOS, run({out, dir.file("missing.jpg"), dir.file("text.jpg")}));
  EXPECT_NE(0, access(out.c_str(), F_OK));
  // Three given, one unusable: a two-photo collage.
  EXPECT_EQ(LY_RENDER_OK, run({out, a, dir.file("text.jpg"), b}));
  EXPECT_EQ(0, access(out.c_str(), F_OK));
}

TEST_F(RenderCommandTest, WritesTheCollageAtTheSaveSize) {
  const std::string out = dir.file("out.jpg");
  ASSERT_EQ(LY_RENDER_OK, run({out, "--ratio", "3:4", "--margin", "3", "--roundness", "5", "--background",
                               "#102030", "--layout", "1", a, b, c}));
  DecodeOptions o;
  ASSERT_EQ(1, BitmapFactory::parseImage(out, o));
  EXPECT_EQ(IMAGE_TYPE_JPEG, o.imageType);
  EXPECT_EQ(500, o.outWidth);  // the largest photo's longer side
  EXPECT_EQ(666, o.outHeight);
  // --screen bounds the decoding and with it the save size.
  ASSERT_EQ(LY_RENDER_OK, run({out, "--screen", "200x300", a, b}));
  DecodeOptions o2;
  ASSERT_EQ(1, BitmapFactory::parseImage(out, o2));
  EXPECT_EQ(266, o2.outWidth);  // b: 300 x 400 bounded by 200 x 300 decodes at 200 x 266
}

TEST_F(RenderCommandTest, UnwritableOutputFails) {
  EXPECT_EQ(LY_RENDER_FAILED, run({dir.file("no/such/folder/out.jpg"), a, b}));
}

// JPEGs are decoded only as large as their cells need, yet the saved picture
// keeps the size the photos have on the screen, also when one photo fails
// and the others are decoded again for a layout with fewer cells.
TEST_F(RenderCommandTest, PhotosDecodedForTheirCellsKeepTheSaveSize) {
  std::vector<std::string> photos;
  for (int i = 0; i < 6; i++) {
    photos.push_back(dir.file("p" + std::to_string(i) + ".jpg"));
    ASSERT_TRUE(pictavo::test::writeJpeg(photos.back(), 1600, 1200, pictavo::test::quadrants(1600, 1200)));
  }
  const std::string out = dir.file("out.jpg");
  std::vector<std::string> args = {out, "--screen", "1000x1000"};
  args.insert(args.end(), photos.begin(), photos.end());
  ASSERT_EQ(LY_RENDER_OK, run(args));
  DecodeOptions o;
  ASSERT_EQ(1, BitmapFactory::parseImage(out, o));
  EXPECT_EQ(1000, o.outWidth);  // 1600 x 1200 bounded by 1000 x 1000: 1000 x 750
  EXPECT_EQ(1000, o.outHeight);
  DecodeOptions photo;
  photo.colorFormat = BITMAP_FORMAT_BGRA;
  Bitmap* saved = BitmapFactory::decodeFile(out, photo, 1000, 1000, 0);
  ASSERT_NE(nullptr, saved);
  // Cell 0 (top left third) shows the photo's red top left quadrant.
  const uint8_t* p = saved->getPixels() + (static_cast<size_t>(100) * 1000 + 100) * 4;
  EXPECT_GT(p[2], 200);
  EXPECT_LT(p[1], 60);
  delete saved;

  args[3] = dir.file("text.jpg");  // five usable photos
  ASSERT_EQ(LY_RENDER_OK, run(args));
  DecodeOptions o2;
  ASSERT_EQ(1, BitmapFactory::parseImage(out, o2));
  EXPECT_EQ(1000, o2.outWidth);
}
