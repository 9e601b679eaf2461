#pragma once
// Helpers shared by every test program.

#include <Evas.h>

#include <mutex>
#include <stdexcept>
#include <string>
#include <vector>

namespace pictavo::test {

// Failed WASSERTs throw this instead of stopping the program.
struct AssertionFired : std::runtime_error {
  using std::runtime_error::runtime_error;
};
void installThrowingAssertHandler();

// Captures log lines while alive (all priorities, whatever the filter).
class LogCapture {
 public:
  LogCapture();
  ~LogCapture();
  LogCapture(const LogCapture&) = delete;
  LogCapture& operator=(const LogCapture&) = delete;
  bool contains(const std::string& text) const;
  size_t count(const std::string& text) const;
  std::vector<std::string> lines() const;
  void clear();

 private:
  static void sink(int prio, const char* tag, const char* msg, void* self);
  mutable std::mutex mMutex;
  std::vector<std::string> mLines;
};

// Creates $HOME with its parents: elementary keeps its run folder there, and
// the private home of a test run may not exist yet on a fresh build tree.
// The shared main calls it before any test.
bool ensureHomeFolder();

// Writes `bytes` as the whole file at `path`.
bool writeFileBytes(const std::string& path, const std::string& bytes);

// elm_init once for the program, on the buffer engine (ELM_ENGINE=buffer).
void ensureElm();
void shutdownElm();

// A fresh, shown buffer-engine window of the given size; deleted by the caller.
Evas_Object* createTestWindow(int width = 720, int height = 1280);

// Runs the main loop for about `seconds`, or until `done` returns true.
void runMainLoop(double seconds);
template <typename Pred>
bool runMainLoopUntil(Pred done, double timeoutSeconds);
bool runMainLoopUntilImpl(bool (*done)(void*), void* data, double timeoutSeconds);

template <typename Pred>
bool runMainLoopUntil(Pred done, double timeoutSeconds) {
  return runMainLoopUntilImpl([](void* p) { return (*static_cast<Pred*>(p))(); }, &done, timeoutSeconds);
}

// A new empty temporary folder, removed with its content by the destructor.
class TempDir {
 public:
  TempDir();
  ~TempDir();
  TempDir(const TempDir&) = delete;
  TempDir& operator=(const TempDir&) = delete;
  const std::string& path() const { return mPath; }
  std::string file(const std::string& name) const { return mPath + "/" + name; }

 private:
  std::string mPath;
};

}  // namespace pictavo::test
