#pragma once
// Files and environment for the shell tests.

#include <cstdint>
#include <string>

#include "tests/support/TestSupport.h"

namespace pictavo::test {

enum class ExifPlace { NONE, IFD0, IFD1_ONLY };

// A small JPEG; with EXIF orientation `orientation` stored in the given IFD,
// in Motorola (big-endian) byte order when `bigEndian`.
bool writeJpeg(const std::string& path, ExifPlace place = ExifPlace::NONE, uint16_t orientation = 1,
               bool bigEndian = false);
// A JPEG whose APP1 segment says "Exif" but holds `junk`.
bool writeJpegWithRawApp1(const std::string& path, const std::string& junk);

// Sets an environment variable for a scope and restores it afterwards
// (nullptr unsets it).
class ScopedEnv {
 public:
  ScopedEnv(const char* name, const char* value);
  ~ScopedEnv();
  ScopedEnv(const ScopedEnv&) = delete;
  ScopedEnv& operator=(const ScopedEnv&) = delete;

 private:
  std::string mName, mOld;
  bool mHad = false;
};

}  // namespace pictavo::test
