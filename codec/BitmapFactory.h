#pragma once
// The bitmap decoding facade: parse a file's header, decode a file to an
// exact target size, decode PNG files, make, copy and turn bitmaps. Every
// function keeps no shared state and may run on any thread, except that the
// caller serialises initPNGFile/decodePNG pairs. Failures log under the tag
// "IV-COMMON" and return null or 0.

#include <string>

#include "codec/Bitmap.h"
#include "codec/DecodeOptions.h"

namespace BitmapFactory {

// Any image whose header claims more pixels than this is refused before
// anything is allocated for it.
constexpr long long kMaxImagePixels = 100000000LL;
// Nor is any image wider or higher than this (the JPEG and GIF limit), which
// keeps every row buffer of a decoder small.
constexpr long long kMaxImageSide = 65535;
// decodeFile targets must lie in 1..kMaxDecodeSide - 1 on each side.
constexpr int kMaxDecodeSide = 3000;

// A new bitmap with a zero-filled buffer; null (logged) when it cannot be allocated.
Bitmap* createBitmap(int width, int height, int format);
// The file's length in bytes; 0 when it cannot be opened or is empty.
long getFileSize(const std::string& path);
// Reads the header: sets outWidth, outHeight and imageType; 1 on success
// (also for an unknown type, code 0), 0 on failure.
int parseImage(const std::string& path, DecodeOptions& options);
// True for the types decodeFile takes: JPEG, BMP, GIF, WBMP (1, 2, 4, 5, 6).
bool isSupportedType(int type);
// The whole image scaled to exactly width x height in options.colorFormat;
// null on failure. flag is passed as 0.
Bitmap* decodeFile(const std::string& path, DecodeOptions& options, int width, int height, int flag);
// Opens a PNG for decoding and keeps the decoder in the options; 1 on success.
int initPNGFile(DecodeOptions& options, const std::string& path);
// Decodes the PNG opened by initPNGFile into the bitmap's buffer at width x
// height (the bitmap's size) in options.colorFormat; 1 on success.
int decodePNG(DecodeOptions& options, Bitmap& bitmap, int width, int height);
// Turns the pixels in place: 0 none, 1 clockwise, 2 half turn, 3 counter-clockwise.
void rotate(Bitmap& bitmap, int rotation);
// A new bitmap with a copy of the pixels; null when there is nothing to copy.
Bitmap* clone(Bitmap& bitmap);
// Writes width x height pixels of 4 bytes (B, G, R, unused), rows `stride`
// bytes apart, to `path` as a baseline 4:2:0 JPEG of the quality (1-100).
// False (logged) on bad arguments or any write error; the file may then be
// incomplete, and the caller removes it.
bool writeJpegBgrx(const unsigned char* pixels, int width, int height, int stride, int quality,
                   const std::string& path);

}  // namespace BitmapFactory
