// Packing of finished accumulator words into rows of pixels; the scaling functions themselves are public
// (tavirpelo/raw.h).
#pragma once

#include <cstddef>
#include <cstdint>

#include "codec/base/byte_order.h"
#include "codec/pixel/lanes.h"
#include "tavirpelo/api.h"

// `count` words, each the sum of four RGB565 pixels (red from bit 23, green from bit 12, blue from bit
// 3), to the average pixels.
TAVIRPELO_API void PELO_WriteOutputBuf(const uint32_t* words, void* output, int count);

// The same of RGB888 pixels in 10-bit lanes (red from bit 20, green from 10, blue from 0).
TAVIRPELO_API void PELO_WriteRGB888OutputBuf(const uint32_t* words, void* output, int count);

namespace pelo {

// How a pixel becomes a word whose lanes hold the sum of four.
struct Word565 {
  static constexpr ptrdiff_t kBytes = 2;
  static uint32_t word(const uint8_t* pixel) {
    const uint32_t p = load_le16(pixel);
    return (p & 0xF800) << 12 | (p & 0x07E0) << 7 | (p & 0x001F) << 3;
  }
};
struct Word888 {
  static constexpr ptrdiff_t kBytes = 3;
  static uint32_t word(const uint8_t* pixel) { return pack_lanes(pixel[0], pixel[1], pixel[2]); }
};

}  // namespace pelo
