// Blending, masked copies, rotation about the centre, cropping from pictures and from files.
#include <cmath>
#include <random>

#include "tests/support/guarded_decode.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

Bytes random_bytes(size_t count, uint32_t seed) {
  std::mt19937 random(seed);
  Bytes bytes(count);
  for (uint8_t& b : bytes) b = static_cast<uint8_t>(random());
  return bytes;
}

TEST(Blend, EveryAlphaOverThreeBytes) {
  Bytes src;
  for (int a = 0; a < 256; ++a) src.insert(src.end(), {10, 200, 255, static_cast<uint8_t>(a)});
  Bytes dst(260 * 3 * 3, 77);
  ASSERT_EQ(1, TAVIRPELO_CODEC_Blend(src.data(), dst.data(), 256, 1, 260, 3, 2, 1, 5));
  for (int a = 0; a < 256; ++a) {
    const int colours[] = {10, 200, 255};
    for (int c = 0; c < 3; ++c) {
      const int want = (colours[c] * (a + 1) >> 8) + (77 * (256 - a) >> 8);
      ASSERT_EQ(want & 255, dst[static_cast<size_t>((260 + 2 + a) * 3 + c)]) << a;
    }
  }
  const auto untouched = [&](int from, int to) {
    return std::count(dst.begin() + from * 3, dst.begin() + to * 3, 77) == (to - from) * 3;
  };
  EXPECT_TRUE(untouched(0, 262) && untouched(518, 780));
}

TEST(Blend, Rgb565) {
  const Bytes src = random_bytes(5 * 4 * 3, 1), before = random_bytes(8 * 6 * 2, 2);
  Bytes dst = before;
  ASSERT_EQ(1, TAVIRPELO_CODEC_Blend(src.data(), dst.data(), 5, 4, 8, 6, 3, 2, 6));
  for (int y = 0; y < 6; ++y) {
    for (int x = 0; x < 8; ++x) {
      const size_t at = static_cast<size_t>(y * 8 + x) * 2;
      const int behind = before[at] | before[at + 1] << 8, got = dst[at] | dst[at + 1] << 8;
      if (x < 3 || y < 2) {
        ASSERT_EQ(behind, got);
        continue;
      }
      const uint8_t* s = &src[static_cast<size_t>((y - 2) * 5 + x - 3) * 3];
      const int front = s[0] | s[1] << 8, a = s[2];
      const auto mix = [&](int f, int b) { return ((f * (a + 1) >> 8) + (b * (256 - a) >> 8)) & 255; };
      const int r = mix(front >> 11 << 3, behind >> 11 << 3),
                g = mix((front >> 5 & 63) << 2, (behind >> 5 & 63) << 2);
      const int b = mix((front & 31) << 3, (behind & 31) << 3);
      ASSERT_EQ(r >> 3 << 11 | g >> 2 << 5 | b >> 3, got) << x << "," << y;
    }
  }
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
    TAVIRPELO_RAWINFO raw{};
    raw.width = width, raw.height = height, raw.pData = pixels.data(),
    raw.format = static_cast<uint32_t>(format);
    for (const int degrees : {0, 1, 30, 45, 90, 180, 270, 359, 360, -45, 100000}) {
      GuardedPixels out(width, height, format);
      ASSERT_EQ(1, TAVIRPELO_CODEC_Rotation(&raw, out.data(), degrees));
      const double a = degrees * 3.1415926535 / 180, c = std::cos(a), s = std::sin(a);
      const auto kc = static_cast<int64_t>(c * 131072), ks = static_cast<int64_t>(s * 131072);
      const auto x0 = static_cast<int64_t>(((1 - c) * (width - 1) / 2 + s * (height - 1) / 2) * 131072);
      const auto y0 = static_cast<int64_t>(((1 - c) * (height - 1) / 2 - s * (width - 1) / 2) * 131072);
      Bytes want(pixels.size(), 0x33);
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
  struct Case {
    TAVIRPELO_CROPRECT rect;
    int width, height;
    uint32_t option;
    int outWidth, outHeight, x, y;
  };
  const Case cases[] = {{{40, 30, 5, 6, 20, 10}, 10, 10, 0, 10, 5, 0, 2},
                        {{40, 30, 5, 6, 20, 10}, 10, 10, 0x100, 10, 5, 0, 0},
                        {{40, 30, 5, 6, 20, 10}, 10, 10, 0x700, 10, 10, 0, 0},
                        {{40, 30, 0, 0, 10, 30}, 60, 60, 0, 20, 60, 20, 0},
                        {{40, 30, 39, 0, 1, 30}, 20, 9, 0, 1, 9, 9, 0}};
  for (const Case& c : cases) {
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
  // At full size the region is the decoded picture's own crop.
  GuardedPixels all(320, 200, 0, 0);
  ASSERT_EQ(1, TAVIRPELO_CropDecoding(file.c_str(), all.data(), 320, 200));
  TAVIRPELO_CROPRECT rect{0, 0, 100, 50, 80, 60};
  GuardedPixels got(80, 60, 0), want(80, 60, 0);
  ASSERT_EQ(1, TAVIRPELO_CropFromImage(file.c_str(), &rect, got.data(), 80, 60, 0, 10000000));
  EXPECT_EQ(320, rect.imageWidth);
  EXPECT_EQ(200, rect.imageHeight);
  ASSERT_EQ(1, TAVIRPELO_Crop(all.data(), &rect, want.data(), 80, 60, 0));
  EXPECT_EQ(want.content(), got.content());
  // Half the size needs a quarter of the picture.
  GuardedPixels half(160, 100, 0, 0), small(40, 30, 0), smallWant(40, 30, 0);
  ASSERT_EQ(1, TAVIRPELO_CropDecoding(file.c_str(), half.data(), 160, 100));
  const TAVIRPELO_CROPRECT halfRect{160, 100, 50, 25, 40, 30};
  ASSERT_EQ(
      1, TAVIRPELO_CropFromImage(file.c_str(), &rect, small.data(), 40, 30, 0, 160 * 100 * 2 + 200000));
  ASSERT_EQ(1, TAVIRPELO_Crop(half.data(), &halfRect, smallWant.data(), 40, 30, 0));
  EXPECT_EQ(smallWant.content(), small.content());
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
