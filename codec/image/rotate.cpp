// Rotation of a raw image about its centre by any angle: nearest samples in fixed point. Compiled
// without contraction of products and sums, which would change the last bit of the start position.
#include <cmath>
#include <cstring>

#include "codec/image/image.h"

namespace pelo {
namespace {

constexpr double kPi = 3.1415926535;  // as many digits as the positions are defined with
constexpr double kOne = 131072;       // 17 fraction bits

// The source position of pixel (i, j), and its steps.
struct Walk {
  int64_t x0, y0;
  int64_t cosine, sine;
};

Walk walk_of(double width, double height, int degrees) {
  const double angle = degrees * kPi / 180;
  const double c = std::cos(angle), s = std::sin(angle);
  return {static_cast<int64_t>(((1 - c) * (width - 1) / 2 + s * (height - 1) / 2) * kOne),
          static_cast<int64_t>(((1 - c) * (height - 1) / 2 - s * (width - 1) / 2) * kOne),
          static_cast<int64_t>(c * kOne), static_cast<int64_t>(s * kOne)};
}

template <size_t Bytes>
void rotate_pixels(const TAVIRPELO_RAWINFO& raw, uint8_t* out, int degrees) {
  const auto* in = static_cast<const uint8_t*>(raw.pData);
  const Walk walk = walk_of(raw.width, raw.height, degrees);
  const int64_t width = raw.width, height = raw.height;
  for (int64_t j = 0; j < height; ++j) {
    int64_t x = walk.x0 - j * walk.sine;
    int64_t y = walk.y0 + j * walk.cosine;
    for (int64_t i = 0; i < width; ++i, out += Bytes, x += walk.cosine, y += walk.sine) {
      if (x < 0 || y < 0 || x >> 17 >= width || y >> 17 >= height) continue;
      std::memcpy(out, in + static_cast<size_t>((y >> 17) * width + (x >> 17)) * Bytes, Bytes);
    }
  }
}

}  // namespace

void rotate(const TAVIRPELO_RAWINFO& raw, void* dst, int degrees) {
  auto* out = static_cast<uint8_t*>(dst);
  switch (raw.format) {
    case TAVIRPELO_RGB565:
      rotate_pixels<2>(raw, out, degrees);
      break;
    case TAVIRPELO_RGB888:
      rotate_pixels<3>(raw, out, degrees);
      break;
    case TAVIRPELO_RGBA8888:
      rotate_pixels<4>(raw, out, degrees);
      break;
    default:
      break;
  }
}

}  // namespace pelo
