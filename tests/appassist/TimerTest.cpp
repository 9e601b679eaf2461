#include <gtest/gtest.h>

#include "app-assist/IWEvasObject.h"
#include "app-assist/WTimer.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using appassist_test::CountingView;
using appassist_test::LifeCounts;
using pictavo::test::AssertionFired;
using pictavo::test::LogCapture;

namespace {

// Idlers only run when the main loop really goes idle, which single
// iterations never do: run the loop itself until `done` or the timeout.
template <typename Pred>
bool runLoopUntil(Pred done, double timeout) {
  struct State {
    Pred* done;
    double end;
  } state{&done, ecore_time_get() + timeout};
  if (done()) return true;
  // The poll cancels itself when it ends the loop.
  ecore_timer_add(
      0.005,
      [](void* data) -> Eina_Bool {
        auto* s = static_cast<State*>(data);
        if ((*s->done)() || ecore_time_get() > s->end) {
          ecore_main_loop_quit();
          return ECORE_CALLBACK_CANCEL;
        }
        return ECORE_CALLBACK_RENEW;
      },
      &state);
  ecore_main_loop_begin();
  return done();
}

void runMainLoop(double seconds) {
  runLoopUntil([] { return false; }, seconds);
}

}  // namespace

class TimerTest : public ::testing::Test {
 protected:
  void SetUp() override {
    win = pictavo::test::createTestWindow(64, 64);
    owner = evas_object_rectangle_add(evas_object_evas_get(win));
  }
  void TearDown() override { evas_object_del(win); }
  Evas_Object* win = nullptr;
  Evas_Object* owner = nullptr;
};

TEST_F(TimerTest, OwnerDeletedBeforeTheTimerFires) {
  int fired = 0;
  WTimerWeakPtr timer = WTimer::addTimer(
      0.01,
      [&](void*) {
        ++fired;
        return false;
      },
      nullptr, owner);
  ASSERT_FALSE(timer.expired());
  EXPECT_NE(WTimer::getTimerHandle(timer), nullptr);
  evas_object_del(owner);
  EXPECT_TRUE(timer.expired());
  runMainLoop(0.05);
  EXPECT_EQ(fired, 0);
}

TEST_F(TimerTest, CallbackDeletingItsOwnOwnerEndsOnce) {
  int fired = 0;
  WTimerWeakPtr timer = WTimer::addTimer(
      0.0,
      [&](void*) {
        ++fired;
        evas_object_del(owner);
        return false;
      },
      nullptr, owner);
  EXPECT_TRUE(runLoopUntil([&] { return timer.expired(); }, 2.0));
  runMainLoop(0.02);
  EXPECT_EQ(fired, 1);
}

TEST_F(TimerTest, ControllerDestroyedByItsOwnIdlerAndJob) {
  WWindowController* window = appassist_test::makeWindow();
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(window->getBaseLayout(), nullptr));
  // The idler asks to run again after deleting its owner: it must not.
  int runs = 0;
  WTimerWeakPtr idler = WTimer::addIdler(
      [&](void*) {
        ++runs;
        view->destroy();
        return true;
      },
      nullptr, view->getEvasObj());
  EXPECT_TRUE(runLoopUntil([&] { return idler.expired(); }, 2.0));
  runMainLoop(0.02);
  EXPECT_EQ(runs, 1);
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);

  auto* other = new CountingView(&counts);
  ASSERT_TRUE(other->create(window->getBaseLayout(), nullptr));
  WTimerWeakPtr job = WTimer::addJob([&](void*) { other->destroy(); }, nullptr, other->getEvasObj());
  EXPECT_NE(WTimer::getJobHandle(job), nullptr);
  EXPECT_TRUE(runLoopUntil([&] { return job.expired(); }, 2.0));
  EXPECT_EQ(counts.deleted, 2);
  window->destroy();
}

TEST_F(TimerTest, IdlerRunsWhileItAsksAndAnimatorToo) {
  int runs = 0;
  int data = 42;
  WTimerWeakPtr idler = WTimer::addIdler(
      [&](void* d) {
        EXPECT_EQ(d, &data);
        return ++runs < 3;
      },
      &data, owner);
  EXPECT_TRUE(runLoopUntil([&] { return idler.expired(); }, 2.0));
  runMainLoop(0.02);
  EXPECT_EQ(runs, 3);

  int frames = 0;
  WTimerWeakPtr animator = WTimer::addAnimator([&](void*) { return ++frames < 2; }, nullptr, owner);
  EXPECT_NE(WTimer::getAnimatorHandle(animator), nullptr);
  EXPECT_TRUE(runLoopUntil([&] { return animator.expired(); }, 2.0));
  EXPECT_EQ(frames, 2);
}

TEST_F(TimerTest, JobRunsOnceAndCancelStopsEverything) {
  int jobs = 0;
  WTimerWeakPtr job = WTimer::addJob([&](void*) { ++jobs; }, nullptr);
  EXPECT_TRUE(runLoopUntil([&] { return job.expired(); }, 2.0));
  runMainLoop(0.02);
  EXPECT_EQ(jobs, 1);

  int ticks = 0;
  WTimerWeakPtr timer = WTimer::addTimer(
      0.0,
      [&](void*) {
        ++ticks;
        return true;
      },
      nullptr, owner);
  WTimer::cancel(timer);
  EXPECT_TRUE(timer.expired());
  runMainLoop(0.03);
  EXPECT_EQ(ticks, 0);
  WTimer::cancel(timer);  // expired: nothing happens
  // The owner no longer carries the timer's deletion callback.
  evas_object_del(owner);
}

TEST_F(TimerTest, HandlesByTypeAndNullOwner) {
  LogCapture log;
  WTimerWeakPtr idler = WTimer::addIdler([](void*) { return false; }, nullptr, owner);
  EXPECT_NE(WTimer::getIdlerHandle(idler), nullptr);
  EXPECT_EQ(WTimer::getTimerHandle(idler), nullptr);
  EXPECT_TRUE(log.contains("This is not Timer type timer!"));
  EXPECT_EQ(WTimer::getJobHandle(idler), nullptr);
  EXPECT_TRUE(log.contains("This is not Job type timer!"));
  EXPECT_EQ(WTimer::getIdlerHandle(WTimerWeakPtr()), nullptr);

  EXPECT_THROW(WTimer::addTimer(
                   1.0, [](void*) { return false; }, nullptr, nullptr),
               AssertionFired);
  EXPECT_TRUE(log.contains("WASSERT! ownerObj is null."));
  EXPECT_THROW(WTimer::addJob([](void*) {}, nullptr, nullptr), AssertionFired);
}

TEST_F(TimerTest, EvasObjectWeakPointersAreIndependent) {
  auto first = wevasobject_get_weak_ptr(owner);
  auto second = wevasobject_get_weak_ptr(owner);
  ASSERT_FALSE(first.expired());
  EXPECT_NE(first.lock(), second.lock());
  EXPECT_EQ(first.lock()->getEvasObj(), owner);
  EXPECT_EQ(second.lock()->getEvasObj(), owner);
  evas_object_del(owner);
  EXPECT_TRUE(first.expired());
  EXPECT_TRUE(second.expired());
  EXPECT_TRUE(wevasobject_get_weak_ptr(nullptr).expired());
}
