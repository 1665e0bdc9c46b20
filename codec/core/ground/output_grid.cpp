#include "codec/core/ground/output_grid.h"

#include <algorithm>

#include "tavirpelo/decinfo.h"

namespace pelo {

OutputGrid::OutputGrid(void* bytes, Size buffer, Size picture, int bytesPerPixel, uint32_t option)
    : bytes_(static_cast<uint8_t*>(bytes)), bytesPerPixel_(bytesPerPixel) {
  const Placement p = place(buffer, picture, option);
  const int64_t right = picture.width - int64_t{1};
  const int64_t bottom = picture.height - int64_t{1};
  const uint32_t rotation = option & TAVIRPELO_ROTATE_MASK;
  const bool sideways = rotation == TAVIRPELO_ROTATE_90 || rotation == TAVIRPELO_ROTATE_270;
  const bool tight = (option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT;
  if (tight) buffer = sideways ? Size{picture.height, picture.width} : picture;
  pitch_ = p.pitch;
  switch (rotation) {
    case TAVIRPELO_ROTATE_90:
      x_ = {p.x + bottom, 0, -1, buffer.width};
      y_ = {p.y, 1, 0, buffer.height};
      break;
    case TAVIRPELO_ROTATE_180:
      x_ = {p.x + right, -1, 0, buffer.width};
      y_ = {p.y + bottom, 0, -1, buffer.height};
      break;
    case TAVIRPELO_ROTATE_270:
      x_ = {p.x, 0, 1, buffer.width};
      y_ = {p.y + right, -1, 0, buffer.height};
      break;
    default:
      x_ = {p.x, 1, 0, buffer.width};
      y_ = {p.y, 0, 1, buffer.height};
      break;
  }
}

OutputGrid::OutputGrid(void* bytes, Size buffer, int64_t x, int64_t y, int bytesPerPixel)
    : bytes_(static_cast<uint8_t*>(bytes)),
      bytesPerPixel_(bytesPerPixel),
      pitch_(buffer.width),
      x_{x, 1, 0, buffer.width},
      y_{y, 0, 1, buffer.height} {}

RowSpan OutputGrid::span(int64_t row, int64_t begin, int64_t count) const {
  int64_t first = begin;
  int64_t end = begin + count;
  for (const Axis& axis : {x_, y_}) {
    const int64_t start = axis.start + row * axis.byRow;
    if (axis.byColumn > 0) {  // 0 <= start + column < limit
      first = std::max(first, -start);
      end = std::min(end, axis.limit - start);
    } else if (axis.byColumn < 0) {  // 0 <= start - column < limit
      first = std::max(first, start - axis.limit + 1);
      end = std::min(end, start + 1);
    } else if (start < 0 || start >= axis.limit) {
      return {};
    }
  }
  if (first >= end) return {};
  const int64_t x = x_.start + row * x_.byRow + first * x_.byColumn;
  const int64_t y = y_.start + row * y_.byRow + first * y_.byColumn;
  return {bytes_ + (y * pitch_ + x) * bytesPerPixel_,
          static_cast<ptrdiff_t>((x_.byColumn + y_.byColumn * pitch_) * bytesPerPixel_),
          static_cast<int>(first - begin), static_cast<int>(end - first)};
}

}  // namespace pelo
