// Raw images: creation, release, filling.
#include <algorithm>
#include <cstring>

#include "codec/base/errors.h"
#include "codec/base/byte_order.h"
#include "codec/base/os_memory.h"
#include "codec/pixel/fill.h"
#include "codec/pixel/packers.h"
#include "codec/pixel/pixel_layout.h"
#include "tavirpelo/raw.h"

static_assert(sizeof(void*) != 4 || sizeof(TAVIRPELO_RAWINFO) == 16);

namespace {

constexpr int kMaxSide = 5000;

bool has_layout(int format) {
  return format == TAVIRPELO_RGB565 || format == TAVIRPELO_RGB888 || format == TAVIRPELO_YUV420 ||
         format == TAVIRPELO_ARGB8888 || format == TAVIRPELO_RGB565A8;
}

// Sides are at most 5000: no product overflows.
size_t block_size(size_t width, size_t height, int format) {
  if (format != TAVIRPELO_YUV420)
    return width * height * static_cast<size_t>(pelo::bytes_per_pixel(format));
  return width * height + ((height + 1) >> 1) * ((width + 1) & ~size_t{1});
}

// Whatever the colour, a planar image turns black.
void fill_planes(TAVIRPELO_RAWINFO& raw) {
  const size_t luma = size_t{raw.width} * raw.height;
  auto* out = static_cast<uint8_t*>(raw.pData);
  std::memset(out, 0, luma);
  std::memset(out + luma, 128, block_size(raw.width, raw.height, TAVIRPELO_YUV420) - luma);
}

int fill(TAVIRPELO_RAWINFO* raw, uint16_t word, uint8_t r, uint8_t g, uint8_t b) {
  if (raw == nullptr || raw->pData == nullptr) {
    pelo::record_error(pelo::ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
    return 0;
  }
  uint8_t pixel[4] = {};
  const auto cover = [&](size_t size) {
    pelo::fill_pixels(raw->pData, size_t{raw->width} * raw->height, pixel, size);
  };
  switch (raw->format) {
    case TAVIRPELO_RGB888:
      pixel[0] = r;
      pixel[1] = g;
      pixel[2] = b;
      cover(3);
      break;
    case TAVIRPELO_YUV420:
      fill_planes(*raw);
      break;
    case TAVIRPELO_ARGB8888:
      pixel[0] = 255;
      pixel[1] = r;
      pixel[2] = g;
      pixel[3] = b;
      cover(4);
      break;
    default:
      pelo::store_le16(pixel, word);
      pixel[2] = 255;
      cover(raw->format == TAVIRPELO_RGB565A8 ? 3 : 2);
      break;
  }
  return 1;
}

}  // namespace

TAVIRPELO_RAWINFO* TAVIRPELO_CreateRawInfo(int width, int height, int format) {
  if (width < 1 || height < 1) {
    pelo::record_error(pelo::ErrorWord::kCodec, TAVIRPELO_CODEC_SIZE);
    return nullptr;
  }
  if (width > kMaxSide || height > kMaxSide) return nullptr;
  if (!has_layout(format)) {
    pelo::record_error(pelo::ErrorWord::kCodec, TAVIRPELO_CODEC_RAW_FORMAT);
    format = TAVIRPELO_RGB565;
  }
  auto raw = pelo::os_new<TAVIRPELO_RAWINFO>();
  if (!raw) {
    pelo::record_error(pelo::ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
    return nullptr;
  }
  pelo::OsBuffer<uint8_t> pixels;
  raw->width = static_cast<uint32_t>(width);
  raw->height = static_cast<uint32_t>(height);
  raw->format = static_cast<uint32_t>(format);
  if (!pixels.allocate(block_size(raw->width, raw->height, format))) return nullptr;
  raw->pData = pixels.release();
  return raw.release();
}

void TAVIRPELO_DestroyRawInfo(TAVIRPELO_RAWINFO* raw) {
  if (raw == nullptr) return;
  TAVIRPELO_OsFree(raw->pData);
  TAVIRPELO_OsFree(raw);
}

int TAVIRPELO_FillRawImageWithRgb565(TAVIRPELO_RAWINFO* raw, uint16_t colour565) {
  return fill(raw, colour565, static_cast<uint8_t>(colour565 >> 8 & 0xF8),
              static_cast<uint8_t>(colour565 >> 3 & 0xFC),
              static_cast<uint8_t>((colour565 & 0x1F) << 3));
}

int TAVIRPELO_FillRawImageWithRgb888(TAVIRPELO_RAWINFO* raw, uint8_t r, uint8_t g, uint8_t b) {
  return fill(raw, pelo::rgb565(r, g, b), r, g, b);
}
