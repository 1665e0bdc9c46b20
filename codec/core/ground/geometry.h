// Where a decoded picture lies in the caller's buffer: offset, rotation, and the steps of a row writer.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pelo {

struct Size {
  int width;
  int height;
  constexpr bool operator==(const Size&) const = default;
};

// The picture's first pixel and the way from it, in pixels of a buffer whose rows are `pitch` long.
struct Placement {
  int64_t first;
  int64_t pixelStep;
  int64_t rowStep;
  int64_t pitch;
  int64_t x, y;  // upper left corner in the buffer
};

// Places a `target` picture (its size before rotation) in a buffer, centred and turned clockwise by the
// option word's rotation bits; a tight buffer is exactly as large as the turned picture.
Placement place(Size buffer, Size target, uint32_t option);

// ---- fitting with proportions ----
// The decoders shrink a picture into a box by two rules that can differ by a pixel. A picture that fits
// stays as it is; a fitted side may come out 0.

// PNG and WBMP: the side of the larger ratio, in single precision, decides.
Size fit_by_ratio(int64_t width, int64_t height, Size box);

// BMP and GIF: the box's width, when the height that belongs to it fits; else the box's height.
Size fit_by_width(int64_t width, int64_t height, Size box);

}  // namespace pelo
