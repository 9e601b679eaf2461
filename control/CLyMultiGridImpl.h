#pragma once
// The private record of the collage control, shared by the rendering code
// (CLyMultiGrid.cpp) and the touch code (CLyMultiGridTouch.cpp). Nothing
// outside control/CLyMultiGrid*.cpp includes this file.

#include <Evas.h>
#include <cairo.h>

#include <functional>
#include <utility>
#include <vector>

#include "common/CLyFloatRectangle.h"
#include "common/CLyRectangle.h"

class CLyCairoCanvas;
class CLyMultiGridDrawRectList;
class CLyMultiGridSrcItemList;
class CLyPressAnimation;
class CLyFocusBox;

// Interaction modes of the touch code.
enum CLyMultiGridMode : int {
  LY_MULTIGRID_MODE_IDLE = 0,
  LY_MULTIGRID_MODE_PRESSED = 1,
  LY_MULTIGRID_MODE_PANNING = 2,
  LY_MULTIGRID_MODE_DRAGGING = 3,
  LY_MULTIGRID_MODE_DROPPING = 4,
};

struct _CLyMultiGridImpl {
  // --- objects ---
  Evas_Object* controlObj = nullptr;  // the control's own object: bg, canvas image, focus box are its members
  Evas_Object* layout = nullptr;      // "LyLayoutHover" layout that holds the control
  Evas_Object* box = nullptr;         // box in the layout's "elm.swallow.content"
  Evas_Object* bgObj = nullptr;       // rectangle filled with the background colour
  Evas_Object* canvasImage = nullptr;  // image object showing the canvas
  CLyCairoCanvas* canvas = nullptr;    // owned

  // --- view ---
  int viewWidth = 0;
  int viewHeight = 0;

  // --- selection (shared with the touch code) ---
  int previousIndex = -1;
  int currentIndex = -1;

  // --- state ---
  bool changed = true;
  bool singleImageMode = false;
  bool saveMode = false;
  bool useGl = true;
  bool bgColorApplied = false;
  int ratio = 0;
  double roundnessValue = -1.0;
  double marginValue = -1.0;

  CLyMultiGridDrawRectList* drawRectList = nullptr;  // not owned
  CLyMultiGridSrcItemList* srcItemList = nullptr;    // not owned

  CLyPressAnimation* pressEffect = nullptr;  // running press effect (touch code)
  CLyRectangle* bgDrawRoi = nullptr;         // collage area (x, y, w, h) in evas coordinates; owned
  CLyRectangle bgColor{255, 255, 255, 255};  // r, g, b, a 0..255 in x, y, w, h
  std::vector<std::vector<int>> margins;     // config/margins.json

  // --- listener callbacks (set by the main view) ---
  std::function<void(int index, bool placeholder)> mouseDownCb;
  std::function<void()> selectionCb;
  std::function<void(bool changed, bool hasSelection)> changeCb;
  std::function<void()> addPictureCb;
  std::function<void(int from, int to)> swapCb;

  // --- surfaces: one per source item, index = item index; owned ---
  std::vector<cairo_surface_t*> surfaces;
  // Cell rectangle each cell was last drawn at, so a partial redraw also
  // repaints cells that moved without changing their crop.
  std::vector<CLyFloatRectangle> drawnRects;
  // Pixel reuse while a handler drag redraws (reusePixels, set by the touch
  // code): the crop each cell was last drawn with and the scale (texels per
  // pixel, x and y) its kept pixels were sampled at. A step then moves a
  // cell's still valid pixels instead of resampling them. Empty or invalid
  // entries mean: redraw the whole cell.
  bool reusePixels = false;
  std::vector<CLyRectangle> drawnCrops;
  std::vector<std::pair<double, double>> sampledScales;

  // --- touch interaction (CLyMultiGridTouch.cpp) ---
  int touchedIndex = -1;
  int pressedIndex = -1;
  int finger1X = 0, finger1Y = 0;
  int finger2X = 0, finger2Y = 0;
  int fingerCount = 0;
  int handlerPressState = 0;  // 0 none, 1 pressed, 2 released
  int mode = LY_MULTIGRID_MODE_IDLE;
  float lastZoom = -1.0f;
  bool zooming = false;
  Evas_Object* dragImage = nullptr;
  Evas_Object* responseDimRect = nullptr;
  CLyFocusBox* focusBox = nullptr;  // owned
  // Touch code may keep further private state here (timers, gesture control).
  void* touchExtra = nullptr;
};
