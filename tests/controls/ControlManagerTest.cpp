#include <gtest/gtest.h>

#include <Elementary.h>

#include <string>
#include <vector>

#include "app-assist/WWindowController.h"
#include "control/CLyControl.h"
#include "manager/CLyControlManager.h"
#include "platform/core/app_common.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

namespace {

struct Tally {
  int destroyed = 0;
  int deleted = 0;
  std::vector<std::string> heard;
};

class TestControl : public CLyControl {
 public:
  TestControl(Tally* tally, std::string tag) : mTally(tally), mTag(std::move(tag)) {}
  std::function<void()> onHeard;
  void onEvent(const CLyEvent& event) override {
    mTally->heard.push_back(mTag + ":" + std::to_string(event.type));
    if (onHeard) onHeard();
  }

 protected:
  ~TestControl() override { ++mTally->deleted; }
  Evas_Object* onCreateView(Evas_Object* parent, void*) override { return elm_box_add(parent); }
  void onDestroy() override { ++mTally->destroyed; }

 private:
  Tally* mTally;
  std::string mTag;
};

class OtherControl : public CLyControl {
 protected:
  Evas_Object* onCreateView(Evas_Object* parent, void*) override { return elm_box_add(parent); }
};

class ControlManagerTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    window = new app_assist::WWindowController("controls");
    ASSERT_TRUE(window->create());
    // A layout with swallow parts, as a screen has.
    parent = elm_layout_add(window->getBaseLayout());
    std::string edj =
        std::string(getenv("PICTAVO_RES_DIR") ? getenv("PICTAVO_RES_DIR") : "") + "/edje/WDefaultView.edj";
    ASSERT_TRUE(elm_layout_file_set(parent, edj.c_str(), "default-view"));
  }
  void TearDown() override { window->destroy(); }
  app_assist::WWindowController* window = nullptr;
  Evas_Object* parent = nullptr;
};

}  // namespace

TEST_F(ControlManagerTest, AttachFindReplaceAndDetach) {
  Tally tally;
  CLyControlManager manager;
  auto* first = new TestControl(&tally, "first");
  manager.attach(parent, first, "rect", true);
  EXPECT_EQ(elm_object_part_content_get(parent, "rect"), first->getEvasObj());
  EXPECT_EQ(manager.findAs<TestControl>("rect"), first);
  EXPECT_EQ(manager.findAs<OtherControl>("rect"), nullptr);

  auto* second = new TestControl(&tally, "second");
  manager.attach(parent, second, "rect", true);
  EXPECT_EQ(tally.destroyed, 1);
  EXPECT_EQ(tally.deleted, 1);
  EXPECT_EQ(manager.findAs<TestControl>("rect"), second);
  EXPECT_EQ(manager.size(), 1u);

  manager.detach(parent, "rect", true);
  EXPECT_EQ(tally.deleted, 2);
  EXPECT_EQ(manager.size(), 0u);
  EXPECT_TRUE(manager.find("rect").expired());
}

TEST_F(ControlManagerTest, ExpiredControlsAreDroppedAtTheNextWalk) {
  LogCapture log;
  Tally tally;
  CLyControlManager manager;
  auto* a = new TestControl(&tally, "a");
  auto* b = new TestControl(&tally, "b");
  manager.attach(parent, a, "rect", true);
  manager.attach(parent, b, "loose", false);
  evas_object_del(a->getEvasObj());
  EXPECT_EQ(manager.size(), 2u);
  EXPECT_TRUE(manager.find("rect").expired());
  EXPECT_EQ(manager.findAs<TestControl>("rect"), nullptr);

  manager.notify(CLyEvent(CLyEvent::CLOSE_OPTIONS, 0, 0));
  EXPECT_EQ(tally.heard, (std::vector<std::string>{"b:5"}));
  EXPECT_TRUE(log.contains("Remove expired control"));
  EXPECT_EQ(manager.size(), 1u);
}

TEST_F(ControlManagerTest, NotifyInPartOrderAndDetachDuringTheWalk) {
  Tally tally;
  CLyControlManager manager;
  auto* z = new TestControl(&tally, "z");
  auto* a = new TestControl(&tally, "a");
  manager.attach(parent, z, "z.part", false);
  manager.attach(parent, a, "a.part", false);
  // The first control detaches the second while the walk is on.
  a->onHeard = [&] { manager.detach(parent, "z.part", false); };
  manager.notify(CLyEvent(CLyEvent::WINDOW_ROTATED, 0, 90));
  EXPECT_EQ(tally.heard, (std::vector<std::string>{"a:4"}));
  EXPECT_EQ(tally.deleted, 1);
  EXPECT_EQ(manager.size(), 1u);

  int visited = 0;
  manager.forEach([&](const CLyControlManager::Holder& holder) {
    ++visited;
    if (auto control = holder.lock()) control->destroy();
  });
  EXPECT_EQ(visited, 1);
  EXPECT_EQ(manager.size(), 0u);
}

TEST_F(ControlManagerTest, DestroyingTheManagerDestroysLiveControls) {
  Tally tally;
  {
    CLyControlManager manager;
    manager.attach(parent, new TestControl(&tally, "a"), "one", false);
    manager.attach(parent, new TestControl(&tally, "b"), "two", false);
    auto* gone = new TestControl(&tally, "c");
    manager.attach(parent, gone, "three", false);
    gone->destroy();
  }
  EXPECT_EQ(tally.destroyed, 3);
  EXPECT_EQ(tally.deleted, 3);
}

TEST_F(ControlManagerTest, BadArgumentsAreRefused) {
  LogCapture log;
  Tally tally;
  CLyControlManager manager;
  auto* control = new TestControl(&tally, "x");
  manager.attach(nullptr, control, "rect", true);
  EXPECT_TRUE(log.contains("Parent is nullptr! Fail to attach control"));
  manager.detach(nullptr, "rect", true);
  manager.attach(parent, nullptr, "rect", true);
  manager.attach(parent, control, nullptr, true);
  EXPECT_EQ(manager.size(), 0u);
  EXPECT_TRUE(manager.find("missing").expired());
  EXPECT_TRUE(log.contains("Failed to get control"));
  // A control that cannot be created is not registered (and is freed).
  auto* empty = new CLyControl();
  manager.attach(parent, empty, "rect", true);
  EXPECT_EQ(manager.size(), 0u);
  control->destroy();
  EXPECT_EQ(tally.deleted, 1);
}
