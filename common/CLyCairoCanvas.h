#pragma once
// The drawing surface of the collage: a cairo context painting straight into
// the pixel buffer of an evas image object. Every rectangle is given in evas
// (screen) coordinates; the canvas subtracts its own position, so a canvas
// placed at (x, y) draws a rectangle given at (x, y) at its top-left corner.
// Pixel rectangles are CLyFloatRectangle read as x, y, width, height
// (x1, y1, x2, y2); colours are CLyFloatRectangle read as r, g, b, a in 0..1.
//
// A GL mode (cairo on an evas GL surface) exists for builds of cairo that
// carry the evas-GL device; without it the canvas runs in software mode.

#include <Evas.h>
#include <cairo.h>

#include "common/CLyFloatRectangle.h"
#include "common/CLyRectangle.h"

class Bitmap;
struct _CLyCairoCanvasGl;

class CLyCairoCanvas {
 public:
  CLyCairoCanvas(Evas_Object* image, const CLyRectangle& geometry, bool useGl);
  CLyCairoCanvas(Evas_Object* image, int width, int height, bool useGl);
  virtual ~CLyCairoCanvas();
  CLyCairoCanvas(const CLyCairoCanvas&) = delete;
  CLyCairoCanvas& operator=(const CLyCairoCanvas&) = delete;

  // True when the surface and the context exist and cairo reports no error.
  bool isValid() const;
  // Whether the canvas really draws through GL (false after a fallback).
  bool isGl() const { return mUseGl; }
  const CLyRectangle& getGeometry() const { return mGeometry; }
  cairo_t* getContext() const { return mContext; }
  cairo_surface_t* getSurface() const { return mSurface; }

  // Changing size or place throws the drawing away and makes a new surface.
  void setGeometry(const CLyRectangle& geometry);
  void resize(int w, int h);

  // Filter used when bitmaps are scaled onto the canvas. The on-screen
  // canvas keeps the cheap bilinear filter; the save pass asks for GOOD,
  // which averages all covered pixels when a large crop shrinks into a cell.
  void setFilter(cairo_filter_t filter) { mFilter = filter; }
  cairo_filter_t getFilter() const { return mFilter; }
  // When a bitmap shrinks by a factor k >= 2, first average it over k x k
  // boxes, then filter the rest (under 2x) bilinearly: every source pixel
  // counts, so a large crop reduced into a small cell does not alias. Used by
  // the save pass; far cheaper than cairo's GOOD filter, which convolves.
  void setSmoothDownscale(bool smooth) { mSmoothDownscale = smooth; }
  bool getSmoothDownscale() const { return mSmoothDownscale; }

  void clear();
  void clearRect(const CLyFloatRectangle& rect);
  // Clears whole pixels: the rectangles of `region`, in evas coordinates.
  void clearRegion(const cairo_region_t* region);
  void update();
  void update(const CLyFloatRectangle& rect);

  // Drops the current path (the path operations below only append to it).
  void beginPath();
  void setRectPath(const CLyFloatRectangle& rect);
  void setRoundRectPath(const CLyFloatRectangle& rect, double rx, double ry);

  void fillRect(const CLyFloatRectangle& color, const CLyFloatRectangle& rect);
  void fillRoundRect(const CLyFloatRectangle& color, const CLyFloatRectangle& rect, double rx, double ry);
  void fillFrame(const CLyFloatRectangle& color, const CLyFloatRectangle& outer,
                 const CLyFloatRectangle& inner);
  void fillRoundFrame(const CLyFloatRectangle& color, const CLyFloatRectangle& outer,
                      const CLyFloatRectangle& inner, double rx, double ry);
  void strokeRect(const CLyFloatRectangle& color, double lineWidth, const CLyFloatRectangle& rect);
  void strokeRoundRect(const CLyFloatRectangle& color, double lineWidth, const CLyFloatRectangle& rect,
                       double rx, double ry);
  void drawIcon(const char* pngPath, const CLyFloatRectangle& rect);

  // A surface showing the bitmap's pixels (wrapped, not copied: the bitmap
  // must outlive it); the caller destroys it. Null bitmap: an empty 32 x 32 surface.
  cairo_surface_t* createSurface(Bitmap* bitmap);
  // Fills the current path with the part `src` (bitmap pixels) of the
  // surface stretched onto `dst`.
  void drawBitmap(cairo_surface_t* surface, const CLyFloatRectangle& dst, const CLyRectangle& src);
  // Fills the current path with the whole bitmap stretched onto `dst`.
  void drawBitmap(Bitmap* bitmap, const CLyFloatRectangle& dst);
  // Sets the rounded path of `dst` (radii `radius`, as setRoundRectPath) and
  // fills it as drawBitmap does. When the canvas copies (SOURCE operator,
  // FAST or NEAREST filter, software surface, no clip or transform) the whole
  // pixels inside the path are copied by a plain nearest-neighbour loop and
  // cairo only fills the partly covered edge: the same picture, at a
  // fraction of the cost, for redraws while a finger moves.
  // `keep` (evas coordinates, optional): whole pixels inside the path left
  // as they are, for a caller that put valid pixels there itself; honoured
  // only when the canvas copies.
  void drawBitmapInRoundRect(cairo_surface_t* surface, const CLyFloatRectangle& dst, const CLyRectangle& src,
                             double radius, const cairo_region_t* keep = nullptr);
  // Whether drawBitmapInRoundRect copies `surface` itself (see above).
  bool canCopyNearest(cairo_surface_t* surface) const;

 private:
  void _init(Evas_Object* image, const CLyRectangle& geometry, bool useGl);
  void _createSurface();
  void _destroySurface();
  bool _initGl();
  void _releaseGl();
  void _flushGl();
  void _setSourcePattern(cairo_surface_t* surface, const cairo_matrix_t& matrix);
  void _copyNearest(cairo_surface_t* surface, const CLyFloatRectangle& dst, const CLyRectangle& src,
                    const cairo_region_t* area);

  bool mUseGl = false;
  Evas_Object* mImage = nullptr;
  cairo_surface_t* mSurface = nullptr;
  cairo_t* mContext = nullptr;
  _CLyCairoCanvasGl* mGl = nullptr;  // GL device, evas GL, config, surface, context (GL mode only)
  CLyRectangle mGeometry{0, 0, 0, 0};
  cairo_filter_t mFilter = CAIRO_FILTER_BILINEAR;
  bool mSmoothDownscale = false;
};
