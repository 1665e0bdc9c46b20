// One MCU row of samples from the image: colour conversion, or copies of planes. Rows and columns beyond
// the picture repeat its last ones, so that the output depends on nothing else.
#include <algorithm>
#include <cstring>

#include "codec/core/ground/byte_order.h"
#include "codec/jpeg/encoder/encoder.h"

using namespace pelo;
using namespace pelo::jpeg;

namespace {

struct Rgb {
  int r, g, b;
};
struct Rgb888 {
  static constexpr size_t kBytes = 3;
  static Rgb load(const uint8_t* p) { return {p[0], p[1], p[2]}; }
};
struct Rgb565 {
  static constexpr size_t kBytes = 2;
  static Rgb load(const uint8_t* p) {
    const int word = load_le16(p);
    return {word >> 8 & 0xF8, word >> 3 & 0xFC, word << 3 & 0xF8};
  }
};

// BT.601 with 12 fraction bits.
template <class Pixel>
void luma_row(const uint8_t* __restrict in, int width, uint8_t* __restrict out) {
  for (int x = 0; x < width; ++x) {
    const Rgb p = Pixel::load(in + Pixel::kBytes * static_cast<size_t>(x));
    out[x] = static_cast<uint8_t>((1225 * p.r + 2404 * p.g + 467 * p.b) >> 12);
  }
}

// Chroma is that of the upper left pixel of each 2 x 2.
template <class Pixel>
void chroma_row(const uint8_t* __restrict in, int count, uint8_t* __restrict cb, uint8_t* __restrict cr) {
  for (int x = 0; x < count; ++x) {
    const Rgb p = Pixel::load(in + 2 * Pixel::kBytes * static_cast<size_t>(x));
    cb[x] = static_cast<uint8_t>(((2048 * p.b - 1357 * p.g - 691 * p.r) >> 12) + 128);
    cr[x] = static_cast<uint8_t>(((2048 * p.r - 1715 * p.g - 333 * p.b) >> 12) + 128);
  }
}

uint8_t* row_of(EncoderComponent& component, int row) {
  return component.samples.data() + static_cast<size_t>(component.stride) * static_cast<size_t>(row);
}

// Repeats the last column to the right, the last of `rows` valid rows downwards.
void pad(EncoderComponent& component, int rows) {
  for (int y = 0; y < rows; ++y) {
    uint8_t* row = row_of(component, y);
    std::memset(row + component.width, row[component.width - 1],
                static_cast<size_t>(component.stride - component.width));
  }
  for (int y = rows; y < 8 * component.v; ++y) {
    std::memcpy(row_of(component, y), row_of(component, rows - 1), static_cast<size_t>(component.stride));
  }
}

// Sample rows of a component that the current MCU row holds.
int valid_rows(const ELO_ENCODER& encoder, const EncoderComponent& component) {
  return std::min(8 * component.v, component.height - encoder.mcuRow * 8 * component.v);
}

template <class Pixel>
void convert_rows(ELO_ENCODER& encoder, const uint8_t* pixels) {
  auto& [y, cb, cr] = encoder.components;
  const size_t stride = Pixel::kBytes * static_cast<size_t>(encoder.width);
  const uint8_t* first = pixels + stride * static_cast<size_t>(encoder.mcuRow) * 16;
  const int rows = valid_rows(encoder, y);
  for (int r = 0; r < rows; ++r) {
    const uint8_t* row = first + stride * static_cast<size_t>(r);
    luma_row<Pixel>(row, encoder.width, row_of(y, r));
    if (r % 2 == 0) chroma_row<Pixel>(row, cb.width, row_of(cb, r / 2), row_of(cr, r / 2));
  }
  pad(y, rows);
  pad(cb, (rows + 1) / 2);
  pad(cr, (rows + 1) / 2);
}

// Planes of a packed picture, moved to the current MCU row.
void read_planes(ELO_ENCODER& encoder, const uint8_t* pixels) {
  const uint8_t* planes[3] = {};
  for (size_t c = 0; c < static_cast<size_t>(encoder.componentCount); ++c) {
    const EncoderComponent& component = encoder.components[c];
    const auto width = static_cast<size_t>(component.width);
    planes[c] = pixels + width * static_cast<size_t>(encoder.mcuRow * 8 * component.v);
    pixels += width * static_cast<size_t>(component.height);
  }
  __elo_jpeg_enc_get_raw_data(&encoder, planes, 8 * encoder.vMax);
}

}  // namespace

void __elo_jpeg_enc_get_raw_data(ELO_ENCODER* encoder, const uint8_t* const* planes, int rowsAvailable) {
  for (size_t c = 0; c < static_cast<size_t>(encoder->componentCount); ++c) {
    EncoderComponent& component = encoder->components[c];
    const int available = rowsAvailable * component.v / encoder->vMax;
    const int rows = std::min(valid_rows(*encoder, component), available);
    const auto width = static_cast<size_t>(component.width);
    for (int y = 0; y < rows; ++y) {
      std::memcpy(row_of(component, y), planes[c] + width * static_cast<size_t>(y), width);
    }
    pad(component, rows);
  }
}

int __elo_jpeg_enc_process_image_data(ELO_ENCODER* encoder, const void* pixels) {
  const auto* bytes = static_cast<const uint8_t*>(pixels);
  switch (encoder->format) {
    case TAVIRPELO_RGB565: convert_rows<Rgb565>(*encoder, bytes); break;
    case TAVIRPELO_RGB888: convert_rows<Rgb888>(*encoder, bytes); break;
    default: read_planes(*encoder, bytes); break;
  }
  return __elo_jpeg_enc_compress_data(encoder);
}
