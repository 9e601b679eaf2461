#pragma once
// One cell of a grid layout: its rectangle (left, top, right, bottom
// fractions), its handlers and the minimum size stored in the style file.

#include <vector>

#include "common/CLyFloatRectangle.h"

class CLyGridHandlerInfo;
class JSONObject;

class CLyGridImageInfo {
 public:
  // Throws std::exception (after logging) when the object is malformed.
  explicit CLyGridImageInfo(const JSONObject* object);
  virtual ~CLyGridImageInfo();
  CLyGridImageInfo(const CLyGridImageInfo&) = delete;
  CLyGridImageInfo& operator=(const CLyGridImageInfo&) = delete;

  bool getDrawRect(float* rect) const;
  const CLyFloatRectangle& getRect() const { return mRect; }
  CLyGridHandlerInfo* getHandlerInfo(int nIndex) const;
  int getHandlerCount() const { return static_cast<int>(mHandlers.size()); }
  float getMinWidth() const { return mMinWidth; }
  float getMinHeight() const { return mMinHeight; }
  // Takes ownership; a null handler is refused.
  void addHandler(CLyGridHandlerInfo* handler);

 private:
  CLyFloatRectangle mRect{0.0f, 0.0f, 0.0f, 0.0f};
  std::vector<CLyGridHandlerInfo*> mHandlers;
  float mMinWidth = 0.0f;
  float mMinHeight = 0.0f;
};
