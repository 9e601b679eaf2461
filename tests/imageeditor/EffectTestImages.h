#pragma once
// Test images for the effect tests: smooth gradients with seeded noise and a
// varying fourth byte, so every look has colour, detail and alpha to act on.

#include <cstdint>
#include <vector>

#include "image-editor/IE_Engine.h"

namespace effects_test {

// width x height pixels in memory order B, G, R, A (format 9).
inline std::vector<uint8_t> makeImage(int width, int height, uint32_t seed = 1) {
  std::vector<uint8_t> px((size_t)width * (size_t)height * 4);
  uint32_t s = seed * 2654435761u + 1;
  for (int y = 0; y < height; ++y)
    for (int x = 0; x < width; ++x) {
      s = s * 1664525u + 1013904223u;
      const int noise = (int)((s >> 24) % 41) - 20;
      uint8_t* p = &px[((size_t)y * (size_t)width + (size_t)x) * 4];
      auto clampb = [](int v) { return (uint8_t)(v < 0 ? 0 : (v > 255 ? 255 : v)); };
      p[0] = clampb(40 + 170 * y / (height > 1 ? height - 1 : 1) + noise);                         // blue
      p[1] = clampb(30 + 190 * x / (width > 1 ? width - 1 : 1) + noise / 2);                       // green
      p[2] = clampb(220 - 150 * (x + y) / (width + height > 2 ? width + height - 2 : 1) + noise);  // red
      p[3] = (uint8_t)(255 - ((x * 7 + y * 3) % 64));                                              // alpha
    }
  return px;
}

// The same pixels with the bytes of every pixel reversed (format 9 <-> 8).
inline std::vector<uint8_t> reversed(const std::vector<uint8_t>& px) {
  std::vector<uint8_t> out(px.size());
  for (size_t i = 0; i + 3 < px.size(); i += 4)
    for (size_t k = 0; k < 4; ++k) out[i + k] = px[i + 3 - k];
  return out;
}

// Applies an effect to a copy of `src` (format 8 or 9); returns the result bytes.
inline std::vector<uint8_t> apply(const std::vector<uint8_t>& src, int width, int height, int format,
                                  int effect, int* rc = nullptr) {
  std::vector<uint8_t> in = src, out(src.size(), 0);
  IeImageInfo s{width, height, (uint16_t)format, in.data()};
  IeImageInfo d{width, height, 0, out.data()};
  const int r = IE_Engine_Apply_Effect(&s, &d, effect);
  if (rc) *rc = r;
  return out;
}

}  // namespace effects_test
