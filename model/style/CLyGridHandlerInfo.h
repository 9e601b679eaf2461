#pragma once
// One drag handler of a grid cell: where its knob sits and how a drag of it
// changes every cell of the layout.

#include <cstdint>

class CLyFloatRectangle;
class JSONObject;

class CLyGridHandlerInfo {
 public:
  static constexpr int kMaxImages = 6;
  // Direction flags: which way a positive drag moves the divider.
  static constexpr int32_t kDirR = 1, kDirL = 2, kDirU = 4, kDirD = 8;

  // Throws std::exception (after logging) when the object is malformed.
  explicit CLyGridHandlerInfo(const JSONObject* object);
  virtual ~CLyGridHandlerInfo() = default;

  bool getPostion(float* x, float* y, int* pImageIndex) const;
  // Change of photo i for a drag of (dx, dy) collage fractions, as left
  // shift, top shift, width change, height change.
  void getImageVariation(int nImageIndex, float dx, float dy, CLyFloatRectangle* p_rectVariation) const;

  int32_t getDirection() const { return mDirection; }
  int32_t getImageCount() const { return mImageCount; }

 private:
  float mX = 0.0f;
  float mY = 0.0f;
  int32_t mBaseImageId = 0;
  int32_t mDirection = 0;
  float mHVariation[kMaxImages][2] = {};
  float mVVariation[kMaxImages][2] = {};
  int32_t mImageCount = 0;
};
