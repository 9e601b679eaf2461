#pragma once
// A decoded image: an owned, packed pixel buffer with its size and colour
// format. The application works in format 8 (B, G, R, A bytes, premultiplied
// alpha), which is cairo's ARGB32 on a little-endian machine.

#include <cstddef>
#include <cstdint>

// Colour format codes of a Bitmap.
enum BitmapColorFormat : int {
  BITMAP_FORMAT_RGB565 = 0,    // 2 bytes per pixel (also every unknown code)
  BITMAP_FORMAT_YUV420 = 2,    // planar Y, then U and V of ceil(w/2) x ceil(h/2)
  BITMAP_FORMAT_ARGB_PNG = 5,  // format 7 with bytes 0 and 3 exchanged: A, G, B, R
  BITMAP_FORMAT_RGBA = 7,      // R, G, B, A: the PNG decoder's own order, straight alpha
  BITMAP_FORMAT_BGRA = 8,      // B, G, R, A premultiplied: cairo ARGB32 (little-endian)
};

class Bitmap {
 public:
  Bitmap() = default;
  virtual ~Bitmap();
  Bitmap(const Bitmap&) = delete;
  Bitmap& operator=(const Bitmap&) = delete;

  unsigned char* getPixels() const { return mPixels; }
  int getWidth() const { return mWidth; }
  int getHeight() const { return mHeight; }
  int getFormat() const { return mFormat; }
  // Bytes per row (rows are packed) and the size of the whole buffer; 0 for
  // the planar format, whose planes have their own strides.
  int getStride() const;
  size_t getByteSize() const;

  // Takes ownership of a malloc'ed buffer (freed with free), releasing the old one.
  void adopt(unsigned char* pixels, int width, int height, int format);
  // Gives up the buffer to the caller (who frees it with free); the bitmap is left empty.
  unsigned char* release();

  // Bytes per pixel of a packed format: 4 for 5, 7, 8; 2 for the rest (and 1 for YUV luma).
  static int bytesPerPixel(int format);
  // Buffer size of a w x h image in the format, or 0 when it would overflow.
  static size_t bufferSize(int width, int height, int format);

 private:
  unsigned char* mPixels = nullptr;
  int mWidth = 0;
  int mHeight = 0;
  int mFormat = BITMAP_FORMAT_BGRA;
};
