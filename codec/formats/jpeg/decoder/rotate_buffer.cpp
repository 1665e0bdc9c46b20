// Turning a decoded buffer in place.
#include <cstring>

#include "codec/base/os_memory.h"
#include "codec/pixel/row_stores.h"
#include "tavirpelo/decode.h"

namespace pelo::jpeg {
namespace {

// Through a second buffer: rows become columns, so that in place every pixel would chase another.
int rotate(void* buffer, int width, int height, int outFormat, bool clockwise) {
  const bool known = outFormat == TAVIRPELO_RGB565 || outFormat == TAVIRPELO_RGB888 ||
                     outFormat == TAVIRPELO_RGB565_DITHER;
  if (!known || buffer == nullptr || width < 1 || height < 1) return 0;
  const auto size = static_cast<size_t>(pelo::bytes_per_pixel(outFormat));
  const auto w = static_cast<size_t>(width);
  const auto h = static_cast<size_t>(height);
  const auto pixels = pelo::checked_mul(w, h);
  const auto bytes = pixels ? pelo::checked_mul(*pixels, size) : std::nullopt;
  pelo::OsBuffer<uint8_t> turned;
  if (!bytes || !turned.allocate(*bytes)) return 0;
  const auto* in = static_cast<const uint8_t*>(buffer);
  for (size_t r = 0; r < h; ++r) {
    for (size_t c = 0; c < w; ++c, in += size) {
      const size_t to = clockwise ? c * h + (h - 1 - r) : (w - 1 - c) * h + r;
      std::memcpy(turned.data() + to * size, in, size);
    }
  }
  std::memcpy(buffer, turned.data(), *bytes);
  return 1;
}

}  // namespace

int rotate_buffer_90(void* buffer, int width, int height, int outFormat) {
  return rotate(buffer, width, height, outFormat, true);
}

int rotate_buffer_270(void* buffer, int width, int height, int outFormat) {
  return rotate(buffer, width, height, outFormat, false);
}

}  // namespace pelo::jpeg
