#pragma once
// System settings. The locale language comes from the process environment
// (LC_ALL, LC_MESSAGES, LANG, LANGUAGE; "en_US" when none is set), written the
// way the platform does: language and territory without encoding, e.g. "en_US".

#ifdef __cplusplus
extern "C" {
#endif

typedef enum {
  SYSTEM_SETTINGS_KEY_LOCALE_COUNTRY = 0,
  SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE,
} system_settings_key_e;

typedef enum {
  SYSTEM_SETTINGS_ERROR_NONE = 0,
  SYSTEM_SETTINGS_ERROR_INVALID_PARAMETER = -22,
  SYSTEM_SETTINGS_ERROR_OUT_OF_MEMORY = -12,
} system_settings_error_e;

// *value is a heap string the caller frees.
int system_settings_get_value_string(system_settings_key_e key, char** value);

#ifdef __cplusplus
}
#endif
