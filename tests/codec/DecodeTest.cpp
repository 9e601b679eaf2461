// Every format decodes to exactly the asked size, the right way up, with
// premultiplied alpha, averaged rather than sampled.

#include <gtest/gtest.h>

#include <cstdlib>

#include "codec/BitmapFactory.h"
#include "codec/Resampler.h"
#include "tests/codec/TestImages.h"
#include "tests/support/TestSupport.h"

using namespace pictavo::test;

namespace {
const uint8_t* px(const Bitmap& b, int x, int y) {
  return b.getPixels() + (static_cast<size_t>(y) * b.getWidth() + x) * 4;
}

// Checks the quadrant colours (red, green / blue, white) near the four
// corners of a BGRA bitmap, within a JPEG's tolerance.
void expectQuadrants(const Bitmap& b, int tolerance = 40) {
  const int w = b.getWidth(), h = b.getHeight();
  struct Probe {
    int x, y;
    int r, g, bl;
  } probes[] = {{w / 4, h / 4, 255, 0, 0},
                {3 * w / 4, h / 4, 0, 255, 0},
                {w / 4, 3 * h / 4, 0, 0, 255},
                {3 * w / 4, 3 * h / 4, 255, 255, 255}};
  for (const Probe& p : probes) {
    const uint8_t* q = px(b, p.x, p.y);
    EXPECT_NEAR(q[2], p.r, tolerance) << "at " << p.x << "," << p.y;
    EXPECT_NEAR(q[1], p.g, tolerance) << "at " << p.x << "," << p.y;
    EXPECT_NEAR(q[0], p.bl, tolerance) << "at " << p.x << "," << p.y;
    EXPECT_EQ(q[3], 255);
  }
}

std::unique_ptr<Bitmap> decode(const std::string& path, int w, int h, int format = 8) {
  DecodeOptions o;
  o.colorFormat = format;
  return std::unique_ptr<Bitmap>(BitmapFactory::decodeFile(path, o, w, h, 0));
}

std::unique_ptr<Bitmap> decodePng(const std::string& path, int w, int h, int format = 8) {
  DecodeOptions o;
  o.colorFormat = format;
  if (BitmapFactory::initPNGFile(o, path) != 1) return nullptr;
  std::unique_ptr<Bitmap> b(BitmapFactory::createBitmap(w, h, format));
  if (!b || BitmapFactory::decodePNG(o, *b, w, h) != 1) return nullptr;
  return b;
}
}  // namespace

TEST(Decode, JpegScaledToExactSizeAllVariants) {
  TempDir dir;
  JpegOptions progressive;
  progressive.progressive = true;
  JpegOptions gray;
  gray.grayscale = true;
  ASSERT_TRUE(writeJpeg(dir.file("base.jpg"), 800, 600, quadrants(800, 600)));
  ASSERT_TRUE(writeJpeg(dir.file("prog.jpg"), 800, 600, quadrants(800, 600), progressive));
  ASSERT_TRUE(writeJpeg(dir.file("gray.jpg"), 300, 200, quadrants(300, 200), gray));
  for (const char* name : {"base.jpg", "prog.jpg"}) {
    // 1/8, 1/4, 3/8, full and upscaled decodes, odd sizes and aspect changes.
    for (auto wh :
         {std::pair<int, int>{100, 75}, {180, 135}, {333, 251}, {800, 600}, {1000, 700}, {77, 300}}) {
      auto b = decode(dir.file(name), wh.first, wh.second);
      ASSERT_TRUE(b) << name << " " << wh.first;
      EXPECT_EQ(b->getWidth(), wh.first);
      EXPECT_EQ(b->getHeight(), wh.second);
      EXPECT_EQ(b->getFormat(), 8);
      expectQuadrants(*b);
    }
  }
  auto g = decode(dir.file("gray.jpg"), 150, 100);
  ASSERT_TRUE(g);
  // Green channel of the quadrants as grey: dark top left, bright top right.
  EXPECT_LT(px(*g, 30, 20)[0], 40);
  EXPECT_GT(px(*g, 120, 20)[0], 215);
  EXPECT_EQ(px(*g, 120, 20)[0], px(*g, 120, 20)[2]);
}

TEST(Decode, CmykJpeg) {
  // Adobe files store inverted inks: 0 cyan ink is full red light, K 255 no black.
  TempDir dir;
  JpegOptions cmyk;
  cmyk.cmyk = true;
  cmyk.quality = 100;
  ASSERT_TRUE(writeJpeg(
      dir.file("c.jpg"), 64, 64,
      [](int, int) {
        return Rgba{0, 255, 255, 255};
      },
      cmyk));
  auto b = decode(dir.file("c.jpg"), 32, 32);
  ASSERT_TRUE(b);
  const uint8_t* p = px(*b, 16, 16);
  EXPECT_NEAR(p[0], 255, 3);  // blue
  EXPECT_NEAR(p[1], 255, 3);  // green
  EXPECT_NEAR(p[2], 0, 3);    // red
  EXPECT_EQ(p[3], 255);
}

TEST(Decode, OtherColourFormats) {
  TempDir dir;
  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 64, 64, [](int, int) { return Rgba{200, 100, 50, 255}; }));
  auto rgba = decode(dir.file("a.jpg"), 32, 32, 7);
  ASSERT_TRUE(rgba);
  EXPECT_NEAR(rgba->getPixels()[0], 200, 6);
  EXPECT_NEAR(rgba->getPixels()[2], 50, 6);
  auto argb = decode(dir.file("a.jpg"), 32, 32, 5);
  ASSERT_TRUE(argb);
  EXPECT_EQ(argb->getPixels()[0], 255);
  EXPECT_NEAR(argb->getPixels()[3], 200, 6);
  auto rgb565 = decode(dir.file("a.jpg"), 32, 32, 0);
  ASSERT_TRUE(rgb565);
  EXPECT_EQ(rgb565->getByteSize(), 32u * 32 * 2);
  const unsigned v = rgb565->getPixels()[0] | (rgb565->getPixels()[1] << 8);
  EXPECT_NEAR(static_cast<int>(v >> 11), 200 >> 3, 1);
  auto yuv = decode(dir.file("a.jpg"), 31, 31, 2);
  ASSERT_TRUE(yuv);
  EXPECT_EQ(yuv->getByteSize(), 31u * 31 + 2 * 16 * 16);
}

TEST(Decode, PngRowByRowWithAlphaPremultiplied) {
  TempDir dir;
  PngOptions alpha;
  alpha.alpha = true;
  ASSERT_TRUE(writePng(dir.file("q.png"), 400, 300, quadrants(400, 300)));
  ASSERT_TRUE(writePng(
      dir.file("half.png"), 50, 40,
      [](int, int) {
        return Rgba{255, 128, 0, 128};
      },
      alpha));
  for (auto wh : {std::pair<int, int>{400, 300}, {200, 150}, {123, 77}, {600, 500}}) {
    auto b = decodePng(dir.file("q.png"), wh.first, wh.second);
    ASSERT_TRUE(b);
    expectQuadrants(*b, 2);
  }
  auto h = decodePng(dir.file("half.png"), 25, 20);
  ASSERT_TRUE(h);
  const uint8_t* p = px(*h, 10, 10);
  EXPECT_EQ(p[3], 128);
  EXPECT_NEAR(p[2], 128, 1);  // red 255 at alpha 128 is stored as 128
  EXPECT_NEAR(p[1], 64, 1);
  EXPECT_EQ(p[0], 0);
  // The PNG decoder's own format keeps straight alpha.
  auto straight = decodePng(dir.file("half.png"), 25, 20, 7);
  ASSERT_TRUE(straight);
  EXPECT_NEAR(straight->getPixels()[0], 255, 2);
  EXPECT_EQ(straight->getPixels()[3], 128);
}

TEST(Decode, InterlacedPng) {
  TempDir dir;
  PngOptions il;
  il.interlaced = true;
  ASSERT_TRUE(writePng(dir.file("i.png"), 301, 203, quadrants(301, 203), il));
  auto b = decodePng(dir.file("i.png"), 150, 101);
  ASSERT_TRUE(b);
  expectQuadrants(*b, 2);
}

TEST(Decode, PngCallOrderAndSizeChecks) {
  TempDir dir;
  ASSERT_TRUE(writePng(dir.file("a.png"), 20, 10, quadrants(20, 10)));
  LogCapture log;
  DecodeOptions o;
  o.colorFormat = 8;
  std::unique_ptr<Bitmap> b(BitmapFactory::createBitmap(10, 5, 8));
  EXPECT_EQ(BitmapFactory::decodePNG(o, *b, 10, 5), 0);  // nothing opened
  ASSERT_EQ(BitmapFactory::initPNGFile(o, dir.file("a.png")), 1);
  EXPECT_EQ(o.outWidth, 20);
  EXPECT_EQ(BitmapFactory::decodePNG(o, *b, 11, 5), 0);  // does not fit the bitmap
  ASSERT_EQ(BitmapFactory::initPNGFile(o, dir.file("a.png")), 1);
  EXPECT_EQ(BitmapFactory::decodePNG(o, *b, 10, 5), 1);
  EXPECT_EQ(BitmapFactory::decodePNG(o, *b, 10, 5), 0);  // one decode per init
  DecodeOptions jpegAsPng;
  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 8, 8, quadrants(8, 8)));
  EXPECT_EQ(BitmapFactory::initPNGFile(jpegAsPng, dir.file("a.jpg")), 0);
  // An opened but never decoded PNG is released with its options.
  {
    DecodeOptions left;
    ASSERT_EQ(BitmapFactory::initPNGFile(left, dir.file("a.png")), 1);
  }
}

TEST(Decode, GifBmpWbmp) {
  TempDir dir;
  auto quadIndex = [](int w, int h) {
    return [w, h](int x, int y) { return (x >= w / 2 ? 1 : 0) + (y >= h / 2 ? 2 : 0); };
  };
  // Colours 0 red, 1 green, 2 blue, 3 black (transparent when asked).
  ASSERT_TRUE(writeGif(dir.file("a.gif"), 60, 40, quadIndex(60, 40), true));
  ASSERT_TRUE(writeGif(dir.file("i.gif"), 61, 41, quadIndex(61, 41), false, 1, true));
  for (const char* name : {"a.gif", "i.gif"}) {
    auto g = decode(dir.file(name), 30, 20);
    ASSERT_TRUE(g) << name;
    EXPECT_EQ(px(*g, 5, 5)[2], 255) << name;
    EXPECT_EQ(px(*g, 25, 5)[1], 255) << name;
    EXPECT_EQ(px(*g, 5, 15)[0], 255) << name;
  }
  auto g = decode(dir.file("a.gif"), 30, 20);
  EXPECT_EQ(px(*g, 25, 15)[3], 0);  // transparent colour
  EXPECT_EQ(px(*g, 25, 15)[2], 0);

  ASSERT_TRUE(writeBytes(dir.file("up.bmp"), makeBmp(50, 30, 24, quadrants(50, 30))));
  ASSERT_TRUE(writeBytes(dir.file("down.bmp"), makeBmp(50, -30, 24, quadrants(50, 30))));
  ASSERT_TRUE(writeBytes(dir.file("x.bmp"), makeBmp(50, 30, 32, quadrants(50, 30))));
  for (const char* name : {"up.bmp", "down.bmp", "x.bmp"}) {
    auto b = decode(dir.file(name), 25, 15);
    ASSERT_TRUE(b) << name;
    expectQuadrants(*b, 1);
  }
  ASSERT_TRUE(
      writeBytes(dir.file("p.bmp"), makeBmp(16, 8, 8, nullptr, 256, [](int x, int) { return x * 16; })));
  auto p = decode(dir.file("p.bmp"), 16, 8);
  ASSERT_TRUE(p);
  EXPECT_EQ(px(*p, 3, 2)[0], 48);
  EXPECT_EQ(px(*p, 3, 2)[1], 48);

  ASSERT_TRUE(writeBytes(dir.file("a.wbmp"), makeWbmp(20, 10, [](int x, int) { return x >= 10; })));
  auto wb = decode(dir.file("a.wbmp"), 20, 10);
  ASSERT_TRUE(wb);
  EXPECT_EQ(px(*wb, 2, 2)[0], 0);
  EXPECT_EQ(px(*wb, 15, 2)[0], 255);
  EXPECT_EQ(px(*wb, 15, 2)[3], 255);
}

TEST(Decode, ShrinkAveragesInsteadOfSampling) {
  // A one-pixel checkerboard halved is flat grey; nearest neighbour would
  // give pure black or white.
  TempDir dir;
  ASSERT_TRUE(writePng(dir.file("c.png"), 64, 64, [](int x, int y) {
    const uint8_t v = ((x + y) & 1) ? 255 : 0;
    return Rgba{v, v, v, 255};
  }));
  for (int size : {32, 21, 7}) {
    auto b = decodePng(dir.file("c.png"), size, size);
    ASSERT_TRUE(b);
    for (int y = 1; y < size - 1; ++y)
      for (int x = 1; x < size - 1; ++x)
        ASSERT_NEAR(px(*b, x, y)[1], 128, 20) << size << " " << x << "," << y;
  }
}

TEST(Resampler, StreamsExtremeRatiosAndShortSources) {
  // 3000 x 1 rows into 2 x 2: every output pixel averages its area.
  std::vector<uint8_t> out(2 * 2 * 4, 1);
  BitmapFactory::Resampler r(3000, 10, 2, 2, out.data());
  std::vector<uint8_t> row(3000 * 4);
  for (int x = 0; x < 3000; ++x) {
    const uint8_t v = x < 1500 ? 200 : 100;
    row[x * 4] = row[x * 4 + 1] = row[x * 4 + 2] = v;
    row[x * 4 + 3] = 255;
  }
  for (int y = 0; y < 10; ++y) r.pushRow(row.data());
  r.finish();
  EXPECT_EQ(out[0], 200);
  EXPECT_EQ(out[4], 100);
  EXPECT_EQ(out[8], 200);
  // Fewer rows than announced: the rest is transparent, never left unwritten.
  std::vector<uint8_t> out2(4 * 4 * 4, 7);
  BitmapFactory::Resampler s(8, 8, 4, 4, out2.data());
  std::vector<uint8_t> white(8 * 4, 255);
  for (int y = 0; y < 4; ++y) s.pushRow(white.data());
  s.finish();
  EXPECT_EQ(out2[0], 255);
  EXPECT_EQ(out2[(3 * 4) * 4 + 3], 0);
  // Bottom-up rows land upside down.
  std::vector<uint8_t> out3(1 * 2 * 4);
  BitmapFactory::Resampler u(1, 2, 1, 2, out3.data(), true);
  const uint8_t first[4] = {1, 1, 1, 255}, second[4] = {2, 2, 2, 255};
  u.pushRow(first);
  u.pushRow(second);
  EXPECT_EQ(out3[0], 2);
  EXPECT_EQ(out3[4], 1);
}
