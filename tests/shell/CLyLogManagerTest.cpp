#include "misc/CLyLogManager.h"

#include <gtest/gtest.h>

#include <string>

#include "ShellTestFiles.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::ScopedEnv;
using pictavo::test::TempDir;

namespace {

class CLyLogManagerTest : public ::testing::Test {
 protected:
  void SetUp() override { CLyLogManager::destroyInstance(); }
  void TearDown() override { CLyLogManager::destroyInstance(); }
  TempDir mDir;
};

}  // namespace

TEST_F(CLyLogManagerTest, RecordsReadBackWithAndWithoutExtra) {
  ScopedEnv db("PICTAVO_USAGE_LOG_DB", mDir.file("usage.db").c_str());
  LogCapture log;
  CLyLogManager* manager = CLyLogManager::getInstance();
  EXPECT_TRUE(log.contains("log handle created"));
  EXPECT_TRUE(manager->insertLog(LY_LOG_FEATURE_COLLAGE, "4-2", nullptr));
  EXPECT_TRUE(manager->insertLog(LY_LOG_FEATURE_REPLACE_OR_EFFECT, LY_LOG_EXTRA_EFFECT, nullptr));
  EXPECT_TRUE(manager->insertLog("PLAIN", nullptr, nullptr));

  brelmo_log_record_s* records = nullptr;
  size_t count = 0;
  ASSERT_EQ(brelmo_log_list(&records, &count), BRELMO_LOG_ERROR_NONE);
  ASSERT_EQ(count, 3u);
  EXPECT_STREQ(records[0].app_id, "com.brelmo.pictavo");
  EXPECT_STREQ(records[0].feature, "CLAY");
  EXPECT_STREQ(records[0].extra, "4-2");
  EXPECT_EQ(records[0].value, nullptr);
  EXPECT_STREQ(records[0].uri, LY_LOG_URI);
  EXPECT_STREQ(records[1].extra, "EFFE");
  // Without extra text the record carries only the application and feature.
  EXPECT_STREQ(records[2].feature, "PLAIN");
  EXPECT_EQ(records[2].extra, nullptr);
  EXPECT_EQ(records[2].value, nullptr);
  brelmo_log_free_records(records, count);

  CLyLogManager::destroyInstance();
  EXPECT_TRUE(log.contains("log handle destroyed"));
}

TEST_F(CLyLogManagerTest, MissingFeatureIsRefused) {
  ScopedEnv db("PICTAVO_USAGE_LOG_DB", mDir.file("usage.db").c_str());
  LogCapture log;
  EXPECT_FALSE(CLyLogManager::getInstance()->insertLog(nullptr, "x", nullptr));
  EXPECT_TRUE(log.contains("feature is nullptr"));
}

TEST_F(CLyLogManagerTest, FailedCreationMakesEveryInsertFail) {
  ScopedEnv db("PICTAVO_USAGE_LOG_DB", mDir.file("missing/folder/usage.db").c_str());
  LogCapture log;
  CLyLogManager* manager = CLyLogManager::getInstance();
  EXPECT_TRUE(log.contains("brelmo_log_manager_create failed! [0x"));
  log.clear();
  EXPECT_FALSE(manager->insertLog(LY_LOG_FEATURE_COLLAGE, "2-0", nullptr));
  EXPECT_TRUE(log.contains("LogManager is nullptr"));
  EXPECT_FALSE(log.contains("bundle_create"));
  EXPECT_FALSE(log.contains("insert failed"));
  CLyLogManager::destroyInstance();
  EXPECT_TRUE(log.contains("log handle is nullptr!"));
}
