#pragma once
// Device storage on a Linux desktop.
//
// The program keeps the device's paths: internal storage "/opt/usr/media" and
// the SD card "/opt/storage/sdcard". Here they stand for desktop folders:
//   internal storage -> the user's pictures folder ($XDG_PICTURES_DIR, else
//                       the XDG user-dirs setting, else ~/Pictures);
//   SD card          -> the folder named by $PICTAVO_SDCARD_DIR (none by
//                       default: no SD card is inserted).
// $PICTAVO_STORAGE_ROOT moves both for tests: internal storage becomes
// <root>/internal and the SD card <root>/sdcard (present when that folder
// exists).

#include <sys/statvfs.h>

#ifdef __cplusplus
extern "C" {
#endif

#define STORAGE_INTERNAL_DEVICE_ROOT "/opt/usr/media"
#define STORAGE_EXTERNAL_DEVICE_ROOT "/opt/storage/sdcard"

typedef enum {
  STORAGE_ERROR_NONE = 0,
  STORAGE_ERROR_INVALID_PARAMETER = -22,
  STORAGE_ERROR_OUT_OF_MEMORY = -12,
  STORAGE_ERROR_NOT_SUPPORTED = -1,
  STORAGE_ERROR_OPERATION_FAILED = -0x02050000 | 0x12,
} storage_error_e;

// statvfs of the folder standing for the storage. A missing SD card fails
// with STORAGE_ERROR_NOT_SUPPORTED.
int storage_get_internal_memory_size(struct statvfs* buf);
int storage_get_external_memory_size(struct statvfs* buf);

// Heap copies (caller frees) of the desktop folders, or NULL (no SD card).
char* storage_get_internal_root(void);
char* storage_get_external_root(void);

// Maps a device path below one of the two device roots to the desktop folder
// it stands for; any other path is returned unchanged. Heap copy, caller
// frees; NULL only for a NULL path or a path on a missing SD card.
char* storage_map_device_path(const char* device_path);

#ifdef __cplusplus
}
#endif
