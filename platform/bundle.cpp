#include "platform/bundle.h"

#include <new>
#include <string>
#include <utility>
#include <vector>

struct _bundle_t {
  std::vector<std::pair<std::string, std::string>> pairs;
};

extern "C" bundle* bundle_create(void) {
  return new (std::nothrow) _bundle_t;
}

extern "C" int bundle_free(bundle* b) {
  if (!b) return BUNDLE_ERROR_INVALID_PARAMETER;
  delete b;
  return BUNDLE_ERROR_NONE;
}

extern "C" int bundle_add_str(bundle* b, const char* key, const char* str) {
  if (!b || !key || !*key || !str) return BUNDLE_ERROR_INVALID_PARAMETER;
  for (const auto& pair : b->pairs) {
    if (pair.first == key) return BUNDLE_ERROR_KEY_EXISTS;
  }
  try {
    b->pairs.emplace_back(key, str);
  } catch (const std::bad_alloc&) {
    return BUNDLE_ERROR_OUT_OF_MEMORY;
  }
  return BUNDLE_ERROR_NONE;
}

extern "C" int bundle_get_str(bundle* b, const char* key, char** str) {
  if (!b || !key || !str) return BUNDLE_ERROR_INVALID_PARAMETER;
  for (auto& pair : b->pairs) {
    if (pair.first == key) {
      *str = pair.second.data();
      return BUNDLE_ERROR_NONE;
    }
  }
  *str = nullptr;
  return BUNDLE_ERROR_KEY_NOT_AVAILABLE;
}

extern "C" int bundle_get_count(bundle* b) {
  return b ? static_cast<int>(b->pairs.size()) : 0;
}

extern "C" void bundle_foreach_str(bundle* b, bundle_str_iterator_cb cb, void* user_data) {
  if (!b || !cb) return;
  for (const auto& pair : b->pairs) cb(pair.first.c_str(), pair.second.c_str(), user_data);
}
