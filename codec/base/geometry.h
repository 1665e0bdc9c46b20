// How large a decoded picture comes out, and where it lies in the caller's buffer: offset, rotation, and
// the steps of a row writer.
#pragma once

#include <cstddef>
#include <cstdint>

#include "tavirpelo/decinfo.h"

namespace pelo {

struct Size {
  int width;
  int height;
  constexpr bool operator==(const Size&) const = default;
};

// Whether the rotation of an option word lays a picture on its side.
constexpr bool sideways(uint32_t option) {
  const uint32_t rotation = option & TAVIRPELO_ROTATE_MASK;
  return rotation == TAVIRPELO_ROTATE_90 || rotation == TAVIRPELO_ROTATE_270;
}
constexpr Size turned(Size size, uint32_t option) {
  return sideways(option) ? Size{size.height, size.width} : size;
}

// A coordinate in the buffer of a picture's pixel: start + column * byColumn + row * byRow.
struct Axis {
  int64_t start, byColumn, byRow;
};

// Where a picture lies in a buffer.
struct Placement {
  Size buffer;
  Axis x, y;
  int64_t left, top;  // its upper left corner

  // The first pixel and the way from it, in pixels.
  int64_t pitch() const { return buffer.width; }
  int64_t first() const { return y.start * pitch() + x.start; }
  int64_t pixel_step() const { return y.byColumn * pitch() + x.byColumn; }
  int64_t row_step() const { return y.byRow * pitch() + x.byRow; }
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

// ---- reducing to a memory budget ----

// Square root of needed / available, 1024 = 1.0 at the most; 0 when either makes no sense. `needed` is
// within 53 bits.
int max_dec_ratio(int64_t needed, int64_t available);

}  // namespace pelo
