#pragma once
// The collage control: shows the collage on an evas image object painted by a
// cairo canvas, redraws it when the layout, ratio, margin, roundness,
// background colour or a photo changes, and renders the picture that is
// saved. A second, hidden instance in save mode (no paddings, no touch, no
// change notifications) is built at the save size only to write the JPEG.
//
// Rendering lives in CLyMultiGrid.cpp, touch handling in
// CLyMultiGridTouch.cpp; both share the private record of CLyMultiGridImpl.h.

#include <Evas.h>
#include <cairo.h>

#include <cstdint>
#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "common/CLyFloatRectangle.h"
#include "common/CLyPoint.h"
#include "common/CLyRectangle.h"
#include "control/CLyControl.h"

class Bitmap;
class CLyEvent;
class CLyFocusBox;
class CLyGridImageInfo;
class CLyMultiGridDrawRectList;
class CLyMultiGridSrcItemList;
struct _CLyMultiGridImpl;

// Aspect ratios of the collage (index -> width : height).
enum CLyMultiGridRatio : int {
  LY_RATIO_1_1 = 0,
  LY_RATIO_2_3 = 1,
  LY_RATIO_3_4 = 2,
  LY_RATIO_9_16 = 3,
  LY_RATIO_16_9 = 4,
  LY_RATIO_4_3 = 5,
  LY_RATIO_3_2 = 6,
  LY_RATIO_COUNT = 7,
};

class CLyMultiGrid : public CLyControl {
 public:
  using MouseDownCallback = std::function<void(int index, bool placeholder)>;
  using SelectionCallback = std::function<void()>;
  using ChangeCallback = std::function<void(bool changed, bool hasSelection)>;
  using AddPictureCallback = std::function<void()>;
  using SwapCallback = std::function<void(int from, int to)>;

  CLyMultiGrid(CLyMultiGridDrawRectList* drawRectList, CLyMultiGridSrcItemList* srcItemList, int width,
               int height);
  CLyMultiGrid(const CLyMultiGrid&) = delete;
  CLyMultiGrid& operator=(const CLyMultiGrid&) = delete;

  const char* getClassName() const override { return "CLyMultiGrid"; }

  // Loads the hover layout; false (logged) on a null window or parent or a missing layout file.
  bool prepare(Evas_Object* win, Evas_Object* parent);

  void setSaveMode(bool saveMode);
  void setUseGl(bool useGl);
  void setSingleImageMode(bool singleImageMode);
  void setBackgroundColor(const CLyRectangle& color);
  void setBorderMarginValue(double value);
  void setBorderRoundnessValue(double value);
  void setViewRatio(int ratio, bool apply);
  void setViewSize(int ratio, int width, int height);
  void setLayoutIndex(int index);

  // Rebuilds every surface from the source items and draws everything.
  void refresh();

  int getCurrentIndex() const;
  int getRatio() const;
  const CLyRectangle& getBackgroundColor() const;
  double getRoundnessValue() const;
  double getMarginValue() const;
  // The collage area (x, y, w, h) in evas coordinates; null before the view size is known.
  const CLyRectangle* getCollageRect() const;
  // Size of the saved picture: at most `limit` wide and never wider than the
  // longer side of the largest decoded photo. False when there is no photo.
  bool getSaveSize(int limit, int& width, int& height) const;
  // The same rule for any list of photos and ratio, before a control exists.
  static bool computeSaveSize(CLyMultiGridSrcItemList* srcItemList, int ratio, int limit, int& width,
                              int& height);
  // The same rule from the largest photo's longer side as it would be decoded
  // for the screen (for bitmaps decoded smaller, for a save alone).
  static bool computeSaveSize(int longestSide, int ratio, int limit, int& width, int& height);
  // A copy of a photo's bitmap (index -1 or -2: the current cell); null on failure.
  Bitmap* clone(int index) const;

  // A new bitmap for a cell (index -1: the current cell).
  void updateBitmap(Bitmap* bitmap, int index, bool adoptPixels);
  // Turns the photo of the current cell a quarter turn counter-clockwise.
  void rotate();

  // Writes the collage over the background colour to `path` (a temporary
  // file renamed into place once complete) and registers it in the media
  // database. False on any failure, leaving no file behind.
  bool save(const std::string& path);

  void notifyChanged(bool value);
  bool isChanged() const;

  // ---- touch interaction (implemented in CLyMultiGridTouch.cpp) ----
  void setMouseDownCallback(MouseDownCallback cb);
  void setSelectionCallback(SelectionCallback cb);
  void setChangeCallback(ChangeCallback cb);
  void setAddPictureCallback(AddPictureCallback cb);
  void setSwapCallback(SwapCallback cb);
  // Forgets the selected cell and removes its focus frame; true when a cell was selected.
  bool clearSelection();
  // The single entry point of gesture events (types and states of CLyGesture;
  // `info` points to a CLyGestureInfo).
  void __processGestureEvent(int type, int state, void* info);
  // Interaction mode (CLyMultiGridMode: 0 idle .. 4 dropping) and the focus
  // box (null in save mode), for hosts and tests.
  int getInteractionMode() const;
  CLyFocusBox* getFocusBox() const;

 protected:
  // Deleted with its view object (destroy()), never directly.
  ~CLyMultiGrid() override;
  Evas_Object* onCreateView(Evas_Object* parent, void* param) override;
  void onCreated() override;
  void onDestroy() override;
  void onEvent(const CLyEvent& event) override;

 private:
  friend class CLyMultiGridTestPeer;

  // ---- rendering (CLyMultiGrid.cpp) ----
  bool __getProportionPadding(int ratio, int& left, int& right, int& top, int& bottom);
  void __calculateViewSize(int ratio, int width, int height, int left, int right, int top, int bottom);
  void __updateBgDrawRoi();
  void __relayout();
  void __createBgObject();
  bool __createCanvas();
  void __setDefaultBorderMargin();
  void __destroySurfaces();
  void __createSurfaces();
  cairo_surface_t* __createSurface(int index);
  void __draw();
  void __drawGridImages();
  void __updateGridImages();
  bool __drawCells(bool clearFirst, bool newCrops, bool skipUnchanged,
                   std::vector<CLyRectangle>* dirty = nullptr);
  void __wipeChangedCells(const std::vector<std::pair<int, CLyFloatRectangle>>& cells,
                          std::vector<CLyRectangle>* dirty);
  bool __paintsWholeCell(int index) const;
  void __updateGridImage(int index);
  void __updateImage(int index, const CLyFloatRectangle& cell, bool recreate);
  void __createGridImage(int index, const CLyFloatRectangle& cell, const cairo_region_t* keep = nullptr);
  cairo_region_t* __planReuse(int index, const CLyFloatRectangle& cell, int& dx, int& dy);
  void __forgetDrawnPixels();
  void __copyCanvasPixels(const cairo_region_t* keep, int dx, int dy, std::vector<uint32_t>* pixels,
                          bool save);
  bool __calculateRectSize(const CLyRectangle& crop, const CLyFloatRectangle& cell,
                           CLyRectangle& result) const;
  void __rotateGridImage(int index, double angle);
  bool __isValidItemIndex(int index) const;

  // ---- touch (CLyMultiGridTouch.cpp) ----
  void __setupTouch();     // onCreated, unless in save mode: focus box, gesture wiring
  void __teardownTouch();  // onDestroy: drag image, dim rectangle, focus box, press effect, timers
  void __abortPressEffect();
  void __resizeFocusBox();   // after the collage area changed size or place
  void __updateFocusRect();  // shows the frame and handler dots at the current cell
  void __destroyFocusRect();
  int __getClickIndex(int x, int y);
  // (touch helpers, CLyMultiGridTouch.cpp)
  void __createHover();
  static void __onLayoutGeometry(void* data, Evas* e, Evas_Object* obj, void* info);
  bool __isPlaceholder(int index) const;
  CLyFloatRectangle __cellRect(int index) const;
  void __fitCrop(int index);
  void __setFingerPosition(int device, int x, int y);
  void __onMouseDown(int x, int y);
  void __onMouseUp(int x, int y);
  void __onMouseMove(int x, int y);
  void __postMouseDown(int index, bool placeholder);
  void __resetStatusAfterMouseUp(int x, int y);
  void __onTap(int type, int state, int x, int y);
  void __tryClickHover(int x, int y, int pressed, int touched);
  void __notifyMainView();
  CLyGridImageInfo* __currentImageInfo() const;
  void __showFocusHandler();
  void __resizeFocusRect(const CLyPoint& delta, int dotIndex);
  void __endHandlerDrag();
  int __tryUpdateCurrentIndex(int x, int y);
  void __onMomentum(int state, int x, int y, int fingers);
  void __movePhoto(int x, int y);
  void __onZoom(int state, int x, int y, double zoom);
  void __pinchGridImage(float zoom);
  void __onLongTap(int state, int x, int y);
  void __cleanGridImage(int index);
  Evas_Object* __drawImage(int index);
  void __createDragImage();
  void __moveDragImage(int x, int y);
  void __createResponseDimRect(int target);
  void __dropDragImage(int x, int y);
  void __startZoomIn(int index);
  static void __onZoomInTransitDone(void* data, Elm_Transit* transit);
  static void __onMoveBackTransitDone(void* data, Elm_Transit* transit);
  void __runPressEffect(int index, int x, int y);
  bool __runReleaseEffect();

  _CLyMultiGridImpl* _pImpl = nullptr;
};
