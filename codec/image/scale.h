// The scaling family on RGB565 and RGB888 pictures, and how the averages are packed.
#pragma once

#include <cstddef>
#include <cstdint>

#include "codec/base/byte_order.h"
#include "codec/image/resample.h"
#include "codec/pixel/quad_sampler.h"

namespace pelo {

// Areas without pixels, or of no size, are left alone.
struct Scaling {
  SourceArea source;
  TargetArea target;
};

void scale565(const Scaling& s);  // averages; enlarges when a side grows, else reduces
void enlarge565(const Scaling& s);
void reduce565(const Scaling& s);
void scale888(const Scaling& s);  // averages
void pick565(const Scaling& s);   // nearest samples

// `count` words, each the sum of four RGB565 pixels (red from bit 23, green from bit 12, blue from bit
// 3), to the average pixels.
void write_averages565(const uint32_t* words, uint8_t* out, int count);

// The same of RGB888 pixels in 10-bit lanes (red from bit 20, green from 10, blue from 0).
void write_averages888(const uint32_t* words, uint8_t* out, int count);

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
