#pragma once
// Decodes one photo on a thread of its own: no larger than the maximum
// decoding size (the screen), turned upright by its EXIF orientation, and
// handed to the listener together with the source item index.

#include <string>

#include "common/CLyThread.h"

class ILyMultiGridListener;

class CLyImageDecoderThread : public CLyThread {
 public:
  CLyImageDecoderThread() = default;
  ~CLyImageDecoderThread() override;

  // Stores the three values; always true.
  bool set(int index, const std::string& path, ILyMultiGridListener* listener);
  // Upper bound of the decoded size of the upright image.
  void setMaxDecodingSize(float width, float height);

  void run() override;

  // The decoding target of a w x h image whose EXIF orientation is given,
  // within maxW x maxH once upright; never enlarged, never below 1 x 1.
  static void computeTarget(int w, int h, int orientation, float maxW, float maxH, int* targetW,
                            int* targetH);
  // EXIF orientation to a turn code of BitmapFactory::rotate (0 for none):
  // 3 -> 2, 6 -> 1, 8 -> 3; mirrored and unknown values are not turned.
  static int rotationForOrientation(int orientation);

 private:
  int mIndex = 0;
  float mMaxDecodingWidth = 720.0f;
  float mMaxDecodingHeight = 1280.0f;
  ILyMultiGridListener* mListener = nullptr;
  std::string mPath;
};
