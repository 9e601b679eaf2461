// Decoding photos to screen size through the decoder threads, as the main
// view does: one thread per photo, all started at once, in one process.
//
//   bench_decode gen DIR            writes the test photos into DIR (see below)
//   bench_decode decode [-r N] FILE...   decodes all FILEs for a 720 x 1280 screen,
//                                   N times; prints "decode_inproc: min median max (ms)"
//   bench_decode mem FILE           decodes FILE once; prints the rise of the peak
//                                   resident memory it caused ("mem_rise_kb: K")
//   bench_decode seeds DIR          writes small pictures of every format (fuzz seeds)
//
// Photos of `gen`: p12_1..6.jpg 4000 x 3000 photo-like, quality 92, 4:2:0, with
// EXIF orientation 6 on p12_2 and p12_5; p24_base.jpg and p24_prog.jpg 6000 x
// 4000 baseline and progressive; p24.png 6000 x 4000 RGB.
// bench/run-decode.sh runs this side by side with djpeg and Pillow.

#include <sys/resource.h>

#include <algorithm>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <cstring>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "codec/BitmapFactory.h"
#include "model/CLyImageDecoderThread.h"
#include "model/ILyMultiGridListener.h"
#include "tests/codec/TestImages.h"

using namespace pictavo::test;

namespace {

class Sink : public ILyMultiGridListener {
 public:
  void onInvalidateMultiGrid(int index, Bitmap* bitmap) override {
    std::lock_guard<std::mutex> lock(mMutex);
    if (bitmap) {
      sizes.push_back(std::to_string(index) + ":" + std::to_string(bitmap->getWidth()) + "x" +
                      std::to_string(bitmap->getHeight()));
    } else {
      sizes.push_back(std::to_string(index) + ":null");
    }
    delete bitmap;
    ++done;
    mCond.notify_all();
  }
  void wait(int n) {
    std::unique_lock<std::mutex> lock(mMutex);
    mCond.wait(lock, [&] { return done >= n; });
  }
  std::vector<std::string> sizes;
  int done = 0;

 private:
  std::mutex mMutex;
  std::condition_variable mCond;
};

double decodeAll(const std::vector<std::string>& files, std::vector<std::string>* sizes) {
  Sink sink;
  const auto t0 = std::chrono::steady_clock::now();
  {
    std::vector<std::unique_ptr<CLyImageDecoderThread>> threads;
    for (size_t i = 0; i < files.size(); ++i) {
      threads.emplace_back(new CLyImageDecoderThread());
      threads.back()->setMaxDecodingSize(720, 1280);
      threads.back()->set(static_cast<int>(i), files[i], &sink);
    }
    for (auto& t : threads) t->start();
    sink.wait(static_cast<int>(files.size()));
  }
  const auto t1 = std::chrono::steady_clock::now();
  if (sizes) {
    *sizes = sink.sizes;
    std::sort(sizes->begin(), sizes->end());
  }
  return std::chrono::duration<double, std::milli>(t1 - t0).count();
}

// Camera-like content: smooth shading with fine detail and sensor noise, so
// the entropy-coded data is about as dense as a phone photo's (~2.7 bit/px at Q92).
PixelFn camera(unsigned seed) {
  return [seed](int x, int y) -> Rgba {
    uint32_t n =
        static_cast<uint32_t>(x) * 374761393u + static_cast<uint32_t>(y) * 668265263u + seed * 2246822519u;
    n = (n ^ (n >> 13)) * 1274126177u;
    n ^= n >> 16;
    const int noise = static_cast<int>(n & 15) + static_cast<int>((n >> 4) & 15) - 15;
    const int base = ((x * 3 + static_cast<int>(seed) * 97) % 512 + (y * 2) % 384) / 4;
    const int detail = ((x / 3) ^ (y / 3)) & 15;
    auto c = [](int v) { return static_cast<uint8_t>(v < 0 ? 0 : (v > 255 ? 255 : v)); };
    return {c(base + detail + noise), c(255 - base + noise), c(base / 2 + 60 + detail - noise), 255};
  };
}

bool genPng(const std::string& path, int w, int h, const PixelFn& pixel) {
  PngOptions o;
  return writePng(path, w, h, pixel, o);
}

int gen(const std::string& dir) {
  for (int i = 1; i <= 6; ++i) {
    JpegOptions o;
    if (i == 2 || i == 5) o.app1 = exifWithOrientation(6);
    const std::string path = dir + "/p12_" + std::to_string(i) + ".jpg";
    if (!writeJpeg(path, 4000, 3000, camera(static_cast<unsigned>(i)), o)) return 1;
  }
  JpegOptions prog;
  prog.progressive = true;
  if (!writeJpeg(dir + "/p24_base.jpg", 6000, 4000, camera(7))) return 1;
  if (!writeJpeg(dir + "/p24_prog.jpg", 6000, 4000, camera(8), prog)) return 1;
  if (!genPng(dir + "/p24.png", 6000, 4000, camera(9))) return 1;
  return 0;
}

int seeds(const std::string& dir) {
  const PixelFn pix = photoLike(3);
  JpegOptions prog;
  prog.progressive = true;
  JpegOptions gray;
  gray.grayscale = true;
  gray.app1 = exifWithOrientation(6);
  PngOptions alpha;
  alpha.alpha = true;
  PngOptions interlaced;
  interlaced.interlaced = true;
  auto index = [](int x, int y) { return (x / 3 + y / 2) % 4; };
  bool ok = writeJpeg(dir + "/a.jpg", 37, 23, pix) && writeJpeg(dir + "/p.jpg", 37, 23, pix, prog) &&
            writeJpeg(dir + "/g.jpg", 19, 17, pix, gray) && writePng(dir + "/a.png", 37, 23, pix) &&
            writePng(dir + "/alpha.png", 21, 13, pix, alpha) &&
            writePng(dir + "/i.png", 37, 23, pix, interlaced) &&
            writeGif(dir + "/a.gif", 37, 23, index, true) &&
            writeGif(dir + "/i.gif", 37, 23, index, false, 1, true) &&
            writeBytes(dir + "/a.bmp", makeBmp(17, 9, 24, pix)) &&
            writeBytes(dir + "/d.bmp", makeBmp(17, -9, 32, pix)) &&
            writeBytes(dir + "/p.bmp", makeBmp(17, 9, 8, nullptr, 16, [](int x, int) { return x; })) &&
            writeBytes(dir + "/a.wbmp", makeWbmp(19, 7, [](int x, int y) { return ((x + y) & 3) == 0; }));
  return ok ? 0 : 1;
}

long maxRssKb() {
  struct rusage u;
  getrusage(RUSAGE_SELF, &u);
  return u.ru_maxrss;
}

}  // namespace

int main(int argc, char** argv) {
  if (argc < 3) {
    fprintf(stderr, "usage: %s gen DIR | seeds DIR | decode [-r N] FILE... | mem FILE\n", argv[0]);
    return 2;
  }
  const std::string mode = argv[1];
  if (mode == "gen") return gen(argv[2]);
  if (mode == "seeds") return seeds(argv[2]);
  if (mode == "mem") {
    // Touch everything a decode needs once on a tiny image, so the rise is the decode's own.
    const long before = maxRssKb();
    std::vector<std::string> sizes;
    decodeAll({argv[2]}, &sizes);
    const long after = maxRssKb();
    printf("mem_rise_kb: %ld (peak %ld kB, before %ld kB) %s\n", after - before, after, before,
           sizes.empty() ? "" : sizes[0].c_str());
    return 0;
  }
  if (mode == "decode") {
    int repeat = 1, first = 2;
    if (std::string(argv[2]) == "-r" && argc > 4) {
      repeat = std::max(1, atoi(argv[3]));
      first = 4;
    }
    std::vector<std::string> files(argv + first, argv + argc);
    std::vector<double> times;
    std::vector<std::string> sizes;
    for (int r = 0; r < repeat; ++r) times.push_back(decodeAll(files, &sizes));
    std::sort(times.begin(), times.end());
    const double median = times.size() % 2 ? times[times.size() / 2]
                                           : (times[times.size() / 2 - 1] + times[times.size() / 2]) / 2;
    printf("decode_inproc: %.1f %.1f %.1f (ms) [", times.front(), median, times.back());
    for (const auto& s : sizes) printf(" %s", s.c_str());
    printf(" ]\n");
    return 0;
  }
  fprintf(stderr, "unknown mode %s\n", mode.c_str());
  return 2;
}
