#include <gtest/gtest.h>
#include <unistd.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "platform/app_control.h"
#include "platform/app_control_private.h"

namespace {

std::string take(char* text) {
  std::string result = text ? text : "(null)";
  free(text);
  return result;
}

std::vector<std::string> takeArray(char** values, int length) {
  std::vector<std::string> result;
  for (int i = 0; i < length; ++i) result.push_back(take(values[i]));
  free(values);
  return result;
}

struct Request {
  app_control_h h = nullptr;
  Request() { EXPECT_EQ(app_control_create(&h), APP_CONTROL_ERROR_NONE); }
  ~Request() { app_control_destroy(h); }
};

}  // namespace

TEST(AppControlData, FieldsRoundTripAndClear) {
  Request r;
  char* out = nullptr;
  EXPECT_EQ(app_control_get_operation(r.h, &out), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(out, nullptr);
  EXPECT_EQ(app_control_set_operation(r.h, APP_CONTROL_OPERATION_PICK), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(app_control_set_app_id(r.h, "org.example.picker"), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(app_control_set_uri(r.h, "file:///tmp/a.jpg"), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(app_control_set_launch_mode(r.h, APP_CONTROL_LAUNCH_MODE_GROUP), APP_CONTROL_ERROR_NONE);
  app_control_get_operation(r.h, &out);
  EXPECT_EQ(take(out), APP_CONTROL_OPERATION_PICK);
  app_control_get_app_id(r.h, &out);
  EXPECT_EQ(take(out), "org.example.picker");
  app_control_get_uri(r.h, &out);
  EXPECT_EQ(take(out), "file:///tmp/a.jpg");
  app_control_launch_mode_e mode;
  app_control_get_launch_mode(r.h, &mode);
  EXPECT_EQ(mode, APP_CONTROL_LAUNCH_MODE_GROUP);
  EXPECT_EQ(app_control_set_uri(r.h, nullptr), APP_CONTROL_ERROR_NONE);
  app_control_get_uri(r.h, &out);
  EXPECT_EQ(out, nullptr);
  // A request made here has no caller.
  app_control_get_caller(r.h, &out);
  EXPECT_EQ(out, nullptr);
}

TEST(AppControlData, ExtrasKeepTypesNullEntriesAndShortKeys) {
  Request r;
  const char* paths[] = {"/a.jpg", nullptr, "/c.png"};
  ASSERT_EQ(app_control_add_extra_data_array(r.h, APP_CONTROL_DATA_SELECTED, paths, 3),
            APP_CONTROL_ERROR_NONE);
  ASSERT_EQ(app_control_add_extra_data(r.h, "max-count", "6"), APP_CONTROL_ERROR_NONE);

  char** values = nullptr;
  int length = 0;
  // The short form names the same entry.
  ASSERT_EQ(app_control_get_extra_data_array(r.h, "appcontrol/data/selected", &values, &length),
            APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(takeArray(values, length), (std::vector<std::string>{"/a.jpg", "(null)", "/c.png"}));

  char* single = nullptr;
  EXPECT_EQ(app_control_get_extra_data(r.h, APP_CONTROL_DATA_SELECTED, &single),
            APP_CONTROL_ERROR_INVALID_DATA_TYPE);
  EXPECT_EQ(app_control_get_extra_data_array(r.h, "max-count", &values, &length),
            APP_CONTROL_ERROR_INVALID_DATA_TYPE);
  EXPECT_EQ(app_control_get_extra_data(r.h, "max-count", &single), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(take(single), "6");
  bool isArray = false;
  app_control_is_extra_data_array(r.h, "appcontrol/data/selected", &isArray);
  EXPECT_TRUE(isArray);

  // Replacing changes the type; removing twice reports the missing key.
  ASSERT_EQ(app_control_add_extra_data(r.h, APP_CONTROL_DATA_SELECTED, "/only.jpg"), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(app_control_get_extra_data(r.h, APP_CONTROL_DATA_SELECTED, &single), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(take(single), "/only.jpg");
  EXPECT_EQ(app_control_remove_extra_data(r.h, "max-count"), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(app_control_remove_extra_data(r.h, "max-count"), APP_CONTROL_ERROR_KEY_NOT_FOUND);
  EXPECT_EQ(app_control_get_extra_data(r.h, "max-count", &single), APP_CONTROL_ERROR_KEY_NOT_FOUND);

  // An empty array is still an array.
  ASSERT_EQ(app_control_add_extra_data_array(r.h, "empty", paths, 0), APP_CONTROL_ERROR_NONE);
  ASSERT_EQ(app_control_get_extra_data_array(r.h, "empty", &values, &length), APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(length, 0);
  free(values);

  std::vector<std::string> keys;
  app_control_foreach_extra_data(
      r.h,
      [](app_control_h, const char* key, void* data) {
        static_cast<std::vector<std::string>*>(data)->push_back(key);
        return true;
      },
      &keys);
  EXPECT_EQ(keys.size(), 2u);
}

TEST(AppControlData, BadArgumentsAreRefused) {
  Request r;
  char* out = nullptr;
  char** values = nullptr;
  int length = 0;
  const char* one[] = {"x"};
  EXPECT_EQ(app_control_create(nullptr), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_destroy(nullptr), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_set_operation(nullptr, "x"), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_get_operation(r.h, nullptr), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_add_extra_data(r.h, nullptr, "v"), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_add_extra_data(r.h, "", "v"), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_add_extra_data(r.h, "k", nullptr), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_add_extra_data(r.h, "__reserved", "v"), APP_CONTROL_ERROR_KEY_REJECTED);
  EXPECT_EQ(app_control_add_extra_data_array(r.h, "k", nullptr, 2), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_add_extra_data_array(r.h, "k", one, -1), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_get_extra_data_array(r.h, "k", &values, nullptr),
            APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_get_extra_data_array(r.h, "k", &values, &length), APP_CONTROL_ERROR_KEY_NOT_FOUND);
  EXPECT_EQ(app_control_get_extra_data(nullptr, "k", &out), APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_set_launch_mode(r.h, static_cast<app_control_launch_mode_e>(7)),
            APP_CONTROL_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(app_control_clone(nullptr, r.h), APP_CONTROL_ERROR_INVALID_PARAMETER);
}

TEST(AppControlData, CloneIsIndependent) {
  Request r;
  const char* paths[] = {"/a.jpg", "/b.jpg"};
  app_control_add_extra_data_array(r.h, APP_CONTROL_DATA_SELECTED, paths, 2);
  app_control_set_operation(r.h, APP_CONTROL_OPERATION_VIEW);
  app_control_h copy = nullptr;
  ASSERT_EQ(app_control_clone(&copy, r.h), APP_CONTROL_ERROR_NONE);
  app_control_remove_extra_data(r.h, APP_CONTROL_DATA_SELECTED);
  app_control_set_operation(r.h, nullptr);
  char** values = nullptr;
  int length = 0;
  ASSERT_EQ(app_control_get_extra_data_array(copy, APP_CONTROL_DATA_SELECTED, &values, &length),
            APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(takeArray(values, length), (std::vector<std::string>{"/a.jpg", "/b.jpg"}));
  char* op = nullptr;
  app_control_get_operation(copy, &op);
  EXPECT_EQ(take(op), APP_CONTROL_OPERATION_VIEW);
  app_control_destroy(copy);
}

TEST(AppControlData, LaunchRequestFromTheCommandLine) {
  char cwd[4096];
  ASSERT_NE(getcwd(cwd, sizeof cwd), nullptr);
  std::vector<std::string> args = {"pictavo", "--engine=x", "./rel.jpg", "/abs/b.png",
                                   "-v",      "--",         "-odd.jpg",  ""};
  std::vector<char*> argv;
  for (auto& a : args) argv.push_back(a.data());
  argv.push_back(nullptr);
  app_control_h request = app_control_create_launch_request(static_cast<int>(args.size()), argv.data());
  ASSERT_NE(request, nullptr);
  char** values = nullptr;
  int length = 0;
  ASSERT_EQ(app_control_get_extra_data_array(request, APP_CONTROL_DATA_SELECTED, &values, &length),
            APP_CONTROL_ERROR_NONE);
  EXPECT_EQ(takeArray(values, length), (std::vector<std::string>{std::string(cwd) + "/rel.jpg", "/abs/b.png",
                                                                 std::string(cwd) + "/-odd.jpg"}));
  char* caller = nullptr;
  app_control_get_caller(request, &caller);
  EXPECT_EQ(take(caller), APP_CONTROL_GALLERY_APP_ID);
  app_control_destroy(request);

  // No paths: the home screen, without caller or array.
  char arg0[] = "pictavo";
  char* bare[] = {arg0, nullptr};
  request = app_control_create_launch_request(1, bare);
  ASSERT_NE(request, nullptr);
  app_control_get_caller(request, &caller);
  EXPECT_EQ(caller, nullptr);
  EXPECT_EQ(app_control_get_extra_data_array(request, APP_CONTROL_DATA_SELECTED, &values, &length),
            APP_CONTROL_ERROR_KEY_NOT_FOUND);
  app_control_destroy(request);
  request = app_control_create_launch_request(0, nullptr);
  ASSERT_NE(request, nullptr);
  app_control_destroy(request);
}
