// The fast paths of the codec: JPEGs decoded straight into the bitmap when the
// DCT scale gives the target size, large buffers (huge pages), turning large
// bitmaps, and JPEG writing from B, G, R, X rows.

#include <gtest/gtest.h>
#include <unistd.h>

#include <cstring>
#include <vector>

#include "codec/BitmapFactory.h"
#include "tests/codec/TestImages.h"
#include "tests/support/TestSupport.h"

using namespace pictavo::test;

namespace {
uint32_t at(const Bitmap& b, int x, int y) {
  uint32_t v;
  memcpy(&v, b.getPixels() + (static_cast<size_t>(y) * b.getWidth() + x) * 4, 4);
  return v;
}
bool near(const uint8_t* p, int r, int g, int b) {
  return std::abs(p[2] - r) < 24 && std::abs(p[1] - g) < 24 && std::abs(p[0] - b) < 24;
}
}  // namespace

TEST(FastPath, JpegAtAnExactDctScaleAndCutShort) {
  TempDir dir;
  const std::string path = dir.file("q.jpg");
  ASSERT_TRUE(writeJpeg(path, 1600, 1200, quadrants(1600, 1200)));
  for (int div : {1, 2, 4, 8}) {  // exact sizes: no resampling
    DecodeOptions o;
    o.colorFormat = BITMAP_FORMAT_BGRA;
    Bitmap* b = BitmapFactory::decodeFile(path, o, 1600 / div, 1200 / div, 0);
    ASSERT_NE(nullptr, b) << div;
    const int w = b->getWidth(), h = b->getHeight();
    const uint8_t* p = b->getPixels();
    EXPECT_TRUE(near(p + (static_cast<size_t>(h / 4) * w + w / 4) * 4, 255, 0, 0)) << div;
    EXPECT_TRUE(near(p + (static_cast<size_t>(h / 4) * w + 3 * w / 4) * 4, 0, 255, 0)) << div;
    EXPECT_TRUE(near(p + (static_cast<size_t>(3 * h / 4) * w + w / 4) * 4, 0, 0, 255)) << div;
    EXPECT_EQ(0xFFu, at(*b, w - 1, h - 1) >> 24) << div;  // opaque to the last pixel
    delete b;
  }
  // Cut in the middle of the scan: a complete, opaque bitmap or a clean failure.
  std::vector<char> bytes;
  {
    FILE* f = fopen(path.c_str(), "rb");
    ASSERT_NE(nullptr, f);
    char buf[65536];
    size_t n;
    while ((n = fread(buf, 1, sizeof buf, f)) > 0) bytes.insert(bytes.end(), buf, buf + n);
    fclose(f);
  }
  const std::string cut = dir.file("cut.jpg");
  FILE* f = fopen(cut.c_str(), "wb");
  fwrite(bytes.data(), 1, bytes.size() / 2, f);
  fclose(f);
  DecodeOptions o;
  o.colorFormat = BITMAP_FORMAT_BGRA;
  Bitmap* b = BitmapFactory::decodeFile(cut, o, 800, 600, 0);
  if (b) {
    EXPECT_EQ(800, b->getWidth());
    EXPECT_TRUE(near(b->getPixels() + (static_cast<size_t>(150) * 800 + 200) * 4, 255, 0, 0));
    delete b;
  }
}

TEST(FastPath, LargeBitmapsAreClearedAndTurnExactly) {
  // 1200 x 1000 x 4 = 4.8 MB: past the size that asks for huge pages.
  Bitmap* b = BitmapFactory::createBitmap(1200, 1000, BITMAP_FORMAT_BGRA);
  ASSERT_NE(nullptr, b);
  const uint8_t* p = b->getPixels();
  size_t nonzero = 0;
  for (size_t i = 0; i < b->getByteSize(); i += 4093) nonzero += p[i] != 0;
  EXPECT_EQ(0u, nonzero);
  uint32_t* px = reinterpret_cast<uint32_t*>(b->getPixels());
  for (int y = 0; y < 1000; y++)
    for (int x = 0; x < 1200; x++) px[static_cast<size_t>(y) * 1200 + x] = static_cast<uint32_t>(y << 16 | x);
  BitmapFactory::rotate(*b, 1);  // clockwise: (x, y) goes to (h - 1 - y, x)
  ASSERT_EQ(1000, b->getWidth());
  ASSERT_EQ(1200, b->getHeight());
  EXPECT_EQ(static_cast<uint32_t>(0 << 16 | 0), at(*b, 999, 0));
  EXPECT_EQ(static_cast<uint32_t>(999 << 16 | 0), at(*b, 0, 0));
  EXPECT_EQ(static_cast<uint32_t>(7 << 16 | 1199), at(*b, 992, 1199));
  BitmapFactory::rotate(*b, 2);
  EXPECT_EQ(static_cast<uint32_t>(0 << 16 | 0), at(*b, 0, 1199));
  BitmapFactory::rotate(*b, 3);  // back to the start, a half turn later
  ASSERT_EQ(1200, b->getWidth());
  EXPECT_EQ(static_cast<uint32_t>(999 << 16 | 1199), at(*b, 0, 0));
  BitmapFactory::rotate(*b, 2);
  bool same = true;
  for (int y = 0; y < 1000 && same; y += 7)
    for (int x = 0; x < 1200 && same; x += 5) same = at(*b, x, y) == static_cast<uint32_t>(y << 16 | x);
  EXPECT_TRUE(same);
  delete b;
}

TEST(FastPath, JpegWritingRoundTripsAndRefusesBadRequests) {
  TempDir dir;
  const int w = 96, h = 64, stride = w * 4 + 32;  // padded rows
  std::vector<uint8_t> pixels(static_cast<size_t>(stride) * h, 0xAB);
  for (int y = 0; y < h; y++) {
    for (int x = 0; x < w; x++) {
      uint8_t* p = pixels.data() + static_cast<size_t>(y) * stride + x * 4;
      const bool left = x < w / 2, top = y < h / 2;
      p[0] = left ? 0 : 255;  // B
      p[1] = top ? 200 : 0;   // G
      p[2] = left ? 255 : 0;  // R
      p[3] = 255;
    }
  }
  const std::string path = dir.file("w.jpg");
  ASSERT_TRUE(BitmapFactory::writeJpegBgrx(pixels.data(), w, h, stride, 80, path));
  DecodeOptions o;
  o.colorFormat = BITMAP_FORMAT_BGRA;
  Bitmap* b = BitmapFactory::decodeFile(path, o, w, h, 0);
  ASSERT_NE(nullptr, b);
  EXPECT_TRUE(near(b->getPixels() + (static_cast<size_t>(10) * w + 10) * 4, 255, 200, 0));
  EXPECT_TRUE(near(b->getPixels() + (static_cast<size_t>(50) * w + 80) * 4, 0, 0, 255));
  delete b;

  EXPECT_FALSE(BitmapFactory::writeJpegBgrx(nullptr, w, h, stride, 80, path));
  EXPECT_FALSE(BitmapFactory::writeJpegBgrx(pixels.data(), 0, h, stride, 80, path));
  EXPECT_FALSE(BitmapFactory::writeJpegBgrx(pixels.data(), w, h, w * 4 - 4, 80, path));  // rows overlap
  EXPECT_FALSE(BitmapFactory::writeJpegBgrx(pixels.data(), w, h, stride, 0, path));
  EXPECT_FALSE(BitmapFactory::writeJpegBgrx(pixels.data(), w, h, stride, 101, path));
  EXPECT_FALSE(BitmapFactory::writeJpegBgrx(pixels.data(), w, h, stride, 80, dir.file("no/such/dir/x.jpg")));
  if (access("/dev/full", W_OK) == 0) {  // a full disk
    EXPECT_FALSE(BitmapFactory::writeJpegBgrx(pixels.data(), w, h, stride, 80, "/dev/full"));
  }
}
