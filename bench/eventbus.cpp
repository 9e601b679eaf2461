// Cost of one event through the event bus against calling the listeners
// directly (the peer), for 1, 8 and 64 listeners:
//   direct      a virtual onEvent call per listener
//   immediate   CLyEventManager::notify of a mode-0 event
//   throttled   notify of a mode-1 event while a throttle window is open
//               (the copy stored per listener)
//   unblock     block, notify one event of each of the 16 slots, unblock
//               (per delivered event)
// Prints nanoseconds per event, the median of 7 runs.
//
//   bench_eventbus [EVENTS]

#include <Elementary.h>

#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <functional>
#include <memory>
#include <vector>

#include "manager/CLyEventManager.h"

namespace {

class Sink : public ILyEventListener {
 public:
  long total = 0;
  void onEvent(const CLyEvent& event) override { total += event.data + 1; }
};

double medianNs(const std::function<void()>& run, long events) {
  std::vector<double> samples;
  for (int i = 0; i < 7; ++i) {
    auto start = std::chrono::steady_clock::now();
    run();
    std::chrono::duration<double, std::nano> took = std::chrono::steady_clock::now() - start;
    samples.push_back(took.count() / static_cast<double>(events));
  }
  std::sort(samples.begin(), samples.end());
  return samples[samples.size() / 2];
}

}  // namespace

int main(int argc, char** argv) {
  elm_init(argc, argv);
  const long events = argc > 1 ? std::max(1L, atol(argv[1])) : 200000;
  printf("%-10s %10s %12s %12s %12s %12s\n", "listeners", "events", "direct", "immediate", "throttled",
         "unblock");
  for (int count : {1, 8, 64}) {
    std::vector<std::unique_ptr<Sink>> sinks;
    for (int i = 0; i < count; ++i) sinks.push_back(std::make_unique<Sink>());
    CLyEventManager* bus = CLyEventManager::getInstance();
    for (auto& sink : sinks) bus->attach(sink.get());
    const long perRun = events / count + 1;

    std::vector<ILyEventListener*> direct;
    for (auto& sink : sinks) direct.push_back(sink.get());
    const CLyEvent immediate(CLyEvent::WINDOW_ROTATED, CLyEvent::MODE_IMMEDIATE, 90);
    double directNs = medianNs(
        [&] {
          for (long i = 0; i < perRun; ++i)
            for (ILyEventListener* listener : direct) listener->onEvent(immediate);
        },
        perRun * count);
    double immediateNs = medianNs(
        [&] {
          for (long i = 0; i < perRun; ++i) bus->notify(immediate);
        },
        perRun * count);
    const CLyEvent throttled(CLyEvent::LOW_MEMORY, CLyEvent::MODE_THROTTLED, 0);
    bus->notify(throttled);  // opens the window; later ones are stored
    double throttledNs = medianNs(
        [&] {
          for (long i = 0; i < perRun; ++i) bus->notify(throttled);
        },
        perRun * count);
    bus->blockAll();
    bus->unblockAll();
    const long rounds = perRun / 16 + 1;
    double unblockNs = medianNs(
        [&] {
          for (long i = 0; i < rounds; ++i) {
            for (auto& sink : sinks) bus->block(sink.get());
            for (int type = CLyEvent::TYPE_MIN; type <= CLyEvent::TYPE_MAX; ++type)
              for (int mode = 0; mode < 2; ++mode) bus->notify(CLyEvent(type, mode, 0));
            for (auto& sink : sinks) bus->unblock(sink.get());
          }
        },
        rounds * 16 * count);
    printf("%-10d %10ld %12.1f %12.1f %12.1f %12.1f\n", count, perRun * count, directNs, immediateNs,
           throttledNs, unblockNs);
    CLyEventManager::destroyInstance();
  }
  elm_shutdown();
  return 0;
}
