#pragma once
// One photo of the collage: its decoded bitmap, its file path, and the crop
// (the part of the photo shown in its cell, in bitmap pixels, kept as left,
// top, right, bottom) with the zoom limits that pinch and pan respect.

#include <cstdint>
#include <string>

class Bitmap;
class CLyRectangle;
struct _CLyMultiGridSrcItemImpl;

class CLyMultiGridSrcItem {
 public:
  CLyMultiGridSrcItem();
  // A placeholder for a photo that is not (or no longer) decoded.
  explicit CLyMultiGridSrcItem(const std::string& path, bool fake = true);
  virtual ~CLyMultiGridSrcItem();
  CLyMultiGridSrcItem(const CLyMultiGridSrcItem&) = delete;
  CLyMultiGridSrcItem& operator=(const CLyMultiGridSrcItem&) = delete;

  // Takes the bitmap (destroying the previous one when deleteOld is set)
  // and resets the crop to the initial crop.
  void setBitmap(Bitmap* bitmap, bool deleteOld);
  // Re-reads the size of the current bitmap and resets the crop.
  void refresh();
  // Destroys the bitmap and the crop.
  void release();

  Bitmap* getBitmap() const;
  const std::string& getPath() const;
  void setPath(const std::string& path);
  bool isFake() const;
  void setFake(bool fake);
  // The main view's mark while it processes a decoded image.
  bool isChecked() const;
  void setChecked(bool checked);
  int getWidth() const;
  int getHeight() const;
  int64_t getPixelCount() const;

  // The crop as left, top, right, bottom (x, y, w, h fields); null before a bitmap is set.
  const CLyRectangle* getSrcRect() const;
  // Takes ownership of the rectangle, fitted inside the bitmap first.
  void setSrcRect(CLyRectangle* rect);
  // Moves and shrinks a left, top, right, bottom rectangle to lie inside
  // the bitmap; returns the same rectangle.
  CLyRectangle* checkRectInOrg(CLyRectangle* rect) const;

  // Current zoom: 1.0 when the crop spans the bitmap in its bound direction.
  float getScale() const;
  float getScaleFor(int left, int top, int right, int bottom) const;
  float getMinScale() const;
  float getMaxScale() const;
  float getInitialCropRatio() const;

  // Moves the crop against a finger movement of (dx, dy) screen pixels;
  // true when it moved.
  bool pan(int dx, int dy);
  // Zooms by `distance` (a fraction of the crop per step; positive zooms
  // in); true when the crop changed.
  bool pinchZoom(float distance);
  // Turns the bitmap (1 clockwise, 2 half, 3 counter-clockwise) and the crop with it.
  void rotate(int code);

 private:
  void _resetCrop();
  void _rotateDrawRect(int code);

  _CLyMultiGridSrcItemImpl* _pv;
};
