// Rows of R, G, B, A bytes into output pixels: what decoders of formats with alpha write through.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pelo {

// Stores `count` pixels of four bytes R, G, B, A, `step` bytes apart in the output.
using StoreRgba = void (*)(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step);

// What an alpha below 255 means to an output format without alpha. Formats with alpha always store it.
enum class Alpha {
  kIgnored,  // every pixel is opaque (and is stored with what stands in A)
  kBlended   // the pixel is blended over the buffer's
};

// The storer of an output format (0, 1, 5 to 8, 10 and 11); null for the others, which have none.
StoreRgba rgba_storer(int format, Alpha alpha);

}  // namespace pelo
