#pragma once
// Small image files written for the platform tests.

#include <string>

#include "tests/support/TestSupport.h"

namespace pictavo::test {

// A w x h PNG (opaque grey) at `path`; false when it cannot be written.
bool writeTestPng(const std::string& path, int w, int h);

}  // namespace pictavo::test
