#pragma once
// The other applications that requests reach, by application id. On the
// desktop each is served inside this process (see app_control_launch.cpp):
// the image picker is a file-selector window, the storage settings page a
// logged stand-in; a share request (no application id) opens the file with
// the desktop's default application.

#define APP_CONTROL_PICKER_APP_ID "org.tizen.ug-gallery-efl"
#define APP_CONTROL_STORAGE_SETTINGS_APP_ID "setting-storage-efl"

// Extra-data keys of the picker request.
#define APP_CONTROL_PICKER_LAUNCH_TYPE "launch-type"
#define APP_CONTROL_PICKER_FILE_TYPE "file-type"
#define APP_CONTROL_PICKER_MAX_COUNT "max-count"
// Extra-data key of the storage settings request.
#define APP_CONTROL_SETTINGS_VIEWTYPE "viewtype"

// The caller id this application shows to the applications it launches.
#define APP_CONTROL_SELF_APP_ID "com.brelmo.pictavo"
