#include "model/style/CLyGridImageLayoutInfo.h"

#include <memory>

#include "common/CLyLog.h"
#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyStyleParseError.h"

CLyGridImageLayoutInfo::CLyGridImageLayoutInfo(const JSONObject* object) {
  if (!object) {
    LYLOG_E("object is nullptr!");
    throw CLyStyleParseError("layout object missing");
  }
  std::unique_ptr<JSONArray> pArray(object->getArray("images"));
  if (!pArray) {
    LYLOG_E("pArray is nullptr!");
    throw CLyStyleParseError("images missing");
  }
  const int count = pArray->getLength();
  if (count > kMaxImages) {
    LYLOG_E("images count(%d) is bigger than %d", count, kMaxImages);
    throw CLyStyleParseError("too many images");
  }
  try {
    for (int i = 0; i < count; ++i) {
      std::unique_ptr<JSONObject> __obj(pArray->getObject(i));
      if (!__obj) {
        LYLOG_E("__obj is nullptr!");
        throw CLyStyleParseError("image is not an object");
      }
      mImages.push_back(new CLyGridImageInfo(__obj.get()));
    }
    // A handler's knob is placed on its base cell: one outside the layout
    // would send the focus box to a cell that does not exist.
    for (CLyGridImageInfo* image : mImages) {
      for (int h = 0; h < image->getHandlerCount(); ++h) {
        const CLyGridHandlerInfo* handler = image->getHandlerInfo(h);
        float x = 0.0f, y = 0.0f;
        int base = 0;
        handler->getPostion(&x, &y, &base);
        if (base < 0 || base >= count) {
          LYLOG_E("base_image_id(%d) is not a cell of %d images", base, count);
          throw CLyStyleParseError("handler does not fit its layout");
        }
      }
    }
  } catch (...) {
    for (CLyGridImageInfo* image : mImages) delete image;
    mImages.clear();
    throw;
  }
}

CLyGridImageLayoutInfo::~CLyGridImageLayoutInfo() {
  for (CLyGridImageInfo* image : mImages) delete image;
}

CLyGridImageInfo* CLyGridImageLayoutInfo::getImageInfo(int nIndex) const {
  if (nIndex < 0 || nIndex >= getImageCount()) {
    LYLOG_E("nIndex(%d) is bigger and equal than size(%d)", nIndex, getImageCount());
    return nullptr;
  }
  return mImages[nIndex];
}

bool CLyGridImageLayoutInfo::getDrawRects(float (*returnPreset)[4]) const {
  if (!returnPreset) {
    LYLOG_E("returnPreset is null");
    return false;
  }
  for (size_t k = 0; k < mImages.size(); ++k) mImages[k]->getDrawRect(returnPreset[k]);
  return true;
}
