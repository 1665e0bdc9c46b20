#include "codec/core/ground/geometry.h"

#include <algorithm>

#include "tavirpelo/decinfo.h"

namespace pelo {

Placement place(Size buffer, Size target, uint32_t option) {
  const uint32_t rotation = option & TAVIRPELO_ROTATE_MASK;
  const bool sideways = rotation == TAVIRPELO_ROTATE_90 || rotation == TAVIRPELO_ROTATE_270;
  const Size turned = sideways ? Size{target.height, target.width} : target;
  if ((option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_TIGHT) buffer = turned;

  Placement p{};
  p.pitch = buffer.width;
  p.x = (int64_t{buffer.width} - turned.width) >> 1;
  p.y = (int64_t{buffer.height} - turned.height) >> 1;
  const int64_t right = p.x + turned.width - 1;
  const int64_t bottom = p.y + turned.height - 1;
  switch (rotation) {
    case TAVIRPELO_ROTATE_90:  // the first row runs down the right edge
      p.first = right + p.pitch * p.y;
      p.pixelStep = p.pitch;
      p.rowStep = -1;
      break;
    case TAVIRPELO_ROTATE_180:
      p.first = right + p.pitch * bottom;
      p.pixelStep = -1;
      p.rowStep = -p.pitch;
      break;
    case TAVIRPELO_ROTATE_270:  // the first row runs up the left edge
      p.first = p.x + p.pitch * bottom;
      p.pixelStep = -p.pitch;
      p.rowStep = 1;
      break;
    default:
      p.first = p.x + p.pitch * p.y;
      p.pixelStep = 1;
      p.rowStep = p.pitch;
      break;
  }
  return p;
}

namespace {

// The other side of a picture whose `side` is made `fitted`, no more than the box has.
int follow(int64_t other, int64_t side, int fitted, int limit) {
  return static_cast<int>(std::min<int64_t>(other * fitted / side, limit));
}

bool fits(int64_t width, int64_t height, Size box) {
  return width <= box.width && height <= box.height;
}
Size as_it_is(int64_t width, int64_t height) {
  return {static_cast<int>(width), static_cast<int>(height)};
}

}  // namespace

Size fit_by_ratio(int64_t width, int64_t height, Size box) {
  if (fits(width, height, box)) return as_it_is(width, height);
  if (box.width == 0 || box.height == 0) return {0, 0};
  const float across = static_cast<float>(width) / static_cast<float>(box.width);
  const float down = static_cast<float>(height) / static_cast<float>(box.height);
  if (across >= down) return {box.width, follow(height, width, box.width, box.height)};
  return {follow(width, height, box.height, box.width), box.height};
}

Size fit_by_width(int64_t width, int64_t height, Size box) {
  if (fits(width, height, box)) return as_it_is(width, height);
  const int64_t fitted = height * box.width / width;
  if (fitted <= box.height) return {box.width, static_cast<int>(fitted)};
  return {follow(width, height, box.height, box.width), box.height};
}

}  // namespace pelo
