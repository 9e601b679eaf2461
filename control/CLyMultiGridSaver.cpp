#include "control/CLyMultiGridSaver.h"

#include <new>
#include <vector>

#include "common/CLyLog.h"
#include "control/CLyMultiGrid.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/CLyMultiGridSrcItem.h"
#include "model/CLyMultiGridSrcItemList.h"

namespace {

// The save pass fits every crop to its (save-size) cell; the user's crops
// on screen must come out of a save unchanged.
class CropSnapshot {
 public:
  explicit CropSnapshot(CLyMultiGridSrcItemList* items) : mItems(items) {
    for (int i = 0; i < items->count(); i++) {
      CLyMultiGridSrcItem* item = items->get(i);
      const CLyRectangle* crop = item ? item->getSrcRect() : nullptr;
      mCrops.push_back(crop ? *crop : CLyRectangle());
      mHave.push_back(crop != nullptr);
    }
  }
  ~CropSnapshot() {
    for (int i = 0; i < mItems->count() && (size_t)i < mCrops.size(); i++) {
      CLyMultiGridSrcItem* item = mItems->get(i);
      if (!item || !mHave[i] || !item->getBitmap()) continue;
      CLyRectangle* crop = new (std::nothrow) CLyRectangle(mCrops[i]);
      if (crop) item->setSrcRect(crop);
    }
  }
  CropSnapshot(const CropSnapshot&) = delete;
  CropSnapshot& operator=(const CropSnapshot&) = delete;

 private:
  CLyMultiGridSrcItemList* mItems;
  std::vector<CLyRectangle> mCrops;
  std::vector<bool> mHave;
};

}  // namespace

bool CLyMultiGridSaver::save(Evas_Object* win, Evas_Object* parent, const CLyMultiGridSaveRequest& request,
                             const std::string& path, int* savedWidth, int* savedHeight) {
  if (!request.cells || !request.items || request.items->count() < 1) {
    LYLOG_E("Nothing to save");
    return false;
  }
  int width = 0, height = 0;
  const bool sized =
      request.longestSide > 0
          ? CLyMultiGrid::computeSaveSize(request.longestSide, request.ratio, request.limit, width, height)
          : CLyMultiGrid::computeSaveSize(request.items, request.ratio, request.limit, width, height);
  if (!sized) {
    LYLOG_E("Failed to get save size");
    return false;
  }
  LYLOG_D("save size: %d x %d", width, height);

  CLyMultiGridDrawRectList* cells = new (std::nothrow) CLyMultiGridDrawRectList();
  if (!cells) {
    LYLOG_E("Failed to create draw rect list");
    return false;
  }
  request.cells->copyItems(cells);
  cells->setStyleIndex(request.cells->getStyleIndex());

  CropSnapshot snapshot(request.items);
  bool saved = false;
  CLyMultiGrid* grid = new (std::nothrow) CLyMultiGrid(cells, request.items, width, height);
  if (!grid) {
    LYLOG_E("Failed to create save grid");
  } else {
    grid->setSaveMode(true);
    grid->setUseGl(false);
    grid->setViewRatio(request.ratio, false);
    grid->setBackgroundColor(request.background);
    grid->setBorderMarginValue(request.margin);
    grid->setBorderRoundnessValue(request.roundness);
    if (!grid->prepare(win, parent) || !grid->create(parent, nullptr)) {
      LYLOG_E("Failed to create save grid");
      grid->destroy();
    } else {
      grid->refresh();
      saved = grid->save(path);
      grid->destroy();
    }
  }
  cells->clear(true);
  delete cells;
  if (saved) {
    if (savedWidth) *savedWidth = width;
    if (savedHeight) *savedHeight = height;
  }
  return saved;
}
