// Pixels as they should be: bytes in each output format, sampling positions, places in a box.
#pragma once

#include <array>
#include <cstdint>

#include "codec/pixel/row_stores.h"
#include "tests/support/bytes.h"

namespace tests {

constexpr uint8_t kFill = 0x33;  // what buffers hold before a decode

struct Rgba {
  uint8_t r = 0, g = 0, b = 0, a = 255;
  bool operator==(const Rgba&) const = default;
};

inline Bytes word_bytes(int word) {
  return {static_cast<uint8_t>(word), static_cast<uint8_t>(word >> 8)};
}
inline int word565(int r, int g, int b) {
  return r >> 3 << 11 | g >> 2 << 5 | b >> 3;
}

// A pixel's bytes in an output format.
inline Bytes pixel_bytes(const Rgba& p, int format) {
  const auto [r, g, b, a] = p;
  Bytes word = word_bytes(format == 10 ? word565(b, g, r) : word565(r, g, b));
  if (format == 6) word.push_back(a);
  switch (format) {
    case 1:
      return {r, g, b};
    case 11:
      return {b, g, r};
    case 5:
      return {a, r, g, b};
    case 7:
      return {r, g, b, a};
    case 8:
      return {b, g, r, a};
    default:
      return word;
  }
}

// A channel of alpha `a` over another.
inline uint8_t blended(int front, int a, int behind) {
  return static_cast<uint8_t>((front * (a + 1) >> 8) + (behind * (256 - a) >> 8));
}
inline int blended565(const Rgba& p, int behind) {
  return word565(blended(p.r, p.a, behind >> 11 << 3), blended(p.g, p.a, (behind >> 5 & 63) << 2),
                 blended(p.b, p.a, (behind & 31) << 3));
}

// Position of sample k of `target` along a side of `source`: floor((q + k * source) / target).
inline int position(int k, int source, int target, int q) {
  return static_cast<int>((q + int64_t{k} * source) / target);
}

struct Size {
  int width, height;
};

// use(x, y) for the four points that output pixel (x, y) of `to` averages over.
template <class Use>
void four_points(Size from, Size to, int x, int y, Use use) {
  for (const int qy : {from.height / 4, 3 * from.height / 4}) {
    for (const int qx : {from.width / 4, 3 * from.width / 4})
      use(position(x, from.width, to.width, qx), position(y, from.height, to.height, qy));
  }
}

// A picture at (x, y) of a box, turned clockwise by quarters.
struct Placement {
  Size box, picture;
  int turn, x, y;
};
inline Placement centred(Size box, Size picture, int turn = 0) {
  const Size turned = turn % 2 ? Size{picture.height, picture.width} : picture;
  return {box, picture, turn, (box.width - turned.width) / 2, (box.height - turned.height) / 2};
}

// The box's bytes: pixel(x, y) where the picture is, cut at the box, and the fill elsewhere.
template <class Pixel>
Bytes placed(const Placement& p, int format, Pixel pixel, uint8_t fill = kFill) {
  const int bytes = pelo::bytes_per_pixel(format);
  Bytes out(static_cast<size_t>(p.box.width * p.box.height * bytes), fill);
  for (int y = 0; y < p.picture.height; ++y) {
    for (int x = 0; x < p.picture.width; ++x) {
      const int right = p.picture.width - 1 - x, below = p.picture.height - 1 - y;
      const int column = p.x + std::array{x, below, right, y}[static_cast<size_t>(p.turn)];
      const int row = p.y + std::array{y, x, below, right}[static_cast<size_t>(p.turn)];
      if (column < 0 || row < 0 || column >= p.box.width || row >= p.box.height) continue;
      const Bytes stored = pixel(x, y);
      std::copy(stored.begin(), stored.end(), out.begin() + (row * p.box.width + column) * bytes);
    }
  }
  return out;
}

}  // namespace tests
