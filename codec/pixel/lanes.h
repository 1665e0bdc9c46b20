// Sums of four samples for three channels at once: 10-bit lanes of a 32-bit word.
#pragma once

#include <cstdint>

namespace pelo {

// First channel in bits 20-29, second in 10-19, third in 0-9. Four samples of 255 fill a lane exactly.
constexpr uint32_t pack_lanes(uint32_t first, uint32_t second, uint32_t third) {
  return first << 20 | second << 10 | third;
}

// The average of four, truncated.
constexpr uint8_t lane_average(uint32_t sums, int channel) {
  return static_cast<uint8_t>(sums >> (20 - 10 * channel) >> 2);
}

}  // namespace pelo
