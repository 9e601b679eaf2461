#pragma once
// Reaches the collage control's private drawing steps for tests and benchmarks.

#include "control/CLyMultiGrid.h"
#include "control/CLyMultiGridImpl.h"

class CLyMultiGridTestPeer {
 public:
  static _CLyMultiGridImpl* impl(CLyMultiGrid* g) { return g->_pImpl; }
  static bool calculateRectSize(CLyMultiGrid* g, const CLyRectangle& crop, const CLyFloatRectangle& cell,
                                CLyRectangle& out) {
    return g->__calculateRectSize(crop, cell, out);
  }
  static void draw(CLyMultiGrid* g) { g->__draw(); }
  static void drawGridImages(CLyMultiGrid* g) { g->__drawGridImages(); }
  static void updateGridImages(CLyMultiGrid* g) { g->__updateGridImages(); }
  static void updateImage(CLyMultiGrid* g, int i, const CLyFloatRectangle& d, bool recreate) {
    g->__updateImage(i, d, recreate);
  }
};
