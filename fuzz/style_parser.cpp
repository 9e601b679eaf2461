// Feeds arbitrary bytes to the grid style parser as a style file and drives
// every layout that parses through the draw rectangle list and its size
// modifiers. Malformed input may only end in std::exception at the parser's
// boundary; anything else (crash, out-of-bounds access, undefined
// behaviour) is a fault.

#include <cstddef>
#include <cstdint>
#include <exception>
#include <memory>
#include <string>

#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "model/CLyMultiGridDrawRectList.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "platform/core/dlog.h"

namespace {

void exerciseLayout(const CLyGridImageLayoutInfo& layout, int styleIndex, const uint8_t* data, size_t size) {
  float rects[6][4] = {};
  layout.getDrawRects(rects);
  CLyMultiGridDrawRectList list;
  list.setSize(720, 960);
  list.setStyleIndex(styleIndex);
  list.setSpacingStep(static_cast<int>(size % 12));
  for (int k = 0; k < layout.getImageCount(); ++k) {
    list.addItem(new CLyFloatRectangle(rects[k][0], rects[k][1], rects[k][2], rects[k][3]));
  }
  for (int k = 0; k < layout.getImageCount(); ++k) {
    const CLyGridImageInfo* info = layout.getImageInfo(k);
    list.get(k);
    for (int h = 0; h < info->getHandlerCount(); ++h) {
      const CLyGridHandlerInfo* handler = info->getHandlerInfo(h);
      float x = 0, y = 0;
      int base = 0;
      handler->getPostion(&x, &y, &base);
      // Drags taken from the input bytes: both signs, small and large.
      for (size_t s = 0; s < 6; ++s) {
        const uint8_t a = size ? data[(k * 7 + h * 3 + s) % size] : 0;
        const uint8_t b = size ? data[(k * 5 + h * 11 + s * 2) % size] : 0;
        list.updateItem(k, info, h,
                        CLyPoint((static_cast<int>(a) - 128) * 6, (static_cast<int>(b) - 128) * 6));
      }
    }
    list.getIndex(360.0f, 480.0f);
  }
  list.clear(true);
}

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
  dlog_set_min_priority(DLOG_SILENT);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  const std::string text(reinterpret_cast<const char*>(data), size);
  try {
    JSONObject root(text);
    std::unique_ptr<JSONArray> layouts(root.getArray("layouts"));
    if (!layouts) return 0;
    for (int i = 0; i < layouts->getLength() && i < 16; ++i) {
      std::unique_ptr<JSONObject> object(layouts->getObject(i));
      try {
        CLyGridImageLayoutInfo layout(object.get());
        exerciseLayout(layout, i, data, size);
      } catch (const std::exception&) {
        // A malformed layout is refused at the parser's boundary.
      }
    }
  } catch (const std::exception&) {
    // Not JSON, or an empty document.
  }
  return 0;
}
