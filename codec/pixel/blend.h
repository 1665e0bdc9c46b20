// A pixel over what the buffer already holds, in integers: alpha 255 replaces, alpha 0 leaves.
#pragma once

#include <cstdint>

#include "codec/pixel/pixel_layout.h"

namespace pelo {

// foreground * (a + 1) / 256 + background * (256 - a) / 256, each part truncated, kept to 8 bits.
constexpr uint8_t blend_channel(uint32_t foreground, uint32_t alpha, uint32_t background) {
  return static_cast<uint8_t>((foreground * (alpha + 1) >> 8) + (background * (256 - alpha) >> 8));
}

// The same over an RGB565 pixel, whose channels are widened by shifts alone (31 becomes 248).
constexpr uint16_t blend_rgb565(uint32_t r, uint32_t g, uint32_t b, uint32_t alpha,
                                uint32_t background) {
  return rgb565(blend_channel(r, alpha, (background >> 11 & 31) << 3),
                blend_channel(g, alpha, (background & 0x7E0) >> 3),
                blend_channel(b, alpha, (background & 31) << 3));
}

}  // namespace pelo
