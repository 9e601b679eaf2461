#include "model/style/CLyGridHandlerInfo.h"

#include <cmath>
#include <cstring>
#include <memory>

#include "common/CLyFloatRectangle.h"
#include "common/CLyLog.h"
#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "model/style/CLyStyleParseError.h"

namespace {

int32_t parseDirection(const std::string& text) {
  static const struct {
    const char* name;
    int32_t flags;
  } kDirections[] = {
      {"R", CLyGridHandlerInfo::kDirR},
      {"L", CLyGridHandlerInfo::kDirL},
      {"U", CLyGridHandlerInfo::kDirU},
      {"D", CLyGridHandlerInfo::kDirD},
      {"RU", CLyGridHandlerInfo::kDirR | CLyGridHandlerInfo::kDirU},
      {"UR", CLyGridHandlerInfo::kDirR | CLyGridHandlerInfo::kDirU},
      {"RD", CLyGridHandlerInfo::kDirR | CLyGridHandlerInfo::kDirD},
      {"DR", CLyGridHandlerInfo::kDirR | CLyGridHandlerInfo::kDirD},
      {"LU", CLyGridHandlerInfo::kDirL | CLyGridHandlerInfo::kDirU},
      {"UL", CLyGridHandlerInfo::kDirL | CLyGridHandlerInfo::kDirU},
      {"LD", CLyGridHandlerInfo::kDirL | CLyGridHandlerInfo::kDirD},
      {"DL", CLyGridHandlerInfo::kDirL | CLyGridHandlerInfo::kDirD},
  };
  for (const auto& d : kDirections) {
    if (text == d.name) return d.flags;
  }
  LYLOG_E("Failed to get direction");
  return 0;
}

// A number the geometry can use; NaN and infinities would poison every
// later computation, so the file is refused instead.
float finiteFloat(double value, const char* what) {
  if (!std::isfinite(value) || std::fabs(value) > 1.0e6) {
    LYLOG_E("%s is not a usable number", what);
    throw CLyStyleParseError("number out of range");
  }
  return static_cast<float>(value);
}

// Reads "h_variation" or "v_variation" into table; at most kMaxImages pairs.
void readVariation(const JSONObject* object, const char* key, float (*table)[2]) {
  std::unique_ptr<JSONArray> pArray(object->getArray(key));
  if (!pArray) {
    LYLOG_E("hVariation is null! pArray is nullptr!");
    throw CLyStyleParseError("variation missing");
  }
  const int length = pArray->getLength();
  if (length > CLyGridHandlerInfo::kMaxImages) {
    LYLOG_E("%s has %d entries, at most %d are allowed", key, length, CLyGridHandlerInfo::kMaxImages);
    throw CLyStyleParseError("variation too long");
  }
  for (int i = 0; i < length; ++i) {
    std::unique_ptr<JSONArray> pArray2(pArray->getArray(i));
    if (!pArray2) {
      LYLOG_E("pArray2 is nullptr!");
      throw CLyStyleParseError("variation entry is not an array");
    }
    const int count = pArray2->getLength() < 2 ? pArray2->getLength() : 2;
    for (int j = 0; j < count; ++j) table[i][j] = finiteFloat(pArray2->getDouble(j), key);
  }
}

}  // namespace

CLyGridHandlerInfo::CLyGridHandlerInfo(const JSONObject* object) {
  if (!object) {
    LYLOG_E("object is nullptr!");
    throw CLyStyleParseError("handler object missing");
  }
  mX = finiteFloat(object->getDouble("x"), "x");
  mY = finiteFloat(object->getDouble("y"), "y");
  mBaseImageId = object->getInt("base_image_id");
  mDirection = parseDirection(object->getString("direction"));
  readVariation(object, "h_variation", mHVariation);
  readVariation(object, "v_variation", mVVariation);
  mImageCount = object->getInt("image_count");
  if (mImageCount < 0 || mImageCount > kMaxImages) {
    LYLOG_E("image_count(%d) is invalid!", mImageCount);
    throw CLyStyleParseError("image_count out of range");
  }
}

bool CLyGridHandlerInfo::getPostion(float* x, float* y, int* pImageIndex) const {
  if (!x || !y || !pImageIndex) {
    LYLOG_E("x = %p, y = %p, pImageIndex = %p", static_cast<void*>(x), static_cast<void*>(y),
            static_cast<void*>(pImageIndex));
    return false;
  }
  *x = mX;
  *y = mY;
  *pImageIndex = mBaseImageId;
  return true;
}

void CLyGridHandlerInfo::getImageVariation(int nImageIndex, float dx, float dy,
                                           CLyFloatRectangle* p_rectVariation) const {
  if (!p_rectVariation) {
    LYLOG_E("p_rectVariation is nullptr!");
    return;
  }
  if (nImageIndex < 0 || nImageIndex >= mImageCount) {
    LYLOG_E("nImageIndex(%d) is incorrect!", nImageIndex);
    return;
  }
  const float sh = (mDirection & kDirR) ? 1.0f : -1.0f;
  const float sv = (mDirection & kDirD) ? 1.0f : -1.0f;
  p_rectVariation->set(sh * mHVariation[nImageIndex][0] * dx, sv * mVVariation[nImageIndex][0] * dy,
                       sh * mHVariation[nImageIndex][1] * dx, sv * mVVariation[nImageIndex][1] * dy);
}
