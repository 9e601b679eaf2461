#pragma once
// Byte-order helpers shared by the engine files.

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "image-editor/IE_Engine.h"

namespace ie {

// Copies `pixels` 4-byte pixels, reversing the bytes of each (A,R,G,B <->
// B,G,R,A). `to` may equal `from`.
inline void copyReversed(const unsigned char* from, unsigned char* to, size_t pixels) {
  for (size_t i = 0; i < pixels; ++i) {
    uint32_t v;
    memcpy(&v, from + i * 4, 4);
    v = __builtin_bswap32(v);
    memcpy(to + i * 4, &v, 4);
  }
}

// Checks one image record: 1 for a null record or buffer, 3 for a size that
// is not positive, 4 for a format code outside 1..9; 0 when usable.
int checkImage(const IeImageInfo* image);

}  // namespace ie
