// Portable pixmaps and greymaps (binary, P6 and P5), the plain picture format of the tools.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "tools/common/exit_code.h"

namespace tool {

struct Pnm {
  int width = 0;
  int height = 0;
  bool grey = false;            // one byte a pixel, else R G B
  std::vector<uint8_t> pixels;  // 0 to 255, rows packed
};

// Nothing when the bytes are no P5 or P6 file of 8-bit samples, or fewer than its header says. What
// follows the picture is ignored.
std::optional<Pnm> parse_pnm(const std::vector<uint8_t>& bytes);

// Writes a file, or standard output for "-".
Exit write_pnm(const std::string& path, const Pnm& picture);

// The luma of R G B pixels (ITU-R BT.601).
std::vector<uint8_t> luma_of(const std::vector<uint8_t>& rgb);

}  // namespace tool
