#pragma once
// One grid layout: an ordered list of cells, cell k showing photo k.

#include <vector>

class CLyGridImageInfo;
class JSONObject;

class CLyGridImageLayoutInfo {
 public:
  static constexpr int kMaxImages = 6;

  // Throws std::exception (after logging) when the object is malformed.
  explicit CLyGridImageLayoutInfo(const JSONObject* object);
  virtual ~CLyGridImageLayoutInfo();
  CLyGridImageLayoutInfo(const CLyGridImageLayoutInfo&) = delete;
  CLyGridImageLayoutInfo& operator=(const CLyGridImageLayoutInfo&) = delete;

  CLyGridImageInfo* getImageInfo(int nIndex) const;
  int getImageCount() const { return static_cast<int>(mImages.size()); }
  // Writes cell k's left, top, right, bottom to returnPreset[k].
  bool getDrawRects(float (*returnPreset)[4]) const;

 private:
  std::vector<CLyGridImageInfo*> mImages;
};
