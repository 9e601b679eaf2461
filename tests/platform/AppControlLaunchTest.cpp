#include <Elementary.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <fstream>
#include <string>
#include <vector>

#include "PlatformTestImages.h"
#include "platform/app_control.h"
#include "platform/app_control_apps.h"
#include "platform/app_control_launch_private.h"
#include "tests/support/AppControlReplies.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::runMainLoopUntil;
using pictavo::test::TempDir;
using pictavo::test::writeFileBytes;
using pictavo::test::writeTestPng;

namespace {

using Replies = pictavo::test::AppControlReplies;
constexpr auto onReply = &Replies::onReply;

app_control_h pickRequest(const char* launchType, const char* maxCount) {
  app_control_h request = nullptr;
  app_control_create(&request);
  app_control_set_operation(request, APP_CONTROL_OPERATION_PICK);
  app_control_set_app_id(request, APP_CONTROL_PICKER_APP_ID);
  app_control_set_launch_mode(request, APP_CONTROL_LAUNCH_MODE_GROUP);
  app_control_add_extra_data(request, APP_CONTROL_PICKER_LAUNCH_TYPE, launchType);
  app_control_add_extra_data(request, APP_CONTROL_PICKER_FILE_TYPE, "image");
  if (maxCount) app_control_add_extra_data(request, APP_CONTROL_PICKER_MAX_COUNT, maxCount);
  return request;
}

bool pickerClosed() {
  return runMainLoopUntil([] { return image_picker_get_window() == nullptr; }, 3.0);
}

class AppControlLaunchTest : public ::testing::Test {
 protected:
  void SetUp() override {
    pictavo::test::ensureElm();
    mWin = pictavo::test::createTestWindow(480, 800);
    for (int i = 0; i < 3; ++i) {
      mImages.push_back(mDir.file("img" + std::to_string(i) + ".png"));
      ASSERT_TRUE(writeTestPng(mImages.back(), 16, 16));
    }
    setenv("PICTAVO_PICKER_DIR", mDir.path().c_str(), 1);
  }
  void TearDown() override {
    image_picker_cancel();
    pictavo::test::runMainLoop(0.05);
    evas_object_del(mWin);
    unsetenv("PICTAVO_PICKER_DIR");
  }
  TempDir mDir;
  Evas_Object* mWin = nullptr;
  std::vector<std::string> mImages;
};

}  // namespace

TEST_F(AppControlLaunchTest, PickerRepliesWithTheChosenImages) {
  Replies replies;
  app_control_h request = pickRequest("select-multiple", "3");
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  ASSERT_NE(image_picker_get_window(), nullptr);
  Evas_Object* fs = image_picker_get_fileselector();
  ASSERT_NE(fs, nullptr);
  EXPECT_TRUE(elm_fileselector_multi_select_get(fs));
  EXPECT_EQ(std::string(elm_fileselector_path_get(fs)), mDir.path());

  ASSERT_TRUE(image_picker_submit({mImages[0], mImages[2]}));
  EXPECT_EQ(replies.count, 0) << "the reply arrives from the main loop";
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.result, APP_CONTROL_RESULT_SUCCEEDED);
  EXPECT_EQ(replies.selected, (std::vector<std::string>{mImages[0], mImages[2]}));
  // The callback sees the request as it was sent.
  char* op = nullptr;
  ASSERT_NE(replies.request, nullptr);
  app_control_get_operation(replies.request, &op);
  EXPECT_STREQ(op, APP_CONTROL_OPERATION_PICK);
  free(op);
  EXPECT_TRUE(pickerClosed());
  // A finished picker may still be told to close.
  EXPECT_EQ(app_control_send_terminate_request(request), APP_CONTROL_ERROR_NONE);
  app_control_destroy(request);
  pictavo::test::runMainLoop(0.05);
  EXPECT_EQ(replies.count, 1);
}

TEST_F(AppControlLaunchTest, PickerEnforcesMaxCountAndSkipsNonImages) {
  LogCapture log;
  Replies replies;
  app_control_h request = pickRequest("select-multiple", "2");
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  EXPECT_FALSE(image_picker_submit(mImages));
  EXPECT_TRUE(log.contains("(2)"));
  EXPECT_NE(image_picker_get_window(), nullptr) << "a refused choice keeps the picker open";
  ASSERT_TRUE(writeFileBytes(mDir.file("text.png"), "not an image"));
  EXPECT_FALSE(image_picker_submit({mDir.file("text.png")}));
  EXPECT_FALSE(image_picker_submit({mDir.file("gone.png")}));
  ASSERT_TRUE(image_picker_submit({mImages[1], mDir.file("text.png")}));
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.selected, (std::vector<std::string>{mImages[1]}));
  app_control_destroy(request);
}

TEST_F(AppControlLaunchTest, CancelRepliesWithoutData) {
  Replies replies;
  app_control_h request = pickRequest("select-one", nullptr);
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  EXPECT_FALSE(elm_fileselector_multi_select_get(image_picker_get_fileselector()));
  // Single selection: one image at most.
  EXPECT_FALSE(image_picker_submit({mImages[0], mImages[1]}));
  // The file selector's cancel button.
  evas_object_smart_callback_call(image_picker_get_fileselector(), "done", nullptr);
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.result, APP_CONTROL_RESULT_CANCELED);
  EXPECT_FALSE(replies.hadArray);
  EXPECT_TRUE(pickerClosed());
  app_control_destroy(request);
}

TEST_F(AppControlLaunchTest, ActivatingAFileInSingleModeChoosesIt) {
  Replies replies;
  app_control_h request = pickRequest("select-one", nullptr);
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  evas_object_smart_callback_call(image_picker_get_fileselector(), "activated",
                                  const_cast<char*>(mImages[1].c_str()));
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.selected, (std::vector<std::string>{mImages[1]}));
  app_control_destroy(request);
}

TEST_F(AppControlLaunchTest, TerminateClosesThePickerWithoutReply) {
  Replies replies;
  app_control_h request = pickRequest("select-multiple", "6");
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  ASSERT_NE(image_picker_get_window(), nullptr);
  EXPECT_EQ(app_control_send_terminate_request(request), APP_CONTROL_ERROR_NONE);
  EXPECT_TRUE(pickerClosed());
  pictavo::test::runMainLoop(0.1);
  EXPECT_EQ(replies.count, 0);
  EXPECT_FALSE(image_picker_submit({mImages[0]}));
  app_control_destroy(request);
}

TEST_F(AppControlLaunchTest, ClosingThePickerWindowCancels) {
  Replies replies;
  app_control_h request = pickRequest("select-multiple", "6");
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  evas_object_del(image_picker_get_window());
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.result, APP_CONTROL_RESULT_CANCELED);
  app_control_destroy(request);
}

TEST_F(AppControlLaunchTest, UnknownApplicationsAndBadRequestsFail) {
  app_control_h request = nullptr;
  app_control_create(&request);
  app_control_set_operation(request, APP_CONTROL_OPERATION_VIEW);
  app_control_set_app_id(request, "org.example.nothing");
  EXPECT_EQ(app_control_send_launch_request(request, nullptr, nullptr), APP_CONTROL_ERROR_APP_NOT_FOUND);
  // Never sent: nothing to terminate.
  EXPECT_EQ(app_control_send_terminate_request(request), APP_CONTROL_ERROR_INVALID_PARAMETER);
  app_control_destroy(request);
  EXPECT_EQ(app_control_send_launch_request(nullptr, nullptr, nullptr), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_send_terminate_request(nullptr), APP_CONTROL_ERROR_INVALID_PARAMETER);
}

TEST_F(AppControlLaunchTest, ShareHandsTheFileToTheDesktopOpener) {
  std::string marker = mDir.file("opened.txt");
  std::string script = mDir.file("opener.sh");
  ASSERT_TRUE(writeFileBytes(script, "#!/bin/sh\necho \"$1\" > '" + marker + "'\n"));
  chmod(script.c_str(), 0755);
  setenv("PICTAVO_SHARE_COMMAND", script.c_str(), 1);

  Replies replies;
  app_control_h request = nullptr;
  app_control_create(&request);
  app_control_set_operation(request, APP_CONTROL_OPERATION_SHARE);
  app_control_set_uri(request, ("file://" + mImages[0]).c_str());
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  ASSERT_TRUE(runMainLoopUntil(
      [&] {
        std::ifstream in(marker);
        std::string line;
        return std::getline(in, line) && line == mImages[0];
      },
      5.0));
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  EXPECT_EQ(replies.result, APP_CONTROL_RESULT_SUCCEEDED);
  app_control_destroy(request);

  // A file that is not there is not shared.
  app_control_create(&request);
  app_control_set_operation(request, APP_CONTROL_OPERATION_SHARE);
  app_control_set_uri(request, ("file://" + mDir.file("missing.jpg")).c_str());
  EXPECT_NE(app_control_send_launch_request(request, nullptr, nullptr), APP_CONTROL_ERROR_NONE);
  app_control_destroy(request);

  // Without an opener the share is only logged.
  setenv("PICTAVO_SHARE_COMMAND", "no-such-opener-program", 1);
  LogCapture log;
  app_control_create(&request);
  app_control_set_operation(request, APP_CONTROL_OPERATION_SHARE);
  app_control_set_uri(request, ("file://" + mImages[1]).c_str());
  EXPECT_EQ(app_control_send_launch_request(request, nullptr, nullptr), APP_CONTROL_ERROR_NONE);
  EXPECT_TRUE(log.contains("no desktop opener"));
  app_control_destroy(request);
  unsetenv("PICTAVO_SHARE_COMMAND");
}

TEST_F(AppControlLaunchTest, StorageSettingsIsALoggedStandIn) {
  LogCapture log;
  app_control_h request = nullptr;
  app_control_create(&request);
  app_control_set_app_id(request, APP_CONTROL_STORAGE_SETTINGS_APP_ID);
  app_control_add_extra_data(request, APP_CONTROL_SETTINGS_VIEWTYPE, "storage_detail");
  EXPECT_EQ(app_control_send_launch_request(request, nullptr, nullptr), APP_CONTROL_ERROR_NONE);
  EXPECT_TRUE(log.contains("storage settings (viewtype=storage_detail)"));
  EXPECT_EQ(app_control_send_terminate_request(request), APP_CONTROL_ERROR_NONE);
  app_control_destroy(request);
}

TEST_F(AppControlLaunchTest, RepliesToLaunchRequests) {
  // A request from the command line has nobody waiting: the reply is logged.
  app_control_h launch = nullptr;
  app_control_create(&launch);
  app_control_h reply = nullptr;
  app_control_create(&reply);
  EXPECT_EQ(app_control_reply_to_launch_request(reply, launch, APP_CONTROL_RESULT_FAILED),
            APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(app_control_reply_to_launch_request(nullptr, launch, APP_CONTROL_RESULT_FAILED),
            APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_reply_to_launch_request(reply, nullptr, APP_CONTROL_RESULT_FAILED),
            APP_CONTROL_ERROR_INVALID_PARAMETER);
  app_control_destroy(launch);

  // The picker's request is answered once only, also through a clone.
  Replies replies;
  app_control_h request = pickRequest("select-one", nullptr);
  ASSERT_EQ(app_control_send_launch_request(request, onReply, &replies), APP_CONTROL_ERROR_NONE);
  ASSERT_TRUE(image_picker_submit({mImages[0]}));
  ASSERT_TRUE(runMainLoopUntil([&] { return replies.count == 1; }, 3.0));
  app_control_destroy(request);
  app_control_destroy(reply);
}
