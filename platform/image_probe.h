#pragma once
// Reads the type and pixel size of an image file from its header, without
// decoding it: JPEG, PNG, GIF, BMP and WBMP.

#include <string>

namespace platform_image {

struct ProbeResult {
  std::string mimeType;
  int width = 0;
  int height = 0;
};

// False when the file cannot be read or is not one of the known types (or its
// header is damaged).
bool probe(const char* path, ProbeResult& result);

}  // namespace platform_image
