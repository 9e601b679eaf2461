#pragma once
// Device utilities without state: storage checks, album folder and file
// names, media database registration, launch-request replies, EXIF
// orientation, theme colours, touch sound, resource lookup and the
// application-control requests sent to other applications.

#include <sys/statvfs.h>

#include <string>

#include "platform/app_control.h"

// Device storage roots and the album folder below them.
#define LY_INTERNAL_STORAGE_ROOT "/opt/usr/media"
#define LY_EXTERNAL_STORAGE_ROOT "/opt/storage/sdcard"
#define LY_ALBUM_DIR "/DCIM/Collage"
#define LY_FILE_NAME_FORMAT "%Y-%m-%d %H.%M.%S"
#define LY_FILE_EXTENSION ".jpg"
// Less space than this (available to the application) counts as full.
#define LY_LOW_STORAGE_BYTES 1243904ULL

// Colour codes of the changeable colour table used by the screens.
#define LY_COLOR_MAIN "AO013"
#define LY_COLOR_MAIN_PRESSED "AO013A"
#define LY_COLOR_PRESS "AO014"
#define LY_COLOR_FOCUS "AO012"
#define LY_COLOR_DIM "AO015"

class CLyUtil {
 public:
  enum class SaveLocation { NONE, INTERNAL, EXTERNAL };

  // Storage: an unreadable storage (or no SD card) counts as low.
  static bool isInternalMemoryLow();
  static bool isExternalMemoryLow();
  // The decision behind both checks: `queryResult` is the storage call's
  // result and `info` what it filled in.
  static bool isStorageLow(int queryResult, const struct statvfs& info);

  static bool makeDir(const char* path);
  // Local time as "%Y-%m-%d %H.%M.%S".
  static void getFileName(std::string& name);

  // Where the next collage goes: internal storage unless it is low, then the
  // SD card (with a notification), else nowhere (NONE, "Low memory"). Creates
  // the album folder and fills `path` with the file path, mapped to the
  // desktop folder standing for the storage. A name already taken by an
  // earlier save in the same second gets " (2)", " (3)"... before ".jpg".
  static SaveLocation chooseSavePath(std::string& path);
  // The file path for a save under `deviceRoot` (one of the two roots above),
  // with the album folder created.
  static bool makeSavePath(const char* deviceRoot, std::string& path);

  static bool mediaContentScanFile(const char* path);
  static void replyToLaunchRequest(app_control_h request, int result);
  // EXIF orientation (1..8), -1 when the file has none or cannot be read.
  static int getOrientation(const std::string& path);
  static void getThemeColor(const char* code, int* r, int* g, int* b, int* a, int* outlineR, int* outlineG,
                            int* outlineB, int* outlineA, int* shadowR, int* shadowG, int* shadowB,
                            int* shadowA);
  static void playTouchSound();

  static bool initResourceManager();
  static bool releaseResourceManager();
  // Heap paths (caller frees) of a layout or image resource, or nullptr.
  static char* getEdjPath(const char* name);
  static char* getImagePath(const char* name);

  // Requests for other applications; the caller hands them to the launcher
  // (which owns them from then on) or destroys them. nullptr on failure.
  static app_control_h createPickImagesRequest(int maxCount);
  static app_control_h createPickImageRequest();
  static app_control_h createShareRequest(const char* path);
  static app_control_h createStorageSettingsRequest();
};
