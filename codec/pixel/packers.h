// Output pixel layouts: how R, G, B become the bytes of each format code. Every row writer picks its
// packer once for a picture.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pelo {

// Stores `count` pixels from three channel rows, `step` bytes apart.
using PackRow = void (*)(const uint8_t* r, const uint8_t* g, const uint8_t* b, int count, uint8_t* out,
                         ptrdiff_t step);

// The packer of an output format that is one opaque pixel after another (0, 1, 5, 7, 8); null otherwise.
PackRow opaque_packer(int format);

// RGB565 with green in five bits (bit 5 is 0), for dithered pixels.
PackRow dithered_packer();

// Bytes of a pixel: 2 for 0, 9 and 10; 3 for 1, 6 and 11; 4 for 5, 7, 8 and 12; 0 for planar and unknown
// codes.
constexpr int bytes_per_pixel(int format) {
  constexpr int kBytes[13] = {2, 3, 0, 0, 0, 4, 3, 4, 4, 2, 2, 3, 4};
  return format >= 0 && format < 13 ? kBytes[format] : 0;
}

}  // namespace pelo
