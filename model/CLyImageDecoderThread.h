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
  // The largest area (upright, in pixels) the photo will be drawn into. A
  // JPEG is then decoded at the smallest DCT scale that still covers it when
  // that is below the maximum decoding size: the bitmap is for this drawing
  // alone (a save), not for the screen. 0 x 0 (the default) turns it off.
  void setCoverSize(float width, float height);

  void run() override;

  // The decoding target of a w x h image whose EXIF orientation is given,
  // within maxW x maxH once upright; never enlarged, never below 1 x 1.
  static void computeTarget(int w, int h, int orientation, float maxW, float maxH, int* targetW,
                            int* targetH);
  // EXIF orientation to a turn code of BitmapFactory::rotate (0 for none):
  // 3 -> 2, 6 -> 1, 8 -> 3; mirrored and unknown values are not turned.
  static int rotationForOrientation(int orientation);
  // Shrinks the target *targetW x *targetH (stored orientation, from
  // computeTarget) of a w x h JPEG to the smallest of the 1/8, 1/4 and 1/2
  // DCT scales whose upright image still covers coverW x coverH; the DCT size
  // is decoded without any resampling. Leaves the target as it is when no
  // such scale is smaller.
  static void computeCoverTarget(int w, int h, int orientation, float coverW, float coverH, int* targetW,
                                 int* targetH);

 private:
  int mIndex = 0;
  float mMaxDecodingWidth = 720.0f;
  float mMaxDecodingHeight = 1280.0f;
  float mCoverWidth = 0.0f;
  float mCoverHeight = 0.0f;
  ILyMultiGridListener* mListener = nullptr;
  std::string mPath;
};
