// RGB565 words, low byte first, as R G B bytes.
#pragma once

#include <cstdint>
#include <vector>

namespace pelo_tool {

// The top bits of a channel repeat in its low ones: white stays white.
inline std::vector<uint8_t> rgb_of_words(const std::vector<uint8_t>& words) {
  std::vector<uint8_t> rgb;
  rgb.reserve(words.size() / 2 * 3);
  for (size_t i = 0; i + 1 < words.size(); i += 2) {
    const int word = words[i] | words[i + 1] << 8;
    const int r = word >> 11, g = word >> 5 & 63, b = word & 31;
    rgb.push_back(static_cast<uint8_t>(r << 3 | r >> 2));
    rgb.push_back(static_cast<uint8_t>(g << 2 | g >> 4));
    rgb.push_back(static_cast<uint8_t>(b << 3 | b >> 2));
  }
  return rgb;
}

}  // namespace pelo_tool
