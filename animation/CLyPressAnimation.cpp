#include "animation/CLyPressAnimation.h"

#include <cstdlib>
#include <string>

#include "common/CLyCairoCanvas.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "platform/core/app_common.h"

namespace {
const char* const kAddPictureIcon = "images/collage_add_picture.png";
const int kPressAlpha = 125;
}  // namespace

int CLyPressAnimation::prepare(Evas_Object* owner, CLyCairoCanvas* canvas, const CLyFloatRectangle& cell,
                               int cornerRadius) {
  if (!owner) {
    LYLOG_E("Invalid view");
    return -1;
  }
  if (!canvas) {
    LYLOG_E("Invalid canvas");
    return -1;
  }
  mOwner = owner;
  mCanvas = canvas;
  mCell = cell;
  mRadius = cornerRadius;
  // A light grey stands in while no colour table is loaded.
  int r = 0x80, g = 0x80, b = 0x80, a = 0xff;
  CLyUtil::getThemeColor(LY_COLOR_PRESS, &r, &g, &b, &a, nullptr, nullptr, nullptr, nullptr, nullptr, nullptr,
                         nullptr, nullptr);
  mPressColor = CLyFloatRectangle(r / 255.0f, g / 255.0f, b / 255.0f, kPressAlpha / 255.0f);
  return 0;
}

void CLyPressAnimation::draw(float factor, bool pressed) {
  if (!mCanvas) {
    LYLOG_E("Invalid canvas");
    return;
  }
  CLyFloatRectangle color(0.0f, 0.0f, 0.0f, 1.0f);
  if (pressed) {
    color = mPressColor;
    color.y2 = mPressColor.y2 * factor;
  }
  mCanvas->fillRoundRect(color, mCell, mRadius, mRadius);
  char* res = app_get_resource_path();
  if (!res) {
    LYLOG_E("Invalid res path");
  } else {
    std::string icon = std::string(res) + kAddPictureIcon;
    free(res);
    mCanvas->drawIcon(icon.c_str(), mCell);
  }
  mCanvas->update(mCell);
}
