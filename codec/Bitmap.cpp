#include "codec/Bitmap.h"

#include <cstdlib>

Bitmap::~Bitmap() {
  free(mPixels);
}

int Bitmap::bytesPerPixel(int format) {
  switch (format) {
    case BITMAP_FORMAT_ARGB_PNG:
    case BITMAP_FORMAT_RGBA:
    case BITMAP_FORMAT_BGRA:
      return 4;
    case BITMAP_FORMAT_YUV420:
      return 1;
    default:
      return 2;
  }
}

size_t Bitmap::bufferSize(int width, int height, int format) {
  if (width <= 0 || height <= 0) return 0;
  const unsigned long long w = static_cast<unsigned long long>(width);
  const unsigned long long h = static_cast<unsigned long long>(height);
  unsigned long long size;
  if (format == BITMAP_FORMAT_YUV420) {
    size = w * h + 2 * ((w + 1) / 2) * ((h + 1) / 2);
  } else {
    size = w * h * static_cast<unsigned long long>(bytesPerPixel(format));
  }
  if (size > static_cast<unsigned long long>(SIZE_MAX / 2)) return 0;
  return static_cast<size_t>(size);
}

int Bitmap::getStride() const {
  if (mFormat == BITMAP_FORMAT_YUV420) return 0;
  return mWidth * bytesPerPixel(mFormat);
}

size_t Bitmap::getByteSize() const {
  return bufferSize(mWidth, mHeight, mFormat);
}

void Bitmap::adopt(unsigned char* pixels, int width, int height, int format) {
  if (pixels != mPixels) free(mPixels);
  mPixels = pixels;
  mWidth = width;
  mHeight = height;
  mFormat = format;
}

unsigned char* Bitmap::release() {
  unsigned char* pixels = mPixels;
  mPixels = nullptr;
  mWidth = 0;
  mHeight = 0;
  return pixels;
}
