#pragma once
// Wall-clock timing shared by the benchmark programs.

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <vector>

namespace pictavo::bench {

// Runs f(i) three times to warm up, then `runs` times, and prints
// "name: min median max (ms)".
template <typename F>
void measure(const char* name, int runs, F&& f) {
  using Clock = std::chrono::steady_clock;
  for (int i = 0; i < 3; i++) f(i);
  std::vector<double> t;
  for (int i = 0; i < runs; i++) {
    auto t0 = Clock::now();
    f(i);
    t.push_back(std::chrono::duration<double, std::milli>(Clock::now() - t0).count());
  }
  std::sort(t.begin(), t.end());
  printf("%s: %.3f %.3f %.3f (ms)\n", name, t.front(), t[t.size() / 2], t.back());
  fflush(stdout);
}

}  // namespace pictavo::bench
