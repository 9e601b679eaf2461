#include <gtest/gtest.h>

#include "app-assist/WMenuPopupController.h"
#include "tests/appassist/AppAssistTestUtil.h"

using namespace app_assist;
using pictavo::test::LogCapture;

namespace {

class TrackedMenu : public WMenuPopupController {
 public:
  explicit TrackedMenu(int* deleted) : mDeleted(deleted) {}

 protected:
  ~TrackedMenu() override { ++*mDeleted; }

 private:
  int* mDeleted;
};

}  // namespace

class MenuPopupTest : public ::testing::Test {
 protected:
  void SetUp() override { window = appassist_test::makeWindow(); }
  void TearDown() override { window->destroy(); }
  WWindowController* window = nullptr;
};

TEST_F(MenuPopupTest, MisuseIsReported) {
  LogCapture log;
  int deleted = 0;
  auto* menu = new TrackedMenu(&deleted);
  EXPECT_EQ(menu->appendItem("x", [] {}), nullptr);
  EXPECT_TRUE(log.contains("Create pop-up first!"));
  EXPECT_FALSE(menu->showMenu());
  EXPECT_TRUE(log.contains("Pop-up is Not created!"));
  EXPECT_FALSE(menu->createMenu(nullptr, nullptr));
  EXPECT_TRUE(log.contains("Call createMenu first!"));
  menu->destroy();
  EXPECT_EQ(deleted, 1);
}

TEST_F(MenuPopupTest, OneCurrentMenuThatClosesOnBackAndOnDestroyCurrent) {
  int deleted = 0;
  auto* menu = new TrackedMenu(&deleted);
  ASSERT_TRUE(menu->createMenu(window->getEvasObj(), window->getBaseLayout()));
  ASSERT_NE(menu->appendItem("First", [] {}), nullptr);
  ASSERT_TRUE(menu->showMenu());
  EXPECT_EQ(WMenuPopupController::getCurrentMenu(), menu->getEvasObj());
  // The layout may be resized while the menu is open.
  evas_object_resize(window->getBaseLayout(), 300, 300);
  WMenuPopupController::destroyCurrentMenu();
  EXPECT_EQ(deleted, 1);
  EXPECT_EQ(WMenuPopupController::getCurrentMenu(), nullptr);
  WMenuPopupController::destroyCurrentMenu();  // none open: nothing happens

  // A menu without items closes at once on back.
  auto* empty = new TrackedMenu(&deleted);
  ASSERT_TRUE(empty->createMenu(window->getEvasObj(), nullptr));
  empty->showMenu();
  appassist_test::pressKey(window->getEvasObj(), "Escape");
  EXPECT_EQ(deleted, 2);

  auto* second = new TrackedMenu(&deleted);
  ASSERT_TRUE(second->createMenu(window->getEvasObj(), window->getBaseLayout()));
  second->appendItem("Only", [] {});
  second->showMenu();
  WViewControllerWeakPtr weak = second->getWeakPtr();
  pictavo::test::runMainLoop(0.1);
  // Back dismisses; the dismissal animation ends in deletion.
  appassist_test::pressKey(window->getEvasObj(), "Escape");
  EXPECT_TRUE(pictavo::test::runMainLoopUntil([&] { return weak.expired(); }, 5.0));
  EXPECT_EQ(WMenuPopupController::getCurrentMenu(), nullptr);
}

TEST_F(MenuPopupTest, LayoutDeletedBeforeTheMenuIsNotTouchedAgain) {
  int deleted = 0;
  Evas_Object* layout = elm_layout_add(window->getBaseLayout());
  auto* menu = new TrackedMenu(&deleted);
  ASSERT_TRUE(menu->createMenu(window->getEvasObj(), layout));
  evas_object_del(layout);
  menu->destroy();
  EXPECT_EQ(deleted, 1);
}

TEST_F(MenuPopupTest, ItemCallbackRunsBeforeTheMenuCloses) {
  int deleted = 0;
  auto* menu = new TrackedMenu(&deleted);
  ASSERT_TRUE(menu->createMenu(window->getEvasObj(), window->getBaseLayout()));
  int chosen = 0;
  int deletedWhenChosen = -1;
  Elm_Object_Item* item = menu->appendItem("Choose", [&] {
    ++chosen;
    deletedWhenChosen = deleted;
  });
  ASSERT_NE(item, nullptr);
  menu->showMenu();
  elm_ctxpopup_item_selected_set(item, EINA_TRUE);
  pictavo::test::runMainLoopUntil([&] { return chosen > 0 && deleted > 0; }, 2.0);
  EXPECT_EQ(chosen, 1);
  EXPECT_EQ(deletedWhenChosen, 0);
  EXPECT_EQ(deleted, 1);
}
