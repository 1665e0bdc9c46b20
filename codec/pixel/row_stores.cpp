#include "codec/pixel/row_stores.h"

#include "codec/pixel/paint.h"
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

namespace {

// Neighbouring pixels get a loop of their own: its constant stride is what vectorises.
template <class Store>
void for_each_pixel(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step, ptrdiff_t packed,
                    Store store) {
  if (step == packed) {
    for (int i = 0; i < count; ++i) store(rgba + 4 * i, out + packed * i);
  } else {
    for (int i = 0; i < count; ++i) store(rgba + 4 * i, out + step * i);
  }
}

template <class Layout>
void store_row(const uint8_t* __restrict rgba, int count, uint8_t* __restrict out, ptrdiff_t step) {
  for_each_pixel(rgba, count, out, step, Layout::kBytes, [](const uint8_t* in, uint8_t* pixel) {
    Layout::store(pixel, in[0], in[1], in[2], in[3]);
  });
}

void blend_row_565(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step) {
  for_each_pixel(rgba, count, out, step, 2, [](const uint8_t* in, uint8_t* pixel) {
    store_le16(pixel, blend_rgb565(in[0], in[1], in[2], in[3], load_le16(pixel)));
  });
}

void blend_row_bgr565(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step) {
  for_each_pixel(rgba, count, out, step, 2, [](const uint8_t* in, uint8_t* pixel) {
    store_le16(pixel, blend_rgb565(in[2], in[1], in[0], in[3], load_le16(pixel)));
  });
}

template <int R, int B>
void blend_row_888(const uint8_t* rgba, int count, uint8_t* out, ptrdiff_t step) {
  for_each_pixel(rgba, count, out, step, 3, [](const uint8_t* in, uint8_t* pixel) {
    pixel[R] = blend_channel(in[0], in[3], pixel[R]);
    pixel[1] = blend_channel(in[1], in[3], pixel[1]);
    pixel[B] = blend_channel(in[2], in[3], pixel[B]);
  });
}

StoreRgba blender(int format) {
  switch (format) {
    case TAVIRPELO_RGB565:
      return blend_row_565;
    case TAVIRPELO_RGB888:
      return blend_row_888<0, 2>;
    case TAVIRPELO_BGR565:
      return blend_row_bgr565;
    case TAVIRPELO_BGR888:
      return blend_row_888<2, 0>;
    default:
      return nullptr;
  }
}

}  // namespace

StoreRgba rgba_storer(int format, Alpha alpha) {
  if (alpha == Alpha::kBlended && blender(format) != nullptr) return blender(format);
  if (format == TAVIRPELO_BGR565) return store_row<layout::Bgr565>;
  if (format == TAVIRPELO_BGR888) return store_row<layout::Bgr888>;
  StoreRgba storer = nullptr;
  visit_layout(format, [&](auto layout) { storer = store_row<decltype(layout)>; });
  return storer;
}

}  // namespace pelo
