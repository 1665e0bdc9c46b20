// Pixels over pixels: blending by alpha, and copying under a mask.
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/image/image.h"
#include "codec/pixel/paint.h"

namespace pelo {
namespace {

// A source pixel over a destination pixel.
struct Rgb565A8 {
  static constexpr ptrdiff_t kSourceBytes = 3, kTargetBytes = 2;
  static void blend(const uint8_t* in, uint8_t* out) {
    const uint32_t p = load_le16(in);
    store_le16(out, blend_rgb565((p >> 11 & 31) << 3, (p >> 5 & 63) << 2, (p & 31) << 3, in[2],
                                 load_le16(out)));
  }
};
struct ColourAlpha {
  static constexpr ptrdiff_t kSourceBytes = 4, kTargetBytes = 3;
  static void blend(const uint8_t* in, uint8_t* out) {
    for (int c = 0; c < 3; ++c) out[c] = blend_channel(in[c], in[3], out[c]);
  }
};

template <class Pixel>
void blend_rows(const uint8_t* src, uint8_t* dst, ptrdiff_t width, ptrdiff_t height, ptrdiff_t dstWidth,
                ptrdiff_t x, ptrdiff_t y) {
  for (ptrdiff_t row = 0; row < height; ++row) {
    const uint8_t* in = src + row * width * Pixel::kSourceBytes;
    uint8_t* out = dst + (dstWidth * (y + row) + x) * Pixel::kTargetBytes;
    for (ptrdiff_t i = 0; i < width; ++i, in += Pixel::kSourceBytes, out += Pixel::kTargetBytes) {
      Pixel::blend(in, out);
    }
  }
}

int refuse_with(int code) {
  record_error(ErrorWord::kCodec, code);
  return 0;
}

}  // namespace

int blend(const void* src, void* dst, Size source, Size target, int x, int y, int format) {
  if (src == nullptr || dst == nullptr) return refuse_with(TAVIRPELO_CODEC_ARGUMENT);
  if (format != TAVIRPELO_ARGB8888 && format != TAVIRPELO_RGB565A8)
    return refuse_with(TAVIRPELO_CODEC_FORMAT);
  const bool inside = x >= 0 && y >= 0 && source.width > 0 && source.height > 0 && target.width > 0 &&
                      target.height > 0 && int64_t{x} + source.width <= target.width &&
                      int64_t{y} + source.height <= target.height;
  if (!inside) return refuse_with(TAVIRPELO_CODEC_SIZE);
  const auto rows = format == TAVIRPELO_RGB565A8 ? blend_rows<Rgb565A8> : blend_rows<ColourAlpha>;
  rows(static_cast<const uint8_t*>(src), static_cast<uint8_t*>(dst), source.width, source.height,
       target.width, x, y);
  return 1;
}

void copy_masked(const void* src, void* dst, const uint8_t* mask, int strideBytes, Size size) {
  if (src == nullptr || dst == nullptr || mask == nullptr) return;
  const auto* in = static_cast<const uint8_t*>(src);
  auto* out = static_cast<uint8_t*>(dst);
  for (ptrdiff_t y = 0; y < size.height; ++y) {
    for (ptrdiff_t x = 0; x < size.width; ++x) {
      if (mask[y * size.width + x] != 0)
        std::memcpy(out + y * strideBytes + 4 * x, in + y * strideBytes + 4 * x, 4);
    }
  }
}

}  // namespace pelo
