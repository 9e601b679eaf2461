#pragma once
// Thrown by the style parsers after they have logged why a layout, cell or
// handler object cannot be used.

#include <stdexcept>

class CLyStyleParseError : public std::runtime_error {
 public:
  using std::runtime_error::runtime_error;
};
