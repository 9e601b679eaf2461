#include <gtest/gtest.h>

#include <functional>
#include <vector>

#include "manager/CLyEventManager.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::runMainLoopUntil;

namespace {

struct Received {
  int type, mode, data;
  bool operator==(const Received& o) const { return type == o.type && mode == o.mode && data == o.data; }
};

class Recorder : public ILyEventListener {
 public:
  std::vector<Received> events;
  std::function<void(const CLyEvent&)> hook;
  void onEvent(const CLyEvent& event) override {
    events.push_back({event.type, event.mode, event.data});
    if (hook) hook(event);
  }
};

// Every test gets a fresh bus whose throttle windows last milliseconds.
class EventManagerTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    CLyEventManager::destroyInstance();
    bus = CLyEventManager::getInstance();
    bus->setThrottleTimeScale(0.005);
  }
  void TearDown() override { CLyEventManager::destroyInstance(); }
  CLyEventManager* bus = nullptr;
};

const CLyEvent kLowMemory(CLyEvent::LOW_MEMORY, CLyEvent::MODE_THROTTLED, 0);
const CLyEvent kLanguage(CLyEvent::LANGUAGE_CHANGED, CLyEvent::MODE_THROTTLED, 0);

}  // namespace

TEST_F(EventManagerTest, SingletonIsRecreatedAfterDestroy) {
  EXPECT_EQ(CLyEventManager::getInstance(), bus);
  EXPECT_TRUE(CLyEventManager::hasInstance());
  CLyEventManager::destroyInstance();
  EXPECT_FALSE(CLyEventManager::hasInstance());
  CLyEventManager::destroyInstance();  // twice: nothing
  bus = CLyEventManager::getInstance();
  EXPECT_NE(bus, nullptr);
}

TEST_F(EventManagerTest, FirstThrottledEventAtOnceLaterOnesCoalescedPerId) {
  Recorder r;
  bus->attach(&r);
  bus->notify(kLowMemory);
  ASSERT_EQ(r.events.size(), 1u);
  EXPECT_EQ(bus->getThrottleInterval(), 2);
  bus->notify(kLowMemory);
  bus->notify(kLanguage);
  bus->notify(kLowMemory);
  EXPECT_EQ(r.events.size(), 1u);

  bus->endThrottleWindow();
  // One of each id, in id order; a longer window follows because events came.
  ASSERT_EQ(r.events.size(), 3u);
  EXPECT_EQ(r.events[1].type, CLyEvent::LANGUAGE_CHANGED);
  EXPECT_EQ(r.events[2].type, CLyEvent::LOW_MEMORY);
  EXPECT_EQ(bus->getThrottleInterval(), 4);

  // Nothing in the 4-second window: the bus calms down.
  bus->endThrottleWindow();
  EXPECT_EQ(bus->getThrottleInterval(), 0);
  EXPECT_EQ(r.events.size(), 3u);
  bus->notify(kLowMemory);
  EXPECT_EQ(r.events.size(), 4u);
  bus->detach(&r);
}

TEST_F(EventManagerTest, WindowsGrowTwoFourEightAndStayAtEight) {
  Recorder r;
  bus->attach(&r);
  std::vector<int> windows;
  bus->notify(kLowMemory);
  for (int i = 0; i < 4; ++i) {
    windows.push_back(bus->getThrottleInterval());
    bus->notify(kLowMemory);
    bus->endThrottleWindow();
  }
  windows.push_back(bus->getThrottleInterval());
  EXPECT_EQ(windows, (std::vector<int>{2, 4, 8, 8, 8}));
  EXPECT_EQ(r.events.size(), 5u);
  bus->detach(&r);
}

TEST_F(EventManagerTest, RealTimerEndsTheWindow) {
  Recorder r;
  bus->attach(&r);
  bus->notify(kLowMemory);
  bus->notify(kLowMemory);
  EXPECT_TRUE(runMainLoopUntil([&] { return r.events.size() == 2; }, 5.0));
  EXPECT_TRUE(runMainLoopUntil([&] { return bus->getThrottleInterval() == 0; }, 5.0));
  bus->detach(&r);
}

TEST_F(EventManagerTest, ImmediateEventsAreNeverDelayed) {
  Recorder r;
  bus->attach(&r);
  bus->notify(kLowMemory);
  bus->notify(kLowMemory);  // held in the window
  bus->notify(CLyEvent(CLyEvent::APP_PAUSED, CLyEvent::MODE_IMMEDIATE, 0));
  bus->notify(CLyEvent(CLyEvent::WINDOW_ROTATED, CLyEvent::MODE_IMMEDIATE, 90));
  ASSERT_EQ(r.events.size(), 3u);
  EXPECT_EQ(r.events[1], (Received{7, 0, 0}));
  EXPECT_EQ(r.events[2], (Received{4, 0, 90}));
  // Immediate events open no window of their own.
  bus->endThrottleWindow();
  bus->endThrottleWindow();
  EXPECT_EQ(bus->getThrottleInterval(), 0);
  bus->detach(&r);
}

TEST_F(EventManagerTest, UnblockDeliversTheLatestPerSlotInSlotOrder) {
  Recorder blocked, free;
  bus->attach(&blocked);
  bus->attach(&free);
  bus->block(&blocked);
  bus->notify(CLyEvent(CLyEvent::WINDOW_ROTATED, 0, 90));
  bus->notify(CLyEvent(CLyEvent::LOW_MEMORY, 1, 1));
  bus->notify(CLyEvent(CLyEvent::WINDOW_ROTATED, 0, 180));
  bus->notify(CLyEvent(CLyEvent::LANGUAGE_CHANGED, 1, 0));
  bus->notify(CLyEvent(CLyEvent::LANGUAGE_CHANGED, 0, 5));
  bus->notify(CLyEvent(CLyEvent::LOW_MEMORY, 1, 2));
  EXPECT_TRUE(blocked.events.empty());
  EXPECT_EQ(free.events.size(), 4u);  // two throttled ones wait for the window

  bus->unblock(&blocked);
  std::vector<Received> expected = {{2, 0, 5}, {2, 1, 0}, {4, 0, 180}, {6, 1, 2}};
  EXPECT_EQ(blocked.events, expected);
  // Delivered once: the window's end has nothing left for it.
  bus->endThrottleWindow();
  EXPECT_EQ(blocked.events.size(), 4u);
  bus->detach(&blocked);
  bus->detach(&free);
}

TEST_F(EventManagerTest, BlockAllHoldsEverythingUntilUnblockAll) {
  Recorder a, b;
  bus->attach(&a);
  bus->attach(&b);
  bus->notify(kLowMemory);  // opens a window
  bus->blockAll();
  EXPECT_EQ(bus->getThrottleInterval(), 0);
  bus->notify(CLyEvent(CLyEvent::APP_PAUSED, 0, 0));
  bus->notify(kLanguage);
  bus->block(&b);
  bus->unblockAll();
  EXPECT_EQ(a.events, (std::vector<Received>{{6, 1, 0}, {2, 1, 0}, {7, 0, 0}}));
  EXPECT_EQ(b.events.size(), 1u);  // still blocked on its own
  bus->unblock(&b);
  EXPECT_EQ(b.events.size(), 3u);
  bus->detach(&a);
  bus->detach(&b);
}

TEST_F(EventManagerTest, ListenerDetachedDuringDeliveryStops) {
  LogCapture log;
  Recorder r;
  bus->attach(&r);
  bus->block(&r);
  bus->notify(CLyEvent(CLyEvent::LANGUAGE_CHANGED, 0, 0));
  bus->notify(CLyEvent(CLyEvent::LOW_MEMORY, 0, 0));
  bus->notify(CLyEvent(CLyEvent::APP_PAUSED, 0, 0));
  r.hook = [&](const CLyEvent&) { bus->detach(&r); };
  bus->unblock(&r);
  EXPECT_EQ(r.events.size(), 1u);
  EXPECT_TRUE(log.contains("null"));
  EXPECT_FALSE(bus->isAttached(&r));
}

TEST_F(EventManagerTest, ListenersChangingTheBusWhileNotified) {
  Recorder first, second, late;
  bus->attach(&first);
  bus->attach(&second);
  // Whoever comes first detaches the other and attaches a newcomer.
  auto shuffle = [&](const CLyEvent&) {
    if (bus->isAttached(&second) && bus->isAttached(&first)) {
      bus->detach(&first);
      bus->detach(&second);
      bus->attach(&late);
    }
  };
  first.hook = shuffle;
  second.hook = shuffle;
  bus->notify(CLyEvent(CLyEvent::APP_PAUSED, 0, 0));
  EXPECT_EQ(first.events.size() + second.events.size(), 1u);
  EXPECT_TRUE(bus->isAttached(&late));
  bus->detach(&late);
}

TEST_F(EventManagerTest, AnEventStoredDuringItsOwnDeliveryIsKept) {
  Recorder r;
  bus->attach(&r);
  bus->block(&r);
  bus->notify(CLyEvent(CLyEvent::WINDOW_ROTATED, 0, 90));
  int round = 0;
  r.hook = [&](const CLyEvent&) {
    if (round++ == 0) {
      bus->block(&r);
      bus->notify(CLyEvent(CLyEvent::WINDOW_ROTATED, 0, 270));
    }
  };
  bus->unblock(&r);
  ASSERT_EQ(r.events.size(), 1u);
  bus->unblock(&r);
  ASSERT_EQ(r.events.size(), 2u);
  EXPECT_EQ(r.events[1].data, 270);
  bus->detach(&r);
}

TEST_F(EventManagerTest, BadInputIsLoggedNotStored) {
  LogCapture log;
  Recorder stranger, r;
  bus->detach(&stranger);
  bus->block(&stranger);
  bus->unblock(&stranger);
  EXPECT_EQ(log.count("null"), 3u);
  bus->attach(&r);
  bus->attach(&r);
  bus->notify(CLyEvent(9, 0, 0));
  bus->notify(CLyEvent(0, 0, 0));
  bus->notify(CLyEvent(2, 2, 0));
  bus->notify(CLyEvent(-3, 1, 0));
  EXPECT_TRUE(r.events.empty());
  EXPECT_TRUE(log.contains("Invalid event"));
  bus->notify(CLyEvent(CLyEvent::APP_PAUSED, 0, 0));
  EXPECT_EQ(r.events.size(), 1u);  // attached once
  bus->detach(&r);
}
