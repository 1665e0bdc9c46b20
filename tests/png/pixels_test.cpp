// Pixels of every colour type, depth and interlacing, in every output format, size and placement.
#include "codec/formats/png/png_abi.h"
#include "tests/png/png_decode.h"

namespace tests {
namespace {

// The bytes of one pixel over a background of fill bytes.
Bytes over_fill(const Rgba& p, int format) {
  if (format == 0) return word_bytes(blended565(p, kFill << 8 | kFill));
  if (format == 1) return {blended(p.r, p.a, kFill), blended(p.g, p.a, kFill), blended(p.b, p.a, kFill)};
  return pixel_bytes(p, format);
}

// Output pixel k of T draws from the point a quarter of a pixel in.
Bytes expected(const PngImage& image, const Placement& place, int format) {
  const int width = static_cast<int>(image.width), height = static_cast<int>(image.height);
  return placed(place, format, [&](int x, int y) {
    return over_fill(image.rgba(position(x, width, place.picture.width, width / 4),
                                position(y, height, place.picture.height, height / 4)),
                     format);
  });
}

TEST(PngPixels, EveryKindInEveryFormat) {
  uint32_t seed = 0;
  for (const PngKind kind : kPngKinds) {
    for (const bool interlaced : {false, true}) {
      for (const bool trns : {false, true}) {
        if (trns && kind.type >= 4) continue;
        for (const int side : {1, 2, 3, 5, 8, 13, 33}) {
          const PngImage image = random_png_image(++seed, kind.type, kind.depth,
                                                  static_cast<uint32_t>(side), 9, interlaced, trns);
          const int format = std::array{0, 1, 5, 6, 7, 8}[seed % 6];
          const Decode got = decode_png(build_png(image), side + 3, 11, format);
          ASSERT_EQ(1, got.answer);
          ASSERT_EQ(expected(image, centred({side + 3, 11}, {side, 9}), format), got.pixels)
              << "type " << int{kind.type} << " depth " << int{kind.depth} << " format " << format
              << " interlaced " << interlaced << " trns " << trns << " width " << side;
        }
      }
    }
  }
}

TEST(PngPixels, ResampledPlainAndInterlacedAlike) {
  uint32_t seed = 100;
  for (const Size size : {Size{7, 9}, {40, 31}, {64, 3}, {3, 50}, {20, 20}, {90, 70}}) {
    for (const int format : {0, 1, 6, 8}) {
      for (const bool interlaced : {false, true}) {
        const bool palette = ++seed % 2 == 0;
        const PngImage image = random_png_image(seed, palette ? 3 : 6, 8, 37, 23, interlaced, palette);
        const Decode got =
            decode_png(build_png(image), size.width, size.height, format, TAVIRPELO_FIT_STRETCH);
        ASSERT_EQ(1, got.answer);
        ASSERT_EQ(size.width, got.outWidth);
        ASSERT_EQ(expected(image, centred(size, size), format), got.pixels)
            << size.width << "x" << size.height << " " << interlaced << " format " << format;
      }
    }
  }
}

TEST(PngPixels, FittingAndPlacing) {
  struct {
    uint32_t width, height, option;
    Placement place;
  } const cases[] = {
      {100, 50, 0, {{200, 200}, {100, 50}, 0, 50, 75}},
      {400, 100, 0, {{100, 100}, {100, 25}, 0, 0, 37}},
      {30, 90, 0, {{45, 45}, {15, 45}, 0, 15, 0}},
      {40, 40, TAVIRPELO_FIT_FILL, {{30, 60}, {30, 30}, 0, 0, 15}},  // no filling: as fitted
      {30, 20, TAVIRPELO_ROTATE_180, {{40, 40}, {30, 20}, 0, 5, 10}},
      // Rows go unrotated where the turned picture would lie, cut at the box.
      {50, 100, TAVIRPELO_ROTATE_90, {{100, 50}, {50, 100}, 0, 0, 0}},
      // Tight rows follow each other.
      {60, 30, TAVIRPELO_FIT_TIGHT, {{20, 20}, {20, 10}, 0, 0, 0}}};
  for (const auto& c : cases) {
    const PngImage image = random_png_image(c.width, 2, 8, c.width, c.height, false, false);
    const Size box = c.place.box;
    const Decode got = decode_png(build_png(image), box.width, box.height, 1, c.option);
    EXPECT_EQ(1, got.answer);
    EXPECT_EQ(expected(image, c.place, 1), got.pixels) << c.width << "x" << c.height;
  }
}

// A resampled interlaced picture that is gathered first comes out rotated.
TEST(PngPixels, GatheredPicturesAreRotated) {
  constexpr uint32_t kGather = 0x1000;
  const PngImage image = random_png_image(7, 2, 8, 24, 16, true, false);
  for (int turn = 0; turn < 4; ++turn) {
    const uint32_t option = kGather | static_cast<uint32_t>(turn) << 2;
    const Decode got = decode_png(build_png(image), 12, 12, 7, option);
    ASSERT_EQ(1, got.answer);
    ASSERT_EQ(12, got.outWidth);
    ASSERT_EQ(8, got.outHeight);
    const Bytes want = expected(image, centred({12, 12}, {12, 8}, turn), 7);
    EXPECT_EQ(want, got.pixels) << turn;
  }
}

// Their tRNS is blended into RGB565 alone, by weights that alpha 255 does not fill.
TEST(PngPixels, GatheredTransparency) {
  const PngImage image = random_png_image(9, 3, 8, 24, 16, true, true);
  const auto mix = [](int front, int alpha, int behind) {
    return (behind * (255 - alpha) >> 8) + (front * alpha >> 8);
  };
  for (const int format : {0, 1, 6}) {
    const Decode got = decode_png(build_png(image), 12, 8, format, 0x1000);
    const Bytes want = placed(centred({12, 8}, {12, 8}), format, [&](int x, int y) {
      const Rgba p = image.rgba(position(x, 24, 12, 6), position(y, 16, 8, 4));
      if (format != 0) return pixel_bytes(p, format);
      constexpr int kWord = kFill << 8 | kFill;
      return word_bytes(word565(mix(p.r, p.a, kWord >> 11 << 3), mix(p.g, p.a, (kWord >> 5 & 63) << 2),
                                mix(p.b, p.a, (kWord & 31) << 3)));
    });
    EXPECT_EQ(want, got.pixels) << format;
  }
}

// Sizes of nothing and formats without a writer are no failure, and write nothing.
TEST(PngPixels, NothingToWrite) {
  const Bytes wide = build_png(random_png_image(8, 2, 8, 1000, 1, false, false));
  EXPECT_EQ(1, decode_png(wide, 0, 10, 1).answer);
  for (const int format : {1, 9, 10, 11, 12}) {
    const Decode got = decode_png(wide, format == 1 ? 100 : 1000, 1, format);
    EXPECT_EQ(1, got.answer);
    EXPECT_EQ(format == 1 ? 100 : 1000, got.outWidth);
    EXPECT_EQ(Bytes(got.pixels.size(), kFill), got.pixels) << format;
  }
}

TEST(PngPixels, AlphaFlag) {
  const auto flag = [](uint8_t type, uint8_t depth, bool trns) {
    Bytes file = build_png(random_png_image(1, type, depth, 3, 3, false, trns));
    return PELOI_GetAlphaTrFlag(open_memory(file, 0).get());
  };
  EXPECT_EQ(0, flag(2, 8, false));
  EXPECT_EQ(1, flag(3, 4, true));
  EXPECT_EQ(1, flag(4, 16, false));
}

}  // namespace
}  // namespace tests
