#include <algorithm>
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

struct Rgb {
  int r, g, b;
};

// Pixel layouts.
struct Rgb565Pixel {
  static constexpr int kBytes = 2;
  static Rgb read(const uint8_t* p) {
    const int word = load_le16(p);
    return {word >> 8 & 0xF8, word >> 3 & 0xFC, word << 3 & 0xF8};
  }
};
struct Rgb888Pixel {
  static constexpr int kBytes = 3;
  static Rgb read(const uint8_t* p) { return {p[0], p[1], p[2]}; }
};

// ITU-R BT.601 at full range with 12 fraction bits. The chroma offset keeps results within 0..255.
constexpr uint8_t luma(Rgb c) {
  return static_cast<uint8_t>((1225 * c.r + 2404 * c.g + 467 * c.b) >> 12);
}
constexpr uint8_t chroma_blue(Rgb c) {
  return static_cast<uint8_t>(((2048 * c.b - 1357 * c.g - 691 * c.r) >> 12) + 128);
}
constexpr uint8_t chroma_red(Rgb c) {
  return static_cast<uint8_t>(((2048 * c.r - 1715 * c.g - 333 * c.b) >> 12) + 128);
}

template <class Pixel>
void luma_row(const uint8_t* __restrict pixels, int count, uint8_t* __restrict y) {
  for (int x = 0; x < count; ++x) y[x] = luma(Pixel::read(pixels + x * Pixel::kBytes));
}

// Chroma of every other pixel: of each 2 x 2 pixels the top left one counts.
template <class Pixel>
void chroma_row(const uint8_t* __restrict pixels, int count, uint8_t* __restrict cb,
                uint8_t* __restrict cr) {
  for (int x = 0; x < count; ++x) {
    const Rgb c = Pixel::read(pixels + 2 * x * Pixel::kBytes);
    cb[x] = chroma_blue(c);
    cr[x] = chroma_red(c);
  }
}

// Rows of the current MCU row that lie in the image.
int valid_rows(const ELO_ENCODER& encoder, const EncoderComponent& component) {
  const int first = encoder.row / encoder.mcu_height() * 8 * component.v;
  return std::clamp(component.height - first, 1, 8 * component.v);
}

// Repeats the last column up to whole blocks, then the last row.
void pad(EncoderComponent& component, int rows) {
  const int extra = component.stride() - component.width;
  for (int y = 0; extra > 0 && y < rows; ++y) {
    uint8_t* end = component.row(y) + component.width;
    std::memset(end, end[-1], static_cast<size_t>(extra));
  }
  for (int y = rows; y < 8 * component.v; ++y) {
    std::memcpy(component.row(y), component.row(rows - 1), static_cast<size_t>(component.stride()));
  }
}

template <class Pixel>
void convert_rows(ELO_ENCODER& encoder) {
  auto& [y, cb, cr] = encoder.components;
  const ptrdiff_t rowBytes = ptrdiff_t{encoder.width} * Pixel::kBytes;
  const uint8_t* pixels = encoder.pixels + encoder.row * rowBytes;
  const int rows = valid_rows(encoder, y);
  for (int i = 0; i < rows; ++i, pixels += rowBytes) {
    luma_row<Pixel>(pixels, y.width, y.row(i));
    if (i % 2 == 0) chroma_row<Pixel>(pixels, cb.width, cb.row(i / 2), cr.row(i / 2));
  }
  pad(y, rows);
  pad(cb, valid_rows(encoder, cb));
  pad(cr, valid_rows(encoder, cr));
}

bool is_420(const ELO_ENCODER& encoder) {
  const auto& [y, cb, cr] = encoder.components;
  return encoder.componentCount == 3 && y.h == 2 && y.v == 2 && cb.h == 1 && cb.v == 1 && cr.h == 1 &&
         cr.v == 1;
}

// Where the current MCU row starts in each plane of the image.
void read_planes(ELO_ENCODER& encoder) {
  std::array<const uint8_t*, kEncoderComponents> planes{};
  const uint8_t* plane = encoder.pixels;
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) {
    const EncoderComponent& component = encoder.components[i];
    const int first = encoder.row / encoder.mcu_height() * 8 * component.v;
    planes[i] = plane + static_cast<ptrdiff_t>(first) * component.width;
    plane += static_cast<ptrdiff_t>(component.height) * component.width;
  }
  take_planes(&encoder, planes.data());
}

}  // namespace

bool takes_planes(const ELO_ENCODER& encoder) {
  return encoder.componentCount == 1 || is_420(encoder);
}

bool read_input_rows(ELO_ENCODER& encoder) {
  if (encoder.pixels == nullptr || !takes_planes(encoder)) return false;
  switch (encoder.format) {
    case TAVIRPELO_RGB565:
      if (!is_420(encoder)) return false;
      convert_rows<Rgb565Pixel>(encoder);
      return true;
    case TAVIRPELO_RGB888:
      if (!is_420(encoder)) return false;
      convert_rows<Rgb888Pixel>(encoder);
      return true;
    case TAVIRPELO_GREY8:
      if (encoder.componentCount != 1) return false;
      [[fallthrough]];
    default:
      read_planes(encoder);
      return true;
  }
}

void take_planes(ELO_ENCODER* encoder, const uint8_t* const* planes) {
  for (size_t i = 0; i < static_cast<size_t>(encoder->componentCount); ++i) {
    EncoderComponent& component = encoder->components[i];
    const auto width = static_cast<size_t>(component.width);
    const int rows = valid_rows(*encoder, component);
    for (int y = 0; y < rows; ++y) {
      std::memcpy(component.row(y), planes[i] + static_cast<size_t>(y) * width, width);
    }
    pad(component, rows);
  }
}

}  // namespace pelo::jpeg
