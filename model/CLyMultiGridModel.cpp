#include "model/CLyMultiGridModel.h"

#include <cstdlib>
#include <exception>
#include <memory>

#include "common/CLyLog.h"
#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "platform/core/app_common.h"

struct _CLyMultiGridModelImpl {
  std::vector<std::vector<int>> margins;
};

CLyMultiGridModel::CLyMultiGridModel() : mImpl(new _CLyMultiGridModelImpl) {
  char* path = app_get_resource_path();
  if (!path) {
    LYLOG_E("Invalid path");
    return;
  }
  const std::string resourceDir(path);
  free(path);
  _loadConfigFile(resourceDir);
}

CLyMultiGridModel::CLyMultiGridModel(const std::string& resourceDir) : mImpl(new _CLyMultiGridModelImpl) {
  _loadConfigFile(resourceDir);
}

CLyMultiGridModel::~CLyMultiGridModel() {
  delete mImpl;
}

void CLyMultiGridModel::_loadConfigFile(const std::string& resourceDir) {
  const std::string filePath = resourceDir + "config/margins.json";
  // A missing or broken file leaves the table empty: the collage is then
  // shown without paddings rather than the application stopping.
  try {
    JSONObject object(filePath, true);
    std::unique_ptr<JSONArray> items(object.getArray("items"));
    if (!items) {
      LYLOG_E("Invalid array");
      return;
    }
    for (int i = 0; i < items->getLength(); ++i) {
      std::unique_ptr<JSONObject> item(items->getObject(i));
      if (!item) continue;
      std::unique_ptr<JSONArray> numbers(item->getArray("margins"));
      if (!numbers) continue;
      std::vector<int> margins;
      for (int j = 0; j < numbers->getLength(); ++j) margins.push_back(numbers->getInt(j));
      mImpl->margins.push_back(std::move(margins));
    }
  } catch (const std::exception& e) {
    LYLOG_E("Failed to load %s: %s", filePath.c_str(), e.what());
  }
  LYLOG_D("margin count: %d", static_cast<int>(mImpl->margins.size()));
}

const std::vector<int>& CLyMultiGridModel::getMargins(int index) const {
  static const std::vector<int> kNone;
  if (index < 0 || static_cast<size_t>(index) >= mImpl->margins.size()) {
    LYLOG_E("Invalid margin index(%d) of %d", index, getMarginsCount());
    return kNone;
  }
  return mImpl->margins[index];
}

int CLyMultiGridModel::getMarginsCount() const {
  return static_cast<int>(mImpl->margins.size());
}
