#pragma once
// Helpers shared by the model tests: the catalogue of the staged style
// files, lists filled from a layout, and the tiling invariants.

#include <cmath>
#include <sstream>
#include <string>
#include <vector>

#include "model/CLyMultiGridDrawRectList.h"
#include "model/style/CLyMultiGridStyleManager.h"

namespace pictavo::test {

// The catalogue loaded from the staged resources (PICTAVO_RES_DIR).
inline CLyMultiGridStyleManager& loadedCatalogue() {
  static bool loaded = CLyMultiGridStyleManager::getInstance().initialize();
  (void)loaded;
  return CLyMultiGridStyleManager::getInstance();
}

inline void fillList(CLyMultiGridDrawRectList& list, int count, int index, int width = 1000,
                     int height = 800) {
  float rects[6][4] = {};
  loadedCatalogue().getDrawRects(count, 0, index, rects);
  list.clear(true);
  for (int k = 0; k < count; ++k) {
    list.addItem(new CLyFloatRectangle(rects[k][0], rects[k][1], rects[k][2], rects[k][3]));
  }
  list.setStyleIndex(index);
  list.setSize(width, height);
}

inline std::vector<CLyFloatRectangle> snapshot(const CLyMultiGridDrawRectList& list) {
  std::vector<CLyFloatRectangle> cells;
  for (int i = 0; i < list.getCount(); ++i) cells.push_back(*list.getItem(i));
  return cells;
}

inline std::string describe(const std::vector<CLyFloatRectangle>& cells) {
  std::ostringstream out;
  for (size_t i = 0; i < cells.size(); ++i) {
    out << " [" << i << "] " << cells[i].x1 << "," << cells[i].y1 << " - " << cells[i].x2 << ","
        << cells[i].y2;
  }
  return out.str();
}

// Empty when the cells tile the unit square (to 1e-4), are all at least
// 0.14 - 1e-5 wide and high, and keep on the border every edge that
// `initial` had there; otherwise what is wrong.
inline std::string checkInvariants(const std::vector<CLyFloatRectangle>& cells,
                                   const std::vector<CLyFloatRectangle>& initial) {
  const double tol = 1e-4;
  double area = 0.0;
  for (size_t i = 0; i < cells.size(); ++i) {
    const CLyFloatRectangle& c = cells[i];
    if (c.x1 < -tol || c.y1 < -tol || c.x2 > 1 + tol || c.y2 > 1 + tol) return "cell outside the collage";
    if (c.x2 - c.x1 < 0.14f - 1e-5f) return "cell " + std::to_string(i) + " too narrow";
    if (c.y2 - c.y1 < 0.14f - 1e-5f) return "cell " + std::to_string(i) + " too short";
    area += static_cast<double>(c.x2 - c.x1) * (c.y2 - c.y1);
    for (size_t j = i + 1; j < cells.size(); ++j) {
      const CLyFloatRectangle& d = cells[j];
      const double ox = std::min(c.x2, d.x2) - std::max(c.x1, d.x1);
      const double oy = std::min(c.y2, d.y2) - std::max(c.y1, d.y1);
      if (ox > tol && oy > tol)
        return "cells " + std::to_string(i) + " and " + std::to_string(j) + " overlap";
    }
    const CLyFloatRectangle& s = initial[i];
    if ((s.x1 == 0.0f && c.x1 != 0.0f) || (s.y1 == 0.0f && c.y1 != 0.0f) || (s.x2 == 1.0f && c.x2 != 1.0f) ||
        (s.y2 == 1.0f && c.y2 != 1.0f)) {
      return "cell " + std::to_string(i) + " left the border";
    }
  }
  if (std::fabs(area - 1.0) > tol) return "gap: cells cover " + std::to_string(area);
  return std::string();
}

}  // namespace pictavo::test
