// The byte layouts of output pixels: one small type per format code, shared by every row writer.
#pragma once

#include <cstddef>
#include <cstdint>

#include "codec/base/byte_order.h"
#include "tavirpelo/decinfo.h"

namespace pelo {

constexpr uint16_t rgb565(int r, int g, int b) {
  return static_cast<uint16_t>((r >> 3) << 11 | (g >> 2) << 5 | b >> 3);
}

namespace layout {

// Each has kBytes, kHasAlpha, and store(); layouts without alpha ignore `a`.
struct Rgb565 {
  static constexpr ptrdiff_t kBytes = 2;
  static constexpr bool kHasAlpha = false;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b, uint8_t = 255) {
    store_le16(out, rgb565(r, g, b));
  }
};

// Green in five bits (bit 5 is 0): dithered pixels.
struct Dithered565 {
  static constexpr ptrdiff_t kBytes = 2;
  static constexpr bool kHasAlpha = false;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b, uint8_t = 255) {
    store_le16(out, static_cast<uint32_t>((r >> 3) << 11 | (g >> 3) << 6 | b >> 3));
  }
};

struct Rgb888 {
  static constexpr ptrdiff_t kBytes = 3;
  static constexpr bool kHasAlpha = false;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b, uint8_t = 255) {
    out[0] = r;
    out[1] = g;
    out[2] = b;
  }
};

// RGB565 low byte first, then alpha.
struct Rgb565Alpha {
  static constexpr ptrdiff_t kBytes = 3;
  static constexpr bool kHasAlpha = true;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b, uint8_t a = 255) {
    store_le16(out, rgb565(r, g, b));
    out[2] = a;
  }
};

// Four bytes: R, G, B at the given ones, alpha in the remaining one.
template <int R, int G, int B>
struct Bytes8888 {
  static constexpr ptrdiff_t kBytes = 4;
  static constexpr bool kHasAlpha = true;
  static void store(uint8_t* out, uint32_t r, uint32_t g, uint32_t b, uint32_t a = 255) {
    constexpr int kAlpha = 6 - R - G - B;
    store_le32(out, r << 8 * R | g << 8 * G | b << 8 * B | a << 8 * kAlpha);
  }
};
using Argb8888 = Bytes8888<1, 2, 3>;
using Rgba8888 = Bytes8888<0, 1, 2>;
using Bgra8888 = Bytes8888<2, 1, 0>;

// Another layout with red and blue exchanged.
template <class Layout>
struct Swapped {
  static constexpr ptrdiff_t kBytes = Layout::kBytes;
  static constexpr bool kHasAlpha = Layout::kHasAlpha;
  static void store(uint8_t* out, uint8_t r, uint8_t g, uint8_t b, uint8_t a = 255) {
    Layout::store(out, b, g, r, a);
  }
};
using Bgr565 = Swapped<Rgb565>;
using Bgr888 = Swapped<Rgb888>;

}  // namespace layout

// Calls visit(Layout()) with the layout of an output format that decoders of pixels with alpha write: 0,
// 1 and 5 to 8. False, without a call, for other formats.
template <class Visit>
bool visit_layout(int format, Visit visit) {
  switch (format) {
    case TAVIRPELO_RGB565:
      visit(layout::Rgb565());
      return true;
    case TAVIRPELO_RGB888:
      visit(layout::Rgb888());
      return true;
    case TAVIRPELO_ARGB8888:
      visit(layout::Argb8888());
      return true;
    case TAVIRPELO_RGB565A8:
      visit(layout::Rgb565Alpha());
      return true;
    case TAVIRPELO_RGBA8888:
      visit(layout::Rgba8888());
      return true;
    case TAVIRPELO_BGRA8888:
      visit(layout::Bgra8888());
      return true;
    default:
      return false;
  }
}

}  // namespace pelo
