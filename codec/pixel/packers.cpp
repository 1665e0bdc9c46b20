#include "codec/pixel/packers.h"

#include "codec/pixel/pixel_layout.h"
#include "tavirpelo/decinfo.h"

namespace pelo {
namespace {

// Neighbouring pixels get a loop of their own: its constant stride is what vectorises.
template <class Packer>
void pack_row(const uint8_t* __restrict r, const uint8_t* __restrict g, const uint8_t* __restrict b,
              int count, uint8_t* __restrict out, ptrdiff_t step) {
  if (step == Packer::kBytes) {
    for (int i = 0; i < count; ++i) Packer::store(out + Packer::kBytes * i, r[i], g[i], b[i]);
  } else {
    for (int i = 0; i < count; ++i) Packer::store(out + step * i, r[i], g[i], b[i]);
  }
}

}  // namespace

PackRow opaque_packer(int format) {
  switch (format) {
    case TAVIRPELO_RGB565:
      return pack_row<layout::Rgb565>;
    case TAVIRPELO_RGB888:
      return pack_row<layout::Rgb888>;
    case TAVIRPELO_ARGB8888:
      return pack_row<layout::Argb8888>;
    case TAVIRPELO_RGBA8888:
      return pack_row<layout::Rgba8888>;
    case TAVIRPELO_BGRA8888:
      return pack_row<layout::Bgra8888>;
    default:
      return nullptr;
  }
}

PackRow dithered_packer() {
  return pack_row<layout::Dithered565>;
}

}  // namespace pelo
