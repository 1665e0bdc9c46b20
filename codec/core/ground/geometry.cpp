#include "codec/core/ground/geometry.h"

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

}  // namespace pelo
