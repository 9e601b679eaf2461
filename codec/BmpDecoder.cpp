// A strict decoder of Windows bitmaps: 1, 4, 8, 16, 24 and 32 bits per
// pixel, uncompressed or with bit fields, RLE8 and RLE4, bottom-up and
// top-down. Rows are read in file order straight into the Resampler (which
// turns a bottom-up image the right way up), so nothing full-size is held.
// Anything that does not add up (sizes, palette, offsets) is refused.

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>
#include <vector>

#include "codec/BitmapFactory.h"
#include "codec/CodecLog.h"
#include "codec/ImageDecoders.h"
#include "codec/Resampler.h"

namespace BitmapFactory {
namespace {

enum { kRgb = 0, kRle8 = 1, kRle4 = 2, kBitfields = 3, kAlphaBitfields = 6 };

uint32_t le32(const uint8_t* p) {
  return p[0] | (p[1] << 8) | (p[2] << 16) | (static_cast<uint32_t>(p[3]) << 24);
}
uint16_t le16(const uint8_t* p) {
  return static_cast<uint16_t>(p[0] | (p[1] << 8));
}

struct BmpInfo {
  uint32_t dataOffset = 0;
  long long width = 0;
  long long height = 0;  // always positive here; topDown says the row order
  bool topDown = false;
  int bpp = 0;
  int compression = kRgb;
  uint32_t masks[4] = {0, 0, 0, 0};  // red, green, blue, alpha
  std::vector<uint8_t> palette;      // B, G, R per entry
  int paletteSize = 0;
};

bool readInfo(FILE* file, BmpInfo& info, bool withPalette) {
  uint8_t head[14 + 124];
  if (fread(head, 1, 18, file) != 18 || head[0] != 'B' || head[1] != 'M') return false;
  info.dataOffset = le32(head + 10);
  const uint32_t infoSize = le32(head + 14);
  if (infoSize != 12 && (infoSize < 40 || infoSize > 124)) {
    IVLOG_E("unknown header size %u", infoSize);
    return false;
  }
  if (fread(head + 18, 1, infoSize - 4, file) != infoSize - 4) return false;
  const uint8_t* h = head + 14;
  long long height;
  if (infoSize == 12) {
    info.width = le16(h + 4);
    height = le16(h + 6);
    info.bpp = le16(h + 10);
  } else {
    info.width = static_cast<int32_t>(le32(h + 4));
    height = static_cast<int32_t>(le32(h + 8));
    info.bpp = le16(h + 14);
    info.compression = static_cast<int>(le32(h + 16));
  }
  info.topDown = height < 0;
  info.height = height < 0 ? -height : height;
  if (info.width < 0) return false;
  switch (info.bpp) {
    case 1:
    case 4:
    case 8:
    case 16:
    case 24:
    case 32:
      break;
    default:
      IVLOG_E("%d bits per pixel not supported", info.bpp);
      return false;
  }
  const int c = info.compression;
  const bool okCompression =
      (c == kRgb) || (c == kRle8 && info.bpp == 8) || (c == kRle4 && info.bpp == 4) ||
      ((c == kBitfields || c == kAlphaBitfields) && (info.bpp == 16 || info.bpp == 32));
  if (!okCompression || ((c == kRle8 || c == kRle4) && info.topDown)) {
    IVLOG_E("compression %d with %d bits per pixel not supported", c, info.bpp);
    return false;
  }
  if (!withPalette) return true;

  long pos = 14 + static_cast<long>(infoSize);
  if (c == kBitfields || c == kAlphaBitfields) {
    const int count = (c == kAlphaBitfields || infoSize >= 56) ? 4 : 3;
    if (infoSize >= 52) {
      for (int i = 0; i < 3; ++i) info.masks[i] = le32(h + 40 + 4 * i);
      if (infoSize >= 56) info.masks[3] = le32(h + 52);
    } else {
      uint8_t m[16];
      if (fread(m, 1, 4 * count, file) != static_cast<size_t>(4 * count)) return false;
      for (int i = 0; i < count; ++i) info.masks[i] = le32(m + 4 * i);
      pos += 4 * count;
    }
  } else if (info.bpp == 16) {
    info.masks[0] = 0x7c00;
    info.masks[1] = 0x03e0;
    info.masks[2] = 0x001f;
  } else if (info.bpp == 32) {
    info.masks[0] = 0xff0000;
    info.masks[1] = 0x00ff00;
    info.masks[2] = 0x0000ff;  // the fourth byte of plain 32-bit rows is padding
  }
  if (info.bpp <= 8) {
    const int entry = infoSize == 12 ? 3 : 4;
    uint32_t used = infoSize >= 40 ? le32(h + 32) : 0;
    const uint32_t most = 1u << info.bpp;
    if (used == 0 || used > most) used = most;
    std::vector<uint8_t> raw(static_cast<size_t>(used) * entry);
    const size_t got = fread(raw.data(), 1, raw.size(), file);
    info.paletteSize = static_cast<int>(got / entry);
    if (info.paletteSize == 0) {
      IVLOG_E("no palette");
      return false;
    }
    info.palette.resize(static_cast<size_t>(info.paletteSize) * 3);
    for (int i = 0; i < info.paletteSize; ++i) memcpy(&info.palette[i * 3], &raw[i * entry], 3);
  }
  (void)pos;
  return true;
}

// Shift and width of a channel mask, to spread its bits over 0..255.
struct Channel {
  uint32_t mask = 0;
  int shift = 0;
  int bits = 0;
  uint8_t get(uint32_t v) const {
    if (!mask || !bits) return 0;
    const uint32_t x = (v & mask) >> shift;
    if (bits >= 8) return static_cast<uint8_t>(x >> (bits - 8));
    return static_cast<uint8_t>((x * 255 + ((1u << bits) - 1) / 2) / ((1u << bits) - 1));
  }
};

Channel channelOf(uint32_t mask) {
  Channel c;
  c.mask = mask;
  if (!mask) return c;
  while (!((mask >> c.shift) & 1)) ++c.shift;
  while (c.shift + c.bits < 32 && ((mask >> (c.shift + c.bits)) & 1)) ++c.bits;
  return c;
}

class RowWriter {
 public:
  RowWriter(const BmpInfo& info, Resampler& resampler) : mInfo(info), mResampler(resampler) {
    for (int i = 0; i < 4; ++i) mChannels[i] = channelOf(info.masks[i]);
  }
  void paletteColour(int index, uint8_t* out) {
    if (index < mInfo.paletteSize) {
      memcpy(out, &mInfo.palette[index * 3], 3);
    } else {
      out[0] = out[1] = out[2] = 0;  // an index beyond the palette shows black
      if (!mWarned) IVLOG_D("palette index %d out of range", index);
      mWarned = true;
    }
    out[3] = 255;
  }
  // One uncompressed file row to BGRA.
  void convert(const uint8_t* src, uint8_t* out) {
    const int w = static_cast<int>(mInfo.width);
    switch (mInfo.bpp) {
      case 1:
      case 4:
      case 8: {
        const int bpp = mInfo.bpp, perByte = 8 / bpp, mask = (1 << bpp) - 1;
        for (int x = 0; x < w; ++x) {
          const int shift = 8 - bpp * (x % perByte + 1);
          paletteColour((src[x / perByte] >> shift) & mask, out + x * 4);
        }
        break;
      }
      case 24:
        for (int x = 0; x < w; ++x) {
          out[x * 4] = src[x * 3];
          out[x * 4 + 1] = src[x * 3 + 1];
          out[x * 4 + 2] = src[x * 3 + 2];
          out[x * 4 + 3] = 255;
        }
        break;
      default: {
        const bool alpha = mChannels[3].mask != 0;
        for (int x = 0; x < w; ++x) {
          const uint32_t v = mInfo.bpp == 16 ? le16(src + x * 2) : le32(src + x * 4);
          uint8_t* p = out + x * 4;
          p[0] = mChannels[2].get(v);
          p[1] = mChannels[1].get(v);
          p[2] = mChannels[0].get(v);
          p[3] = alpha ? mChannels[3].get(v) : 255;
        }
        if (alpha) premultiplyRow(out, w);
        break;
      }
    }
  }
  void push(const uint8_t* row) { mResampler.pushRow(row); }

 private:
  const BmpInfo& mInfo;
  Resampler& mResampler;
  Channel mChannels[4];
  bool mWarned = false;
};

bool decodeRle(FILE* file, const BmpInfo& info, RowWriter& writer, std::vector<uint8_t>& row) {
  const int w = static_cast<int>(info.width), h = static_cast<int>(info.height);
  const bool four = info.compression == kRle4;
  int x = 0, y = 0;
  std::fill(row.begin(), row.end(), 0);
  auto nextRow = [&]() {
    writer.push(row.data());
    std::fill(row.begin(), row.end(), 0);
    x = 0;
    ++y;
  };
  auto put = [&](int index) {
    if (x < w) writer.paletteColour(index, &row[static_cast<size_t>(x) * 4]);
    ++x;
  };
  while (y < h) {
    const int count = getc(file);
    const int value = getc(file);
    if (count == EOF || value == EOF) break;  // a short file: the rest stays transparent
    if (count > 0) {
      for (int i = 0; i < count && x < w; ++i) put(four ? ((i & 1) ? value & 15 : value >> 4) : value);
      continue;
    }
    if (value == 0) {
      nextRow();
    } else if (value == 1) {
      break;
    } else if (value == 2) {
      const int dx = getc(file), dy = getc(file);
      if (dx == EOF || dy == EOF) break;
      x += dx;
      for (int i = 0; i < dy && y < h; ++i) {
        const int keepX = x;
        nextRow();
        x = keepX;
      }
    } else {
      const int bytes = four ? (value + 1) / 2 : value;
      uint8_t literal[256];
      if (fread(literal, 1, static_cast<size_t>(bytes), file) != static_cast<size_t>(bytes)) break;
      for (int i = 0; i < value && x < w; ++i)
        put(four ? ((i & 1) ? literal[i / 2] & 15 : literal[i / 2] >> 4) : literal[i]);
      if (bytes & 1) getc(file);  // literal runs are padded to 16 bits
    }
  }
  if (y < h && x > 0) writer.push(row.data());
  return true;
}

}  // namespace

bool readBmpSize(FILE* file, long long& width, long long& height) {
  BmpInfo info;
  if (!readInfo(file, info, false)) return false;
  width = info.width;
  height = info.height;
  return true;
}

bool decodeBmp(FILE* file, int outW, int outH, uint8_t* out) {
  BmpInfo info;
  try {
    if (!readInfo(file, info, true)) return false;
  } catch (const std::bad_alloc&) {
    return false;
  }
  if (!imageSizeAcceptable(info.width, info.height)) return false;
  const int w = static_cast<int>(info.width), h = static_cast<int>(info.height);
  if (fseek(file, static_cast<long>(info.dataOffset), SEEK_SET) != 0) return false;
  // Rows arrive bottom-up unless the height was negative.
  Resampler resampler(w, h, outW, outH, out, !info.topDown);
  if (!resampler.ok()) return false;
  RowWriter writer(info, resampler);
  std::vector<uint8_t> row, raw;
  const size_t stride = ((static_cast<size_t>(w) * info.bpp + 31) / 32) * 4;
  try {
    row.assign(static_cast<size_t>(w) * 4, 0);
    if (info.compression != kRle8 && info.compression != kRle4) raw.resize(stride);
  } catch (const std::bad_alloc&) {
    return false;
  }
  if (info.compression == kRle8 || info.compression == kRle4) {
    decodeRle(file, info, writer, row);
  } else {
    for (int y = 0; y < h; ++y) {
      if (fread(raw.data(), 1, stride, file) != stride) {
        IVLOG_E("file ends at row %d of %d", y, h);
        return false;
      }
      writer.convert(raw.data(), row.data());
      writer.push(row.data());
    }
  }
  resampler.finish();
  return true;
}

}  // namespace BitmapFactory
