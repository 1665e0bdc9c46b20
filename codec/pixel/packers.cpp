#include "codec/pixel/packers.h"

#include "codec/core/ground/byte_order.h"
#include "tavirpelo/decinfo.h"

namespace pelo {
namespace {

struct Rgb565 {
  static constexpr ptrdiff_t kBytes = 2;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b) { store_le16(out, rgb565(r, g, b)); }
};

struct Dithered565 {
  static constexpr ptrdiff_t kBytes = 2;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b) {
    store_le16(out, static_cast<uint32_t>((r >> 3) << 11 | (g >> 3) << 6 | b >> 3));
  }
};

// R, G and B at the given bytes; the fourth, when there is one, is opaque alpha.
template <int Bytes, int R, int G, int B>
struct Bytewise {
  static constexpr ptrdiff_t kBytes = Bytes;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b) {
    out[R] = r;
    out[G] = g;
    out[B] = b;
    if constexpr (Bytes == 4) out[6 - R - G - B] = 255;
  }
};

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
    case TAVIRPELO_RGB565: return pack_row<Rgb565>;
    case TAVIRPELO_RGB888: return pack_row<Bytewise<3, 0, 1, 2>>;
    case TAVIRPELO_ARGB8888: return pack_row<Bytewise<4, 1, 2, 3>>;
    case TAVIRPELO_RGBA8888: return pack_row<Bytewise<4, 0, 1, 2>>;
    case TAVIRPELO_BGRA8888: return pack_row<Bytewise<4, 2, 1, 0>>;
    default: return nullptr;
  }
}

PackRow dithered_packer() { return pack_row<Dithered565>; }

}  // namespace pelo
