#pragma once
// Something a CLyThread can run.

class CLyRunnable {
 public:
  virtual ~CLyRunnable() = default;
  virtual void run() = 0;
};
