#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <vector>

#include "platform/brelmo_log.h"
#include "platform/bundle.h"
#include "tests/support/TestSupport.h"

using pictavo::test::TempDir;

namespace {

const char* kUri = "content://com.brelmo.logprovider/log/use_app_feature_survey";

class UsageLogStoreTest : public ::testing::Test {
 protected:
  void SetUp() override { setenv("PICTAVO_USAGE_LOG_DB", mDir.file("usage.db").c_str(), 1); }
  void TearDown() override { unsetenv("PICTAVO_USAGE_LOG_DB"); }
  TempDir mDir;
};

void collect(const char* key, const char* value, void* data) {
  static_cast<std::vector<std::string>*>(data)->push_back(std::string(key) + "=" + value);
}

}  // namespace

TEST(BundleTest, KeepsPairsInOrderAndRefusesDuplicates) {
  bundle* b = bundle_create();
  ASSERT_NE(b, nullptr);
  EXPECT_EQ(bundle_add_str(b, "app_id", "x"), BUNDLE_ERROR_NONE);
  EXPECT_EQ(bundle_add_str(b, "feature", "CLAY"), BUNDLE_ERROR_NONE);
  EXPECT_EQ(bundle_add_str(b, "feature", "RPEF"), BUNDLE_ERROR_KEY_EXISTS);
  EXPECT_EQ(bundle_add_str(b, nullptr, "v"), BUNDLE_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(bundle_add_str(b, "k", nullptr), BUNDLE_ERROR_INVALID_PARAMETER);
  char* value = nullptr;
  EXPECT_EQ(bundle_get_str(b, "feature", &value), BUNDLE_ERROR_NONE);
  EXPECT_STREQ(value, "CLAY");
  EXPECT_EQ(bundle_get_str(b, "extra", &value), BUNDLE_ERROR_KEY_NOT_AVAILABLE);
  EXPECT_EQ(value, nullptr);
  std::vector<std::string> pairs;
  bundle_foreach_str(b, collect, &pairs);
  EXPECT_EQ(pairs, (std::vector<std::string>{"app_id=x", "feature=CLAY"}));
  EXPECT_EQ(bundle_get_count(b), 2);
  EXPECT_EQ(bundle_free(b), BUNDLE_ERROR_NONE);
  EXPECT_EQ(bundle_free(nullptr), BUNDLE_ERROR_INVALID_PARAMETER);
}

TEST_F(UsageLogStoreTest, InsertedRecordsReadBack) {
  brelmo_log_manager_h handle = nullptr;
  ASSERT_EQ(brelmo_log_manager_create(&handle), BRELMO_LOG_ERROR_NONE);
  bundle* b = bundle_create();
  bundle_add_str(b, "app_id", "com.brelmo.pictavo");
  bundle_add_str(b, "feature", "CLAY");
  bundle_add_str(b, "extra", "3-1");
  int called = -1;
  auto cb = [](int result, void* data) { *static_cast<int*>(data) = result; };
  EXPECT_EQ(brelmo_log_manager_insert(handle, kUri, b, cb, &called), BRELMO_LOG_ERROR_NONE);
  EXPECT_EQ(called, BRELMO_LOG_ERROR_NONE);
  bundle_free(b);

  b = bundle_create();
  bundle_add_str(b, "app_id", "com.brelmo.pictavo");
  bundle_add_str(b, "feature", "RPEF");
  bundle_add_str(b, "value", "7");
  EXPECT_EQ(brelmo_log_manager_insert(handle, kUri, b, nullptr, nullptr), BRELMO_LOG_ERROR_NONE);
  bundle_free(b);
  EXPECT_EQ(brelmo_log_manager_destroy(handle), BRELMO_LOG_ERROR_NONE);

  brelmo_log_record_s* records = nullptr;
  size_t count = 0;
  ASSERT_EQ(brelmo_log_list(&records, &count), BRELMO_LOG_ERROR_NONE);
  ASSERT_EQ(count, 2u);
  EXPECT_STREQ(records[0].uri, kUri);
  EXPECT_STREQ(records[0].app_id, "com.brelmo.pictavo");
  EXPECT_STREQ(records[0].feature, "CLAY");
  EXPECT_STREQ(records[0].extra, "3-1");
  EXPECT_EQ(records[0].value, nullptr);
  EXPECT_GT(records[0].time, 0);
  EXPECT_STREQ(records[1].feature, "RPEF");
  EXPECT_EQ(records[1].extra, nullptr);
  EXPECT_STREQ(records[1].value, "7");
  EXPECT_LT(records[0].id, records[1].id);
  brelmo_log_free_records(records, count);
}

TEST_F(UsageLogStoreTest, IncompleteRecordsAreRefused) {
  brelmo_log_manager_h handle = nullptr;
  ASSERT_EQ(brelmo_log_manager_create(&handle), BRELMO_LOG_ERROR_NONE);
  bundle* b = bundle_create();
  bundle_add_str(b, "app_id", "com.brelmo.pictavo");
  // No feature.
  EXPECT_EQ(brelmo_log_manager_insert(handle, kUri, b, nullptr, nullptr), BRELMO_LOG_ERROR_INVALID_PARAMETER);
  bundle_add_str(b, "feature", "CLAY");
  EXPECT_EQ(brelmo_log_manager_insert(handle, "http://example.com/log", b, nullptr, nullptr),
            BRELMO_LOG_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(brelmo_log_manager_insert(handle, nullptr, b, nullptr, nullptr),
            BRELMO_LOG_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(brelmo_log_manager_insert(nullptr, kUri, b, nullptr, nullptr),
            BRELMO_LOG_ERROR_INVALID_PARAMETER);
  EXPECT_EQ(brelmo_log_manager_insert(handle, kUri, nullptr, nullptr, nullptr),
            BRELMO_LOG_ERROR_INVALID_PARAMETER);
  bundle_free(b);
  brelmo_log_manager_destroy(handle);

  brelmo_log_record_s* records = nullptr;
  size_t count = 0;
  ASSERT_EQ(brelmo_log_list(&records, &count), BRELMO_LOG_ERROR_NONE);
  EXPECT_EQ(count, 0u);
  EXPECT_EQ(brelmo_log_manager_create(nullptr), BRELMO_LOG_ERROR_INVALID_PARAMETER);
}

TEST_F(UsageLogStoreTest, UnwritableStoreFailsCreation) {
  setenv("PICTAVO_USAGE_LOG_DB", mDir.file("no/such/folder/usage.db").c_str(), 1);
  brelmo_log_manager_h handle = nullptr;
  EXPECT_NE(brelmo_log_manager_create(&handle), BRELMO_LOG_ERROR_NONE);
  EXPECT_EQ(handle, nullptr);
}
