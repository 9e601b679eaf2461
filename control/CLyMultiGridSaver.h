#pragma once
// Saving a collage: builds the hidden save-mode collage control at the save
// size (never by scaling the screen picture), renders it without paddings
// and writes the JPEG. The main view's save and the headless render command
// both go through here, so they produce the same picture.

#include <Evas.h>

#include <string>

#include "common/CLyRectangle.h"

class CLyMultiGridDrawRectList;
class CLyMultiGridSrcItemList;

struct CLyMultiGridSaveRequest {
  // The layout's cells (fractions) and layout index; copied, not changed.
  CLyMultiGridDrawRectList* cells = nullptr;
  // The photos with their crops; the crops are restored after the save.
  CLyMultiGridSrcItemList* items = nullptr;
  int ratio = 0;
  double margin = 1.0;
  double roundness = 0.0;
  CLyRectangle background{255, 255, 255, 255};
  int limit = 2000;  // widest saved picture
  // When > 0: the longer side of the largest photo as decoded for the screen.
  // Photos decoded for this save alone, just large enough to cover their
  // cells, are smaller than that and must not shrink the saved picture.
  int longestSide = 0;
};

namespace CLyMultiGridSaver {

// Renders and writes `path` (JPEG), registering it in the media database.
// `parent` is an object inside a window that has a window controller. On
// success fills the saved width and height (when given). False on any
// failure, with nothing left at `path`.
bool save(Evas_Object* win, Evas_Object* parent, const CLyMultiGridSaveRequest& request,
          const std::string& path, int* savedWidth = nullptr, int* savedHeight = nullptr);

}  // namespace CLyMultiGridSaver
