// The decoder threads: target sizes, upright results, the PNG lock, bad
// files and broken EXIF, and six threads at once (run under TSan too).

#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <map>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "codec/BitmapFactory.h"
#include "common/CLyAppData.h"
#include "model/CLyImageDecoderThread.h"
#include "model/ILyMultiGridListener.h"
#include "tests/codec/TestImages.h"
#include "tests/support/TestSupport.h"

using namespace pictavo::test;

namespace {

class Collector : public ILyMultiGridListener {
 public:
  ~Collector() override {
    for (auto& r : mResults) delete r.second;
  }
  void onInvalidateMultiGrid(int index, Bitmap* bitmap) override {
    std::lock_guard<std::mutex> lock(mMutex);
    mResults[index] = bitmap;
    ++mCalls;
    mChanged.notify_all();
  }
  bool waitFor(int calls, int millis = 20000) {
    std::unique_lock<std::mutex> lock(mMutex);
    return mChanged.wait_for(lock, std::chrono::milliseconds(millis), [&] { return mCalls >= calls; });
  }
  int calls() {
    std::lock_guard<std::mutex> lock(mMutex);
    return mCalls;
  }
  Bitmap* result(int index) {
    std::lock_guard<std::mutex> lock(mMutex);
    auto it = mResults.find(index);
    return it == mResults.end() ? nullptr : it->second;
  }
  bool has(int index) {
    std::lock_guard<std::mutex> lock(mMutex);
    return mResults.count(index) != 0;
  }

 private:
  std::mutex mMutex;
  std::condition_variable mChanged;
  std::map<int, Bitmap*> mResults;
  int mCalls = 0;
};

// Runs one decode to the end (the object's destruction joins).
Bitmap* decodeOne(Collector& c, const std::string& path, int index = 0, float maxW = 720, float maxH = 1280) {
  {
    CLyImageDecoderThread t;
    t.setMaxDecodingSize(maxW, maxH);
    t.set(index, path, &c);
    EXPECT_TRUE(t.start());
  }
  EXPECT_TRUE(c.has(index));
  return c.result(index);
}

// Colour at (x, y) of a BGRA bitmap as a name: r, g, b or w.
char colourAt(const Bitmap& b, int x, int y) {
  const uint8_t* p = b.getPixels() + (static_cast<size_t>(y) * b.getWidth() + x) * 4;
  const bool r = p[2] > 160, g = p[1] > 160, bl = p[0] > 160;
  if (r && g && bl) return 'w';
  if (r && !g && !bl) return 'r';
  if (g && !r && !bl) return 'g';
  if (bl && !r && !g) return 'b';
  return '?';
}

std::string corners(const Bitmap& b) {
  const int w = b.getWidth(), h = b.getHeight();
  return {colourAt(b, w / 8, h / 8), colourAt(b, w - 1 - w / 8, h / 8), colourAt(b, w / 8, h - 1 - h / 8),
          colourAt(b, w - 1 - w / 8, h - 1 - h / 8)};
}

// Raw EXIF (little-endian TIFF) of one IFD0: the orientation entry and an
// optional Exif-IFD pointer, then the next-IFD offset.
std::vector<uint8_t> rawExif(int orientation, uint32_t nextIfd, bool exifPointer = false,
                             uint32_t pointer = 0, uint16_t entryCount = 0) {
  std::vector<uint8_t> v = {'E', 'x', 'i', 'f', 0, 0, 'I', 'I', 42, 0, 8, 0, 0, 0};
  const uint16_t entries = entryCount ? entryCount : static_cast<uint16_t>(exifPointer ? 2 : 1);
  put16(v, entries);
  put16(v, 0x0112);
  put16(v, 3);
  put32(v, 1);
  put16(v, static_cast<uint32_t>(orientation));
  put16(v, 0);
  if (exifPointer) {
    put16(v, 0x8769);
    put16(v, 4);
    put32(v, 1);
    put32(v, pointer);
  }
  put32(v, nextIfd);
  return v;
}

}  // namespace

class DecoderThread : public ::testing::Test {
 protected:
  void SetUp() override {
    // Made on the main thread, as the application does before any decode.
    CLyAppData::getInstance();
  }
};

TEST_F(DecoderThread, TargetSizesAndRotationTable) {
  int w = 0, h = 0;
  CLyImageDecoderThread::computeTarget(4000, 3000, 1, 720, 1280, &w, &h);
  EXPECT_EQ(w, 720);
  EXPECT_EQ(h, 540);
  CLyImageDecoderThread::computeTarget(4000, 3000, 6, 720, 1280, &w, &h);
  EXPECT_EQ(w, 960);
  EXPECT_EQ(h, 720);
  CLyImageDecoderThread::computeTarget(500, 400, 1, 720, 1280, &w, &h);
  EXPECT_EQ(w, 500);
  EXPECT_EQ(h, 400);
  CLyImageDecoderThread::computeTarget(3000, 4000, 8, 1080, 1920, &w, &h);
  EXPECT_EQ(w, 810);  // stored turned: 3000 against 1920, 4000 against 1080
  EXPECT_EQ(h, 1080);
  CLyImageDecoderThread::computeTarget(60000, 1, 1, 720, 1280, &w, &h);  // a sliver keeps a pixel
  EXPECT_EQ(w, 720);
  EXPECT_EQ(h, 1);
  // Many sizes: never above the limits, never enlarged, aspect kept within a pixel.
  for (int iw = 1; iw < 6000; iw += 397) {
    for (int ih = 1; ih < 6000; ih += 411) {
      CLyImageDecoderThread::computeTarget(iw, ih, 1, 720, 1280, &w, &h);
      ASSERT_LE(w, std::max(720, 1));
      ASSERT_LE(h, 1280);
      ASSERT_LE(w, iw);
      ASSERT_LE(h, ih);
      ASSERT_TRUE(w == 720 || h == 1280 || (w == iw && h == ih)) << iw << "x" << ih;
    }
  }
  const std::map<int, int> table = {{1, 0}, {2, 0}, {3, 2}, {4, 0}, {5, 0},  {6, 1},
                                    {7, 0}, {8, 3}, {0, 0}, {9, 0}, {-1, 0}, {65535, 0}};
  for (auto& e : table)
    EXPECT_EQ(CLyImageDecoderThread::rotationForOrientation(e.first), e.second) << e.first;
}

TEST_F(DecoderThread, PhotosComeUprightAtTheTargetSize) {
  TempDir dir;
  JpegOptions turned;
  turned.app1 = exifWithOrientation(6);
  ASSERT_TRUE(writeJpeg(dir.file("plain.jpg"), 4000, 3000, quadrants(4000, 3000)));
  ASSERT_TRUE(writeJpeg(dir.file("six.jpg"), 4000, 3000, quadrants(4000, 3000), turned));
  turned.app1 = exifWithOrientation(3);
  ASSERT_TRUE(writeJpeg(dir.file("three.jpg"), 800, 600, quadrants(800, 600), turned));
  turned.app1 = exifWithOrientation(8);
  ASSERT_TRUE(writeJpeg(dir.file("eight.jpg"), 800, 600, quadrants(800, 600), turned));
  ASSERT_TRUE(writeJpeg(dir.file("small.jpg"), 500, 400, quadrants(500, 400)));

  Collector c;
  Bitmap* b = decodeOne(c, dir.file("plain.jpg"), 0);
  ASSERT_TRUE(b);
  EXPECT_EQ(b->getWidth(), 720);
  EXPECT_EQ(b->getHeight(), 540);
  EXPECT_EQ(corners(*b), "rgbw");
  b = decodeOne(c, dir.file("six.jpg"), 1);
  ASSERT_TRUE(b);
  EXPECT_EQ(b->getWidth(), 720);
  EXPECT_EQ(b->getHeight(), 960);
  EXPECT_EQ(corners(*b), "brwg");  // turned clockwise: the left column is now the top row
  b = decodeOne(c, dir.file("three.jpg"), 2);
  ASSERT_TRUE(b);
  EXPECT_EQ(corners(*b), "wbgr");
  b = decodeOne(c, dir.file("eight.jpg"), 3);
  ASSERT_TRUE(b);
  EXPECT_EQ(b->getWidth(), 600);
  EXPECT_EQ(corners(*b), "gwrb");
  b = decodeOne(c, dir.file("small.jpg"), 4);
  ASSERT_TRUE(b);
  EXPECT_EQ(b->getWidth(), 500);
  EXPECT_EQ(b->getHeight(), 400);
}

TEST_F(DecoderThread, BadFilesAndBrokenExif) {
  TempDir dir;
  ASSERT_TRUE(writeBytes(dir.file("text.jpg"), {'n', 'o', 't', ' ', 'a', ' ', 'p', 'h', 'o', 't', 'o'}));
  ASSERT_TRUE(writeBytes(dir.file("empty.jpg"), {}));
  Collector c;
  EXPECT_EQ(decodeOne(c, dir.file("text.jpg"), 0), nullptr);
  EXPECT_EQ(decodeOne(c, dir.file("empty.jpg"), 1), nullptr);
  EXPECT_EQ(decodeOne(c, dir.file("missing.jpg"), 2), nullptr);

  // Orientation values outside 1..8 and EXIF blocks that loop or point
  // outside themselves: the photo shows, not turned.
  std::vector<std::vector<uint8_t>> blocks = {
      exifWithOrientation(0),
      exifWithOrientation(9),
      exifWithOrientation(65535),
      rawExif(1, 8),                     // IFD0 is its own next IFD
      rawExif(1, 0, true, 8),            // the Exif IFD is IFD0 again
      rawExif(1, 0xFFFFFF00u),           // next IFD far outside
      rawExif(1, 0, true, 0x7FFFFFF0u),  // Exif IFD far outside
      rawExif(6, 0, false, 0, 0xFFFF),   // 65535 entries claimed, one present
      {'E', 'x', 'i', 'f', 0, 0, 'M', 'M', 0, 42, 0xFF, 0xFF, 0xFF, 0xF0},  // IFD0 outside
  };
  for (size_t i = 0; i < blocks.size(); ++i) {
    JpegOptions o;
    o.app1 = blocks[i];
    const std::string path = dir.file("exif" + std::to_string(i) + ".jpg");
    ASSERT_TRUE(writeJpeg(path, 800, 600, quadrants(800, 600), o));
    Bitmap* b = decodeOne(c, path, 10 + static_cast<int>(i));
    ASSERT_TRUE(b) << i;
    if (i == 7) continue;  // the orientation itself is readable there: turned or not, it shows
    EXPECT_EQ(b->getWidth(), 720) << i;
    EXPECT_EQ(b->getHeight(), 540) << i;
    EXPECT_EQ(corners(*b), "rgbw") << i;
  }

  LogCapture log;
  {
    CLyImageDecoderThread t;
    t.set(0, dir.file("exif0.jpg"), nullptr);
    ASSERT_TRUE(t.start());
  }
  EXPECT_TRUE(log.contains("Invalid listener"));
  // A thread never started is deleted without a join; one is never started twice.
  { CLyImageDecoderThread idle; }
  {
    CLyImageDecoderThread t;
    Collector once;
    t.set(0, dir.file("exif0.jpg"), &once);
    EXPECT_TRUE(t.start());
    EXPECT_FALSE(t.start());
    EXPECT_TRUE(once.waitFor(1));
  }
}

TEST_F(DecoderThread, PngsDecodeOneAtATimeUnderTheAppLock) {
  TempDir dir;
  PngOptions alpha;
  alpha.alpha = true;
  ASSERT_TRUE(writePng(dir.file("a.png"), 1600, 1200, quadrants(1600, 1200), alpha));
  ASSERT_TRUE(writePng(dir.file("b.png"), 1200, 1600, quadrants(1200, 1600)));
  ASSERT_TRUE(writeJpeg(dir.file("c.jpg"), 800, 600, quadrants(800, 600)));
  Collector c;
  std::vector<std::unique_ptr<CLyImageDecoderThread>> threads;
  const char* names[] = {"a.png", "b.png", "c.jpg"};
  // While the test holds the lock no PNG can decode; the JPEG goes on.
  CLyAppData::getInstance()->lock();
  for (int i = 0; i < 3; ++i) {
    threads.emplace_back(new CLyImageDecoderThread());
    threads.back()->set(i, dir.file(names[i]), &c);
    ASSERT_TRUE(threads.back()->start());
  }
  EXPECT_TRUE(c.waitFor(1));
  std::this_thread::sleep_for(std::chrono::milliseconds(300));
  EXPECT_EQ(c.calls(), 1);
  EXPECT_TRUE(c.has(2));
  CLyAppData::getInstance()->unlock();
  EXPECT_TRUE(c.waitFor(3));
  threads.clear();
  ASSERT_TRUE(c.result(0));
  EXPECT_EQ(c.result(0)->getWidth(), 720);
  EXPECT_EQ(c.result(0)->getHeight(), 540);
  EXPECT_EQ(corners(*c.result(0)), "rgbw");
  ASSERT_TRUE(c.result(1));
  EXPECT_EQ(c.result(1)->getWidth(), 720);
  EXPECT_EQ(c.result(1)->getHeight(), 960);
}

TEST_F(DecoderThread, SixPhotosAtOnce) {
  TempDir dir;
  std::vector<std::string> paths;
  for (int i = 0; i < 6; ++i) {
    JpegOptions o;
    if (i == 1 || i == 4) o.app1 = exifWithOrientation(6);
    paths.push_back(dir.file("p" + std::to_string(i) + (i == 5 ? ".png" : ".jpg")));
    if (i == 5) {
      ASSERT_TRUE(writePng(paths.back(), 1600, 1200, photoLike(i)));
    } else {
      ASSERT_TRUE(writeJpeg(paths.back(), 1600, 1200, photoLike(i), o));
    }
  }
  Collector c;
  {
    std::vector<std::unique_ptr<CLyImageDecoderThread>> threads;
    for (int i = 0; i < 6; ++i) {
      threads.emplace_back(new CLyImageDecoderThread());
      threads.back()->setMaxDecodingSize(720, 1280);
      threads.back()->set(i, paths[i], &c);
    }
    for (auto& t : threads) ASSERT_TRUE(t->start());
    ASSERT_TRUE(c.waitFor(6));
  }
  for (int i = 0; i < 6; ++i) {
    ASSERT_TRUE(c.result(i)) << i;
    const bool turned = i == 1 || i == 4;
    EXPECT_EQ(c.result(i)->getWidth(), 720) << i;
    EXPECT_EQ(c.result(i)->getHeight(), turned ? 960 : 540) << i;
  }
}

// A photo decoded for one save only: the smallest DCT scale whose upright
// image still covers the cell, never above what the screen bound gives.
TEST_F(DecoderThread, CoverTargetsTakeTheSmallestCoveringScale) {
  int w = 2000, h = 1500;  // 4000 x 3000 within 2000 x 2000
  CLyImageDecoderThread::computeCoverTarget(4000, 3000, 1, 667, 700, &w, &h);
  EXPECT_EQ(w, 1000);  // 1/4
  EXPECT_EQ(h, 750);
  w = 2000, h = 1500;  // 1000 rows: 1/4 (750) does not cover, 3/8 is not used, 1/2 is the bound
  CLyImageDecoderThread::computeCoverTarget(4000, 3000, 1, 667, 1000, &w, &h);
  EXPECT_EQ(w, 2000);
  EXPECT_EQ(h, 1500);
  w = 2000, h = 1500;
  CLyImageDecoderThread::computeCoverTarget(4000, 3000, 6, 667, 1000, &w, &h);
  EXPECT_EQ(w, 1000);  // upright 750 x 1000 covers 667 x 1000
  EXPECT_EQ(h, 750);
  w = 2000, h = 1500;
  CLyImageDecoderThread::computeCoverTarget(4000, 3000, 1, 0, 0, &w, &h);  // no cell: unchanged
  EXPECT_EQ(w, 2000);
  CLyImageDecoderThread::computeCoverTarget(4000, 3000, 1, 1900, 1900, &w, &h);  // only 1/2 covers: the bound
  EXPECT_EQ(w, 2000);
  EXPECT_EQ(h, 1500);
  w = 720, h = 540;  // a bound below every covering scale is kept
  CLyImageDecoderThread::computeCoverTarget(4000, 3000, 1, 1000, 1000, &w, &h);
  EXPECT_EQ(w, 720);
  EXPECT_EQ(h, 540);
  w = 333, h = 250;  // odd sizes: libjpeg's rounding up
  CLyImageDecoderThread::computeCoverTarget(1001, 751, 1, 100, 90, &w, &h);
  EXPECT_EQ(w, 126);  // 1/8: ceil(1001 / 8) x ceil(751 / 8)
  EXPECT_EQ(h, 94);
  // Whatever the cell, the result covers it upright or is the bound itself.
  for (int cw = 50; cw < 2100; cw += 173) {
    for (int ch = 50; ch < 2100; ch += 191) {
      for (int o : {1, 6}) {
        int tw = 0, th = 0;
        CLyImageDecoderThread::computeTarget(4000, 3000, o, 2000, 2000, &tw, &th);
        const int bw = tw, bh = th;
        CLyImageDecoderThread::computeCoverTarget(4000, 3000, o, (float)cw, (float)ch, &tw, &th);
        const int uw = o == 6 ? th : tw, uh = o == 6 ? tw : th;
        ASSERT_TRUE((tw == bw && th == bh) || (uw >= cw && uh >= ch)) << cw << "x" << ch << " o" << o;
        ASSERT_LE(tw, bw);
        ASSERT_LE(th, bh);
      }
    }
  }
}

TEST_F(DecoderThread, ACoverSizeDecodesAtTheDctScaleUpright) {
  TempDir dir;
  JpegOptions turned;
  turned.app1 = exifWithOrientation(6);
  ASSERT_TRUE(writeJpeg(dir.file("plain.jpg"), 1600, 1200, quadrants(1600, 1200)));
  ASSERT_TRUE(writeJpeg(dir.file("six.jpg"), 1600, 1200, quadrants(1600, 1200), turned));
  Collector c;
  for (int i = 0; i < 2; i++) {
    CLyImageDecoderThread t;
    t.setMaxDecodingSize(2000, 2000);
    t.setCoverSize(300, 400);
    t.set(i, dir.file(i == 0 ? "plain.jpg" : "six.jpg"), &c);
    EXPECT_TRUE(t.start());
  }
  Bitmap* plain = c.result(0);
  ASSERT_TRUE(plain);
  EXPECT_EQ(plain->getWidth(), 800);  // 1/2: 600 rows cover 400, 1/4 (300) would not
  EXPECT_EQ(plain->getHeight(), 600);
  EXPECT_EQ(corners(*plain), "rgbw");
  Bitmap* six = c.result(1);
  ASSERT_TRUE(six);
  EXPECT_EQ(six->getWidth(), 300);  // 1/4, turned: 300 x 400
  EXPECT_EQ(six->getHeight(), 400);
  EXPECT_EQ(corners(*six), "brwg");
}
