// Blending, masked copies, rotation about the centre, cropping from pictures and from files.
#include <cmath>

#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

TEST(Blend, EveryAlphaOverBytesAndWords) {
  const Bytes front = random_bytes(3 * 256, 1), behind = random_bytes(260 * 3 * 3, 2);
  Bytes src[2], dst[2] = {behind, behind};
  const auto colour = [&](int a) {
    return Rgba{front[3 * a], front[3 * a + 1], front[3 * a + 2], uint8_t(a)};
  };
  for (int a = 0; a < 256; ++a) {
    append(src[0], pixel_bytes(colour(a), TAVIRPELO_RGBA8888));
    append(src[1], pixel_bytes(colour(a), 6));
  }
  ASSERT_EQ(1, TAVIRPELO_CODEC_Blend(src[0].data(), dst[0].data(), 256, 1, 260, 3, 2, 1, 5));
  ASSERT_EQ(1, TAVIRPELO_CODEC_Blend(src[1].data(), dst[1].data(), 128, 2, 260, 3, 131, 1, 6));
  Bytes want[2] = {behind, behind};
  for (int a = 0; a < 256; ++a) {
    const size_t at = static_cast<size_t>(260 + 2 + a) * 3;
    const Rgba c = colour(a);
    want[0] = overwritten(
        want[0], at,
        {blended(c.r, a, behind[at]), blended(c.g, a, behind[at + 1]), blended(c.b, a, behind[at + 2])});
    const size_t wordAt = static_cast<size_t>(260 * (1 + a / 128) + 131 + a % 128) * 2;
    const int word = word565(c.r, c.g, c.b);
    const Rgba stored{uint8_t(word >> 11 << 3), uint8_t((word >> 5 & 63) << 2),
                      uint8_t((word & 31) << 3), c.a};
    const int over = blended565(stored, behind[wordAt] | behind[wordAt + 1] << 8);
    want[1] = overwritten(want[1], wordAt, word_bytes(over));
  }
  EXPECT_EQ(want[0], dst[0]);
  EXPECT_EQ(want[1], dst[1]);
}

TEST(Blend, PlacesOutsideAreRefused) {
  uint8_t src[16] = {}, dst[12] = {};
  const auto refused = [&](int w, int h, int x, int y, int format) {
    debug_PeloCodecError = 0;
    EXPECT_EQ(0, TAVIRPELO_CODEC_Blend(src, dst, w, h, 2, 2, x, y, format));
    return debug_PeloCodecError;
  };
  EXPECT_EQ(TAVIRPELO_CODEC_FORMAT, refused(1, 1, 0, 0, 7));
  for (const auto& [w, h, x, y] : {std::array{3, 1, 0, 0},
                                   {1, 1, 2, 0},
                                   {1, 1, -1, 0},
                                   {1, 1, 0, -1},
                                   {0, 1, 0, 0},
                                   {1, 1, 0x7FFFFFFF, 0},
                                   {0x7FFFFFFF, 1, 1, 0}}) {
    EXPECT_EQ(TAVIRPELO_CODEC_SIZE, refused(w, h, x, y, 5));
  }
  EXPECT_EQ(0, TAVIRPELO_CODEC_Blend(nullptr, dst, 1, 1, 2, 2, 0, 0, 5));
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
}

TEST(Clipping, CopiesWhereTheMaskSays) {
  const Bytes src = random_bytes(3 * 30, 3);
  Bytes dst(90, 9);
  const uint8_t mask[] = {0, 1, 0, 2, 0, 255};
  EXPECT_EQ(1, Tavir_Clipping(src.data(), dst.data(), mask, 30, 2, 3));
  for (size_t i = 0; i < 90; ++i) {
    const size_t y = i / 30, x = i % 30 / 4;
    EXPECT_EQ(x < 2 && mask[2 * y + x] != 0 ? src[i] : 9, dst[i]) << i;
  }
}

TEST(Rotation, AgainstTheFormula) {
  for (const int format : {0, 1, 7}) {
    const int bytes = pelo::bytes_per_pixel(format), width = 9, height = 6;
    Bytes pixels = random_bytes(static_cast<size_t>(width * height * bytes), 4);
    TAVIRPELO_RAWINFO raw = raw_image(pixels, width, height, static_cast<uint32_t>(format));
    for (const int degrees : {0, 1, 30, 45, 90, 180, 270, 359, 360, -45, 100000}) {
      GuardedPixels out(width, height, format);
      ASSERT_EQ(1, TAVIRPELO_CODEC_Rotation(&raw, out.data(), degrees));
      const double a = degrees * 3.1415926535 / 180, c = std::cos(a), s = std::sin(a);
      const auto kc = static_cast<int64_t>(c * 131072), ks = static_cast<int64_t>(s * 131072);
      const auto x0 = static_cast<int64_t>(((1 - c) * (width - 1) / 2 + s * (height - 1) / 2) * 131072);
      const auto y0 = static_cast<int64_t>(((1 - c) * (height - 1) / 2 - s * (width - 1) / 2) * 131072);
      Bytes want(pixels.size(), kFill);
      for (int j = 0; j < height; ++j) {
        for (int i = 0; i < width; ++i) {
          const int64_t x = x0 + i * kc - j * ks, y = y0 + i * ks + j * kc;
          if (x < 0 || y < 0 || x >= width * int64_t{131072} || y >= height * int64_t{131072}) continue;
          const auto from = pixels.begin() + ((y >> 17) * width + (x >> 17)) * bytes;
          std::copy(from, from + bytes, want.begin() + (j * width + i) * bytes);
        }
      }
      ASSERT_EQ(want, out.content()) << format << " " << degrees;
    }
    GuardedPixels out(width, height, format);
    elo_codec_rotation(&raw, out.data(), 0);
    EXPECT_EQ(pixels, out.content());
    raw.format = 5;
    EXPECT_EQ(1, TAVIRPELO_CODEC_Rotation(&raw, out.data(), 90));
  }
  EXPECT_EQ(0, TAVIRPELO_CODEC_Rotation(nullptr, nullptr, 0));
}

// ---- crops ----

TEST(Crop, FitsCentresAndStretches) {
  Bytes picture = random_bytes(40 * 30 * 2, 5);
  struct {
    TAVIRPELO_CROPRECT rect;
    int width, height;
    uint32_t option;
    int outWidth, outHeight, x, y;
  } const cases[] = {{{40, 30, 5, 6, 20, 10}, 10, 10, 0, 10, 5, 0, 2},
                     {{40, 30, 5, 6, 20, 10}, 10, 10, 0x100, 10, 5, 0, 0},
                     {{40, 30, 5, 6, 20, 10}, 10, 10, 0x700, 10, 10, 0, 0},
                     {{40, 30, 0, 0, 10, 30}, 60, 60, 0, 20, 60, 20, 0},
                     {{40, 30, 39, 0, 1, 30}, 20, 9, 0, 1, 9, 9, 0}};
  for (const auto& c : cases) {
    GuardedPixels got(c.width, c.height, 0), want(c.width, c.height, 0);
    ASSERT_EQ(1, TAVIRPELO_Crop(picture.data(), &c.rect, got.data(), c.width, c.height, c.option));
    PELO_Scale_ex(picture.data() + (c.rect.y * 40 + c.rect.x) * 2, c.rect.width, c.rect.height, 40,
                  want.data() + (c.y * c.width + c.x) * 2, c.outWidth, c.outHeight, c.width);
    EXPECT_EQ(want.content(), got.content());
  }
  const TAVIRPELO_CROPRECT whole{40, 30, 0, 0, 40, 30};
  GuardedPixels cropped(50, 20, 0), scaled(50, 20, 0);
  EXPECT_EQ(1, TAVIRPELO_Crop(picture.data(), &whole, cropped.data(), 50, 20, 0));
  EXPECT_EQ(1, TAVIRPELO_Scale(picture.data(), 40, 30, scaled.data(), 50, 20, 0));
  EXPECT_EQ(cropped.content(), scaled.content());
  for (const TAVIRPELO_CROPRECT& rect : {TAVIRPELO_CROPRECT{40, 30, 30, 0, 11, 30},
                                         {40, 30, -1, 0, 5, 5},
                                         {40, 30, 0, 0, 0, 5},
                                         {40, 30, 0x7FFFFFFF, 0, 0x7FFFFFFF, 5}}) {
    EXPECT_EQ(0, TAVIRPELO_Crop(picture.data(), &rect, cropped.data(), 50, 20, 0));
    EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
  }
  EXPECT_EQ(0, TAVIRPELO_Crop(picture.data(), &whole, cropped.data(), 0, 20, 0));
  EXPECT_EQ(0, gTAVIRPELO_Error);
}

TEST(Crop, FromAFileWithinAMemoryLimit) {
  const TempFile file;
  file.write(sample_jpeg(320, 200));
  TAVIRPELO_CROPRECT rect{0, 0, 100, 50, 80, 60};
  // At full size the region is the decoded picture's own crop; half the size needs a quarter of it.
  for (const int part : {1, 2}) {
    const int width = 320 / part, height = 200 / part, limit = width * height * 2 + 200000;
    const TAVIRPELO_CROPRECT same{width, height, 100 / part, 50 / part, 80 / part, 60 / part};
    GuardedPixels all(width, height, 0, 0), got(same.width, same.height, 0),
        want(same.width, same.height, 0);
    ASSERT_EQ(1, TAVIRPELO_CropDecoding(file.c_str(), all.data(), width, height));
    ASSERT_EQ(
        1, TAVIRPELO_CropFromImage(file.c_str(), &rect, got.data(), same.width, same.height, 0, limit));
    EXPECT_EQ(320, rect.imageWidth);
    EXPECT_EQ(200, rect.imageHeight);
    ASSERT_EQ(1, TAVIRPELO_Crop(all.data(), &same, want.data(), same.width, same.height, 0));
    EXPECT_EQ(want.content(), got.content());
  }
  GuardedPixels small(40, 30, 0);
  EXPECT_EQ(
      0, TAVIRPELO_CropFromImage(file.c_str(), &rect, small.data(), 40, 30, 0, 160 * 100 * 2 + 199999));
  EXPECT_EQ(TAVIRPELO_ERROR_MEMORY, gTAVIRPELO_Error);
  // Odd shapes keep inside their buffers, whatever the option.
  std::mt19937 random(6);
  const auto below = [&](int n) { return static_cast<int>(random() % static_cast<uint32_t>(n)); };
  for (int n = 0; n < 60; ++n) {
    TAVIRPELO_CROPRECT any{320, 200, below(320), below(200), 1, 1};
    any.width += below(320 - any.x), any.height += below(200 - any.y);
    const int width = 1 + below(90), height = 1 + below(90);
    GuardedPixels out(width, height, 0);
    const int answer = TAVIRPELO_CropFromImage(file.c_str(), &any, out.data(), width, height,
                                               n % 2 ? 0x700 : 0, 100000000);
    EXPECT_TRUE(answer == 1 || gTAVIRPELO_Error == TAVIRPELO_ERROR_CROP);
  }
  rect.x = 300;
  EXPECT_EQ(0, TAVIRPELO_CropFromImage(file.c_str(), &rect, small.data(), 40, 30, 0, 10000000));
  EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
  TAVIRPELO_CROPRECT unknown{};
  EXPECT_EQ(0, TAVIRPELO_CropFromImage("no such file", &unknown, small.data(), 40, 30, 0, 10000000));
  EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
}

}  // namespace
}  // namespace tests
