#pragma once
// A test window hosting the collage control with generated photos and the
// gesture control over it, driven by fed evas input on the buffer engine.

#include <Evas.h>

#include <vector>

#include "common/CLyFloatRectangle.h"
#include "common/CLyPoint.h"
#include "common/CLyRectangle.h"

class CLyGesture;
class CLyMultiGrid;
class CLyMultiGridDrawRectList;
class CLyMultiGridSrcItemList;

namespace pictavo::test::touch {

struct HostOptions {
  int photos = 2;
  int layout = 0;
  int width = 720;
  int height = 1280;
  bool singleImage = false;
  std::vector<int> placeholders;  // indexes of placeholder items (single-image mode)
  double longTapSeconds = 0.25;
};

class CollageHost {
 public:
  explicit CollageHost(const HostOptions& options = HostOptions());
  ~CollageHost();
  CollageHost(const CollageHost&) = delete;
  CollageHost& operator=(const CollageHost&) = delete;

  bool ok() const { return mOk; }
  CLyMultiGrid* grid() const { return mGrid; }
  CLyMultiGridDrawRectList* list() const { return mList; }
  CLyMultiGridSrcItemList* items() const { return mItems; }
  Evas* evas() const;
  Evas_Object* window() const { return mWin; }

  CLyFloatRectangle cell(int index) const;
  CLyPoint centre(int index) const;
  // Crop (left, top, right, bottom) of item `index`.
  CLyRectangle crop(int index) const;

  // Input: the mouse is the first finger, multi events (device 1) the second.
  void down(int x, int y);
  void move(int x, int y);
  void up(int x, int y);
  void multiDown(int x, int y);
  void multiMove(int x, int y);
  void multiUp(int x, int y);
  // Press and release at a point, letting the main loop run in between.
  void tap(int x, int y);
  // Selects a cell with a tap and waits for the selection job.
  bool select(int index);
  void spin(double seconds);
  unsigned int now() const;

  // Callbacks the control raised.
  std::vector<std::pair<int, bool>> mouseDowns;
  int selections = 0;
  std::vector<std::pair<bool, bool>> changes;
  int addPictures = 0;
  std::vector<std::pair<int, int>> swaps;

 private:
  bool mOk = false;
  Evas_Object* mWin = nullptr;
  CLyMultiGridDrawRectList* mList = nullptr;
  CLyMultiGridSrcItemList* mItems = nullptr;
  CLyMultiGrid* mGrid = nullptr;
  CLyGesture* mGesture = nullptr;
};

}  // namespace pictavo::test::touch
