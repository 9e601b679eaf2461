#include "model/style/CLyMultiGridStyleManager.h"

#include <cstdio>
#include <cstdlib>
#include <exception>
#include <map>
#include <memory>
#include <vector>

#include "common/CLyLog.h"
#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "platform/core/app_common.h"

namespace {

// Thumbnails per image count: icon i + 1 shows layout i.
constexpr int kThumbnailCounts[] = {2, 6, 9, 8, 7};

bool validCount(int imgCnt) {
  return imgCnt >= CLyMultiGridStyleManager::kMinImageCount &&
         imgCnt <= CLyMultiGridStyleManager::kMaxImageCount;
}

}  // namespace

struct _CLyMultiGridStyleManagerImpl {
  std::map<int, std::vector<CLyGridImageLayoutInfo*>*> gridLayouts;
};

CLyMultiGridStyleManager& CLyMultiGridStyleManager::getInstance() {
  static CLyMultiGridStyleManager instance;
  return instance;
}

CLyMultiGridStyleManager::CLyMultiGridStyleManager() : mImpl(new _CLyMultiGridStyleManagerImpl) {}

CLyMultiGridStyleManager::~CLyMultiGridStyleManager() {
  clear();
  delete mImpl;
}

void CLyMultiGridStyleManager::clear() {
  for (auto& entry : mImpl->gridLayouts) {
    for (CLyGridImageLayoutInfo* layout : *entry.second) delete layout;
    delete entry.second;
  }
  mImpl->gridLayouts.clear();
}

bool CLyMultiGridStyleManager::initialize() {
  char* path = app_get_resource_path();
  if (!path) {
    LYLOG_E("Invalid path");
    clear();
    for (int count = kMinImageCount; count <= kMaxImageCount; ++count) {
      mImpl->gridLayouts[count] = new std::vector<CLyGridImageLayoutInfo*>();
    }
    return false;
  }
  const std::string resourceDir(path);
  free(path);
  return initialize(resourceDir);
}

bool CLyMultiGridStyleManager::initialize(const std::string& resourceDir) {
  clear();
  for (int count = kMinImageCount; count <= kMaxImageCount; ++count) {
    mImpl->gridLayouts[count] = new std::vector<CLyGridImageLayoutInfo*>();
  }
  return _loadGridStyleFiles(resourceDir);
}

bool CLyMultiGridStyleManager::_loadGridStyleFiles(const std::string& resourceDir) {
  const std::string basePath = resourceDir + "styles/grid/styleimage";
  for (int count = kMinImageCount; count <= kMaxImageCount; ++count) {
    const std::string filePath = basePath + std::to_string(count) + ".json";
    // The parsers throw on malformed data; catching here keeps a broken
    // resource file from taking the whole application down at start-up.
    try {
      JSONObject object(filePath, true);
      std::unique_ptr<JSONArray> pArray(object.getArray("layouts"));
      if (!pArray) {
        LYLOG_E("pArray is nullptr!");
        return false;
      }
      for (int i = 0; i < pArray->getLength(); ++i) {
        std::unique_ptr<JSONObject> layoutObject(pArray->getObject(i));
        auto layout = std::make_unique<CLyGridImageLayoutInfo>(layoutObject.get());
        if (layout->getImageCount() != count) {
          // Every consumer indexes photos by cell; a layout with another
          // number of cells than photos would make them read past the end.
          LYLOG_E("layout %d of %s has %d cells", i, filePath.c_str(), layout->getImageCount());
          return false;
        }
        if (_addGridImageLayout(count, layout.get())) layout.release();
      }
    } catch (const std::exception& e) {
      LYLOG_E("Failed to load %s: %s", filePath.c_str(), e.what());
      return false;
    }
  }
  return true;
}

bool CLyMultiGridStyleManager::_addGridImageLayout(int imgCnt, CLyGridImageLayoutInfo* pLayoutInfo) {
  if (!pLayoutInfo) {
    LYLOG_E("pLayoutInfo is null");
    return false;
  }
  if (!validCount(imgCnt)) {
    LYLOG_E("imgCnt(%d) is invalid!", imgCnt);
    return false;
  }
  auto it = mImpl->gridLayouts.find(imgCnt);
  if (it == mImpl->gridLayouts.end()) return false;
  it->second->push_back(pLayoutInfo);
  return true;
}

CLyGridImageLayoutInfo* CLyMultiGridStyleManager::getGridImageLayout(int imgCnt, int nIndex) const {
  if (!validCount(imgCnt)) {
    LYLOG_E("imgCnt(%d) is invalid!", imgCnt);
    return nullptr;
  }
  auto it = mImpl->gridLayouts.find(imgCnt);
  if (it == mImpl->gridLayouts.end()) {
    LYLOG_E("Failed to get data(%d / %d)", nIndex, imgCnt);
    return nullptr;
  }
  // Negative indexes are refused as well: they would read before the vector.
  if (nIndex < 0 || static_cast<size_t>(nIndex) >= it->second->size()) {
    LYLOG_E("nIndex(%d) is invalid!", nIndex);
    return nullptr;
  }
  return (*it->second)[nIndex];
}

int CLyMultiGridStyleManager::getGridLayoutCount(int imgCnt) const {
  auto it = mImpl->gridLayouts.find(imgCnt);
  return it == mImpl->gridLayouts.end() ? 0 : static_cast<int>(it->second->size());
}

int CLyMultiGridStyleManager::getLayoutCount(int imgCnt) const {
  if (!validCount(imgCnt)) return 0;
  return getGridLayoutCount(imgCnt);
}

int CLyMultiGridStyleManager::getThumbnailCount(int imgCnt) {
  return validCount(imgCnt) ? kThumbnailCounts[imgCnt - kMinImageCount] : 0;
}

std::string CLyMultiGridStyleManager::getLayoutThumbnailPath(int imgCnt, int nIndex, bool pressed) const {
  if (!validCount(imgCnt)) {
    LYLOG_E("imgCnt(%d) is Invalid", imgCnt);
    return std::string();
  }
  // The icon table has one row per count; an index past the row has no icon.
  if (nIndex < 0 || nIndex >= getThumbnailCount(imgCnt)) {
    LYLOG_E("nIndex(%d) has no thumbnail", nIndex);
    return std::string();
  }
  char name[64];
  snprintf(name, sizeof(name), "pictavo_ic_2depth_%02d_%d%s.png", imgCnt, nIndex + 1,
           pressed ? "_press" : "");
  return name;
}

bool CLyMultiGridStyleManager::getDrawRects(int imgCnt, int proportion, int layoutIndex,
                                            float (*out)[4]) const {
  LYLOG_D("imgCnt = %d, proportion = %d, layout index = %d", imgCnt, proportion, layoutIndex);
  if (!validCount(imgCnt)) {
    LYLOG_E("imgCnt(%d) is invalid!", imgCnt);
    return false;
  }
  CLyGridImageLayoutInfo* layout = getGridImageLayout(imgCnt, layoutIndex);
  if (layout) layout->getDrawRects(out);
  return true;
}
