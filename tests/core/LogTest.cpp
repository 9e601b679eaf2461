#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>

#include "common/CLyLog.h"
#include "platform/core/app_common.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

TEST(Log, LinesCarrySourceFunctionLineAndCriticalPrefix) {
  LogCapture capture;
  LYLOG_E("boom %d", 7);
  LYLOG_W("trace");
  auto lines = capture.lines();
  ASSERT_EQ(lines.size(), 2u);
  EXPECT_EQ(lines[0].rfind("LogTest.cpp: TestBody(", 0), 0u) << lines[0];
  EXPECT_NE(lines[0].find(") > * Critical * boom 7"), std::string::npos) << lines[0];
  EXPECT_NE(lines[1].find(") > trace"), std::string::npos) << lines[1];
  EXPECT_EQ(lines[1].find("Critical"), std::string::npos);
}

TEST(Log, PriorityFilterAndBadArguments) {
  log_priority saved = dlog_get_min_priority();
  dlog_set_min_priority(DLOG_SILENT);
  EXPECT_EQ(dlog_print(DLOG_ERROR, "PICTAVO", "%s", "hidden"), DLOG_ERROR_NONE);
  dlog_set_min_priority(DLOG_VERBOSE);
  EXPECT_EQ(dlog_print(DLOG_ERROR, "PICTAVO", "%s", "shown"), 5);
  EXPECT_EQ(dlog_print(DLOG_ERROR, nullptr, "x"), DLOG_ERROR_INVALID_PARAMETER);
  dlog_set_min_priority(saved);
}

TEST(Log, AssertLogsConditionThenStops) {
  LogCapture capture;
  int value = 3;
  EXPECT_THROW(WASSERT(value == 4), pictavo::test::AssertionFired);
  EXPECT_TRUE(capture.contains("* Critical * WASSERT! value == 4"));
  EXPECT_THROW(WASSERT_MSG(value == 5, "Failed to create %s", "thing"), pictavo::test::AssertionFired);
  EXPECT_TRUE(capture.contains("WASSERT! Failed to create thing"));
  EXPECT_NO_THROW(WASSERT(value == 3));
}

TEST(Log, AssertStopsTheProgramWithoutAHandler) {
  EXPECT_DEATH(
      {
        pictavo::setAssertHandler(nullptr);
        WASSERT(1 == 2);
      },
      "");
}

TEST(ResourcePath, EnvironmentOverridesAndEndsWithSlash) {
  pictavo::test::TempDir dir;
  const char* saved = getenv("PICTAVO_RES_DIR");
  std::string savedCopy = saved ? saved : "";
  setenv("PICTAVO_RES_DIR", dir.path().c_str(), 1);
  char* path = app_get_resource_path();
  ASSERT_NE(path, nullptr);
  EXPECT_EQ(std::string(path), dir.path() + "/");
  free(path);
  setenv("PICTAVO_RES_DIR", (dir.path() + "/missing").c_str(), 1);
  EXPECT_EQ(app_get_resource_path(), nullptr);
  if (saved)
    setenv("PICTAVO_RES_DIR", savedCopy.c_str(), 1);
  else
    unsetenv("PICTAVO_RES_DIR");
}
