#include "common/CLyUtil.h"

#include <dirent.h>
#include <gtest/gtest.h>
#include <sys/stat.h>

#include <cctype>
#include <climits>
#include <cstdlib>
#include <ctime>
#include <fstream>
#include <iterator>
#include <random>
#include <string>

#include "ShellTestFiles.h"
#include "platform/app_control_apps.h"
#include "platform/feedback.h"
#include "platform/media_content.h"
#include "platform/notification.h"
#include "tests/support/TestSupport.h"

using pictavo::test::ExifPlace;
using pictavo::test::LogCapture;
using pictavo::test::ScopedEnv;
using pictavo::test::TempDir;
using pictavo::test::writeJpeg;

namespace {

struct statvfs space(unsigned long fragment, fsblkcnt_t available) {
  struct statvfs info = {};
  info.f_frsize = fragment;
  info.f_bsize = fragment;
  info.f_bavail = available;
  return info;
}

std::string extra(app_control_h request, const char* key) {
  char* value = nullptr;
  if (app_control_get_extra_data(request, key, &value) != APP_CONTROL_ERROR_NONE) return "<none>";
  std::string result = value ? value : "";
  free(value);
  return result;
}

std::string field(int (*get)(app_control_h, char**), app_control_h request) {
  char* value = nullptr;
  get(request, &value);
  std::string result = value ? value : "<none>";
  free(value);
  return result;
}

size_t entries(const std::string& dir) {
  DIR* d = opendir(dir.c_str());
  if (!d) return 0;
  size_t n = 0;
  while (readdir(d)) ++n;
  closedir(d);
  return n;
}

// "2015-03-07 14.05.09": digits where the pattern has '9', the rest as given.
// (std::regex trips a false GCC warning under the address sanitizer.)
bool isTimeStamp(const std::string& text) {
  static const std::string pattern = "9999-99-99 99.99.99";
  if (text.size() != pattern.size()) return false;
  for (size_t i = 0; i < text.size(); ++i) {
    if (pattern[i] == '9' ? !isdigit(static_cast<unsigned char>(text[i])) : text[i] != pattern[i])
      return false;
  }
  return true;
}

bool touch(const std::string& path) {
  std::ofstream out(path);
  out << "x";
  return static_cast<bool>(out);
}

}  // namespace

TEST(CLyUtilStorageTest, LowStorageThresholdIsExact) {
  LogCapture log;
  EXPECT_FALSE(CLyUtil::isStorageLow(0, space(1, 1243904)));
  EXPECT_TRUE(CLyUtil::isStorageLow(0, space(1, 1243903)));
  EXPECT_TRUE(log.contains("Memory is almost full < 1MB"));
  // The same amount counted in 4 KiB blocks: 304 blocks are enough, 303 not.
  EXPECT_FALSE(CLyUtil::isStorageLow(0, space(4096, 304)));
  EXPECT_TRUE(CLyUtil::isStorageLow(0, space(4096, 303)));
  EXPECT_TRUE(CLyUtil::isStorageLow(0, space(4096, 0)));
}

TEST(CLyUtilStorageTest, LargeStoragesDoNotOverflow) {
  // 5 GiB free: more than a 32-bit byte count holds.
  EXPECT_FALSE(CLyUtil::isStorageLow(0, space(4096, (5ULL << 30) / 4096)));
  EXPECT_FALSE(CLyUtil::isStorageLow(0, space(1, 5ULL << 30)));
  // A product beyond 64 bits must not wrap round to a small number.
  EXPECT_FALSE(CLyUtil::isStorageLow(0, space(1UL << 20, static_cast<fsblkcnt_t>(-1))));
  // File systems that leave the fragment size at 0 count in blocks.
  struct statvfs info = space(0, 400);
  info.f_bsize = 4096;
  EXPECT_FALSE(CLyUtil::isStorageLow(0, info));
}

TEST(CLyUtilStorageTest, UnreadableStorageIsLow) {
  LogCapture log;
  EXPECT_TRUE(CLyUtil::isStorageLow(-1, space(4096, 1ULL << 30)));
  EXPECT_TRUE(log.contains("fail to get memory size"));
  EXPECT_TRUE(CLyUtil::isStorageLow(0, space(0, 1ULL << 30)));
}

TEST(CLyUtilStorageTest, DesktopStoragesAnswer) {
  TempDir dir;
  ScopedEnv root("PICTAVO_STORAGE_ROOT", dir.path().c_str());
  EXPECT_FALSE(CLyUtil::isInternalMemoryLow());
  // No SD card counts as low.
  EXPECT_TRUE(CLyUtil::isExternalMemoryLow());
  ASSERT_EQ(mkdir(dir.file("sdcard").c_str(), 0755), 0);
  EXPECT_FALSE(CLyUtil::isExternalMemoryLow());
}

TEST(CLyUtilFileTest, MakeDirOnExistingFolderCreatesNothing) {
  TempDir dir;
  size_t before = entries(dir.path());
  EXPECT_TRUE(CLyUtil::makeDir(dir.path().c_str()));
  EXPECT_EQ(entries(dir.path()), before);
  EXPECT_TRUE(CLyUtil::makeDir(dir.file("a/b/c").c_str()));
  struct stat st;
  EXPECT_EQ(stat(dir.file("a/b/c").c_str(), &st), 0);
  EXPECT_TRUE(S_ISDIR(st.st_mode));
  LogCapture log;
  EXPECT_FALSE(CLyUtil::makeDir(nullptr));
  EXPECT_TRUE(log.contains("Invalid input path"));
  // A file in the way of the path.
  ASSERT_TRUE(touch(dir.file("file")));
  EXPECT_FALSE(CLyUtil::makeDir(dir.file("file/sub").c_str()));
}

TEST(CLyUtilFileTest, FileNameIsTheLocalTime) {
  std::string name;
  time_t before = time(nullptr);
  CLyUtil::getFileName(name);
  ASSERT_TRUE(isTimeStamp(name)) << name;
  struct tm parsed = {};
  ASSERT_NE(strptime(name.c_str(), "%Y-%m-%d %H.%M.%S", &parsed), nullptr);
  parsed.tm_isdst = -1;
  time_t stamp = mktime(&parsed);
  EXPECT_LE(before, stamp);
  EXPECT_LE(stamp - before, 2);
}

TEST(CLyUtilFileTest, SavePathLiesInTheAlbumOfTheMappedStorage) {
  TempDir dir;
  ScopedEnv root("PICTAVO_STORAGE_ROOT", dir.path().c_str());
  std::string path;
  ASSERT_EQ(CLyUtil::chooseSavePath(path), CLyUtil::SaveLocation::INTERNAL);
  std::string album = dir.path() + "/internal/DCIM/Collage/";
  EXPECT_EQ(path.compare(0, album.size(), album), 0) << path;
  std::string name = path.substr(album.size());
  EXPECT_TRUE(name.size() > 4 && name.substr(name.size() - 4) == ".jpg" &&
              isTimeStamp(name.substr(0, name.size() - 4)))
      << path;
  struct stat st;
  EXPECT_EQ(stat(album.c_str(), &st), 0) << "the album folder is made";

  // The SD card is not there: nothing to save to there.
  EXPECT_FALSE(CLyUtil::makeSavePath(LY_EXTERNAL_STORAGE_ROOT, path));
  ASSERT_EQ(mkdir(dir.file("sdcard").c_str(), 0755), 0);
  ASSERT_TRUE(CLyUtil::makeSavePath(LY_EXTERNAL_STORAGE_ROOT, path));
  EXPECT_EQ(
      path.compare(0, (dir.path() + "/sdcard/DCIM/Collage/").size(), dir.path() + "/sdcard/DCIM/Collage/"),
      0);
}

TEST(CLyUtilFileTest, SecondSaveInTheSameSecondGetsItsOwnName) {
  TempDir dir;
  ScopedEnv root("PICTAVO_STORAGE_ROOT", dir.path().c_str());
  // Retried when the clock crosses a second between the calls.
  for (int attempt = 0; attempt < 5; ++attempt) {
    std::string first, second, third;
    ASSERT_TRUE(CLyUtil::makeSavePath(LY_INTERNAL_STORAGE_ROOT, first));
    ASSERT_TRUE(touch(first));
    ASSERT_TRUE(CLyUtil::makeSavePath(LY_INTERNAL_STORAGE_ROOT, second));
    ASSERT_TRUE(touch(second));
    ASSERT_TRUE(CLyUtil::makeSavePath(LY_INTERNAL_STORAGE_ROOT, third));
    std::string stem = first.substr(0, first.size() - 4);
    if (second.compare(0, stem.size(), stem) != 0 || third.compare(0, stem.size(), stem) != 0) continue;
    EXPECT_EQ(second, stem + " (2).jpg");
    EXPECT_EQ(third, stem + " (3).jpg");
    return;
  }
  FAIL() << "the clock never stayed within one second";
}

TEST(CLyUtilMediaTest, ScannedFileIsInTheDatabase) {
  TempDir dir;
  ScopedEnv db("PICTAVO_MEDIA_DB", dir.file("media.db").c_str());
  ScopedEnv root("PICTAVO_STORAGE_ROOT", dir.path().c_str());
  std::string jpeg = dir.file("photo.jpg");
  ASSERT_TRUE(writeJpeg(jpeg));
  EXPECT_TRUE(CLyUtil::mediaContentScanFile(jpeg.c_str()));

  media_info_s* rows = nullptr;
  size_t count = 0;
  ASSERT_EQ(media_content_list(jpeg.c_str(), &rows, &count), MEDIA_CONTENT_ERROR_NONE);
  ASSERT_EQ(count, 1u);
  EXPECT_STREQ(rows[0].mime_type, "image/jpeg");
  EXPECT_EQ(rows[0].width, 8);
  EXPECT_EQ(rows[0].height, 6);
  media_content_free_rows(rows, count);

  // A device path is recorded under the desktop folder standing for it.
  ASSERT_EQ(mkdir(dir.file("internal").c_str(), 0755), 0);
  ASSERT_TRUE(writeJpeg(dir.file("internal/x.jpg")));
  EXPECT_TRUE(CLyUtil::mediaContentScanFile(LY_INTERNAL_STORAGE_ROOT "/x.jpg"));
  ASSERT_EQ(media_content_list(dir.file("internal/x.jpg").c_str(), &rows, &count), MEDIA_CONTENT_ERROR_NONE);
  EXPECT_EQ(count, 1u);
  media_content_free_rows(rows, count);
}

TEST(CLyUtilMediaTest, ScanFailuresReportFalse) {
  TempDir dir;
  ScopedEnv db("PICTAVO_MEDIA_DB", dir.file("media.db").c_str());
  LogCapture log;
  EXPECT_FALSE(CLyUtil::mediaContentScanFile(dir.file("missing.jpg").c_str()));
  EXPECT_TRUE(log.contains("Fail to scan file into DB"));
  // The database was left cleanly: no disconnect failure.
  EXPECT_FALSE(log.contains("Fail to disconnect DB"));
  EXPECT_FALSE(CLyUtil::mediaContentScanFile(nullptr));
  EXPECT_TRUE(log.contains("Invalid input path"));
  // No database can be opened there.
  ScopedEnv broken("PICTAVO_MEDIA_DB", dir.file("no/such/dir/media.db").c_str());
  ASSERT_TRUE(writeJpeg(dir.file("ok.jpg")));
  EXPECT_FALSE(CLyUtil::mediaContentScanFile(dir.file("ok.jpg").c_str()));
  EXPECT_TRUE(log.contains("Fail to connect DB"));
}

TEST(CLyUtilOrientationTest, ReadsTheOrientationTag) {
  TempDir dir;
  ASSERT_TRUE(writeJpeg(dir.file("ifd0.jpg"), ExifPlace::IFD0, 6));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("ifd0.jpg")), 6);
  ASSERT_TRUE(writeJpeg(dir.file("motorola.jpg"), ExifPlace::IFD0, 3, true));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("motorola.jpg")), 3);
  ASSERT_TRUE(writeJpeg(dir.file("ifd1.jpg"), ExifPlace::IFD1_ONLY, 8));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("ifd1.jpg")), 8);
  // Values outside 1..8 are passed on as they are.
  ASSERT_TRUE(writeJpeg(dir.file("odd.jpg"), ExifPlace::IFD0, 42));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("odd.jpg")), 42);
}

TEST(CLyUtilOrientationTest, MissingOrBrokenExifGivesMinusOne) {
  TempDir dir;
  LogCapture log;
  EXPECT_EQ(CLyUtil::getOrientation(""), -1);
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("missing.jpg")), -1);
  EXPECT_TRUE(log.contains("exif_data_new failed"));
  ASSERT_TRUE(writeJpeg(dir.file("plain.jpg")));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("plain.jpg")), -1);
  ASSERT_TRUE(pictavo::test::writeJpegWithRawApp1(dir.file("junk.jpg"), std::string(64, '\xA5')));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("junk.jpg")), -1);
  // A TIFF header whose first IFD points far outside the data.
  ASSERT_TRUE(pictavo::test::writeJpegWithRawApp1(dir.file("wild.jpg"),
                                                  std::string("II*\0\xFF\xFF\xFF\x7F\x01\x00\x12\x01", 12)));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("wild.jpg")), -1);
  // An orientation entry that claims more values than the data holds.
  ASSERT_TRUE(pictavo::test::writeJpegWithRawApp1(
      dir.file("short.jpg"), std::string("II*\0\x08\0\0\0\x01\0\x12\x01\x03\0\xFF\xFF\0\0\xF0\xFF\0\0", 22)));
  CLyUtil::getOrientation(dir.file("short.jpg"));  // any answer, but no crash
  ASSERT_TRUE(pictavo::test::writeFileBytes(dir.file("text.jpg"), "hello"));
  EXPECT_EQ(CLyUtil::getOrientation(dir.file("text.jpg")), -1);
}

TEST(CLyUtilResourceTest, ResolvesLayoutsAndImages) {
  char* path = CLyUtil::getEdjPath("edje/LyTheme.edj");
  ASSERT_NE(path, nullptr);
  free(path);
  path = CLyUtil::getImagePath("code/changeableFontInfo.xml");
  ASSERT_NE(path, nullptr);
  free(path);
  LogCapture log;
  EXPECT_EQ(CLyUtil::getEdjPath(nullptr), nullptr);
  EXPECT_TRUE(log.contains("Invalid EDJ name"));
  EXPECT_EQ(CLyUtil::getImagePath(nullptr), nullptr);
  EXPECT_TRUE(log.contains("Invalid Image name"));
  EXPECT_EQ(CLyUtil::getImagePath("images/none.png"), nullptr);
  EXPECT_TRUE(log.contains("app_resource_manager_get failed["));
  EXPECT_TRUE(CLyUtil::initResourceManager());
  EXPECT_TRUE(CLyUtil::releaseResourceManager());
}

TEST(CLyUtilRequestTest, PickRequests) {
  // Four images in use: two more may be picked.
  app_control_h request = CLyUtil::createPickImagesRequest(6 - 4);
  ASSERT_NE(request, nullptr);
  EXPECT_EQ(field(app_control_get_operation, request), "http://tizen.org/appcontrol/operation/pick");
  EXPECT_EQ(field(app_control_get_app_id, request), APP_CONTROL_PICKER_APP_ID);
  EXPECT_EQ(extra(request, "launch-type"), "select-multiple");
  EXPECT_EQ(extra(request, "file-type"), "image");
  EXPECT_EQ(extra(request, "max-count"), "2");
  app_control_launch_mode_e mode = APP_CONTROL_LAUNCH_MODE_SINGLE;
  app_control_get_launch_mode(request, &mode);
  EXPECT_EQ(mode, APP_CONTROL_LAUNCH_MODE_GROUP);
  app_control_destroy(request);

  request = CLyUtil::createPickImageRequest();
  ASSERT_NE(request, nullptr);
  EXPECT_EQ(extra(request, "launch-type"), "select-one");
  EXPECT_EQ(extra(request, "max-count"), "<none>");
  app_control_destroy(request);
}

TEST(CLyUtilRequestTest, ShareAndSettingsRequests) {
  app_control_h request = CLyUtil::createShareRequest("/tmp/a b.jpg");
  ASSERT_NE(request, nullptr);
  EXPECT_EQ(field(app_control_get_operation, request), "http://tizen.org/appcontrol/operation/share");
  EXPECT_EQ(field(app_control_get_uri, request), "file:///tmp/a b.jpg");
  EXPECT_EQ(field(app_control_get_app_id, request), "<none>");
  app_control_destroy(request);
  EXPECT_EQ(CLyUtil::createShareRequest(nullptr), nullptr);
  EXPECT_EQ(CLyUtil::createShareRequest(""), nullptr);

  request = CLyUtil::createStorageSettingsRequest();
  ASSERT_NE(request, nullptr);
  EXPECT_EQ(field(app_control_get_app_id, request), APP_CONTROL_STORAGE_SETTINGS_APP_ID);
  EXPECT_EQ(field(app_control_get_operation, request), "<none>");
  EXPECT_EQ(extra(request, "viewtype"), "storage_detail");
  app_control_destroy(request);
}

TEST(CLyUtilDeviceTest, ReplyThemeColourAndTouchSound) {
  LogCapture log;
  app_control_h request = nullptr;
  app_control_create(&request);
  CLyUtil::replyToLaunchRequest(request, 0);
  EXPECT_TRUE(log.contains("Reply: 0"));
  CLyUtil::replyToLaunchRequest(nullptr, -1);
  EXPECT_TRUE(log.contains("Failed to reply"));
  app_control_destroy(request);

  int r = 11, g = 12, b = 13, a = 14;
  CLyUtil::getThemeColor("NO-SUCH-CODE", &r, &g, &b, &a, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                         nullptr, nullptr);
  EXPECT_TRUE(log.contains("Failed to get theme color[NO-SUCH-CODE]"));
  EXPECT_EQ((std::vector<int>{r, g, b, a}), (std::vector<int>{11, 12, 13, 14}));

  setenv("PICTAVO_NO_SOUND", "1", 1);
  while (feedback_is_initialized()) feedback_deinitialize();
  CLyUtil::playTouchSound();
  EXPECT_TRUE(log.contains("feedback_play error : "));
  feedback_initialize();
  int played = feedback_get_play_count();
  log.clear();
  CLyUtil::playTouchSound();
  EXPECT_FALSE(log.contains("feedback_play error"));
  EXPECT_EQ(feedback_get_play_count(), played + 1);
  feedback_deinitialize();
}

TEST(CLyUtilOrientationTest, DamagedExifNeverCrashes) {
  TempDir dir;
  ASSERT_TRUE(writeJpeg(dir.file("base.jpg"), ExifPlace::IFD0, 6));
  std::ifstream in(dir.file("base.jpg"), std::ios::binary);
  std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
  // The EXIF segment sits right after the start-of-image marker.
  ASSERT_GT(bytes.size(), 64u);
  std::mt19937 rng(1206);
  int sixes = 0;
  for (int round = 0; round < 600; ++round) {
    std::string damaged = bytes;
    for (int i = 0; i < 3; ++i) damaged[2 + rng() % 60] = static_cast<char>(rng() & 0xFF);
    ASSERT_TRUE(pictavo::test::writeFileBytes(dir.file("damaged.jpg"), damaged));
    int orientation = CLyUtil::getOrientation(dir.file("damaged.jpg"));
    EXPECT_GE(orientation, -1);
    EXPECT_LE(orientation, 0xFFFF);
    if (orientation == 6) ++sixes;
  }
  EXPECT_GT(sixes, 0) << "mutations away from the tag leave it readable";
}

TEST(CLyUtilFileTest, FullInternalStorageSendsCollagesToTheSdCard) {
  TempDir card;
  ScopedEnv root("PICTAVO_STORAGE_ROOT", nullptr);
  // A pictures folder that cannot be examined counts as full storage.
  ScopedEnv pictures("XDG_PICTURES_DIR", "no-such-relative-folder/Pictures");
  ScopedEnv sd("PICTAVO_SDCARD_DIR", card.path().c_str());
  notification_clear_posted();
  std::string path;
  ASSERT_EQ(CLyUtil::chooseSavePath(path), CLyUtil::SaveLocation::EXTERNAL);
  std::string album = card.path() + "/DCIM/Collage/";
  EXPECT_EQ(path.compare(0, album.size(), album), 0) << path;
  ASSERT_EQ(notification_get_posted_count(), 1u);
  char* text = notification_get_posted(0);
  EXPECT_STREQ(text, "IDS_IDLE_TPOP_ITEMS_SAVED_TO_SD_CARD_INSTEAD_OF_DEFAULT_LOCATION_HDEVICE_STORAGE");
  free(text);

  // Without the card nothing can be saved.
  ScopedEnv noCard("PICTAVO_SDCARD_DIR", nullptr);
  LogCapture log;
  path.clear();
  EXPECT_EQ(CLyUtil::chooseSavePath(path), CLyUtil::SaveLocation::NONE);
  EXPECT_TRUE(path.empty());
  EXPECT_TRUE(log.contains("Low memory"));
  notification_clear_posted();
}
