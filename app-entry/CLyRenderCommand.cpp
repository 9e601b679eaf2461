#include "app-entry/CLyRenderCommand.h"

#include <Efreet.h>
#include <Elementary.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "app-assist/WWindowController.h"
#include "codec/Bitmap.h"
#include "codec/BitmapFactory.h"
#include "common/CLyAppData.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridSaver.h"
#include "model/CLyImageDecoderThread.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"
#include "model/ILyMultiGridListener.h"
#include "model/style/CLyMultiGridStyleManager.h"

namespace {

// PICTAVO_RENDER_TIMES=1 prints how long each step took, to stderr.
class StepTimer {
 public:
  StepTimer() : mOn(getenv("PICTAVO_RENDER_TIMES") != nullptr), mLast(std::chrono::steady_clock::now()) {}
  void mark(const char* step) {
    if (!mOn) return;
    auto now = std::chrono::steady_clock::now();
    const double cpu = threadCpuMs();
    fprintf(stderr, "pictavo: %-8s %7.1f ms (main thread CPU %5.1f ms)\n", step,
            std::chrono::duration<double, std::milli>(now - mLast).count(), cpu - mLastCpu);
    mLast = now;
    mLastCpu = cpu;
  }

 private:
  static double threadCpuMs() {
    timespec t{};
    clock_gettime(CLOCK_THREAD_CPUTIME_ID, &t);
    return t.tv_sec * 1e3 + t.tv_nsec / 1e6;
  }
  bool mOn;
  std::chrono::steady_clock::time_point mLast;
  double mLastCpu = threadCpuMs();
};

StepTimer& stepTimer() {
  static StepTimer timer;
  return timer;
}

const int kMinPhotos = 2;
const int kMaxPhotos = 6;
const int kSaveLimit = 2000;

struct Options {
  std::string out;
  int layout = 0;
  int ratio = LY_RATIO_1_1;
  int margin = 1;
  int roundness = 0;
  CLyRectangle background{255, 255, 255, 255};
  int screenW = 1080, screenH = 1920;
  std::vector<std::string> photos;
};

void usage() {
  fprintf(stderr,
          "usage: pictavo --render OUT.jpg [--layout N] [--ratio 1:1|3:4|9:16] [--margin 0-10]\n"
          "                [--roundness 0-10] [--background '#RRGGBB'] [--screen WxH] PHOTO...\n"
          "  2 to 6 photos; --layout is the layout index for that many photos, from 0\n"
          "  (2 photos: 0-1, 3: 0-5, 4: 0-8, 5: 0-7, 6: 0-6); defaults: layout 0, ratio 1:1,\n"
          "  margin 1, roundness 0, background #FFFFFF, screen 1080x1920.\n");
}

bool parseInt(const char* text, int lo, int hi, int& out) {
  if (!text || !*text) return false;
  char* end = nullptr;
  errno = 0;
  long v = strtol(text, &end, 10);
  if (errno || *end || v < lo || v > hi) return false;
  out = (int)v;
  return true;
}

bool parseColor(const char* text, CLyRectangle& out) {
  if (!text || text[0] != '#' || strlen(text) != 7) return false;
  for (int i = 1; i < 7; i++)
    if (!isxdigit((unsigned char)text[i])) return false;
  unsigned long v = strtoul(text + 1, nullptr, 16);
  out.set((int)((v >> 16) & 0xFF), (int)((v >> 8) & 0xFF), (int)(v & 0xFF), 255);
  return true;
}

bool parseSize(const char* text, int& w, int& h) {
  if (!text) return false;
  const char* x = strchr(text, 'x');
  if (!x) return false;
  std::string ws(text, x - text);
  return parseInt(ws.c_str(), 16, 8192, w) && parseInt(x + 1, 16, 8192, h);
}

// Returns -1 on success, else the exit status.
int parseArgs(int argc, char** argv, Options& o) {
  if (argc < 3 || argv[2][0] == '-') {
    fprintf(stderr, "pictavo: --render needs the output file first\n");
    usage();
    return LY_RENDER_USAGE;
  }
  o.out = argv[2];
  for (int i = 3; i < argc; i++) {
    const std::string a = argv[i];
    if (a.size() > 2 && a.compare(0, 2, "--") == 0) {
      const char* v = i + 1 < argc ? argv[i + 1] : nullptr;
      bool ok = v != nullptr;
      if (a == "--layout") {
        ok = ok && parseInt(v, 0, 99, o.layout);
      } else if (a == "--ratio") {
        std::string r = v ? v : "";
        if (r == "1:1")
          o.ratio = LY_RATIO_1_1;
        else if (r == "3:4")
          o.ratio = LY_RATIO_3_4;
        else if (r == "9:16")
          o.ratio = LY_RATIO_9_16;
        else
          ok = false;
      } else if (a == "--margin") {
        ok = ok && parseInt(v, 0, 10, o.margin);
      } else if (a == "--roundness") {
        ok = ok && parseInt(v, 0, 10, o.roundness);
      } else if (a == "--background") {
        ok = ok && parseColor(v, o.background);
      } else if (a == "--screen") {
        ok = ok && parseSize(v, o.screenW, o.screenH);
      } else {
        fprintf(stderr, "pictavo: unknown option %s\n", a.c_str());
        usage();
        return LY_RENDER_USAGE;
      }
      if (!ok) {
        fprintf(stderr, "pictavo: bad value for %s: %s\n", a.c_str(), v ? v : "(missing)");
        usage();
        return LY_RENDER_USAGE;
      }
      i++;
    } else {
      o.photos.push_back(a);
    }
  }
  if (o.photos.size() < (size_t)kMinPhotos || o.photos.size() > (size_t)kMaxPhotos) {
    fprintf(stderr, "pictavo: a collage takes %d to %d photos, %zu given\n", kMinPhotos, kMaxPhotos,
            o.photos.size());
    usage();
    return LY_RENDER_USAGE;
  }
  const size_t dot = o.out.rfind('.');
  std::string ext = dot == std::string::npos ? "" : o.out.substr(dot);
  for (char& c : ext) c = (char)tolower((unsigned char)c);
  if (ext != ".jpg" && ext != ".jpeg") {
    fprintf(stderr, "pictavo: the output must be a .jpg file: %s\n", o.out.c_str());
    return LY_RENDER_USAGE;
  }
  return -1;
}

// Collects the decoder threads' results (called on the worker threads).
class DecodeResults : public ILyMultiGridListener {
 public:
  explicit DecodeResults(size_t n) : mBitmaps(n, nullptr) {}
  ~DecodeResults() override {
    for (Bitmap* b : mBitmaps) delete b;
  }
  void onInvalidateMultiGrid(int index, Bitmap* bitmap) override {
    std::lock_guard<std::mutex> lock(mMutex);
    if (index < 0 || (size_t)index >= mBitmaps.size()) {
      delete bitmap;
      return;
    }
    delete mBitmaps[index];
    mBitmaps[index] = bitmap;
  }
  bool has(size_t i) {
    std::lock_guard<std::mutex> lock(mMutex);
    return mBitmaps[i] != nullptr;
  }
  Bitmap* take(size_t i) {
    std::lock_guard<std::mutex> lock(mMutex);
    Bitmap* b = mBitmaps[i];
    mBitmaps[i] = nullptr;
    return b;
  }

 private:
  std::mutex mMutex;
  std::vector<Bitmap*> mBitmaps;
};

// How the photos are decoded for this one save. The saved picture's size
// follows the largest photo as the screen would show it (the screen size
// ordered so that width <= height, like the main view), but each photo is
// decoded only as large as its cell in the saved picture needs: a 12 MP
// photo turned upright in a sixth of a 2000 x 2000 collage is decoded at 1/4, not at 1/2.
struct DecodePlan {
  float maxW = 0, maxH = 0;
  int longestSide = 0;                // 0 when no photo could be read
  std::vector<float> coverW, coverH;  // per photo; 0 for no cell
};

DecodePlan planDecoding(const Options& o) {
  DecodePlan plan;
  plan.maxW = (float)std::min(o.screenW, o.screenH);
  plan.maxH = (float)std::max(o.screenW, o.screenH);
  const size_t n = o.photos.size();
  plan.coverW.assign(n, 0.0f);
  plan.coverH.assign(n, 0.0f);
  for (const std::string& photo : o.photos) {
    DecodeOptions header;
    if (BitmapFactory::parseImage(photo, header) != 1 || header.outWidth < 1 || header.outHeight < 1)
      continue;
    int w = 0, h = 0;
    CLyImageDecoderThread::computeTarget(header.outWidth, header.outHeight, CLyUtil::getOrientation(photo),
                                         plan.maxW, plan.maxH, &w, &h);
    plan.longestSide = std::max(plan.longestSide, std::max(w, h));
  }
  CLyMultiGridStyleManager* styles = &CLyMultiGridStyleManager::getInstance();
  if (styles->getGridLayoutCount(2) == 0 && !styles->initialize()) return plan;  // render() reports it
  int saveW = 0, saveH = 0;
  if ((int)n > kMaxPhotos || o.layout >= styles->getGridLayoutCount((int)n) ||
      !CLyMultiGrid::computeSaveSize(plan.longestSide, o.ratio, kSaveLimit, saveW, saveH))
    return plan;
  float rects[kMaxPhotos][4] = {};
  if (!styles->getDrawRects((int)n, o.ratio, o.layout, rects)) return plan;
  // Cells are left, top, right, bottom fractions of the picture; margins
  // only make them smaller, so the whole fraction always covers.
  for (size_t i = 0; i < n; i++) {
    plan.coverW[i] = std::max(0.0f, rects[i][2] - rects[i][0]) * saveW;
    plan.coverH[i] = std::max(0.0f, rects[i][3] - rects[i][1]) * saveH;
  }
  return plan;
}

// Decodes every photo on its own thread. The threads run while the main
// thread brings up the toolkit and the window.
class PhotoDecoder {
 public:
  PhotoDecoder(const Options& o, const DecodePlan& plan) : mResults(o.photos.size()) {
    for (size_t i = 0; i < o.photos.size(); i++) {
      auto t = std::make_unique<CLyImageDecoderThread>();
      t->setMaxDecodingSize(plan.maxW, plan.maxH);
      t->setCoverSize(plan.coverW[i], plan.coverH[i]);
      t->set((int)i, o.photos[i], &mResults);
      mThreads.push_back(std::move(t));
    }
    for (auto& t : mThreads) t->start();
  }
  ~PhotoDecoder() { join(); }
  void join() { mThreads.clear(); }  // deleting a thread object joins it
  DecodeResults& results() { return mResults; }

 private:
  DecodeResults mResults;
  std::vector<std::unique_ptr<CLyImageDecoderThread>> mThreads;
};

int render(const Options& o, const DecodePlan& plan, PhotoDecoder& decoder) {
  CLyMultiGridStyleManager* styles = &CLyMultiGridStyleManager::getInstance();
  if (styles->getGridLayoutCount(2) == 0 && !styles->initialize()) {
    fprintf(stderr, "pictavo: the layout styles could not be read\n");
    return LY_RENDER_FAILED;
  }
  stepTimer().mark("styles");
  // A window controller on the buffer engine: the collage control lives in
  // a window like in the application, but nothing is shown.
  auto* window = new app_assist::WWindowController("pictavo-render");
  if (!window->precreate()) {
    fprintf(stderr, "pictavo: no canvas could be created\n");
    return LY_RENDER_FAILED;
  }
  stepTimer().mark("window");

  decoder.join();
  stepTimer().mark("decode");
  // A photo that could not be decoded leaves fewer photos, thus other cells,
  // which the planned sizes may not cover: decode the rest again, for the
  // screen, as if there had been no plan.
  bool planned = plan.longestSide > 0;
  std::unique_ptr<PhotoDecoder> again;
  for (size_t i = 0; i < o.photos.size() && planned; i++) planned = decoder.results().has(i);
  if (!planned && plan.longestSide > 0) {
    DecodePlan screen = plan;
    std::fill(screen.coverW.begin(), screen.coverW.end(), 0.0f);
    std::fill(screen.coverH.begin(), screen.coverH.end(), 0.0f);
    again = std::make_unique<PhotoDecoder>(o, screen);
    again->join();
  }
  DecodeResults& results = again ? again->results() : decoder.results();
  CLyMultiGridSrcItemList items;
  for (size_t i = 0; i < o.photos.size(); i++) {
    Bitmap* bitmap = results.take(i);
    if (!bitmap) {
      fprintf(stderr, "pictavo: skipping %s: not a photo that can be decoded\n", o.photos[i].c_str());
      continue;
    }
    CLyMultiGridSrcItem* item = new (std::nothrow) CLyMultiGridSrcItem();
    if (!item) {
      delete bitmap;
      continue;
    }
    item->setPath(o.photos[i]);
    item->setBitmap(bitmap, true);
    items.add(item);
  }
  const int count = items.count();
  int status = LY_RENDER_OK;
  const int layouts = styles->getGridLayoutCount(count);
  CLyMultiGridDrawRectList cells;
  if (count < kMinPhotos) {
    fprintf(stderr, "pictavo: a collage needs at least %d usable photos, %d could be decoded\n", kMinPhotos,
            count);
    status = LY_RENDER_NO_PHOTOS;
  } else if (o.layout >= layouts) {
    fprintf(stderr, "pictavo: %d photos have layouts 0 to %d, not %d\n", count, layouts - 1, o.layout);
    status = LY_RENDER_USAGE;
  } else {
    float rects[6][4] = {};
    styles->getDrawRects(count, o.ratio, o.layout, rects);
    for (int i = 0; i < count; i++) {
      auto* cell = new (std::nothrow) CLyFloatRectangle(rects[i][0], rects[i][1], rects[i][2], rects[i][3]);
      if (!cell || !cells.addItem(cell)) delete cell;
    }
    cells.setStyleIndex(o.layout);

    CLyMultiGridSaveRequest request;
    request.cells = &cells;
    request.items = &items;
    request.ratio = o.ratio;
    request.margin = o.margin;
    request.roundness = o.roundness;
    request.background = o.background;
    request.limit = kSaveLimit;
    request.longestSide = planned ? plan.longestSide : 0;
    int w = 0, h = 0;
    Evas_Object* parent = window->getBaseLayout() ? window->getBaseLayout() : window->getEvasObj();
    if (CLyMultiGridSaver::save(window->getEvasObj(), parent, request, o.out, &w, &h)) {
      char* real = realpath(o.out.c_str(), nullptr);
      printf("Collage of %d photos (%d x %d) saved to %s\n", count, w, h, real ? real : o.out.c_str());
      free(real);
    } else {
      fprintf(stderr, "pictavo: the collage could not be written to %s (PICTAVO_LOG_LEVEL=E shows why)\n",
              o.out.c_str());
      status = LY_RENDER_FAILED;
    }
    stepTimer().mark("save");
  }
  window->destroy();
  cells.clear(true);
  items.clear(true);
  return status;
}

}  // namespace

int runRenderCommand(int argc, char** argv) {
  Options o;
  int status = parseArgs(argc, argv, o);
  if (status >= 0) return status;
  // Headless whatever the environment: the picture goes to a file only.
  setenv("ELM_ENGINE", "buffer", 1);
  // The command reports every failure itself; the application's log joins
  // in only when asked for (PICTAVO_LOG_LEVEL, EINA_LOG_LEVEL).
  if (!getenv("PICTAVO_LOG_LEVEL")) dlog_set_min_priority(DLOG_FATAL);
  setenv("EINA_LOG_LEVEL", "0", 0);
  setenv("ECORE_NO_SYSTEM_MODULES", "1", 0);
  setenv("EINA_LOG_BACKTRACE", "-1", 0);
  stepTimer().mark("args");
  // The application data (with the lock around PNG decoding) exists before
  // any decoder thread asks for it: its lazy creation is not thread-safe.
  CLyAppData::getInstance();
  // Decoding starts first: it is the longest step and needs no toolkit.
  const DecodePlan plan = planDecoding(o);
  stepTimer().mark("plan");
  PhotoDecoder decoder(o, plan);
  // Nothing here looks up desktop files, icons or MIME types: without this
  // the toolkit starts the efreet daemon, which builds its caches in three
  // more processes, all competing with the decoding for the CPU.
  efreet_cache_disable();
  if (!elm_init(argc, argv)) {
    fprintf(stderr, "pictavo: the toolkit could not start\n");
    return LY_RENDER_FAILED;
  }
  stepTimer().mark("elm_init");
  status = render(o, plan, decoder);
  decoder.join();
  elm_shutdown();
  return status;
}
