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
  PackRow packer = nullptr;
  if (format == TAVIRPELO_RGB565A8) return packer;
  visit_layout(format, [&](auto layout) { packer = pack_row<decltype(layout)>; });
  return packer;
}

PackRow dithered_packer() {
  return pack_row<layout::Dithered565>;
}

}  // namespace pelo
