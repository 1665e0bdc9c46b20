// Whole, small pictures of every format, with something of everything that each can hold.
#pragma once

#include <string>

#include "tests/support/entries.h"
#include "tests/support/pixels.h"

namespace tests {

struct Sample {
  std::string name;  // begins with the format
  Bytes file;
  Size size;
  bool interlaced = false;
  // The whole picture at its size; interlaced ones have no lines.
  Request whole() const { return {size.width, size.height, 1, 0, interlaced ? size.height : 5}; }
  bool reads(const Entry& e) const { return name.starts_with(e.format); }
};
const std::vector<Sample>& samples();
const Sample& sample(std::string_view name);

// A BMP of 24 bits a pixel.
Bytes bmp_file(int width, int height);
Bytes wbmp_file(int width, int height);

}  // namespace tests
