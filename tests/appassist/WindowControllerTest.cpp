#include <gtest/gtest.h>

#include "app-assist/WDefine.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using appassist_test::CountingView;
using appassist_test::LifeCounts;
using pictavo::test::AssertionFired;
using pictavo::test::LogCapture;

namespace {

class CountingWindow : public WWindowController {
 public:
  CountingWindow(LifeCounts* counts, const char* name) : WWindowController(name), mCounts(counts) {}

 protected:
  ~CountingWindow() override { ++mCounts->deleted; }
  Evas_Object* onCreateWin() override {
    ++mCounts->created;
    return WWindowController::onCreateWin();
  }
  void onDestroy() override { ++mCounts->destroyed; }

 private:
  LifeCounts* mCounts;
};

}  // namespace

TEST(WindowController, CreateTwiceMakesOneWindowWithItsTags) {
  pictavo::test::ensureElm();
  LifeCounts counts;
  auto* window = new CountingWindow(&counts, "tagged");
  ASSERT_TRUE(window->create());
  Evas_Object* win = window->getEvasObj();
  ASSERT_TRUE(window->create());
  EXPECT_EQ(window->getEvasObj(), win);
  EXPECT_EQ(counts.created, 1);
  EXPECT_TRUE(evas_object_visible_get(win));
  EXPECT_STREQ(elm_win_title_get(win), "tagged");
  EXPECT_EQ(evas_object_data_get(win, kWindowInstanceKey), static_cast<IWWindowController*>(window));
  ASSERT_NE(window->getBaseLayout(), nullptr);
  ASSERT_NE(window->getConformant(), nullptr);
  EXPECT_EQ(evas_object_data_get(window->getBaseLayout(), kBaseLayoutTagKey),
            static_cast<IWWindowController*>(window));
  EXPECT_STREQ(window->getClassName(), "WWindowController");
  window->destroy();
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
}

TEST(WindowController, WindowDeletedFromOutsideEndsTheControllerOnce) {
  pictavo::test::ensureElm();
  LifeCounts counts, viewCounts;
  auto* window = new CountingWindow(&counts, "outside");
  ASSERT_TRUE(window->create());
  ASSERT_TRUE(window->attachBaseViewController(new CountingView(&viewCounts)));
  evas_object_del(window->getEvasObj());
  EXPECT_EQ(counts.destroyed, 1);
  EXPECT_EQ(counts.deleted, 1);
  EXPECT_EQ(viewCounts.deleted, 1);
}

TEST(WindowController, WithoutBaseLayoutTheViewIsNotCreated) {
  pictavo::test::ensureElm();
  LogCapture log;
  auto* window = new WWindowController("bare");
  window->setOnCreateBaseLayout([](Evas_Object*, Evas_Object**) -> Evas_Object* { return nullptr; });
  ASSERT_TRUE(window->create());
  EXPECT_EQ(window->getBaseLayout(), nullptr);
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  EXPECT_TRUE(window->attachBaseViewController(view));
  EXPECT_EQ(view->getEvasObj(), nullptr);
  EXPECT_EQ(counts.created, 0);
  EXPECT_TRUE(log.contains("base layout does not exist!"));
  EXPECT_EQ(window->detachBaseViewController(), view);
  view->destroy();
  EXPECT_EQ(counts.deleted, 1);
  window->destroy();
}

TEST(WindowController, ProgrammingErrorsAssert) {
  pictavo::test::ensureElm();
  LogCapture log;
  EXPECT_THROW((void)new WWindowController(nullptr), AssertionFired);
  EXPECT_TRUE(log.contains("WASSERT! name"));

  WWindowController* window = appassist_test::makeWindow();
  LifeCounts counts;
  ASSERT_TRUE(window->attachBaseViewController(new CountingView(&counts)));
  auto* second = new CountingView(&counts);
  EXPECT_THROW(window->attachBaseViewController(second), AssertionFired);
  EXPECT_TRUE(log.contains("WASSERT! _pv->_baseViewController == nullptr"));
  second->destroy();
  window->destroy();
}

TEST(WindowController, BaseViewDeletedElsewhereIsForgotten) {
  WWindowController* window = appassist_test::makeWindow();
  LifeCounts counts;
  auto* view = new CountingView(&counts);
  ASSERT_TRUE(window->attachBaseViewController(view));
  EXPECT_EQ(elm_object_part_content_get(window->getBaseLayout(), "elm.swallow.content"), view->getEvasObj());
  view->destroy();
  EXPECT_EQ(window->getBaseViewController(), nullptr);
  window->destroyBaseViewController();  // nothing to destroy, no crash
  // A new base view may be attached once the old one is gone.
  EXPECT_TRUE(window->attachBaseViewController(new CountingView(&counts)));
  window->destroy();
  EXPECT_EQ(counts.deleted, 2);
}

TEST(WindowController, BackKeyHandlerGetsTheKey) {
  pictavo::test::ensureElm();
  auto* window = new WWindowController("keys");
  int backs = 0;
  window->setOnBackKey([&](Evas_Object* obj, void*) {
    ++backs;
    EXPECT_EQ(obj, window->getEvasObj());
  });
  ASSERT_TRUE(window->create());
  appassist_test::pressKey(window->getEvasObj(), "Escape");
  appassist_test::pressKey(window->getEvasObj(), "XF86Back");
  appassist_test::pressKey(window->getEvasObj(), "Return");
  EXPECT_EQ(backs, 2);
  window->destroy();
}
