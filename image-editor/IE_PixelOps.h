#pragma once
// Byte-order helpers shared by the engine files.

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "image-editor/IE_Engine.h"
#include "platform/core/pixel_order.h"

namespace ie {

// Copies `pixels` 4-byte pixels, reversing the bytes of each (A,R,G,B <->
// B,G,R,A). `to` may equal `from`.
using pixel_order::copyReversed;

// Checks one image record: 1 for a null record or buffer, 3 for a size that
// is not positive, 4 for a format code outside 1..9; 0 when usable.
int checkImage(const IeImageInfo* image);

}  // namespace ie
