// The facade itself: bitmaps, file sizes, header parsing, the rules of
// decodeFile, rotate and clone.

#include <gtest/gtest.h>

#include <cstring>

#include "codec/BitmapFactory.h"
#include "tests/codec/TestImages.h"
#include "tests/support/TestSupport.h"

using namespace pictavo::test;

namespace {
// Pixel (x, y) of a 4-byte bitmap as B, G, R, A.
const uint8_t* px(const Bitmap& b, int x, int y) {
  return b.getPixels() + (static_cast<size_t>(y) * b.getWidth() + x) * 4;
}
}  // namespace

TEST(Bitmap, CreateSizesPerFormatAndZeroFill) {
  struct Case {
    int format;
    size_t size;
  } cases[] = {{8, 4u * 5 * 3}, {7, 4u * 5 * 3},      {5, 4u * 5 * 3},
               {0, 2u * 5 * 3}, {2, 15u + 2 * 3 * 2}, {42, 30u}};
  for (const Case& c : cases) {
    std::unique_ptr<Bitmap> b(BitmapFactory::createBitmap(5, 3, c.format));
    ASSERT_TRUE(b) << c.format;
    EXPECT_EQ(b->getByteSize(), c.size) << c.format;
    EXPECT_EQ(b->getWidth(), 5);
    EXPECT_EQ(b->getHeight(), 3);
    for (size_t i = 0; i < c.size; ++i) ASSERT_EQ(b->getPixels()[i], 0);
  }
  LogCapture log;
  EXPECT_EQ(BitmapFactory::createBitmap(0, 3, 8), nullptr);
  EXPECT_EQ(BitmapFactory::createBitmap(5, -1, 8), nullptr);
  // Too large for memory: refused, not crashed.
  EXPECT_EQ(BitmapFactory::createBitmap(2000000000, 2000000000, 8), nullptr);
  EXPECT_TRUE(log.contains("IV-COMMON") || log.contains("createBitmap"));
}

TEST(BitmapFactory, LogLinesCarryTheFacadeForm) {
  LogCapture log;
  EXPECT_EQ(BitmapFactory::getFileSize("/nonexistent/file.jpg"), 0);
  ASSERT_FALSE(log.lines().empty());
  const std::string line = log.lines().back();
  EXPECT_NE(line.find("BitmapFactory.cpp: getFileSize("), std::string::npos) << line;
  EXPECT_NE(line.find(") > [F:BitmapFactory.cpp\tL:"), std::string::npos) << line;
  EXPECT_NE(line.find("] getFileSize : file open fail"), std::string::npos) << line;
}

TEST(BitmapFactory, FileSizeAndParseOfEveryType) {
  TempDir dir;
  LogCapture log;
  ASSERT_TRUE(writeBytes(dir.file("empty.jpg"), {}));
  EXPECT_EQ(BitmapFactory::getFileSize(dir.file("empty.jpg")), 0);
  EXPECT_TRUE(log.contains("file length is zero"));
  EXPECT_EQ(BitmapFactory::getFileSize(dir.path()), 0);  // a folder is not a file

  DecodeOptions o;
  EXPECT_EQ(BitmapFactory::parseImage(dir.file("empty.jpg"), o), 0);
  EXPECT_FALSE(log.contains("CreateDecInfo"));  // refused before any decoder opened it

  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 40, 30, quadrants(40, 30)));
  ASSERT_TRUE(writePng(dir.file("a.png"), 41, 31, quadrants(41, 31)));
  ASSERT_TRUE(writeGif(dir.file("a.gif"), 42, 32, [](int x, int) { return x % 3; }));
  ASSERT_TRUE(writeBytes(dir.file("a.bmp"), makeBmp(43, 33, 24, quadrants(43, 33))));
  ASSERT_TRUE(writeBytes(dir.file("a.wbmp"), makeWbmp(44, 34, [](int x, int) { return x & 1; })));
  ASSERT_TRUE(writeBytes(dir.file("text.jpg"), {'h', 'e', 'l', 'l', 'o', '\n'}));
  struct Case {
    const char* name;
    int type, w, h;
  } cases[] = {{"a.jpg", 1, 40, 30}, {"a.png", 3, 41, 31},  {"a.gif", 4, 42, 32},
               {"a.bmp", 2, 43, 33}, {"a.wbmp", 5, 44, 34}, {"text.jpg", 0, 0, 0}};
  for (const Case& c : cases) {
    DecodeOptions opt;
    EXPECT_EQ(BitmapFactory::parseImage(dir.file(c.name), opt), 1) << c.name;
    EXPECT_EQ(opt.imageType, c.type) << c.name;
    EXPECT_EQ(opt.outWidth, c.w) << c.name;
    EXPECT_EQ(opt.outHeight, c.h) << c.name;
  }
  EXPECT_FALSE(BitmapFactory::isSupportedType(3));
  for (int t : {1, 2, 4, 5, 6}) EXPECT_TRUE(BitmapFactory::isSupportedType(t));
  for (int t : {0, 3, 7, -1}) EXPECT_FALSE(BitmapFactory::isSupportedType(t));

  // Just a GIF signature and screen descriptor: type 4 with its size.
  ASSERT_TRUE(writeBytes(dir.file("gif.x"), {'G', 'I', 'F', '8', '9', 'a', 10, 0, 5, 0, 0, 0, 0}));
  DecodeOptions g;
  EXPECT_EQ(BitmapFactory::parseImage(dir.file("gif.x"), g), 1);
  EXPECT_EQ(g.imageType, 4);
  EXPECT_EQ(g.outWidth, 10);
  ASSERT_TRUE(writeBytes(dir.file("short.gif"), {'G', 'I', 'F'}));
  EXPECT_EQ(BitmapFactory::parseImage(dir.file("short.gif"), g), 0);  // unreadable header
  EXPECT_TRUE(log.contains("parseImage : CreateDecInfo fail"));

  DecodeOptions busy;
  busy.handle = 5;
  log.clear();
  EXPECT_EQ(BitmapFactory::parseImage(dir.file("a.jpg"), busy), 0);
  EXPECT_TRUE(log.contains("parseImage : handle fail"));
}

TEST(BitmapFactory, DecodeFileRules) {
  TempDir dir;
  ASSERT_TRUE(writeJpeg(dir.file("a.jpg"), 64, 48, quadrants(64, 48)));
  ASSERT_TRUE(writePng(dir.file("a.png"), 64, 48, quadrants(64, 48)));
  LogCapture log;
  DecodeOptions o;
  o.colorFormat = 8;
  EXPECT_EQ(BitmapFactory::decodeFile(dir.file("a.jpg"), o, 3000, 2000, 0), nullptr);
  EXPECT_TRUE(log.contains("decodeFile : not support image resolution"));
  std::unique_ptr<Bitmap> big(BitmapFactory::decodeFile(dir.file("a.jpg"), o, 2999, 2999, 0));
  ASSERT_TRUE(big);
  EXPECT_EQ(big->getWidth(), 2999);
  EXPECT_EQ(big->getHeight(), 2999);
  for (auto wh : {std::pair<int, int>{0, 10}, {10, 0}, {-5, 10}, {10, 3000}}) {
    log.clear();
    EXPECT_EQ(BitmapFactory::decodeFile(dir.file("a.jpg"), o, wh.first, wh.second, 0), nullptr);
    EXPECT_TRUE(log.contains("not support image resolution"));
  }
  log.clear();
  EXPECT_EQ(BitmapFactory::decodeFile(dir.file("a.png"), o, 32, 24, 0), nullptr);
  EXPECT_TRUE(log.contains("decodeFile : not support file type"));
  log.clear();
  EXPECT_EQ(BitmapFactory::decodeFile(dir.file("missing.jpg"), o, 32, 24, 0), nullptr);
  EXPECT_TRUE(log.contains("decodeFile : CreateDecInfo fail"));
  DecodeOptions busy;
  busy.handle = 1;
  log.clear();
  EXPECT_EQ(BitmapFactory::decodeFile(dir.file("a.jpg"), busy, 32, 24, 0), nullptr);
  EXPECT_TRUE(log.contains("decodeFile : getHandle fail"));
}

TEST(BitmapFactory, RotateThreeByTwo) {
  // Pixel value = 10 * row + column, in the first byte of each pixel.
  auto make = []() {
    Bitmap* b = BitmapFactory::createBitmap(3, 2, 8);
    for (int y = 0; y < 2; ++y)
      for (int x = 0; x < 3; ++x) b->getPixels()[(y * 3 + x) * 4] = static_cast<uint8_t>(10 * y + x);
    return std::unique_ptr<Bitmap>(b);
  };
  auto row = [](const Bitmap& b, int y) {
    std::vector<int> r;
    for (int x = 0; x < b.getWidth(); ++x) r.push_back(px(b, x, y)[0]);
    return r;
  };
  auto b = make();
  BitmapFactory::rotate(*b, 1);  // clockwise: first row is the first column read upwards
  ASSERT_EQ(b->getWidth(), 2);
  ASSERT_EQ(b->getHeight(), 3);
  EXPECT_EQ(row(*b, 0), (std::vector<int>{10, 0}));
  EXPECT_EQ(row(*b, 1), (std::vector<int>{11, 1}));
  EXPECT_EQ(row(*b, 2), (std::vector<int>{12, 2}));
  b = make();
  BitmapFactory::rotate(*b, 2);
  ASSERT_EQ(b->getWidth(), 3);
  EXPECT_EQ(row(*b, 0), (std::vector<int>{12, 11, 10}));
  EXPECT_EQ(row(*b, 1), (std::vector<int>{2, 1, 0}));
  b = make();
  BitmapFactory::rotate(*b, 3);  // counter-clockwise: row i is column W-1-i from the top
  ASSERT_EQ(b->getWidth(), 2);
  EXPECT_EQ(row(*b, 0), (std::vector<int>{2, 12}));
  EXPECT_EQ(row(*b, 2), (std::vector<int>{0, 10}));
  // 1 then 3 is the identity; four quarter turns too.
  b = make();
  BitmapFactory::rotate(*b, 1);
  BitmapFactory::rotate(*b, 3);
  EXPECT_EQ(row(*b, 1), (std::vector<int>{10, 11, 12}));
  for (int i = 0; i < 4; ++i) BitmapFactory::rotate(*b, 1);
  EXPECT_EQ(row(*b, 0), (std::vector<int>{0, 1, 2}));

  // Two-byte pixels turn with their own size (no overrun under ASan).
  std::unique_ptr<Bitmap> small(BitmapFactory::createBitmap(3, 2, 0));
  for (int i = 0; i < 6; ++i) small->getPixels()[i * 2] = static_cast<uint8_t>(i);
  BitmapFactory::rotate(*small, 1);
  EXPECT_EQ(small->getWidth(), 2);
  EXPECT_EQ(small->getPixels()[0], 3);
  EXPECT_EQ(small->getPixels()[2], 0);

  LogCapture log;
  Bitmap empty;
  BitmapFactory::rotate(empty, 1);
  EXPECT_TRUE(log.contains("Invalid buffer"));
  b = make();
  BitmapFactory::rotate(*b, 7);  // not a turn: left alone
  EXPECT_EQ(b->getWidth(), 3);
  EXPECT_EQ(row(*b, 1), (std::vector<int>{10, 11, 12}));
}

TEST(BitmapFactory, Clone) {
  std::unique_ptr<Bitmap> b(BitmapFactory::createBitmap(4, 3, 8));
  for (size_t i = 0; i < b->getByteSize(); ++i) b->getPixels()[i] = static_cast<uint8_t>(i * 7);
  std::unique_ptr<Bitmap> c(BitmapFactory::clone(*b));
  ASSERT_TRUE(c);
  EXPECT_NE(c->getPixels(), b->getPixels());
  EXPECT_EQ(c->getWidth(), 4);
  EXPECT_EQ(c->getFormat(), 8);
  EXPECT_EQ(memcmp(c->getPixels(), b->getPixels(), b->getByteSize()), 0);
  LogCapture log;
  Bitmap empty;
  EXPECT_EQ(BitmapFactory::clone(empty), nullptr);
  EXPECT_TRUE(log.contains("Invalid buffer"));
}
