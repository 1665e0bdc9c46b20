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

struct Rgb888 {
  static constexpr ptrdiff_t kBytes = 3;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b) {
    out[0] = r;
    out[1] = g;
    out[2] = b;
  }
};

// Four bytes: R, G, B at the given ones, opaque alpha in the remaining one.
template <int R, int G, int B>
struct Opaque8888 {
  static constexpr ptrdiff_t kBytes = 4;
  static void store(uint8_t* out, uint32_t r, uint32_t g, uint32_t b) {
    constexpr int kAlpha = 6 - R - G - B;
    store_le32(out, r << 8 * R | g << 8 * G | b << 8 * B | 255u << 8 * kAlpha);
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
    case TAVIRPELO_RGB888: return pack_row<Rgb888>;
    case TAVIRPELO_ARGB8888: return pack_row<Opaque8888<1, 2, 3>>;
    case TAVIRPELO_RGBA8888: return pack_row<Opaque8888<0, 1, 2>>;
    case TAVIRPELO_BGRA8888: return pack_row<Opaque8888<2, 1, 0>>;
    default: return nullptr;
  }
}

PackRow dithered_packer() { return pack_row<Dithered565>; }

}  // namespace pelo
