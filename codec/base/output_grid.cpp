#include "codec/base/output_grid.h"

#include <algorithm>

namespace pelo {
namespace {

// Narrows [first, end) to the columns of a row that lie inside the buffer along one axis.
void clip(const Axis& axis, int64_t limit, int64_t row, int64_t& first, int64_t& end) {
  const int64_t start = axis.start + row * axis.byRow;
  if (axis.byColumn > 0) {  // 0 <= start + column < limit
    first = std::max(first, -start);
    end = std::min(end, limit - start);
  } else if (axis.byColumn < 0) {  // 0 <= start - column < limit
    first = std::max(first, start - limit + 1);
    end = std::min(end, start + 1);
  } else if (start < 0 || start >= limit) {
    end = first;
  }
}

}  // namespace

OutputGrid::OutputGrid(void* bytes, Size buffer, Size picture, int bytesPerPixel, uint32_t option)
    : bytes_(static_cast<uint8_t*>(bytes)),
      bytesPerPixel_(bytesPerPixel),
      place_(place(buffer, picture, option)) {}

OutputGrid::OutputGrid(void* bytes, Size buffer, int64_t x, int64_t y, int bytesPerPixel)
    : bytes_(static_cast<uint8_t*>(bytes)),
      bytesPerPixel_(bytesPerPixel),
      place_{buffer, {x, 1, 0}, {y, 0, 1}, x, y} {}

RowSpan OutputGrid::span(int64_t row, int64_t begin, int64_t count) const {
  int64_t first = begin;
  int64_t end = begin + count;
  clip(place_.x, place_.buffer.width, row, first, end);
  clip(place_.y, place_.buffer.height, row, first, end);
  if (first >= end) return {};
  const int64_t pixel = place_.first() + row * place_.row_step() + first * place_.pixel_step();
  return {bytes_ + pixel * bytesPerPixel_, static_cast<ptrdiff_t>(place_.pixel_step() * bytesPerPixel_),
          static_cast<int>(first - begin), static_cast<int>(end - first)};
}

}  // namespace pelo
