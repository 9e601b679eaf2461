#pragma once
// The per-format decoders behind BitmapFactory. Each reads the header for
// the image size, or decodes the whole image scaled to exactly outW x outH
// into `out` (outW x outH premultiplied B, G, R, A pixels). All of them read
// the file as they go and never hold the full-size image when it is larger
// than the target (except an interlaced GIF, one byte per pixel).

#include <cstdint>
#include <cstdio>
#include <string>

namespace BitmapFactory {

struct ImageHeader {
  int type = 0;  // image type code
  long long width = 0;
  long long height = 0;
};

// Sniffs the type from the first bytes and reads the size from the header.
// False when the file cannot be opened or its header is unreadable; a file
// of no known type gives true with type 0 and size 0 x 0.
bool readImageHeader(const std::string& path, ImageHeader& header);
int sniffImageType(const unsigned char* bytes, size_t length);
// Within the size limits of BitmapFactory (sides and pixel count).
bool imageSizeAcceptable(long long width, long long height);

bool readJpegSize(FILE* file, long long& width, long long& height);
bool readPngSize(FILE* file, long long& width, long long& height);
bool readGifSize(FILE* file, long long& width, long long& height);
bool readBmpSize(FILE* file, long long& width, long long& height);
bool readWbmpSize(FILE* file, long long& width, long long& height);

bool decodeJpeg(FILE* file, int outW, int outH, uint8_t* out);
bool decodeGif(FILE* file, int outW, int outH, uint8_t* out);
bool decodeBmp(FILE* file, int outW, int outH, uint8_t* out);
bool decodeWbmp(FILE* file, int outW, int outH, uint8_t* out);

// Pixel helpers shared by the decoders.
void premultiplyRow(uint8_t* bgra, int width);
// Turns a w x h premultiplied BGRA buffer into `format` in `dst` (which may
// be `src` for the 4-byte formats).
void convertFromBgra(const uint8_t* src, int width, int height, int format, uint8_t* dst);

}  // namespace BitmapFactory
