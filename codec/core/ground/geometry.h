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

}  // namespace pelo
