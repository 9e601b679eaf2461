#include <gtest/gtest.h>

#include "app-assist/WDefine.h"
#include "app-assist/WNaviframeController.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using appassist_test::CountingPage;
using appassist_test::LifeCounts;
using appassist_test::pressKey;
using pictavo::test::AssertionFired;
using pictavo::test::LogCapture;
using pictavo::test::runMainLoopUntil;

class NaviframeTest : public ::testing::Test {
 protected:
  void SetUp() override {
    window = appassist_test::makeWindow();
    naviframe = new WNaviframeController();
    ASSERT_TRUE(window->attachBaseViewController(naviframe));
    // Pops are animated; no test should wait for the full transition.
    elm_config_transition_duration_factor_set(0.01);
  }
  void TearDown() override { window->destroy(); }
  // Lets push transitions finish: a naviframe does not pop while animating.
  void settle() { pictavo::test::runMainLoop(0.3); }
  int itemCount() const {
    Eina_List* items = elm_naviframe_items_get(naviframe->getEvasObj());
    int n = static_cast<int>(eina_list_count(items));
    eina_list_free(items);
    return n;
  }
  WWindowController* window = nullptr;
  WNaviframeController* naviframe = nullptr;
  // Pages still pushed are deleted by TearDown, after the test body: their
  // counters must outlive the body.
  LifeCounts counts, lower, upper, a, b;
};

TEST_F(NaviframeTest, PushRecordsTheItemAndTheNaviframeTag) {
  EXPECT_EQ(evas_object_data_get(naviframe->getEvasObj(), kNaviframeInstanceKey), naviframe);
  EXPECT_EQ(window->getBaseViewController(), naviframe);
  auto* page = new CountingPage(&counts);
  page->setTitle("Title");
  int handlerCalls = 0;
  Elm_Object_Item* handed = nullptr;
  page->setOnPushed([&](Elm_Object_Item* item) {
    ++handlerCalls;
    handed = item;
  });
  ASSERT_TRUE(naviframe->push(page, "first"));
  EXPECT_STREQ(page->getName(), "first");
  EXPECT_EQ(handlerCalls, 1);
  EXPECT_EQ(page->pushed, 0);  // the handler replaces onPushed
  EXPECT_EQ(handed, page->getNaviItem());
  EXPECT_EQ(page->getNaviframeController(), naviframe);
  EXPECT_TRUE(naviframe->isTop(page));
  EXPECT_EQ(naviframe->getTopViewController(), page);
  EXPECT_STREQ(elm_object_item_text_get(page->getNaviItem()), "Title");
}

TEST_F(NaviframeTest, BackKeyPopsTheTopUnlessItsOnPopVetoes) {
  auto* bottom = new CountingPage(&lower, "bottom");
  auto* top = new CountingPage(&upper, "top");
  ASSERT_TRUE(naviframe->push(bottom));
  ASSERT_TRUE(naviframe->push(top));
  EXPECT_EQ(bottom->pushed, 1);
  settle();

  top->allowPop = false;
  pressKey(naviframe->getEvasObj(), "Escape");
  EXPECT_EQ(top->popAsked, 1);
  EXPECT_EQ(itemCount(), 2);
  EXPECT_EQ(bottom->becameTop, 0);

  top->allowPop = true;
  pressKey(naviframe->getEvasObj(), "Escape");
  EXPECT_EQ(bottom->becameTop, 1);
  EXPECT_TRUE(runMainLoopUntil([&] { return upper.deleted == 1; }, 5.0));
  EXPECT_EQ(upper.destroyed, 1);
  EXPECT_EQ(itemCount(), 1);
  EXPECT_TRUE(naviframe->isTop(bottom));
}

TEST_F(NaviframeTest, LastItemPopAsksTheHandler) {
  auto* only = new CountingPage(&counts);
  ASSERT_TRUE(naviframe->push(only));
  settle();

  int asked = 0;
  bool answer = false;
  naviframe->setOnLastItemPop([&](bool* popOut) {
    ++asked;
    EXPECT_TRUE(*popOut);  // offered as poppable
    *popOut = answer;
  });
  pressKey(naviframe->getEvasObj(), "Escape");
  EXPECT_EQ(asked, 1);
  EXPECT_EQ(itemCount(), 1);

  // A page that refuses to go is not even offered.
  only->allowPop = false;
  pressKey(naviframe->getEvasObj(), "Escape");
  EXPECT_EQ(asked, 1);
  EXPECT_EQ(only->popAsked, 2);

  only->allowPop = true;
  answer = true;
  pressKey(naviframe->getEvasObj(), "Escape");
  EXPECT_EQ(asked, 2);
  EXPECT_TRUE(runMainLoopUntil([&] { return counts.deleted == 1; }, 5.0));
  EXPECT_EQ(itemCount(), 0);
}

TEST_F(NaviframeTest, LastItemPopWithoutHandlerKeepsTheScreen) {
  auto* only = new CountingPage(&counts);
  ASSERT_TRUE(naviframe->push(only));
  settle();
  pressKey(naviframe->getEvasObj(), "Escape");
  EXPECT_EQ(only->popAsked, 1);
  pictavo::test::runMainLoop(0.05);
  EXPECT_EQ(itemCount(), 1);
  EXPECT_EQ(counts.deleted, 0);
}

TEST_F(NaviframeTest, PopOutOfTheTopView) {
  LogCapture log;
  auto* loose = new CountingPage(&b);
  EXPECT_FALSE(loose->popOut());
  EXPECT_TRUE(log.contains("Not created view! No Evas Object!"));
  loose->destroy();

  auto* bottom = new CountingPage(&a);
  auto* top = new CountingPage(&b);
  ASSERT_TRUE(naviframe->push(bottom));
  ASSERT_TRUE(naviframe->push(top));
  settle();
  EXPECT_TRUE(top->popOut());
  EXPECT_TRUE(runMainLoopUntil([&] { return b.deleted == 2; }, 5.0));
  EXPECT_TRUE(naviframe->isTop(bottom));
  EXPECT_EQ(bottom->becameTop, 1);
}

// A failed assertion ends the program; the test only sees that it fires.
TEST_F(NaviframeTest, PopOutOfAViewBelowTheTopAsserts) {
  LogCapture log;
  auto* bottom = new CountingPage(&a);
  auto* top = new CountingPage(&b);
  ASSERT_TRUE(naviframe->push(bottom));
  ASSERT_TRUE(naviframe->push(top));
  settle();
  EXPECT_THROW(bottom->popOut(), AssertionFired);
  EXPECT_TRUE(log.contains("WASSERT! This view is not on Top of Naviframe!"));
}

TEST_F(NaviframeTest, DestroyingTheNaviframeEndsEveryPageOnce) {
  for (int i = 0; i < 3; ++i) ASSERT_TRUE(naviframe->push(new CountingPage(&counts)));
  WViewControllerWeakPtr weak = naviframe->getWeakPtr();
  window->destroyBaseViewController();
  EXPECT_TRUE(weak.expired());
  EXPECT_EQ(counts.destroyed, 3);
  EXPECT_EQ(counts.deleted, 3);
  EXPECT_EQ(window->getBaseViewController(), nullptr);
}

TEST_F(NaviframeTest, DestroyingAPushedPageRemovesItsItem) {
  auto* bottom = new CountingPage(&counts);
  auto* top = new CountingPage(&counts);
  ASSERT_TRUE(naviframe->push(bottom));
  ASSERT_TRUE(naviframe->push(top));
  top->destroy();
  EXPECT_EQ(counts.deleted, 1);
  EXPECT_EQ(itemCount(), 1);
}

TEST_F(NaviframeTest, MoreKeyPressesTheMoreButtonOfTheTopPage) {
  auto* page = new CountingPage(&counts);
  ASSERT_TRUE(naviframe->push(page));
  int clicks = 0;
  page->addMoreButton(
      page->getNaviItem(), [](void* data, Evas_Object*, void*) { ++*static_cast<int*>(data); }, &clicks);
  pressKey(naviframe->getEvasObj(), "Menu");
  EXPECT_EQ(clicks, 1);
}

TEST_F(NaviframeTest, PlaceholderPageShowsItsName) {
  auto* page = new WContentViewController("placeholder");
  ASSERT_TRUE(naviframe->push(page));
  Evas_Object* obj = page->getEvasObj();
  ASSERT_NE(obj, nullptr);
  EXPECT_STREQ(elm_object_part_text_get(obj, "name"), "placeholder");
  EXPECT_NE(elm_object_part_content_get(obj, "rect"), nullptr);
}
