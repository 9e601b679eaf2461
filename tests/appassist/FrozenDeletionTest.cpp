// Objects whose events are frozen (e.g. while another application is being
// launched on top of them) can still be deleted. Everything the framework
// binds to an object's life must notice that deletion all the same.

#include <gtest/gtest.h>

#include "app-assist/IWEvasObject.h"
#include "app-assist/WTimer.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using appassist_test::CountingView;
using appassist_test::LifeCounts;

class FrozenDeletionTest : public ::testing::Test {
 protected:
  void SetUp() override { window = appassist_test::makeWindow(); }
  void TearDown() override { window->destroy(); }
  Evas_Object* base() const { return window->getBaseLayout(); }
  Evas_Object* frozenRectangle() const {
    Evas_Object* obj = evas_object_rectangle_add(evas_object_evas_get(base()));
    evas_object_freeze_events_set(obj, EINA_TRUE);
    return obj;
  }
  WWindowController* window = nullptr;
};

TEST_F(FrozenDeletionTest, WeakPointerExpiresAndOwnedTimersNeverFire) {
  Evas_Object* owner = frozenRectangle();
  std::weak_ptr<IWEvasObject> weak = wevasobject_get_weak_ptr(owner);
  int fired = 0;
  auto count = [](void* data) {
    ++*static_cast<int*>(data);
    return false;
  };
  WTimerWeakPtr timer = WTimer::addTimer(0.01, count, &fired, owner);
  WTimerWeakPtr idler = WTimer::addIdler(count, &fired, owner);
  WTimerWeakPtr job = WTimer::addJob([](void* data) { ++*static_cast<int*>(data); }, &fired, owner);
  ASSERT_FALSE(weak.expired());
  ASSERT_FALSE(timer.expired());

  evas_object_del(owner);
  EXPECT_TRUE(weak.expired());
  EXPECT_TRUE(timer.expired());
  EXPECT_TRUE(idler.expired());
  EXPECT_TRUE(job.expired());
  pictavo::test::runMainLoop(0.1);
  EXPECT_EQ(fired, 0);
}

TEST_F(FrozenDeletionTest, UnfrozenBeforeDeletionStillEndsOnce) {
  // Thawing must not leave a second deletion hook behind.
  Evas_Object* owner = frozenRectangle();
  std::weak_ptr<IWEvasObject> weak = wevasobject_get_weak_ptr(owner);
  int fired = 0;
  WTimerWeakPtr timer = WTimer::addTimer(
      0.01,
      [](void* data) {
        ++*static_cast<int*>(data);
        return false;
      },
      &fired, owner);
  evas_object_freeze_events_set(owner, EINA_FALSE);
  evas_object_del(owner);
  EXPECT_TRUE(weak.expired());
  EXPECT_TRUE(timer.expired());
  pictavo::test::runMainLoop(0.05);
  EXPECT_EQ(fired, 0);
}

TEST_F(FrozenDeletionTest, ViewControllerEndsOnceWithItsFrozenObject) {
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(base(), nullptr));
  WViewControllerWeakPtr weak = view->getWeakPtr();
  evas_object_freeze_events_set(view->getEvasObj(), EINA_TRUE);
  evas_object_del(view->getEvasObj());
  EXPECT_TRUE(weak.expired());
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
}

TEST_F(FrozenDeletionTest, FrozenViewControllerDestroyedThroughTheController) {
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(base(), nullptr));
  evas_object_freeze_events_set(view->getEvasObj(), EINA_TRUE);
  view->destroy();
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
}

TEST_F(FrozenDeletionTest, FrozenParentTakesTheViewControllerAlong) {
  // The view is deleted as a child of a frozen container.
  LifeCounts counts;
  Evas_Object* box = elm_box_add(base());
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(box, nullptr));
  elm_box_pack_end(box, view->getEvasObj());
  evas_object_freeze_events_set(box, EINA_TRUE);
  evas_object_del(box);
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
}
