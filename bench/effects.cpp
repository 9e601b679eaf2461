// Effect speed on a 2000 x 1500 photo, single thread, in process.
//
//   bench_effects [runs]      (default 7 timed runs after one warm-up; medians of
//                             the thread's CPU time in ms, peers timed the same way)
//
// For each of the editor's 19 effects: the look alone (image filter on a
// packed "BGRA" buffer), and the whole engine call for a format-8 and a
// format-9 source (surface copies and byte order included). In the same run:
// plain-C peers (a sepia matrix and grey + LUT, as a user would write them,
// and one 12 MB memcpy as the bandwidth floor) and, when /usr/bin/python3 has
// Pillow, Pillow's sepia matrix and grey + contrast on the same size.
#include <algorithm>
#include <cstdio>
#include <cstring>
#include <ctime>
#include <functional>
#include <string>
#include <vector>

#include "bench/effects_sample.h"
#include "image-editor/IE_Effects.h"
#include "image-editor/IE_Engine.h"
#include "platform/core/dlog.h"
#include "platform/image-filter/image_filter.h"

namespace {

constexpr int kW = 2000, kH = 1500;

// CPU time of this thread: the machine is shared, and CPU time leaves out
// the time spent waiting for a core (cache and memory sharing still count).
double threadMs() {
  timespec ts;
  clock_gettime(CLOCK_THREAD_CPUTIME_ID, &ts);
  return ts.tv_sec * 1e3 + ts.tv_nsec / 1e6;
}

struct Timing {
  double min;
  double median;
};

Timing timeMs(int runs, const std::function<void()>& fn) {
  fn();
  std::vector<double> t;
  for (int i = 0; i < runs; ++i) {
    const double t0 = threadMs();
    fn();
    t.push_back(threadMs() - t0);
  }
  std::sort(t.begin(), t.end());
  return {t.front(), t.size() % 2 ? t[t.size() / 2] : (t[t.size() / 2 - 1] + t[t.size() / 2]) / 2};
}

double medianMs(int runs, const std::function<void()>& fn) {
  return timeMs(runs, fn).median;
}

struct Target {
  const char* kind;
  double ms;
};

Target targetOf(int code) {
  switch (code) {
    case 602:
    case 210:
    case 211:
    case 201:
      return {"blur/glow/sharpen/cartoon", 30};
    case 603:
    case 212:
      return {"grade + glow", 30};
    case 608:
    case 609:
      return {"light", 15};
    default:
      return {"matrix/curve", 5};
  }
}

inline uint32_t clamp255(uint32_t v) {
  return v > 255 ? 255 : v;
}

// The plain-C peers of the shared peer baseline, xRGB words in and out.
void sepiaC(uint32_t* __restrict d, const uint32_t* __restrict s, size_t n) {
  for (size_t i = 0; i < n; i++) {
    uint32_t p = s[i], r = (p >> 16) & 255, g = (p >> 8) & 255, b = p & 255;
    uint32_t nr = clamp255((101 * r + 197 * g + 48 * b) >> 8);
    uint32_t ng = clamp255((89 * r + 176 * g + 43 * b) >> 8);
    uint32_t nb = clamp255((70 * r + 137 * g + 34 * b) >> 8);
    d[i] = 0xff000000u | nr << 16 | ng << 8 | nb;
  }
}
void greyLutC(uint32_t* __restrict d, const uint32_t* __restrict s, size_t n, const uint8_t* lut) {
  for (size_t i = 0; i < n; i++) {
    uint32_t p = s[i];
    uint32_t y = lut[(77 * ((p >> 16) & 255) + 150 * ((p >> 8) & 255) + 29 * (p & 255)) >> 8];
    d[i] = 0xff000000u | y * 0x010101u;
  }
}

void runPillow(int runs) {
  const char* script =
      "import sys,time,statistics\n"
      "from PIL import Image, ImageEnhance\n"
      "runs=int(sys.argv[1])\n"
      "src=Image.effect_noise((2000,1500),40).convert('RGB')\n"
      "src=Image.merge('RGB',(src.getchannel(0),src.rotate(90,expand=0).getchannel(0),src.transpose(0)."
      "getchannel(0)))\n"
      "def t(name,fn):\n"
      "  fn(); ts=[]\n"
      "  for _ in range(runs):\n"
      "    a=time.thread_time(); fn(); ts.append((time.thread_time()-a)*1e3)\n"
      "  print(f'{name} {min(ts):.2f} {statistics.median(ts):.2f}')\n"
      "sep=(0.393,0.769,0.189,0,0.349,0.686,0.168,0,0.272,0.534,0.131,0)\n"
      "t('pillow_sepia_matrix',lambda: src.convert('RGB',sep))\n"
      "t('pillow_grey_contrast',lambda: "
      "ImageEnhance.Contrast(src.convert('L')).enhance(1.3).convert('RGB'))\n";
  std::string cmd = "/usr/bin/python3 -c \"$PICTAVO_PILLOW_SCRIPT\" " + std::to_string(runs) + " 2>/dev/null";
  setenv("PICTAVO_PILLOW_SCRIPT", script, 1);
  FILE* p = popen(cmd.c_str(), "r");
  if (!p) return;
  char line[256];
  bool any = false;
  while (fgets(line, sizeof line, p)) {
    char name[64];
    double lo, med;
    if (sscanf(line, "%63s %lf %lf", name, &lo, &med) == 3) {
      printf("%-34s %8.2f %8.2f\n", name, lo, med);
      any = true;
    }
  }
  pclose(p);
  if (!any) printf("# Pillow not available to /usr/bin/python3: its figures are skipped\n");
}

}  // namespace

int main(int argc, char** argv) {
  const int runs = argc > 1 ? std::max(1, atoi(argv[1])) : 7;
  dlog_set_min_priority(DLOG_ERROR);
  std::vector<uint8_t> photo9 = effects_sample::makePhoto(kW, kH);  // B, G, R, A
  std::vector<uint8_t> photo8(photo9.size());                       // A, R, G, B
  for (size_t i = 0; i < photo9.size(); i += 4)
    for (int k = 0; k < 4; ++k) photo8[i + (size_t)k] = photo9[i + 3 - (size_t)k];
  std::vector<uint8_t> out(photo9.size());

  printf("# effects on %dx%d, single thread, thread CPU time of %d runs after 1 warm-up (ms)\n", kW, kH,
         runs);
  printf("%-3s %-13s %-5s %8s %8s %9s %9s %7s  %s\n", "#", "effect", "code", "look min", "look med",
         "engine/8", "engine/9", "target", "class");
  int misses = 0;
  for (int i = 0; i < IE_Engine_Effect_Count(); ++i) {
    const IeEffect* e = IE_Engine_Effect_Get(i);
    const int code = IE_Engine_Filter_Code(e->effectNumber);
    const Timing look = timeMs(runs, [&] {
      image_filter_h f = nullptr;
      image_filter_create(&f, IMAGE_FILTER_MODE_BUFFER);
      image_filter_set_input_by_buffer(f, photo8.data(), kW, kH, IMAGE_FILTER_FORMAT_BGRA);
      image_filter_set_output_by_buffer(f, out.data());
      image_filter_set_filter(f, code);
      image_filter_apply(f);
      image_filter_destroy(f);
    });
    auto engine = [&](std::vector<uint8_t>& src, int format) {
      return medianMs(runs, [&] {
        IeImageInfo s{kW, kH, (uint16_t)format, src.data()};
        IeImageInfo d{kW, kH, 0, out.data()};
        IE_Engine_Apply_Effect(&s, &d, e->effectNumber);
      });
    };
    const double e8 = engine(photo8, IE_FORMAT_BGRA8888), e9 = engine(photo9, IE_FORMAT_ARGB8888);
    const Target t = targetOf(code);
    const bool ok = look.median <= t.ms;
    misses += ok ? 0 : 1;
    std::string label = e->labelId;
    label = label.substr(label.find('_', 4) + 1);
    label = label.substr(label.find('_') + 1);
    label = label.substr(0, label.find("_M_"));
    printf("%-3d %-13.13s %-5d %8.2f %8.2f %9.2f %9.2f %5.0f%s  %s\n", i + 1, label.c_str(), code, look.min,
           look.median, e8, e9, t.ms, ok ? "  " : " !", t.kind);
  }
  printf(
      "# look = image filter alone; engine/8, engine/9 = medians of IE_Engine_Apply_Effect with a format-8 "
      "/\n"
      "# format-9 source (its two surface copies and, for format 9, the byte-order turns included)\n");
  printf("# %d effect(s) above target (look median)\n", misses);

  printf("\n# peers, same run, same size (ms)\n");
  const size_t n = (size_t)kW * kH;
  std::vector<uint32_t> xs(n), xd(n);
  memcpy(xs.data(), photo9.data(), n * 4);
  uint8_t lut[256];
  for (int i = 0; i < 256; ++i) lut[i] = (uint8_t)std::clamp((int)((i - 128) * 1.3 + 128), 0, 255);
  printf("%-34s %8s %8s\n", "", "min", "median");
  auto peer = [&](const char* name, const std::function<void()>& fn) {
    const Timing t = timeMs(runs, fn);
    printf("%-34s %8.2f %8.2f\n", name, t.min, t.median);
  };
  peer("plain_c_sepia_matrix", [&] { sepiaC(xd.data(), xs.data(), n); });
  peer("plain_c_grey_lut", [&] { greyLutC(xd.data(), xs.data(), n, lut); });
  peer("memcpy_12MB (bandwidth floor)", [&] { memcpy(xd.data(), xs.data(), n * 4); });
  runPillow(runs);
  return 0;
}
