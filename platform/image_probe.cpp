#include "platform/image_probe.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <vector>

namespace platform_image {

namespace {

// Header bytes enough for every type but JPEG, whose size sits in a frame
// segment that may follow large metadata segments.
constexpr size_t kHeaderBytes = 64;
// Limits reading a corrupt JPEG's chain of segments.
constexpr int kMaxJpegSegments = 4096;

uint32_t be16(const unsigned char* p) {
  return (p[0] << 8) | p[1];
}
uint32_t be32(const unsigned char* p) {
  return (uint32_t(p[0]) << 24) | (uint32_t(p[1]) << 16) | (uint32_t(p[2]) << 8) | p[3];
}
uint32_t le16(const unsigned char* p) {
  return p[0] | (p[1] << 8);
}
int32_t le32(const unsigned char* p) {
  return int32_t(uint32_t(p[0]) | (uint32_t(p[1]) << 8) | (uint32_t(p[2]) << 16) | (uint32_t(p[3]) << 24));
}

bool validSize(int w, int h) {
  return w > 0 && h > 0 && w <= 1 << 20 && h <= 1 << 20;
}

bool probeJpeg(FILE* f, ProbeResult& r) {
  if (fseek(f, 2, SEEK_SET) != 0) return false;
  for (int i = 0; i < kMaxJpegSegments; ++i) {
    int c = fgetc(f);
    if (c != 0xFF) return false;
    int marker;
    do {
      marker = fgetc(f);
    } while (marker == 0xFF);
    if (marker == EOF || marker == 0xD9 || marker == 0xDA) return false;
    if (marker == 0x01 || (marker >= 0xD0 && marker <= 0xD7)) continue;  // no length
    unsigned char len[2];
    if (fread(len, 1, 2, f) != 2) return false;
    uint32_t length = be16(len);
    if (length < 2) return false;
    bool sof = marker >= 0xC0 && marker <= 0xCF && marker != 0xC4 && marker != 0xC8 && marker != 0xCC;
    if (sof) {
      unsigned char frame[5];
      if (length < 7 || fread(frame, 1, 5, f) != 5) return false;
      r.mimeType = "image/jpeg";
      r.height = int(be16(frame + 1));
      r.width = int(be16(frame + 3));
      return validSize(r.width, r.height);
    }
    if (fseek(f, long(length) - 2, SEEK_CUR) != 0) return false;
  }
  return false;
}

// WBMP: type 0, fix header 0, then width and height as multi-byte integers.
bool probeWbmp(const unsigned char* h, size_t n, ProbeResult& r) {
  if (n < 4 || h[0] != 0 || h[1] != 0) return false;
  size_t pos = 2;
  uint32_t values[2] = {0, 0};
  for (uint32_t& value : values) {
    int bytes = 0;
    for (;;) {
      if (pos >= n || ++bytes > 4) return false;
      unsigned char c = h[pos++];
      value = (value << 7) | (c & 0x7F);
      if (!(c & 0x80)) break;
    }
  }
  r.mimeType = "image/vnd.wap.wbmp";
  r.width = int(values[0]);
  r.height = int(values[1]);
  return validSize(r.width, r.height);
}

}  // namespace

bool probe(const char* path, ProbeResult& result) {
  if (!path) return false;
  FILE* f = fopen(path, "rb");
  if (!f) return false;
  unsigned char h[kHeaderBytes] = {};
  size_t n = fread(h, 1, sizeof(h), f);
  bool ok = false;
  if (n >= 3 && h[0] == 0xFF && h[1] == 0xD8 && h[2] == 0xFF) {
    ok = probeJpeg(f, result);
  } else if (n >= 24 && memcmp(h, "\x89PNG\r\n\x1a\n", 8) == 0 && memcmp(h + 12, "IHDR", 4) == 0) {
    result.mimeType = "image/png";
    result.width = int(be32(h + 16));
    result.height = int(be32(h + 20));
    ok = validSize(result.width, result.height);
  } else if (n >= 10 && (memcmp(h, "GIF87a", 6) == 0 || memcmp(h, "GIF89a", 6) == 0)) {
    result.mimeType = "image/gif";
    result.width = int(le16(h + 6));
    result.height = int(le16(h + 8));
    ok = validSize(result.width, result.height);
  } else if (n >= 26 && h[0] == 'B' && h[1] == 'M') {
    uint32_t dib = uint32_t(le32(h + 14));
    result.mimeType = "image/bmp";
    if (dib == 12) {
      result.width = int(le16(h + 18));
      result.height = int(le16(h + 20));
    } else if (dib >= 40) {
      result.width = le32(h + 18);
      int32_t height = le32(h + 22);
      // Top-down bitmaps store a negative height.
      result.height = height == INT32_MIN ? 0 : (height < 0 ? -height : height);
    }
    ok = validSize(result.width, result.height);
  } else {
    ok = probeWbmp(h, n, result);
  }
  fclose(f);
  return ok;
}

}  // namespace platform_image
