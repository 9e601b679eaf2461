#pragma once
// The cells of the collage as left, top, right, bottom fractions, with the
// pixel size and origin of the collage area and the border (spacing) and
// corner (roundness) settings. Turns cells into pixel rectangles, finds the
// cell under a point and applies handler drags with the layout's size
// modifier. Main loop only.

#include <cstdint>

#include "common/CLyFloatRectangle.h"
#include "common/CLyPoint.h"

class CLyGridImageInfo;
struct _CLyMultiGridDrawRectListImpl;

class CLyMultiGridDrawRectList {
 public:
  static constexpr int kMaxItems = 6;
  // A cell narrower or shorter than this after a drag calls the size modifier.
  static constexpr float kDetectLimit = 0.139999f;
  static constexpr float kMinCellSize = 0.14f;

  CLyMultiGridDrawRectList();
  virtual ~CLyMultiGridDrawRectList();
  CLyMultiGridDrawRectList(const CLyMultiGridDrawRectList&) = delete;
  CLyMultiGridDrawRectList& operator=(const CLyMultiGridDrawRectList&) = delete;

  void setSize(int width, int height);
  int getWidth() const;
  int getHeight() const;
  void setOffsetX(int x);
  void setOffsetY(int y);
  int getOffsetX() const;
  int getOffsetY() const;
  void setStyleIndex(int index);
  int getStyleIndex() const;

  void setSpacingStep(int step);
  int getSpacingStep() const;
  // Border width in pixels to the nearest lower step, clamped to 0..10.
  int getSpacingStep(int pixels) const;
  float getSpacing() const;
  void setRoundStep(int step);
  int getRoundStep() const;
  // Corner radius in pixels.
  int getRoundness() const;

  // Takes ownership; refused (false) when null or when the list is full.
  bool addItem(CLyFloatRectangle* rect);
  CLyFloatRectangle* getItem(int i) const;
  int getCount() const;
  void clear(bool deleteItems);
  void copyItems(CLyMultiGridDrawRectList* other) const;

  // Pixel rectangle of cell i as x, y, width, height.
  CLyFloatRectangle get(int i) const;
  // The cell under a pixel point, −1 when none.
  int getIndex(float x, float y) const;
  // Applies a drag (pixels) of handler `handlerIndex` of the selected cell.
  void updateItem(int selected, const CLyGridImageInfo* info, int handlerIndex, const CLyPoint& drag);

 private:
  _CLyMultiGridDrawRectListImpl* mImpl;
};
