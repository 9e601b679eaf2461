#pragma once
// The options record handed to every decode call of BitmapFactory. The
// application sets colorFormat; parseImage fills outWidth, outHeight and
// imageType; initPNGFile keeps the open PNG decoder here until decodePNG.

#include <cstdint>
#include <memory>

#include "codec/Bitmap.h"

// Image type codes, found from the first bytes of a file.
enum ImageType : int {
  IMAGE_TYPE_UNKNOWN = 0,
  IMAGE_TYPE_JPEG = 1,
  IMAGE_TYPE_BMP = 2,
  IMAGE_TYPE_PNG = 3,
  IMAGE_TYPE_GIF = 4,
  IMAGE_TYPE_WBMP = 5,
  IMAGE_TYPE_GIF2 = 6,  // a second GIF-family type, decoded by the GIF decoder
};

namespace BitmapFactory {
struct PngReader;  // the open PNG decoder between initPNGFile and decodePNG
}

struct DecodeOptions {
  int32_t colorFormat = BITMAP_FORMAT_RGBA;
  int32_t sampleSize = 1;
  int32_t reserved1 = 0;
  int32_t reserved2 = 0;
  int32_t openFlags = 0;  // handed to the decoder when a file is opened; unused today
  bool flag1 = false;
  bool flag2 = false;
  int32_t handle = 0;  // must be 0 when a call begins
  int32_t outWidth = 0;
  int32_t outHeight = 0;
  // Working state of the PNG decoder between initPNGFile and decodePNG.
  int32_t pngWidth = 0;
  int32_t pngHeight = 0;
  int32_t pngPasses = 0;
  int32_t imageType = IMAGE_TYPE_UNKNOWN;
  std::shared_ptr<BitmapFactory::PngReader> png;
};
