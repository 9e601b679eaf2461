// Broken and hostile files: each gives a picture or a logged null, never a
// crash, a hang or a huge allocation (run under ASan to see the latter).

#include <gtest/gtest.h>
#include <zlib.h>

#include "codec/BitmapFactory.h"
#include "tests/codec/TestImages.h"
#include "tests/support/TestSupport.h"

using namespace pictavo::test;

namespace {
std::unique_ptr<Bitmap> decode(const std::string& path, int w = 64, int h = 48) {
  DecodeOptions o;
  o.colorFormat = 8;
  return std::unique_ptr<Bitmap>(BitmapFactory::decodeFile(path, o, w, h, 0));
}

int decodePngStatus(const std::string& path, int w = 64, int h = 48) {
  DecodeOptions o;
  o.colorFormat = 8;
  if (BitmapFactory::initPNGFile(o, path) != 1) return -1;
  std::unique_ptr<Bitmap> b(BitmapFactory::createBitmap(w, h, 8));
  return BitmapFactory::decodePNG(o, *b, w, h);
}

// Offset of the first SOFn marker of a JPEG (its size follows at +5).
size_t findSof(const std::vector<uint8_t>& j) {
  for (size_t i = 2; i + 9 < j.size(); ++i)
    if (j[i] == 0xFF && (j[i + 1] == 0xC0 || j[i + 1] == 0xC2)) return i;
  return 0;
}

void setJpegSize(std::vector<uint8_t>& j, int w, int h) {
  const size_t sof = findSof(j);
  ASSERT_NE(sof, 0u);
  j[sof + 5] = static_cast<uint8_t>(h >> 8);
  j[sof + 6] = static_cast<uint8_t>(h);
  j[sof + 7] = static_cast<uint8_t>(w >> 8);
  j[sof + 8] = static_cast<uint8_t>(w);
}

void setPngSize(std::vector<uint8_t>& p, uint32_t w, uint32_t h) {
  for (int i = 0; i < 4; ++i) {
    p[16 + i] = static_cast<uint8_t>(w >> (24 - 8 * i));
    p[20 + i] = static_cast<uint8_t>(h >> (24 - 8 * i));
  }
  const uLong crc = crc32(crc32(0, nullptr, 0), &p[12], 17);
  for (int i = 0; i < 4; ++i) p[29 + i] = static_cast<uint8_t>(crc >> (24 - 8 * i));
}
}  // namespace

TEST(BadInput, EmptyTextAndTruncatedFiles) {
  TempDir dir;
  LogCapture log;
  ASSERT_TRUE(writeBytes(dir.file("empty.jpg"), {}));
  EXPECT_EQ(decode(dir.file("empty.jpg")), nullptr);
  EXPECT_EQ(decodePngStatus(dir.file("empty.jpg")), -1);
  ASSERT_TRUE(
      writeBytes(dir.file("text.jpg"), std::vector<uint8_t>({'J', 'F', 'I', 'F', ' ', 'n', 'o', 't'})));
  EXPECT_EQ(decode(dir.file("text.jpg")), nullptr);
  EXPECT_TRUE(log.contains("not support file type"));

  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 640, 480, photoLike(1)));
  ASSERT_TRUE(writePng(dir.file("a.png"), 640, 480, photoLike(2)));
  const auto jpeg = readBytes(dir.file("a.jpg"));
  const auto png = readBytes(dir.file("a.png"));
  // Cut at many points: the header, inside the scan data, just before the end.
  for (size_t cut : {size_t(1), size_t(3), size_t(20), size_t(200), jpeg.size() / 3, jpeg.size() - 2}) {
    ASSERT_TRUE(writeBytes(dir.file("cut.jpg"), std::vector<uint8_t>(jpeg.begin(), jpeg.begin() + cut)));
    auto b = decode(dir.file("cut.jpg"));
    if (b) {  // the part that was there, the rest grey
      EXPECT_EQ(b->getWidth(), 64);
      EXPECT_EQ(b->getHeight(), 48);
    }
  }
  for (size_t cut : {size_t(8), size_t(30), size_t(100), png.size() / 2}) {
    ASSERT_TRUE(writeBytes(dir.file("cut.png"), std::vector<uint8_t>(png.begin(), png.begin() + cut)));
    EXPECT_NE(decodePngStatus(dir.file("cut.png")), 1) << cut;
  }
  // Only the end chunk missing: every row is there, so the picture is whole.
  ASSERT_TRUE(writeBytes(dir.file("cut.png"), std::vector<uint8_t>(png.begin(), png.end() - 5)));
  EXPECT_EQ(decodePngStatus(dir.file("cut.png")), 1);
}

TEST(BadInput, ZeroAndHugeSizesRefusedFromTheHeader) {
  TempDir dir;
  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 64, 48, photoLike(3)));
  auto jpeg = readBytes(dir.file("a.jpg"));
  LogCapture log;

  auto zero = jpeg;
  setJpegSize(zero, 0, 48);
  ASSERT_TRUE(writeBytes(dir.file("zero.jpg"), zero));
  EXPECT_EQ(decode(dir.file("zero.jpg")), nullptr);

  // 65535 is beyond what libjpeg reads at all; 65500 is readable but far
  // beyond the pixel limit. Neither allocates anything of that size.
  auto huge = jpeg;
  setJpegSize(huge, 65535, 65535);
  ASSERT_TRUE(writeBytes(dir.file("huge.jpg"), huge));
  DecodeOptions o;
  EXPECT_EQ(BitmapFactory::parseImage(dir.file("huge.jpg"), o), 0);
  EXPECT_EQ(decode(dir.file("huge.jpg"), 720, 720), nullptr);
  setJpegSize(huge, 65500, 65500);
  ASSERT_TRUE(writeBytes(dir.file("huge.jpg"), huge));
  ASSERT_EQ(BitmapFactory::parseImage(dir.file("huge.jpg"), o), 1);
  EXPECT_EQ(o.outWidth, 65500);
  log.clear();
  EXPECT_EQ(decode(dir.file("huge.jpg"), 720, 720), nullptr);
  EXPECT_TRUE(log.contains("not support image resolution"));

  // Just over and just under 100 million pixels (sizes only: the data is the small picture's).
  auto over = jpeg;
  setJpegSize(over, 10001, 10000);
  ASSERT_TRUE(writeBytes(dir.file("over.jpg"), over));
  EXPECT_EQ(decode(dir.file("over.jpg")), nullptr);

  ASSERT_TRUE(writePng(dir.file("a.png"), 64, 48, photoLike(4)));
  auto png = readBytes(dir.file("a.png"));
  auto bigPng = png;
  setPngSize(bigPng, 100000, 100000);
  ASSERT_TRUE(writeBytes(dir.file("huge.png"), bigPng));
  log.clear();
  EXPECT_EQ(decodePngStatus(dir.file("huge.png")), -1);
  EXPECT_TRUE(log.contains("not support image resolution"));
  auto zeroPng = png;
  setPngSize(zeroPng, 0, 48);
  ASSERT_TRUE(writeBytes(dir.file("zero.png"), zeroPng));
  EXPECT_EQ(decodePngStatus(dir.file("zero.png")), -1);
  // A PNG claiming more rows than it has: the decode fails cleanly.
  auto tall = png;
  setPngSize(tall, 64, 9000);
  ASSERT_TRUE(writeBytes(dir.file("tall.png"), tall));
  EXPECT_NE(decodePngStatus(dir.file("tall.png")), 1);

  // A BMP and a WBMP claiming sizes they do not have.
  auto bmp = makeBmp(8, 8, 24, photoLike(5));
  bmp[18] = 0xff;
  bmp[19] = 0xff;
  bmp[20] = 0xff;
  bmp[21] = 0x7f;  // width 2^31 - 1
  ASSERT_TRUE(writeBytes(dir.file("wide.bmp"), bmp));
  EXPECT_EQ(decode(dir.file("wide.bmp")), nullptr);
  ASSERT_TRUE(writeBytes(dir.file("big.wbmp"), {0, 0, 0xff, 0xff, 0x7f, 0xff, 0xff, 0x7f, 0, 0}));
  EXPECT_EQ(decode(dir.file("big.wbmp")), nullptr);
}

TEST(BadInput, GifBmpOddities) {
  TempDir dir;
  LogCapture log;
  ASSERT_TRUE(writeGif(
      dir.file("none.gif"), 10, 10, [](int, int) { return 0; }, false, 0));
  EXPECT_EQ(decode(dir.file("none.gif")), nullptr);
  EXPECT_TRUE(log.contains("decoding fail"));

  // Negative height: a top-down picture, decoded the right way up (covered
  // in DecodeTest); with RLE it is invalid and refused.
  auto rle = makeBmp(8, -8, 8, nullptr, 4, [](int, int) { return 0; });
  rle[30] = 1;  // compression RLE8
  ASSERT_TRUE(writeBytes(dir.file("rle-down.bmp"), rle));
  EXPECT_EQ(decode(dir.file("rle-down.bmp")), nullptr);

  // Palette of 4 colours, indexes up to 255: the picture shows, in black where out of range.
  ASSERT_TRUE(
      writeBytes(dir.file("pal.bmp"), makeBmp(16, 4, 8, nullptr, 4, [](int x, int) { return x * 16; })));
  auto b = decode(dir.file("pal.bmp"), 16, 4);
  ASSERT_TRUE(b);
  EXPECT_EQ(b->getPixels()[4 * 15 + 3], 255);
  EXPECT_EQ(b->getPixels()[4 * 15], 0);

  // RLE8 with runs, a delta jump past the end and an end-of-bitmap.
  auto head = makeBmp(8, 8, 8, nullptr, 256, [](int, int) { return 0; });
  head.resize(14 + 40 + 256 * 4);
  head[30] = 1;
  const std::vector<uint8_t> data = {4, 200, 0, 0, 2, 100, 0, 2,   3,   50, 0,
                                     3, 1,   2, 3, 0, 0,   2, 100, 100, 0,  1};
  head.insert(head.end(), data.begin(), data.end());
  ASSERT_TRUE(writeBytes(dir.file("rle.bmp"), head));
  auto r = decode(dir.file("rle.bmp"), 8, 8);
  ASSERT_TRUE(r);
  EXPECT_EQ(r->getPixels()[(7 * 8 + 0) * 4], 200);  // the first run fills the bottom row
}

TEST(BadInput, CorruptBytesNeverCrash) {
  // Deterministic bit flips over every format; under ASan this also shows
  // reads and writes out of bounds.
  TempDir dir;
  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 96, 64, photoLike(6)));
  JpegOptions prog;
  prog.progressive = true;
  ASSERT_TRUE(writeJpeg(dir.file("p.jpg"), 96, 64, photoLike(7), prog));
  ASSERT_TRUE(writePng(dir.file("a.png"), 96, 64, photoLike(8)));
  ASSERT_TRUE(writeGif(
      dir.file("a.gif"), 96, 64, [](int x, int y) { return (x + y) % 4; }, true));
  ASSERT_TRUE(writeBytes(dir.file("a.bmp"), makeBmp(96, 64, 24, photoLike(9))));
  uint32_t seed = 12345;
  auto next = [&seed]() {
    seed = seed * 1103515245u + 12345u;
    return seed >> 8;
  };
  for (const char* name : {"a.jpg", "p.jpg", "a.png", "a.gif", "a.bmp"}) {
    const auto original = readBytes(dir.file(name));
    for (int round = 0; round < 60; ++round) {
      auto bytes = original;
      const int flips = 1 + static_cast<int>(next() % 8);
      for (int i = 0; i < flips; ++i) bytes[next() % bytes.size()] ^= static_cast<uint8_t>(1 + next() % 255);
      const std::string path = dir.file(std::string("x-") + name);
      ASSERT_TRUE(writeBytes(path, bytes));
      DecodeOptions o;
      o.colorFormat = 8;
      if (BitmapFactory::parseImage(path, o) != 1) continue;
      if (o.imageType == IMAGE_TYPE_PNG) {
        decodePngStatus(path, 48, 32);
      } else {
        auto b = decode(path, 48, 32);
        if (b) {
          EXPECT_EQ(b->getWidth(), 48);
        }
      }
    }
  }
}
