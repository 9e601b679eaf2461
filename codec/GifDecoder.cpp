// GIF through giflib: the first image of the file, placed on the logical
// screen, with the transparent colour of its graphic control block. Rows go
// straight to the Resampler; an interlaced image is gathered first (one
// byte per visible pixel) because its rows arrive out of order.

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>
#include <vector>

#include <gif_lib.h>

#include "codec/BitmapFactory.h"
#include "codec/CodecLog.h"
#include "codec/ImageDecoders.h"
#include "codec/Resampler.h"

namespace BitmapFactory {
namespace {

int readFromFile(GifFileType* gif, GifByteType* buffer, int length) {
  return static_cast<int>(fread(buffer, 1, static_cast<size_t>(length), static_cast<FILE*>(gif->UserData)));
}

struct GifCloser {
  GifFileType* gif;
  ~GifCloser() {
    if (gif) {
      int error = 0;
      DGifCloseFile(gif, &error);
    }
  }
};

GifFileType* openGif(FILE* file) {
  int error = 0;
  GifFileType* gif = DGifOpen(file, readFromFile, &error);
  if (!gif) IVLOG_E("giflib: %s", GifErrorString(error));
  return gif;
}

// Maps colour indexes of one row to premultiplied BGRA.
void paletteRow(const GifByteType* indexes, int count, const ColorMapObject* map, int transparent,
                uint8_t* out) {
  for (int i = 0; i < count; ++i, out += 4) {
    const int index = indexes[i];
    if (index == transparent) {
      out[0] = out[1] = out[2] = out[3] = 0;
    } else if (map && index < map->ColorCount) {
      const GifColorType& c = map->Colors[index];
      out[0] = c.Blue;
      out[1] = c.Green;
      out[2] = c.Red;
      out[3] = 255;
    } else if (!map) {
      out[0] = out[1] = out[2] = static_cast<uint8_t>(index);  // no colour table: grey ramp
      out[3] = 255;
    } else {
      out[0] = out[1] = out[2] = 0;  // index beyond the table: black
      out[3] = 255;
    }
  }
}

// Skips extensions up to the first image; picks up its transparent colour.
bool findFirstImage(GifFileType* gif, int& transparent) {
  transparent = NO_TRANSPARENT_COLOR;
  for (;;) {
    GifRecordType type;
    if (DGifGetRecordType(gif, &type) == GIF_ERROR) return false;
    if (type == IMAGE_DESC_RECORD_TYPE) return DGifGetImageDesc(gif) != GIF_ERROR;
    if (type == TERMINATE_RECORD_TYPE) {
      IVLOG_E("no image in the file");
      return false;
    }
    if (type != EXTENSION_RECORD_TYPE) return false;
    int code = 0;
    GifByteType* ext = nullptr;
    if (DGifGetExtension(gif, &code, &ext) == GIF_ERROR) return false;
    if (code == GRAPHICS_EXT_FUNC_CODE && ext && ext[0] >= 4) {
      GraphicsControlBlock gcb;
      if (DGifExtensionToGCB(ext[0], ext + 1, &gcb) == GIF_OK) transparent = gcb.TransparentColor;
    }
    while (ext) {
      if (DGifGetExtensionNext(gif, &ext) == GIF_ERROR) return false;
    }
  }
}

}  // namespace

bool readGifSize(FILE* file, long long& width, long long& height) {
  GifCloser closer{openGif(file)};
  if (!closer.gif) return false;
  width = closer.gif->SWidth;
  height = closer.gif->SHeight;
  return true;
}

bool decodeGif(FILE* file, int outW, int outH, uint8_t* out) {
  GifCloser closer{openGif(file)};
  GifFileType* gif = closer.gif;
  if (!gif) return false;
  const int screenW = gif->SWidth, screenH = gif->SHeight;
  if (!imageSizeAcceptable(screenW, screenH)) return false;
  int transparent = NO_TRANSPARENT_COLOR;
  if (!findFirstImage(gif, transparent)) return false;
  const GifImageDesc& desc = gif->Image;
  const int fw = desc.Width, fh = desc.Height, left = desc.Left, top = desc.Top;
  if (fw <= 0 || fh <= 0 || static_cast<long long>(fw) * fh > kMaxImagePixels) {
    IVLOG_E("image of %d x %d refused", fw, fh);
    return false;
  }
  const ColorMapObject* map = desc.ColorMap ? desc.ColorMap : gif->SColorMap;
  // The part of the image that lies on the screen.
  const int visX0 = std::min(left, screenW), visX1 = std::min(left + fw, screenW);
  const int visY0 = std::min(top, screenH), visY1 = std::min(top + fh, screenH);
  const int visW = visX1 - visX0;

  Resampler resampler(screenW, screenH, outW, outH, out);
  std::vector<GifByteType> line;
  std::vector<uint8_t> row;
  std::vector<GifByteType> gathered;
  try {
    line.resize(fw);
    row.assign(static_cast<size_t>(screenW) * 4, 0);
    if (desc.Interlace && visW > 0) gathered.assign(static_cast<size_t>(visW) * (visY1 - visY0), 0);
  } catch (const std::bad_alloc&) {
    IVLOG_E("no memory for %d x %d", fw, fh);
    return false;
  }
  if (!resampler.ok()) return false;

  auto pushScreenRow = [&](const GifByteType* indexes) {
    std::fill(row.begin(), row.end(), 0);
    if (indexes && visW > 0)
      paletteRow(indexes, visW, map, transparent, row.data() + static_cast<size_t>(visX0) * 4);
    resampler.pushRow(row.data());
  };

  if (!desc.Interlace) {
    for (int y = 0; y < visY0; ++y) pushScreenRow(nullptr);
    for (int y = visY0; y < visY1; ++y) {
      if (DGifGetLine(gif, line.data(), fw) == GIF_ERROR) {
        IVLOG_E("giflib: %s", GifErrorString(gif->Error));
        return false;
      }
      pushScreenRow(visW > 0 ? line.data() + (visX0 - left) : nullptr);
    }
  } else {
    static const int kStart[4] = {0, 4, 2, 1};
    static const int kStep[4] = {8, 8, 4, 2};
    for (int pass = 0; pass < 4; ++pass) {
      for (int fy = kStart[pass]; fy < fh; fy += kStep[pass]) {
        if (DGifGetLine(gif, line.data(), fw) == GIF_ERROR) {
          IVLOG_E("giflib: %s", GifErrorString(gif->Error));
          return false;
        }
        const int y = top + fy;
        if (y < visY0 || y >= visY1 || visW <= 0) continue;
        memcpy(&gathered[static_cast<size_t>(y - visY0) * visW], line.data() + (visX0 - left),
               static_cast<size_t>(visW));
      }
    }
    for (int y = 0; y < visY0; ++y) pushScreenRow(nullptr);
    for (int y = visY0; y < visY1; ++y)
      pushScreenRow(visW > 0 ? &gathered[static_cast<size_t>(y - visY0) * visW] : nullptr);
  }
  resampler.finish();
  return true;
}

}  // namespace BitmapFactory
