// The gesture control's one event stream over a plain target object.

#include <Elementary.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <vector>

#include "app-assist/WWindowController.h"
#include "control/CLyGesture.h"
#include "tests/support/TestSupport.h"
#include "tests/touch/TouchTestSupport.h"

using pictavo::test::runMainLoop;
using pictavo::test::runMainLoopUntil;

namespace {

struct Event {
  int type;
  int state;
  CLyGestureInfo info;
};

class GestureTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::touch::setUnitScale();
    window = new app_assist::WWindowController("pictavo-gesture-test");
    ASSERT_TRUE(window->create());
    win = window->getEvasObj();
    evas_object_resize(win, 400, 400);
    target = evas_object_rectangle_add(evas_object_evas_get(win));
    evas_object_color_set(target, 10, 10, 10, 255);
    evas_object_move(target, 0, 0);
    evas_object_resize(target, 400, 400);
    evas_object_show(target);
    gesture = new CLyGesture([this](int type, int state, void* info) {
      events.push_back({type, state, *static_cast<CLyGestureInfo*>(info)});
    });
    gesture->setLongTapTimeout(0.2);
    ASSERT_TRUE(gesture->create(win, nullptr));
    gesture->setTarget(target);
    runMainLoop(0.02);
  }
  void TearDown() override { window->destroy(); }

  unsigned int now() const { return (unsigned int)(ecore_time_get() * 1000.0); }
  Evas* evas() const { return evas_object_evas_get(win); }
  bool has(int type, int state = -1) const {
    return std::any_of(events.begin(), events.end(),
                       [&](const Event& e) { return e.type == type && (state < 0 || e.state == state); });
  }
  int indexOf(int type, int state = -1) const {
    for (size_t i = 0; i < events.size(); ++i)
      if (events[i].type == type && (state < 0 || events[i].state == state)) return (int)i;
    return -1;
  }

  app_assist::WWindowController* window = nullptr;
  Evas_Object* win = nullptr;
  Evas_Object* target = nullptr;
  CLyGesture* gesture = nullptr;
  std::vector<Event> events;
};

TEST_F(GestureTest, ATapReportsPressReleaseAndTheTap) {
  evas_event_feed_mouse_move(evas(), 100, 120, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.02);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  ASSERT_TRUE(runMainLoopUntil([&]() { return has(LY_GESTURE_TAP, LY_GESTURE_STATE_END); }, 2.0));
  const int down = indexOf(LY_GESTURE_MOUSE_DOWN), up = indexOf(LY_GESTURE_MOUSE_UP);
  ASSERT_GE(down, 0);
  ASSERT_GT(up, down);
  EXPECT_EQ(100, events[down].info.x);
  EXPECT_EQ(120, events[down].info.y);
  const Event& tap = events[indexOf(LY_GESTURE_TAP, LY_GESTURE_STATE_END)];
  EXPECT_EQ(1, tap.info.fingers);
  EXPECT_NEAR(100, tap.info.x, 1);
  EXPECT_FALSE(has(LY_GESTURE_LONG_TAP, LY_GESTURE_STATE_MOVE));
}

TEST_F(GestureTest, ARestingFingerBecomesALongTap) {
  evas_event_feed_mouse_move(evas(), 200, 200, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  ASSERT_TRUE(runMainLoopUntil([&]() { return has(LY_GESTURE_LONG_TAP, LY_GESTURE_STATE_MOVE); }, 2.0));
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.05);
  // The long tap runs while the finger is still down.
  EXPECT_LT(indexOf(LY_GESTURE_LONG_TAP, LY_GESTURE_STATE_MOVE), indexOf(LY_GESTURE_MOUSE_UP));
  EXPECT_EQ(200, events[indexOf(LY_GESTURE_LONG_TAP, LY_GESTURE_STATE_MOVE)].info.x);
}

TEST_F(GestureTest, MovesReportMomentumWithTheCurrentPoint) {
  evas_event_feed_mouse_move(evas(), 50, 50, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  for (int i = 1; i <= 10; ++i) {
    runMainLoop(0.01);
    evas_event_feed_mouse_move(evas(), 50 + i * 10, 50, now(), nullptr);
  }
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.05);
  ASSERT_TRUE(has(LY_GESTURE_MOMENTUM, LY_GESTURE_STATE_MOVE));
  int last = -1;
  for (size_t i = 0; i < events.size(); ++i)
    if (events[i].type == LY_GESTURE_MOMENTUM && events[i].state == LY_GESTURE_STATE_MOVE) last = (int)i;
  EXPECT_EQ(150, events[last].info.x);
  EXPECT_TRUE(has(LY_GESTURE_MOUSE_MOVE));
  // The release comes after the end of the momentum: the collage resets last.
  const int end = indexOf(LY_GESTURE_MOMENTUM, LY_GESTURE_STATE_END);
  ASSERT_GE(end, 0);
  EXPECT_GT(indexOf(LY_GESTURE_MOUSE_UP), end);
}

TEST_F(GestureTest, ASecondFingerComesAsMultiEventsAndAZoom) {
  evas_event_feed_mouse_move(evas(), 150, 200, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.01);
  evas_event_feed_multi_down(evas(), 1, 250, 200, 1, 1, 1, 1, 0, 250, 200, EVAS_BUTTON_NONE, now(), nullptr);
  for (int d = 5; d <= 60; d += 5) {
    runMainLoop(0.01);
    evas_event_feed_mouse_move(evas(), 150 - d, 200, now(), nullptr);
    evas_event_feed_multi_move(evas(), 1, 250 + d, 200, 1, 1, 1, 1, 0, 250 + d, 200, now(), nullptr);
  }
  evas_event_feed_multi_up(evas(), 1, 310, 200, 1, 1, 1, 1, 0, 310, 200, EVAS_BUTTON_NONE, now(), nullptr);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.05);
  const int multiDown = indexOf(LY_GESTURE_MULTI_DOWN);
  ASSERT_GE(multiDown, 0);
  EXPECT_EQ(1, events[multiDown].info.device);
  EXPECT_EQ(250, events[multiDown].info.x);
  EXPECT_TRUE(has(LY_GESTURE_MULTI_MOVE));
  EXPECT_TRUE(has(LY_GESTURE_MULTI_UP));
  ASSERT_TRUE(has(LY_GESTURE_ZOOM, LY_GESTURE_STATE_MOVE));
  double zoom = 0;
  for (const Event& e : events)
    if (e.type == LY_GESTURE_ZOOM && e.state == LY_GESTURE_STATE_MOVE) zoom = e.info.zoom;
  EXPECT_GT(zoom, 1.5) << "fingers 100 px apart moved to 220 px apart";
  // Taps of two fingers belong to the pinch and are not reported.
  for (const Event& e : events) {
    if (e.type == LY_GESTURE_TAP || e.type == LY_GESTURE_DOUBLE_TAP) {
      EXPECT_EQ(1, e.info.fingers);
    }
  }
}

TEST_F(GestureTest, ADeletedTargetIsForgotten) {
  evas_object_del(target);
  target = nullptr;
  EXPECT_EQ(nullptr, gesture->getTarget());
  evas_event_feed_mouse_move(evas(), 10, 10, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.05);
  EXPECT_FALSE(has(LY_GESTURE_MOUSE_DOWN));
  // A new target works.
  Evas_Object* other = evas_object_rectangle_add(evas());
  evas_object_resize(other, 100, 100);
  evas_object_show(other);
  gesture->setTarget(other);
  evas_event_feed_mouse_move(evas(), 20, 20, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.02);
  EXPECT_TRUE(has(LY_GESTURE_MOUSE_DOWN));
}

TEST_F(GestureTest, NoHandlerNoTrouble) {
  gesture->setHandler(nullptr);
  evas_event_feed_mouse_move(evas(), 100, 100, now(), nullptr);
  evas_event_feed_mouse_down(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  evas_event_feed_mouse_up(evas(), 1, EVAS_BUTTON_NONE, now(), nullptr);
  runMainLoop(0.3);
  EXPECT_TRUE(events.empty());
}

}  // namespace
