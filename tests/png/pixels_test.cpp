// Pixels of every colour type, depth and interlacing, in every output format, size and placement.
#include "tests/png/png_decode.h"

namespace tests {
namespace {

struct Kind {
  uint8_t type, depth;
};
constexpr Kind kKinds[] = {{0, 1}, {0, 2}, {0, 4}, {0, 8}, {0, 16}, {2, 8}, {2, 16}, {3, 1},
                           {3, 2}, {3, 4}, {3, 8}, {4, 8}, {4, 16}, {6, 8}, {6, 16}};

// Where output pixel k of T draws from: the point a quarter of a pixel in.
uint32_t sampled(uint32_t k, uint32_t source, uint32_t target) {
  return static_cast<uint32_t>((source / 4 + uint64_t{k} * source) / target);
}

uint8_t blended(uint32_t f, uint32_t a, uint32_t b) {
  return static_cast<uint8_t>((f * (a + 1) >> 8) + (b * (256 - a) >> 8));
}
uint16_t word565(uint32_t r, uint32_t g, uint32_t b) {
  return static_cast<uint16_t>((r >> 3) << 11 | (g >> 2) << 5 | b >> 3);
}

// The bytes of one pixel over a background of `fill` bytes.
Bytes pixel_bytes(const std::array<uint8_t, 4>& p, int format, uint8_t fill) {
  const auto [r, g, b, a] = p;
  const uint32_t behind = static_cast<uint32_t>(fill << 8 | fill);
  switch (format) {
    case 0: {
      const uint16_t v =
          word565(blended(r, a, behind >> 11 << 3), blended(g, a, (behind >> 5 & 63) << 2),
                  blended(b, a, (behind & 31) << 3));
      return {static_cast<uint8_t>(v), static_cast<uint8_t>(v >> 8)};
    }
    case 1:
      return {blended(r, a, fill), blended(g, a, fill), blended(b, a, fill)};
    case 5:
      return {a, r, g, b};
    case 6:
      return {static_cast<uint8_t>(word565(r, g, b)), static_cast<uint8_t>(word565(r, g, b) >> 8), a};
    case 7:
      return {r, g, b, a};
    default:
      return {b, g, r, a};
  }
}

// The whole expected buffer: the picture at (x0, y0), the fill elsewhere and where the box ends.
Bytes expected(const PngImage& image, int width, int height, int outWidth, int outHeight, int x0, int y0,
               int format, uint8_t fill = 0x33) {
  const size_t bpp = static_cast<size_t>(pelo::bytes_per_pixel(format));
  Bytes out(static_cast<size_t>(width * height) * bpp, fill);
  for (int y = 0; y < outHeight && y + y0 < height; ++y) {
    for (int x = 0; x < outWidth && x + x0 < width; ++x) {
      const uint32_t sx = sampled(x, image.width, outWidth), sy = sampled(y, image.height, outHeight);
      const Bytes p = pixel_bytes(image.rgba(sx, sy), format, fill);
      std::copy(p.begin(), p.end(), out.begin() + ((y + y0) * width + x + x0) * static_cast<int>(bpp));
    }
  }
  return out;
}

TEST(PngPixels, EveryKindInEveryFormat) {
  uint32_t seed = 0;
  for (const Kind kind : kKinds) {
    for (const bool interlaced : {false, true}) {
      for (const bool trns : {false, true}) {
        if (trns && kind.type >= 4) continue;
        for (const int side : {1, 2, 3, 5, 8, 13, 33}) {
          const PngImage image = random_png_image(++seed, kind.type, kind.depth,
                                                  static_cast<uint32_t>(side), 9, interlaced, trns);
          const int format = std::array{0, 1, 5, 6, 7, 8}[seed % 6];
          const PngResult got = decode_png(build_png(image), side + 3, 11, format);
          ASSERT_EQ(1, got.answer);
          ASSERT_EQ(expected(image, side + 3, 11, side, 9, 1, 1, format), got.pixels)
              << "type " << int{kind.type} << " depth " << int{kind.depth} << " format " << format
              << " interlaced " << interlaced << " trns " << trns << " width " << side;
        }
      }
    }
  }
}

TEST(PngPixels, ResampledPlainAndInterlacedAlike) {
  const int sizes[][2] = {{7, 9}, {40, 31}, {64, 3}, {3, 50}, {20, 20}, {90, 70}};
  uint32_t seed = 100;
  for (const auto& [width, height] : sizes) {
    for (const int format : {0, 1, 6, 8}) {
      for (const bool interlaced : {false, true}) {
        ++seed;
        const bool palette = seed % 2 == 0;
        const PngImage image = random_png_image(seed, palette ? 3 : 6, 8, 37, 23, interlaced, palette);
        const PngResult got = decode_png(build_png(image), width, height, format, TAVIRPELO_FIT_STRETCH);
        ASSERT_EQ(1, got.answer);
        ASSERT_EQ(width, got.outWidth);
        ASSERT_EQ(expected(image, width, height, width, height, 0, 0, format), got.pixels)
            << width << "x" << height << " interlaced " << interlaced << " format " << format;
      }
    }
  }
}

TEST(PngPixels, FittingAndPlacing) {
  struct Case {
    uint32_t width, height;
    int boxWidth, boxHeight;
    uint32_t option;
    int outWidth, outHeight, x, y;
  };
  const Case cases[] = {{100, 50, 200, 200, 0, 100, 50, 50, 75},
                        {400, 100, 100, 100, 0, 100, 25, 0, 37},
                        {30, 90, 45, 45, 0, 15, 45, 15, 0},
                        {40, 40, 30, 60, TAVIRPELO_FIT_FILL, 30, 30, 0, 15},  // no filling: as fitted
                        {30, 20, 40, 40, TAVIRPELO_ROTATE_180, 30, 20, 5, 10}};
  for (const Case& c : cases) {
    const PngImage image = random_png_image(c.width, 2, 8, c.width, c.height, false, false);
    const PngResult got = decode_png(build_png(image), c.boxWidth, c.boxHeight, 1, c.option);
    EXPECT_EQ(1, got.answer);
    EXPECT_EQ(expected(image, c.boxWidth, c.boxHeight, c.outWidth, c.outHeight, c.x, c.y, 1), got.pixels)
        << c.width << "x" << c.height;
  }
}

// Rows go unrotated where the turned picture would lie, cut at the box.
TEST(PngPixels, SidewaysRowsAreCutAtTheBox) {
  const PngImage image = random_png_image(5, 2, 8, 50, 100, false, false);
  const PngResult got = decode_png(build_png(image), 100, 50, 1, TAVIRPELO_ROTATE_90);
  EXPECT_EQ(1, got.answer);
  EXPECT_EQ(expected(image, 100, 50, 50, 100, 0, 0, 1), got.pixels);
}

TEST(PngPixels, TightRowsFollowEachOther) {
  const PngImage image = random_png_image(6, 2, 8, 60, 30, false, false);
  const PngResult got = decode_png(build_png(image), 20, 20, 1, TAVIRPELO_FIT_TIGHT);
  EXPECT_EQ(20, got.outWidth);
  EXPECT_EQ(10, got.outHeight);
  const Bytes picture = expected(image, 20, 10, 20, 10, 0, 0, 1);
  EXPECT_TRUE(std::equal(picture.begin(), picture.end(), got.pixels.begin()));
}

// A resampled interlaced picture that is gathered first comes out rotated.
TEST(PngPixels, GatheredPicturesAreRotated) {
  constexpr uint32_t kGather = 0x1000;
  const PngImage image = random_png_image(7, 2, 8, 24, 16, true, false);
  const uint32_t turns[] = {0, TAVIRPELO_ROTATE_90, TAVIRPELO_ROTATE_180, TAVIRPELO_ROTATE_270};
  for (int turn = 0; turn < 4; ++turn) {
    const PngResult got = decode_png(build_png(image), 12, 12, 7, kGather | turns[turn]);
    ASSERT_EQ(1, got.answer);
    ASSERT_EQ(12, got.outWidth);
    ASSERT_EQ(8, got.outHeight);
    for (int y = 0; y < 8; ++y) {
      for (int x = 0; x < 12; ++x) {
        const int toX[] = {x, 9 - y, 11 - x, 2 + y}, toY[] = {2 + y, x, 9 - y, 11 - x};
        const auto p = image.rgba(sampled(x, 24, 12), sampled(y, 16, 8));
        const size_t at = 4 * static_cast<size_t>(toY[turn] * 12 + toX[turn]);
        ASSERT_EQ(Bytes(p.begin(), p.end()), Bytes(&got.pixels[at], &got.pixels[at] + 4)) << turn;
      }
    }
  }
}

// Sizes of nothing and formats without a writer are no failure, and write nothing.
TEST(PngPixels, NothingToWrite) {
  const Bytes wide = build_png(random_png_image(8, 2, 8, 1000, 1, false, false));
  const Bytes untouched(100 * 100 * 3, 0x33);
  EXPECT_EQ(1, decode_png(wide, 100, 100, 1).answer);
  EXPECT_EQ(untouched, decode_png(wide, 100, 100, 1).pixels);
  EXPECT_EQ(1, decode_png(wide, 0, 10, 1).answer);
  for (const int format : {9, 10, 11, 12}) {
    const PngResult got = decode_png(wide, 1000, 1, format);
    EXPECT_EQ(1, got.answer);
    EXPECT_EQ(1000, got.outWidth);
    EXPECT_EQ(Bytes(got.pixels.size(), 0x33), got.pixels);
  }
}

TEST(PngPixels, AlphaFlag) {
  const auto flag = [](const PngImage& image) {
    Bytes file = build_png(image);
    return PELOI_GetAlphaTrFlag(open_memory(file, 0).get());
  };
  EXPECT_EQ(0, flag(random_png_image(1, 2, 8, 3, 3, false, false)));
  EXPECT_EQ(1, flag(random_png_image(1, 3, 4, 3, 3, false, true)));
  EXPECT_EQ(1, flag(random_png_image(1, 4, 16, 3, 3, false, false)));
}

}  // namespace
}  // namespace tests
