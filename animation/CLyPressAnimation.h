#pragma once
// The press effect of a placeholder cell: while a finger rests on an empty
// cell in single-image mode the cell is tinted with the press colour; on
// release (or abort) it is drawn back as the black placeholder with its
// "add picture" mark. It paints on the collage control's canvas.

#include <Evas.h>

#include "common/CLyFloatRectangle.h"

class CLyCairoCanvas;

class CLyPressAnimation {
 public:
  CLyPressAnimation() = default;
  virtual ~CLyPressAnimation() = default;
  CLyPressAnimation(const CLyPressAnimation&) = delete;
  CLyPressAnimation& operator=(const CLyPressAnimation&) = delete;

  // 0, or -1 (logged) without an owner or a canvas. The canvas is not owned.
  int prepare(Evas_Object* owner, CLyCairoCanvas* canvas, const CLyFloatRectangle& cell, int cornerRadius);
  // Draws one state: pressed tints the cell with the press colour (its alpha
  // times `factor`); released draws the black placeholder. Both carry the icon.
  void draw(float factor, bool pressed);

  const CLyFloatRectangle& getCell() const { return mCell; }
  const CLyFloatRectangle& getPressColor() const { return mPressColor; }

 private:
  int mRadius = 0;
  Evas_Object* mOwner = nullptr;
  CLyCairoCanvas* mCanvas = nullptr;
  CLyFloatRectangle mCell;
  CLyFloatRectangle mPressColor;
};
