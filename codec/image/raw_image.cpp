// Raw images: creation, release, filling.
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"
#include "codec/base/os_memory.h"
#include "codec/image/image.h"
#include "codec/pixel/paint.h"
#include "codec/pixel/pixel_layout.h"
#include "codec/pixel/row_stores.h"

static_assert(sizeof(void*) != 4 || sizeof(TAVIRPELO_RAWINFO) == 16);

namespace pelo {
namespace {

constexpr int kMaxSide = 5000;

bool has_layout(int format) {
  return format == TAVIRPELO_RGB565 || format == TAVIRPELO_RGB888 || format == TAVIRPELO_YUV420 ||
         format == TAVIRPELO_ARGB8888 || format == TAVIRPELO_RGB565A8;
}

// Sides are at most 5000: no product overflows.
size_t block_size(size_t width, size_t height, int format) {
  if (format != TAVIRPELO_YUV420) return width * height * static_cast<size_t>(bytes_per_pixel(format));
  return width * height + ((height + 1) >> 1) * ((width + 1) & ~size_t{1});
}

// Whatever the colour, a planar image turns black.
void fill_planes(TAVIRPELO_RAWINFO& raw) {
  const size_t luma = size_t{raw.width} * raw.height;
  auto* out = static_cast<uint8_t*>(raw.pData);
  std::memset(out, 0, luma);
  std::memset(out + luma, 128, block_size(raw.width, raw.height, TAVIRPELO_YUV420) - luma);
}

}  // namespace

int fill(TAVIRPELO_RAWINFO* raw, uint16_t word, uint8_t r, uint8_t g, uint8_t b) {
  if (raw == nullptr || raw->pData == nullptr) {
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
    return 0;
  }
  uint8_t pixel[4] = {};
  const auto cover = [&](size_t size) {
    fill_pixels(raw->pData, size_t{raw->width} * raw->height, pixel, size);
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
      store_le16(pixel, word);
      pixel[2] = 255;
      cover(raw->format == TAVIRPELO_RGB565A8 ? 3 : 2);
      break;
  }
  return 1;
}

TAVIRPELO_RAWINFO* create_raw_image(int width, int height, int format) {
  if (width < 1 || height < 1) {
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_SIZE);
    return nullptr;
  }
  if (width > kMaxSide || height > kMaxSide) {
    refuse_size("raw image", width, height);
    return nullptr;
  }
  if (!has_layout(format)) {
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_RAW_FORMAT);
    format = TAVIRPELO_RGB565;
  }
  auto raw = os_new<TAVIRPELO_RAWINFO>();
  if (!raw) {
    refuse(Reason::kNoMemory, "raw image");
    record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
    return nullptr;
  }
  OsBuffer<uint8_t> pixels;
  raw->width = static_cast<uint32_t>(width);
  raw->height = static_cast<uint32_t>(height);
  raw->format = static_cast<uint32_t>(format);
  if (!pixels.allocate(block_size(raw->width, raw->height, format))) {
    refuse(Reason::kNoMemory, "raw image");
    return nullptr;
  }
  raw->pData = pixels.release();
  return raw.release();
}

void destroy_raw_image(TAVIRPELO_RAWINFO* raw) {
  if (raw == nullptr) return;
  os_free(raw->pData);
  os_free(raw);
}

}  // namespace pelo
