#include "platform/system_settings.h"

#include <cstdlib>
#include <cstring>
#include <string>

namespace {

// "de_DE.UTF-8@euro" -> "de_DE"; "C" and "POSIX" mean no language.
std::string localeFromEnvironment() {
  const char* names[] = {"LC_ALL", "LC_MESSAGES", "LANG"};
  for (const char* name : names) {
    const char* value = getenv(name);
    if (!value || !*value) continue;
    std::string locale(value);
    locale = locale.substr(0, locale.find_first_of(".@"));
    if (locale.empty() || locale == "C" || locale == "POSIX") continue;
    return locale;
  }
  // LANGUAGE is a priority list "de:en"; take the first one.
  if (const char* language = getenv("LANGUAGE"); language && *language) {
    std::string first(language);
    first = first.substr(0, first.find(':'));
    if (!first.empty()) return first;
  }
  return "en_US";
}

}  // namespace

extern "C" int system_settings_get_value_string(system_settings_key_e key, char** value) {
  if (!value) return SYSTEM_SETTINGS_ERROR_INVALID_PARAMETER;
  *value = nullptr;
  std::string locale = localeFromEnvironment();
  switch (key) {
    case SYSTEM_SETTINGS_KEY_LOCALE_LANGUAGE:
    case SYSTEM_SETTINGS_KEY_LOCALE_COUNTRY:
      break;
    default:
      return SYSTEM_SETTINGS_ERROR_INVALID_PARAMETER;
  }
  *value = strdup(locale.c_str());
  return *value ? SYSTEM_SETTINGS_ERROR_NONE : SYSTEM_SETTINGS_ERROR_OUT_OF_MEMORY;
}
