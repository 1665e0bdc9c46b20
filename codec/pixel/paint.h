// What goes over pixels that are there: one with alpha, and one colour over a run.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>

#include "codec/pixel/pixel_layout.h"

namespace pelo {

// In integers: alpha 255 replaces, alpha 0 leaves.
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

// Copies a pixel of `size` bytes (1 to 4) over `count` pixels. What is filled already is the source of
// ever longer copies, up to a chunk that stays in the first-level cache.
inline void fill_pixels(void* pixels, size_t count, const uint8_t* pixel, size_t size) {
  constexpr size_t kChunk = 12 * 1024;  // bytes: whole pixels of each size
  if (count == 0) return;
  auto* out = static_cast<uint8_t*>(pixels);
  const size_t total = count * size;
  std::memcpy(out, pixel, size);
  for (size_t done = size; done < total;) {
    const size_t length = std::min({done, total - done, kChunk});
    std::memcpy(out + done, out, length);
    done += length;
  }
}

}  // namespace pelo
