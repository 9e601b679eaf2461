#include <gtest/gtest.h>

#include "app-assist/WDefine.h"
#include "app-assist/WPopupController.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using appassist_test::CountingView;
using appassist_test::LifeCounts;
using pictavo::test::AssertionFired;
using pictavo::test::LogCapture;

class ViewControllerTest : public ::testing::Test {
 protected:
  void SetUp() override { window = appassist_test::makeWindow(); }
  void TearDown() override { window->destroy(); }
  Evas_Object* base() const { return window->getBaseLayout(); }
  WWindowController* window = nullptr;
};

TEST_F(ViewControllerTest, CreateTwiceMakesOneObjectAndFindsTheWindow) {
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  view->setName("box");
  ASSERT_TRUE(view->create(base(), nullptr));
  Evas_Object* obj = view->getEvasObj();
  ASSERT_NE(obj, nullptr);
  EXPECT_TRUE(view->create(base(), nullptr));
  EXPECT_EQ(view->getEvasObj(), obj);
  EXPECT_EQ(counts.created, 1);
  EXPECT_EQ(view->getWindowController(), static_cast<IWWindowController*>(window));
  EXPECT_EQ(view->getWindowBaseLayoutEvasObj(), base());
  EXPECT_EQ(WViewController::fromEvasObj(obj), view);
  EXPECT_STREQ(evas_object_name_get(obj), "box");
  view->destroy();
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
}

TEST_F(ViewControllerTest, DeletingTheObjectFromOutsideEndsTheControllerOnce) {
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(base(), nullptr));
  WViewControllerWeakPtr weak = view->getWeakPtr();
  EXPECT_FALSE(weak.expired());
  evas_object_del(view->getEvasObj());
  EXPECT_TRUE(weak.expired());
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
}

TEST_F(ViewControllerTest, UncreatedAndRefusedControllersDeleteAtOnce) {
  LifeCounts counts;
  auto* never = new CountingView(&counts);
  never->destroy();
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);

  LifeCounts refused;
  auto* view = new CountingView(&refused);
  view->failOnCreate = true;
  EXPECT_FALSE(view->create(base(), nullptr));
  EXPECT_EQ(view->getEvasObj(), nullptr);
  EXPECT_EQ(refused.created, 0);
  view->destroy();
  EXPECT_EQ(refused.deleted, 1);
}

TEST_F(ViewControllerTest, NoViewObjectAndNoWindowAreReported) {
  LogCapture log;
  auto* empty = new WViewController();
  EXPECT_FALSE(empty->create(base(), nullptr));
  EXPECT_TRUE(log.contains("No view object created!"));
  empty->destroy();

  // A window made without a window controller: the view cannot find one.
  Evas_Object* bare = pictavo::test::createTestWindow(100, 100);
  LifeCounts counts;
  auto* lost = new CountingView(&counts);
  EXPECT_THROW(lost->create(bare, nullptr), AssertionFired);
  EXPECT_TRUE(log.contains("WASSERT! Cannot find window controll."));
  // The half-made controller is left behind: only a programming error gets here.
  evas_object_del(bare);
}

TEST_F(ViewControllerTest, PartContentRoundTripAndRefusals) {
  LogCapture log;
  LifeCounts parentCounts, childCounts;
  auto* container = new CountingView(&parentCounts, true);
  auto* orphan = new CountingView(&childCounts);
  EXPECT_FALSE(orphan->setPartContent("rect", container));
  EXPECT_TRUE(log.contains("Container object is not yet created!"));
  orphan->destroy();
  container->destroy();

  LifeCounts c1, c2;
  auto* layout = new CountingView(&c1, true);
  ASSERT_TRUE(layout->create(base(), nullptr));
  auto* child = new CountingView(&c2);
  ASSERT_TRUE(layout->setPartContent("rect", child));
  EXPECT_EQ(layout->getPartContent("rect"), child);
  EXPECT_EQ(layout->getPartContent("nothing"), nullptr);
  EXPECT_TRUE(log.contains("Content has not been set or the part does not exist!"));

  Evas_Object* plain = evas_object_rectangle_add(evas_object_evas_get(layout->getEvasObj()));
  elm_object_part_content_set(layout->getEvasObj(), "rect", plain);  // replaces (deletes) the child
  EXPECT_EQ(c2.deleted, 1);
  EXPECT_EQ(layout->getPartContent("rect"), nullptr);
  EXPECT_TRUE(log.contains("This is not a view controller object"));
  layout->destroy();
  EXPECT_EQ(c1.deleted, 1);
}

TEST_F(ViewControllerTest, SecondPopupClosesTheFirstAndPopupsCloseWithTheirView) {
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(base(), nullptr));

  auto* first = new WPopupController("first", "one");
  view->attachPopup(first);
  WViewControllerWeakPtr firstWeak = first->getWeakPtr();
  ASSERT_NE(first->getEvasObj(), nullptr);
  // Popups sit on the window's base layout, not inside the view.
  EXPECT_EQ(elm_object_parent_widget_get(first->getEvasObj()), base());

  auto* second = new WPopupController("second", "two");
  view->attachPopup(second);
  WViewControllerWeakPtr secondWeak = second->getWeakPtr();
  EXPECT_TRUE(firstWeak.expired());
  EXPECT_FALSE(secondWeak.expired());

  view->destroyPopup();
  EXPECT_TRUE(secondWeak.expired());
  view->destroyPopup();  // nothing left: no effect

  auto* third = new WPopupController("third", "three");
  view->attachPopup(third);
  WViewControllerWeakPtr thirdWeak = third->getWeakPtr();
  view->destroy();
  EXPECT_TRUE(thirdWeak.expired());
  EXPECT_EQ(counts.deleted, 1);
}

TEST_F(ViewControllerTest, PopupButtonsAndBackKey) {
  LogCapture log;
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(view->create(base(), nullptr));

  auto* popup = new WPopupController("title", "text");
  Evas_Object* buttons[3] = {nullptr, nullptr, nullptr};
  int keepPressed = 0, closePressed = 0;
  EXPECT_TRUE(popup->addButton(
      "keep",
      [&](bool* destroy) {
        ++keepPressed;
        *destroy = false;
      },
      [&](Evas_Object* b) { buttons[0] = b; }));
  EXPECT_TRUE(popup->addButton(
      "close", [&](bool*) { ++closePressed; }, [&](Evas_Object* b) { buttons[1] = b; }));
  EXPECT_TRUE(popup->addButton("third", nullptr, [&](Evas_Object* b) { buttons[2] = b; }));
  EXPECT_FALSE(popup->addButton("fourth", nullptr));
  EXPECT_TRUE(log.contains("Over the max button number! =3"));
  EXPECT_EQ(popup->getButtonCount(), 3);

  view->attachPopup(popup);
  WViewControllerWeakPtr weak = popup->getWeakPtr();
  ASSERT_NE(buttons[0], nullptr);
  evas_object_smart_callback_call(buttons[0], "clicked", nullptr);
  EXPECT_EQ(keepPressed, 1);
  EXPECT_FALSE(weak.expired());
  evas_object_smart_callback_call(buttons[1], "clicked", nullptr);
  EXPECT_EQ(closePressed, 1);
  EXPECT_TRUE(weak.expired());

  // Back key on a popup without a back handler closes only the popup.
  auto* another = new WPopupController("t", "c");
  view->attachPopup(another);
  WViewControllerWeakPtr anotherWeak = another->getWeakPtr();
  appassist_test::pressKey(view->getEvasObj(), "Escape");
  EXPECT_TRUE(anotherWeak.expired());
  EXPECT_EQ(counts.deleted, 0);

  // A back handler that keeps the popup open.
  auto* sticky = new WPopupController("t", "c");
  int backs = 0;
  sticky->setOnBack([&](bool* destroy) {
    ++backs;
    *destroy = false;
  });
  view->attachPopup(sticky);
  WViewControllerWeakPtr stickyWeak = sticky->getWeakPtr();
  appassist_test::pressKey(view->getEvasObj(), "Escape");
  EXPECT_EQ(backs, 1);
  EXPECT_FALSE(stickyWeak.expired());
  view->destroy();
  EXPECT_TRUE(stickyWeak.expired());
}

TEST_F(ViewControllerTest, PopupContentViewIsCreatedInsideThePopup) {
  LifeCounts viewCounts, contentCounts;
  auto* view = new CountingView(&viewCounts);
  ASSERT_TRUE(view->create(base(), nullptr));
  auto* popup = new WPopupController();
  auto* content = new CountingView(&contentCounts);
  popup->setContentView(content);
  view->attachPopup(popup);
  EXPECT_EQ(contentCounts.created, 1);
  view->destroyPopup();
  EXPECT_EQ(contentCounts.deleted, 1);

  // Never shown: the content view is freed with the popup.
  LifeCounts unused;
  auto* idle = new WPopupController();
  idle->setContentView(new CountingView(&unused));
  idle->destroy();
  EXPECT_EQ(unused.deleted, 1);
  view->destroy();
}
