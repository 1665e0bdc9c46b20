// Rows of pixels into each output format: the functions that row writers choose from, once a picture.
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>

namespace pelo {

// ---- three channel rows: formats without alpha ----

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

// ---- R, G, B, A bytes: formats with alpha ----

// Stores `count` pixels of four bytes R, G, B, A, `step` bytes apart in the output.
using StoreRgba = void (*)(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step);

// What an alpha below 255 means to an output format without alpha. Formats with alpha always store it.
enum class Alpha {
  kIgnored,  // every pixel is opaque (and is stored with what stands in A)
  kBlended   // the pixel is blended over the buffer's
};

// The storer of an output format (0, 1, 5 to 8, 10 and 11); null for the others, which have none.
StoreRgba rgba_storer(int format, Alpha alpha);

// A row goes through the first-level cache in runs.
constexpr int kPixelRun = 256;

// For `count` pixels: fill(first, length, rgba) and use(rgba, first, length), run by run.
template <class Fill, class Use>
void for_pixel_runs(int count, Fill fill, Use use) {
  uint8_t rgba[4 * kPixelRun];
  for (int first = 0; first < count; first += kPixelRun) {
    const int length = std::min(kPixelRun, count - first);
    fill(first, length, rgba);
    use(rgba, first, length);
  }
}

}  // namespace pelo
