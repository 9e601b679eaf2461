#include "tests/support/TestSupport.h"

#include <Ecore.h>
#include <Elementary.h>
#include <ftw.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <system_error>

#include "common/CLyLog.h"

namespace pictavo::test {

void installThrowingAssertHandler() {
  setAssertHandler([](const char* condition) { throw AssertionFired(condition); });
}

LogCapture::LogCapture() {
  dlog_set_sink(&LogCapture::sink, this);
}
LogCapture::~LogCapture() {
  dlog_set_sink(nullptr, nullptr);
}

void LogCapture::sink(int, const char*, const char* msg, void* self) {
  auto* capture = static_cast<LogCapture*>(self);
  std::lock_guard<std::mutex> lock(capture->mMutex);
  capture->mLines.emplace_back(msg);
}

bool LogCapture::contains(const std::string& text) const {
  return count(text) > 0;
}

size_t LogCapture::count(const std::string& text) const {
  std::lock_guard<std::mutex> lock(mMutex);
  size_t n = 0;
  for (const auto& line : mLines)
    if (line.find(text) != std::string::npos) ++n;
  return n;
}

std::vector<std::string> LogCapture::lines() const {
  std::lock_guard<std::mutex> lock(mMutex);
  return mLines;
}

void LogCapture::clear() {
  std::lock_guard<std::mutex> lock(mMutex);
  mLines.clear();
}

bool ensureHomeFolder() {
  const char* home = getenv("HOME");
  if (!home || !*home) return false;
  std::string path;
  for (const char* p = home; *p; ++p) {
    path += *p;
    if (p[1] == '/' || p[1] == '\0') mkdir(path.c_str(), 0755);
  }
  return true;
}

bool writeFileBytes(const std::string& path, const std::string& bytes) {
  std::ofstream out(path, std::ios::binary);
  out << bytes;
  return static_cast<bool>(out);
}

namespace {
bool gElmUp = false;
}

void ensureElm() {
  if (gElmUp) return;
  // elm_init needs the private HOME that CTest points at to exist.
  if (const char* home = getenv("HOME")) {
    std::error_code ignored;
    std::filesystem::create_directories(home, ignored);
  }
  setenv("ELM_ENGINE", "buffer", 0);
  setenv("ECORE_NO_SYSTEM_MODULES", "1", 0);
  static char arg0[] = "pictavo-test";
  static char* argv[] = {arg0, nullptr};
  elm_init(1, argv);
  gElmUp = true;
}

void shutdownElm() {
  if (!gElmUp) return;
  elm_shutdown();
  gElmUp = false;
}

Evas_Object* createTestWindow(int width, int height) {
  ensureElm();
  Evas_Object* win = elm_win_add(nullptr, "pictavo-test", ELM_WIN_BASIC);
  evas_object_resize(win, width, height);
  evas_object_show(win);
  return win;
}

void runMainLoop(double seconds) {
  runMainLoopUntilImpl([](void*) { return false; }, nullptr, seconds);
}

bool runMainLoopUntilImpl(bool (*done)(void*), void* data, double timeoutSeconds) {
  ensureElm();
  const double end = ecore_time_get() + timeoutSeconds;
  while (ecore_time_get() < end) {
    if (done(data)) return true;
    ecore_main_loop_iterate();
    usleep(1000);
  }
  return done(data);
}

TempDir::TempDir() {
  const char* base = getenv("TMPDIR");
  std::string pattern = std::string(base && *base ? base : "/tmp") + "/pictavo-test-XXXXXX";
  std::vector<char> buffer(pattern.begin(), pattern.end());
  buffer.push_back('\0');
  if (!mkdtemp(buffer.data())) throw std::runtime_error("mkdtemp failed");
  mPath = buffer.data();
}

TempDir::~TempDir() {
  nftw(
      mPath.c_str(), [](const char* path, const struct stat*, int, struct FTW*) { return remove(path); }, 16,
      FTW_DEPTH | FTW_PHYS);
}

}  // namespace pictavo::test
