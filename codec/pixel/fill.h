// One colour over a run of pixels.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>

namespace pelo {

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
