#pragma once
// A POSIX thread that runs once: either its own run() (override it) or the
// run() of a runnable it was given. Deleting the object joins the thread.
//
// A class deriving from CLyThread must call join() in its own destructor:
// by the time this base destructor runs, the derived part (and the run()
// the thread may still be in) is gone.

#include <pthread.h>

#include <cerrno>
#include <string>

#include "common/CLyLog.h"
#include "common/CLyRunnable.h"

class CLyThread : public CLyRunnable {
 public:
  CLyThread() = default;
  explicit CLyThread(CLyRunnable* runnable) : mRunnable(runnable) {}
  CLyThread(const CLyThread&) = delete;
  CLyThread& operator=(const CLyThread&) = delete;
  ~CLyThread() override { join(); }

  void run() override {
    if (mRunnable) mRunnable->run();
  }

  // Starts the thread with default attributes; false (logged) when the
  // system refuses or the thread was started before.
  bool start() {
    if (mStarted) {
      LYLOG_E("Thread already started");
      return false;
    }
    const int ret = pthread_create(&mThread, nullptr, &CLyThread::_entry, this);
    if (ret == 0) {
      mStarted = true;
      return true;
    }
    std::string message = "Failed to create thread";
    switch (ret) {
      case EAGAIN:
        LYLOG_D("System thread is max or Insufficient resource");
        message += "[EAGAIN]";
        break;
      case EPERM:
        LYLOG_E("No permission");
        message += "[EPERM]";
        break;
      case EINVAL:
        LYLOG_E("Invalid thread attribute");
        message += "[EINVAL]";
        LYLOG_E("%s", message.c_str());
        WASSERT(0);  // the attributes are the defaults: this cannot come from input
        return false;
      default:
        break;
    }
    LYLOG_E("%s", message.c_str());
    return false;
  }

  bool isStarted() const { return mStarted; }

 protected:
  // Waits for the thread when one was started; safe to call more than once.
  void join() {
    if (!mStarted) return;
    mStarted = false;
    const int ret = pthread_join(mThread, nullptr);
    if (ret == 0) return;
    std::string message = "Failed to join thread";
    if (ret == EINVAL) message += "[Not joinable or already waiting at another thread]";
    if (ret == EDEADLK) message += "[DEADLOCK]";
    if (ret == ESRCH) message += "[No thread with thread id]";
    LYLOG_D("%s", message.c_str());
  }

 private:
  static void* _entry(void* self) {
    static_cast<CLyThread*>(self)->run();
    return nullptr;
  }

  pthread_t mThread{};
  bool mStarted = false;
  CLyRunnable* mRunnable = nullptr;
};
