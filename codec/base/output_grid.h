// A picture's place in the caller's buffer, with the buffer's bounds: rows are clipped once each, so
// that no writer needs a check of its own.
#pragma once

#include <cstddef>
#include <cstdint>

#include "codec/base/geometry.h"

namespace pelo {

// The visible part of one row of a picture.
struct RowSpan {
  uint8_t* first;  // address of its first visible pixel
  ptrdiff_t step;  // bytes between neighbours
  int skip;        // pixels cut off before it
  int count;       // visible pixels; 0 when none
};

class OutputGrid {
 public:
  // Rows of a `picture` (its size before rotation), placed in a `buffer` as place() does.
  OutputGrid(void* bytes, Size buffer, Size picture, int bytesPerPixel, uint32_t option);
  // Rows unrotated from buffer pixel (x, y) on.
  OutputGrid(void* bytes, Size buffer, int64_t x, int64_t y, int bytesPerPixel);
  OutputGrid() = default;

  // Pixels [begin, begin + count) of a picture row.
  RowSpan span(int64_t row, int64_t begin, int64_t count) const;

 private:
  uint8_t* bytes_ = nullptr;
  int bytesPerPixel_ = 0;
  Placement place_{};
};

}  // namespace pelo
