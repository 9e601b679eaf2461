#pragma once
// Small image files written for the platform tests.

#include <string>

namespace pictavo::test {

// A w x h PNG (opaque grey) at `path`; false when it cannot be written.
bool writeTestPng(const std::string& path, int w, int h);
// Writes `bytes` as the whole file.
bool writeBytes(const std::string& path, const std::string& bytes);

}  // namespace pictavo::test
