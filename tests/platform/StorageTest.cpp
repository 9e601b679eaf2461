#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cstdlib>
#include <string>

#include "platform/storage.h"
#include "tests/support/TestSupport.h"

using pictavo::test::TempDir;

namespace {

// Sets an environment variable for one test and restores it afterwards.
class ScopedEnv {
 public:
  ScopedEnv(const char* name, const char* value) : mName(name) {
    if (const char* old = getenv(name)) mOld = old, mHad = true;
    if (value)
      setenv(name, value, 1);
    else
      unsetenv(name);
  }
  ~ScopedEnv() {
    if (mHad)
      setenv(mName.c_str(), mOld.c_str(), 1);
    else
      unsetenv(mName.c_str());
  }

 private:
  std::string mName, mOld;
  bool mHad = false;
};

std::string take(char* s) {
  std::string result = s ? s : "";
  free(s);
  return result;
}

}  // namespace

TEST(StorageTest, InternalStorageIsThePicturesFolder) {
  TempDir dir;
  ScopedEnv root("PICTAVO_STORAGE_ROOT", nullptr);
  ScopedEnv pictures("XDG_PICTURES_DIR", (dir.path() + "/Pictures/").c_str());
  EXPECT_EQ(take(storage_get_internal_root()), dir.path() + "/Pictures");
  EXPECT_EQ(take(storage_map_device_path("/opt/usr/media/DCIM/Collage/a.jpg")),
            dir.path() + "/Pictures/DCIM/Collage/a.jpg");
  // Only whole path components match a root.
  EXPECT_EQ(take(storage_map_device_path("/opt/usr/mediax/a.jpg")), "/opt/usr/mediax/a.jpg");
  EXPECT_EQ(take(storage_map_device_path("/tmp/other.jpg")), "/tmp/other.jpg");
  EXPECT_EQ(storage_map_device_path(nullptr), nullptr);

  // The pictures folder need not exist yet: its nearest parent answers.
  struct statvfs info = {};
  EXPECT_EQ(storage_get_internal_memory_size(&info), STORAGE_ERROR_NONE);
  EXPECT_GT(info.f_blocks, 0u);
  EXPECT_EQ(storage_get_internal_memory_size(nullptr), STORAGE_ERROR_INVALID_PARAMETER);
}

TEST(StorageTest, NoSdCardUnlessNamed) {
  ScopedEnv root("PICTAVO_STORAGE_ROOT", nullptr);
  ScopedEnv sd("PICTAVO_SDCARD_DIR", nullptr);
  struct statvfs info = {};
  EXPECT_NE(storage_get_external_memory_size(&info), STORAGE_ERROR_NONE);
  EXPECT_EQ(storage_get_external_root(), nullptr);
  EXPECT_EQ(storage_map_device_path("/opt/storage/sdcard/DCIM/Collage/x.jpg"), nullptr);

  TempDir card;
  ScopedEnv named("PICTAVO_SDCARD_DIR", card.path().c_str());
  EXPECT_EQ(storage_get_external_memory_size(&info), STORAGE_ERROR_NONE);
  EXPECT_EQ(take(storage_map_device_path("/opt/storage/sdcard/DCIM")), card.path() + "/DCIM");

  // A named folder that is not there is a card that was taken out.
  ScopedEnv gone("PICTAVO_SDCARD_DIR", (card.path() + "/missing").c_str());
  EXPECT_NE(storage_get_external_memory_size(&info), STORAGE_ERROR_NONE);
}

TEST(StorageTest, OneVariableMovesBothStorages) {
  TempDir dir;
  ScopedEnv root("PICTAVO_STORAGE_ROOT", dir.path().c_str());
  EXPECT_EQ(take(storage_get_internal_root()), dir.path() + "/internal");
  struct statvfs info = {};
  EXPECT_NE(storage_get_external_memory_size(&info), STORAGE_ERROR_NONE);
  ASSERT_EQ(mkdir((dir.path() + "/sdcard").c_str(), 0755), 0);
  EXPECT_EQ(storage_get_external_memory_size(&info), STORAGE_ERROR_NONE);
  EXPECT_EQ(take(storage_map_device_path("/opt/storage/sdcard/DCIM/Collage")),
            dir.path() + "/sdcard/DCIM/Collage");
}
