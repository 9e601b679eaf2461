// End to end: six 4000 x 3000 camera-like JPEGs (two with EXIF orientation 6)
// to a saved 2000 x 2000 collage, against the Pillow collage peer of
// ../shared/bench/peers.sh section (b), measured in the same run, A B A B...
//
//   bench_render [RUNS] [PEERS_SH]
//
// Figures (min median max, ms):
//   render_inproc     runRenderCommand in this process (decode, compose, encode, save, register)
//   render_process    a whole `pictavo --render` process (start-up included)
//   pil_collage_2thr  the peer: Pillow, 2 threads, rounded corners, whole python process
// and the ratios peer / ours, pair by pair.

#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "app-entry/CLyRenderCommand.h"

namespace {

using Clock = std::chrono::steady_clock;

std::string selfDir() {
  char buf[4096];
  ssize_t n = readlink("/proc/self/exe", buf, sizeof buf - 1);
  if (n <= 0) return ".";
  buf[n] = 0;
  std::string p(buf);
  return p.substr(0, p.rfind('/'));
}

int runProcess(const std::vector<std::string>& args, bool quiet = true) {
  fflush(nullptr);  // or the child repeats what is still buffered
  pid_t pid = fork();
  if (pid == 0) {
    if (quiet) {
      freopen("/dev/null", "w", stdout);
      freopen("/dev/null", "w", stderr);
    }
    std::vector<char*> argv;
    for (auto& a : args) argv.push_back(const_cast<char*>(a.c_str()));
    argv.push_back(nullptr);
    execv(argv[0], argv.data());
    _exit(127);
  }
  int status = 0;
  waitpid(pid, &status, 0);
  return WIFEXITED(status) ? WEXITSTATUS(status) : 128;
}

double childCpuMs() {
  rusage ru{};
  getrusage(RUSAGE_CHILDREN, &ru);
  return (ru.ru_utime.tv_sec + ru.ru_stime.tv_sec) * 1e3 + (ru.ru_utime.tv_usec + ru.ru_stime.tv_usec) / 1e3;
}

double selfCpuMs() {
  rusage ru{};
  getrusage(RUSAGE_SELF, &ru);
  return (ru.ru_utime.tv_sec + ru.ru_stime.tv_sec) * 1e3 + (ru.ru_utime.tv_usec + ru.ru_stime.tv_usec) / 1e3;
}

template <typename F>
double timeMs(F&& f) {
  auto t0 = Clock::now();
  f();
  return std::chrono::duration<double, std::milli>(Clock::now() - t0).count();
}

void report(const char* name, std::vector<double> t, const char* unit = "ms") {
  std::sort(t.begin(), t.end());
  printf("%s: %.1f %.1f %.1f (%s)\n", name, t.front(), t[t.size() / 2], t.back(), unit);
}

// The Python peer is embedded in peers.sh between its heredoc markers.
bool extractPeer(const std::string& peersSh, const std::string& out) {
  std::ifstream in(peersSh);
  if (!in) return false;
  std::ofstream o(out);
  std::string line;
  bool inside = false;
  while (std::getline(in, line)) {
    if (!inside && line.find("peers_py.py\" <<'EOF_PY'") != std::string::npos) {
      inside = true;
      continue;
    }
    if (inside && line == "EOF_PY") return true;
    if (inside) o << line << "\n";
  }
  return false;
}

}  // namespace

int main(int argc, char** argv) {
  const int runs = argc > 1 ? std::max(1, atoi(argv[1])) : 5;
  const std::string peersSh = argc > 2 ? argv[2] : "/work/shared/bench/peers.sh";
  const std::string dir = selfDir();
  char tmpl[] = "/tmp/pictavo-bench-render-XXXXXX";
  if (!mkdtemp(tmpl)) return 1;
  const std::string tmp = tmpl;
  // Registration in the media database is part of the save; keep it private.
  setenv("XDG_DATA_HOME", (tmp + "/data").c_str(), 1);
  setenv("PICTAVO_LOG_LEVEL", "E", 0);

  // Inputs like the peer's: 4000 x 3000, noisy, quality 92, 2 of 6 turned by EXIF.
  if (runProcess({dir + "/bench_make_samples", tmp + "/in", "--size", "4000x3000", "--count", "6",
                  "--quality", "92", "--noise", "7"}) != 0) {
    fprintf(stderr, "bench_render: bench_make_samples failed\n");
    return 1;
  }
  std::vector<std::string> photos;
  long bytes = 0;
  for (int i = 1; i <= 6; i++) {
    photos.push_back(tmp + "/in/sample_" + std::to_string(i) + ".jpg");
    struct stat st {};
    stat(photos.back().c_str(), &st);
    bytes += st.st_size;
  }
  printf("# inputs: six 4000x3000 JPEGs, %.1f MB on average, photos 2 and 5 with EXIF orientation 6\n",
         bytes / 6.0 / 1e6);

  const std::string out = tmp + "/ours.jpg";
  std::vector<std::string> renderArgs = {"pictavo", "--render", out,        "--layout", "0",
                                         "--ratio", "1:1",      "--margin", "2",        "--roundness",
                                         "2",       "--screen", "2000x2000"};
  renderArgs.insert(renderArgs.end(), photos.begin(), photos.end());
  auto inproc = [&]() {
    std::vector<char*> a;
    for (auto& s : renderArgs) a.push_back(s.data());
    a.push_back(nullptr);
    fflush(stdout);
    int saved = dup(1);
    freopen("/dev/null", "w", stdout);
    int rc = runRenderCommand((int)renderArgs.size(), a.data());
    fflush(stdout);
    dup2(saved, 1);
    close(saved);
    if (rc != 0) fprintf(stderr, "bench_render: render failed (%d)\n", rc);
  };
  std::vector<std::string> procArgs = renderArgs;
  procArgs[0] = dir + "/../pictavo";
  const bool haveBinary = access(procArgs[0].c_str(), X_OK) == 0;

  const std::string peer = tmp + "/peers_py.py";
  const bool havePeer = extractPeer(peersSh, peer) && access("/usr/bin/python3", X_OK) == 0 &&
                        runProcess({"/usr/bin/python3", "-c", "import PIL"}) == 0;
  std::vector<std::string> peerArgs = {"/usr/bin/python3", peer, "collage", tmp + "/pil.jpg", "1", "2"};
  peerArgs.insert(peerArgs.end(), photos.begin(), photos.end());
  if (!havePeer)
    printf("# Pillow peer unavailable (needs python3-pil and %s): peer figures skipped\n", peersSh.c_str());

  // warm-up
  inproc();
  if (haveBinary) runProcess(procArgs);
  if (havePeer) runProcess(peerArgs);

  // Wall time, and CPU time (user + system, all threads): on a busy machine
  // the wall figures lose the parallel decoding, the CPU figures do not.
  std::vector<double> a, p, b, ratioIn, ratioProc, ca, cp, cb, ratioCpu;
  for (int i = 0; i < runs; i++) {
    double c0 = selfCpuMs();
    double ta = timeMs(inproc);
    ca.push_back(selfCpuMs() - c0);
    double k0 = childCpuMs();
    double tp = haveBinary ? timeMs([&] { runProcess(procArgs); }) : 0;
    double k1 = childCpuMs();
    double tb = havePeer ? timeMs([&] { runProcess(peerArgs); }) : 0;
    double k2 = childCpuMs();
    a.push_back(ta);
    if (haveBinary) {
      p.push_back(tp);
      cp.push_back(k1 - k0);
    }
    if (havePeer) {
      b.push_back(tb);
      cb.push_back(k2 - k1);
      ratioIn.push_back(tb / ta);
      if (haveBinary) {
        ratioProc.push_back(tb / tp);
        ratioCpu.push_back((k2 - k1) / (k1 - k0));
      }
    }
  }
  report("render_inproc_6x12mp_to_2000x2000", a);
  report("render_inproc_cpu", ca);
  if (haveBinary) {
    report("render_process_6x12mp_to_2000x2000", p);
    report("render_process_cpu", cp);
  }
  if (havePeer) {
    report("pil_collage2000_rounded_2thr_process", b);
    report("pil_collage2000_rounded_2thr_process_cpu", cb);
    report("ratio_pil_over_render_inproc", ratioIn, "x");
    if (haveBinary) {
      report("ratio_pil_over_render_process", ratioProc, "x");
      report("ratio_pil_over_render_process_cpu", ratioCpu, "x");
    }
  }
  struct stat st {};
  if (stat(out.c_str(), &st) == 0) printf("# our collage: %ld bytes\n", (long)st.st_size);
  if (havePeer && stat((tmp + "/pil.jpg").c_str(), &st) == 0)
    printf("# peer collage: %ld bytes\n", (long)st.st_size);
  runProcess({"/bin/rm", "-rf", tmp});
  return 0;
}
