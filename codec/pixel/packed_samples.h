// Samples of 1, 2, 4, 8 or 16 bits in a row, as PNG, BMP and WBMP pack them: the first pixel in the
// highest bits of a byte. Of 16-bit samples the first byte counts.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pelo {

template <int Depth>
constexpr uint32_t packed_sample(const uint8_t* row, size_t x) {
  if constexpr (Depth >= 8) {
    return row[x * (Depth / 8)];
  } else {
    constexpr size_t kPerByte = 8 / Depth;
    const auto shift = static_cast<uint32_t>((kPerByte - 1 - x % kPerByte) * Depth);
    return uint32_t{row[x / kPerByte]} >> shift & ((1u << Depth) - 1);
  }
}

}  // namespace pelo
