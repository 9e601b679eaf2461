#include "launcher/CLyAppControlLauncher.h"

#include <Elementary.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "ShellTestFiles.h"
#include "common/CLyUtil.h"
#include "platform/app_control_launch_private.h"
#include "tests/support/AppControlReplies.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::runMainLoop;
using pictavo::test::runMainLoopUntil;
using pictavo::test::TempDir;

namespace {

// The shell reads the selection under the key's short form.
struct Replies : pictavo::test::AppControlReplies {
  Replies() { selectedKey = "appcontrol/data/selected"; }
};
constexpr auto onReply = &Replies::onReply;

class CLyAppControlLauncherTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    mWin = pictavo::test::createTestWindow(480, 800);
    setenv("PICTAVO_PICKER_DIR", mDir.path().c_str(), 1);
    for (int i = 0; i < 2; ++i) {
      mImages.push_back(mDir.file("p" + std::to_string(i) + ".jpg"));
      ASSERT_TRUE(pictavo::test::writeJpeg(mImages.back()));
    }
  }
  void TearDown() override {
    CLyAppControlLauncher::destroy();
    runMainLoop(0.05);
    if (mWin) evas_object_del(mWin);
    unsetenv("PICTAVO_PICKER_DIR");
  }
  TempDir mDir;
  Evas_Object* mWin = nullptr;
  std::vector<std::string> mImages;
};

}  // namespace

TEST_F(CLyAppControlLauncherTest, PickerReplyReachesTheCallback) {
  Replies replies;
  CLyAppControlLauncher* launcher = CLyAppControlLauncher::getInstance();
  ASSERT_TRUE(
      launcher->sendLaunchRequest(CLyUtil::createPickImagesRequest(6), onReply, &replies, nullptr, 1.6));
  EXPECT_TRUE(launcher->hasCurrentRequest());
  ASSERT_TRUE(image_picker_submit(mImages));
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.result, APP_CONTROL_RESULT_SUCCEEDED);
  EXPECT_EQ(replies.selected, mImages);
}

TEST_F(CLyAppControlLauncherTest, SecondRequestTerminatesThePreviousPickerFirst) {
  Replies first, second;
  CLyAppControlLauncher* launcher = CLyAppControlLauncher::getInstance();
  int opened = image_picker_get_open_count();
  ASSERT_TRUE(
      launcher->sendLaunchRequest(CLyUtil::createPickImagesRequest(6), onReply, &first, nullptr, 1.6));
  Evas_Object* firstWindow = image_picker_get_window();
  ASSERT_NE(firstWindow, nullptr);
  LogCapture log;
  ASSERT_TRUE(launcher->sendLaunchRequest(CLyUtil::createPickImageRequest(), onReply, &second, nullptr, 1.6));
  EXPECT_EQ(image_picker_get_open_count(), opened + 2);
  // The first picker was told to close before the second opened.
  std::vector<std::string> lines = log.lines();
  size_t terminate = lines.size(), launch = lines.size();
  for (size_t i = 0; i < lines.size(); ++i) {
    if (terminate == lines.size() && lines[i].find("terminate") != std::string::npos) terminate = i;
    if (launch == lines.size() && lines[i].find("launch ") != std::string::npos) launch = i;
  }
  ASSERT_LT(terminate, lines.size());
  EXPECT_LT(terminate, launch);
  EXPECT_NE(image_picker_get_window(), firstWindow);
  ASSERT_TRUE(image_picker_submit({mImages[1]}));
  ASSERT_TRUE(runMainLoopUntil([&] { return second.count == 1; }, 3.0));
  EXPECT_EQ(first.count, 0);
  EXPECT_EQ(second.selected, (std::vector<std::string>{mImages[1]}));
}

TEST_F(CLyAppControlLauncherTest, FreezeLastsUntilTheTimerEnds) {
  CLyAppControlLauncher* launcher = CLyAppControlLauncher::getInstance();
  ASSERT_TRUE(
      launcher->sendLaunchRequest(CLyUtil::createStorageSettingsRequest(), nullptr, nullptr, mWin, 0.2));
  EXPECT_TRUE(evas_object_freeze_events_get(mWin));
  EXPECT_TRUE(launcher->isFreezing());
  ASSERT_TRUE(runMainLoopUntil([&] { return !evas_object_freeze_events_get(mWin); }, 3.0));
  EXPECT_FALSE(launcher->isFreezing());
}

TEST_F(CLyAppControlLauncherTest, FrozenObjectDeletedEarlyIsLeftAlone) {
  LogCapture log;
  CLyAppControlLauncher* launcher = CLyAppControlLauncher::getInstance();
  Evas_Object* rect = evas_object_rectangle_add(evas_object_evas_get(mWin));
  ASSERT_TRUE(launcher->sendLaunchRequest(CLyUtil::createPickImagesRequest(6), nullptr, nullptr, rect, 1.6));
  EXPECT_TRUE(evas_object_freeze_events_get(rect));
  evas_object_del(rect);
  EXPECT_FALSE(launcher->isFreezing()) << "the timer goes with the object";
  runMainLoop(1.8);
  // Clearing later touches nothing that is gone.
  launcher->_clearAll();
  EXPECT_FALSE(launcher->hasCurrentRequest());
  EXPECT_FALSE(log.contains("Critical"));
}

TEST_F(CLyAppControlLauncherTest, ClearAllLiftsTheFreezeAndClosesThePicker) {
  CLyAppControlLauncher* launcher = CLyAppControlLauncher::getInstance();
  ASSERT_TRUE(launcher->sendLaunchRequest(CLyUtil::createPickImagesRequest(6), nullptr, nullptr, mWin, 1.6));
  EXPECT_NE(image_picker_get_window(), nullptr);
  launcher->_clearAll();
  EXPECT_FALSE(evas_object_freeze_events_get(mWin));
  EXPECT_FALSE(launcher->isFreezing());
  EXPECT_FALSE(launcher->hasCurrentRequest());
  EXPECT_EQ(image_picker_get_window(), nullptr);
  // The window may still be deleted afterwards without trouble.
  evas_object_del(mWin);
  mWin = nullptr;
}

TEST_F(CLyAppControlLauncherTest, FailedSendIsReportedAndForgotten) {
  LogCapture log;
  app_control_h request = nullptr;
  app_control_create(&request);
  app_control_set_app_id(request, "org.example.none");
  CLyAppControlLauncher* launcher = CLyAppControlLauncher::getInstance();
  EXPECT_FALSE(launcher->sendLaunchRequest(request, nullptr, nullptr, nullptr, 1.6));
  EXPECT_TRUE(log.contains("app_control ret error code= "));
  EXPECT_FALSE(launcher->hasCurrentRequest());
  EXPECT_FALSE(launcher->sendLaunchRequest(nullptr, nullptr, nullptr, nullptr, 1.6));
}

TEST_F(CLyAppControlLauncherTest, DestroyClosesTheOpenPicker) {
  Replies replies;
  ASSERT_TRUE(CLyAppControlLauncher::getInstance()->sendLaunchRequest(CLyUtil::createPickImagesRequest(3),
                                                                      onReply, &replies, mWin, 1.6));
  CLyAppControlLauncher::destroy();
  EXPECT_EQ(image_picker_get_window(), nullptr);
  EXPECT_FALSE(evas_object_freeze_events_get(mWin));
  runMainLoop(0.1);
  EXPECT_EQ(replies.count, 0);
}
