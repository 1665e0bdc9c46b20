// GIF decodes with guard bytes around the buffer, and what they should give by the plain formulas.
#pragma once

#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"

namespace tests {

constexpr uint8_t kFill = 0x33;

struct GifResult {
  int answer;
  Bytes pixels;
  int outWidth, outHeight;
};

inline GifResult decode_gif(Bytes file, int width, int height, int format = 7, uint32_t option = 0) {
  GuardedPixels pixels(width, height, format, kFill);
  const DecInfo decInfo = open_memory(file, format, option);
  if (decInfo == nullptr) return {0, {}, 0, 0};
  const int answer = TAVIRPELOI_DecodeGIF(decInfo.get(), pixels.data(), width, height);
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  return {answer, pixels.content(), decInfo->outWidth, decInfo->outHeight};
}

// Every frame that an animation gives, and the answer that ended it.
struct GifFrames {
  int answer;
  std::vector<Bytes> frames;
};
inline GifFrames decode_frames(Bytes file, int width, int height, int format = 7, uint32_t option = 0) {
  GifFrames result{0, {}};
  const DecInfo decInfo = open_memory(file, format, option);
  if (decInfo == nullptr) return result;
  do {
    GuardedPixels pixels(width, height, format, kFill);
    result.answer = TAVIRPELOI_DecodeAGIF(decInfo.get(), pixels.data(), width, height);
    result.frames.push_back(pixels.content());
  } while (result.answer == 1);
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  return result;
}

// A pixel of the first image as R, G, B, A; zeros where it is transparent.
struct Colour {
  uint8_t r, g, b, a;
  bool operator==(const Colour&) const = default;
};
inline Colour colour_at(const GifFile& file, int x, int y) {
  const GifImage& image = file.images[0];
  const int index = image.indices[static_cast<size_t>((y - image.top) * image.width + x - image.left)];
  if (image.control && image.control->transparent == index) return {0, 0, 0, 0};
  const Bytes& palette = image.palette.empty() ? file.palette : image.palette;
  const uint8_t* p = palette.data() + 3 * index;
  return {p[0], p[1], p[2], 255};
}

// A pixel's bytes in an output format.
inline Bytes packed(Colour c, int format) {
  const int swapped = c.b >> 3 << 11 | c.g >> 2 << 5 | c.r >> 3;
  const int straight = c.r >> 3 << 11 | c.g >> 2 << 5 | c.b >> 3;
  const int word = format == 0 ? straight : swapped;
  switch (format) {
    case 0:
    case 10:
      return {static_cast<uint8_t>(word), static_cast<uint8_t>(word >> 8)};
    case 1:
      return {c.r, c.g, c.b};
    case 11:
      return {c.b, c.g, c.r};
    case 5:
      return {c.a, c.r, c.g, c.b};
    case 7:
      return {c.r, c.g, c.b, c.a};
    default:
      return {c.b, c.g, c.r, c.a};
  }
}

// Stores a pixel at (x, y) of a buffer `width` pixels wide.
inline void put_pixel(Bytes& buffer, int width, int x, int y, const Bytes& pixel) {
  std::copy(
      pixel.begin(), pixel.end(),
      buffer.begin() + (static_cast<ptrdiff_t>(y) * width + x) * static_cast<ptrdiff_t>(pixel.size()));
}

}  // namespace tests
