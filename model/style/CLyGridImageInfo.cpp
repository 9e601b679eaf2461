#include "model/style/CLyGridImageInfo.h"

#include <cmath>
#include <memory>

#include "common/CLyLog.h"
#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyStyleParseError.h"

namespace {

float finiteFraction(double value) {
  if (!std::isfinite(value) || std::fabs(value) > 1.0e6) {
    LYLOG_E("rect value is not a usable number");
    throw CLyStyleParseError("rect value out of range");
  }
  return static_cast<float>(value);
}

}  // namespace

CLyGridImageInfo::CLyGridImageInfo(const JSONObject* object) {
  if (!object) {
    LYLOG_E("object is nullptr!");
    throw CLyStyleParseError("cell object missing");
  }
  std::unique_ptr<JSONArray> pArray(object->getArray("rect"));
  std::unique_ptr<JSONArray> handlers(object->getArray("handlers"));
  if (!pArray || !handlers) {
    LYLOG_E("pArray is nullptr!");
    throw CLyStyleParseError("rect or handlers missing");
  }
  float edges[4] = {0.0f, 0.0f, 0.0f, 0.0f};
  const int count = pArray->getLength() < 4 ? pArray->getLength() : 4;
  for (int i = 0; i < count; ++i) edges[i] = finiteFraction(pArray->getDouble(i));
  mRect.set(edges[0], edges[1], edges[2], edges[3]);
  mMinWidth = finiteFraction(object->getDouble("min_width"));
  mMinHeight = finiteFraction(object->getDouble("min_height"));

  const int handlerCount = handlers->getLength();
  try {
    for (int i = 0; i < handlerCount; ++i) {
      std::unique_ptr<JSONObject> __obj(handlers->getObject(i));
      if (!__obj) {
        LYLOG_E("__obj is nullptr!");
        throw CLyStyleParseError("handler is not an object");
      }
      addHandler(new CLyGridHandlerInfo(__obj.get()));
    }
  } catch (...) {
    for (CLyGridHandlerInfo* handler : mHandlers) delete handler;
    mHandlers.clear();
    throw;
  }
}

CLyGridImageInfo::~CLyGridImageInfo() {
  for (CLyGridHandlerInfo* handler : mHandlers) delete handler;
}

bool CLyGridImageInfo::getDrawRect(float* rect) const {
  if (!rect) {
    LYLOG_E("rect is nullptr");
    return false;
  }
  rect[0] = mRect.x1;
  rect[1] = mRect.y1;
  rect[2] = mRect.x2;
  rect[3] = mRect.y2;
  return true;
}

CLyGridHandlerInfo* CLyGridImageInfo::getHandlerInfo(int nIndex) const {
  if (nIndex < 0 || nIndex >= getHandlerCount()) {
    LYLOG_E("nIndex(%d) is bigger and equal than size(%d)", nIndex, getHandlerCount());
    return nullptr;
  }
  return mHandlers[nIndex];
}

void CLyGridImageInfo::addHandler(CLyGridHandlerInfo* handler) {
  if (!handler) {
    LYLOG_E("handler is nullptr!");
    return;
  }
  mHandlers.push_back(handler);
}
