// Formats, rotations, fittings and modes of a decode, against the upright RGB888 picture.
#include <gtest/gtest.h>

#include <algorithm>

#include "tavirpelo/tavirpelo.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

constexpr uint8_t kGuard = 0xA5;
constexpr size_t kGuardBytes = 64;

// Decodes into a box with guard bytes on both sides, which must survive.
struct Box {
  int width, height;
  Bytes bytes;
  int result, outWidth, outHeight;
  uint8_t at(size_t i) const { return bytes[kGuardBytes + i]; }
};

Box decode(Bytes jpeg, int width, int height, int format, uint32_t option, int mode = 0) {
  const size_t size = format == 2 ? static_cast<size_t>(width * height + (width + 1) / 2 * ((height + 1) / 2) * 2)
                                  : static_cast<size_t>(width * height * (format == 1 ? 3 : format == 0 || format == 9 ? 2 : 4));
  Box box{width, height, Bytes(size + 2 * kGuardBytes, kGuard), 0, 0, 0};
  TAVIRPELO_DECINFO* info =
      TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, jpeg.data(), static_cast<int>(jpeg.size()), format, option);
  TAVIRPELO_SetDecMode(info, mode);
  box.result = TAVIRPELO_DecodeJPEG(info, box.bytes.data() + kGuardBytes, width, height);
  PELOJ_GetDecSize(info, &box.outWidth, &box.outHeight);
  TAVIRPELO_DestroyDecInfo(info);
  for (size_t i = 0; i < kGuardBytes; ++i) {
    EXPECT_EQ(kGuard, box.bytes[i]);
    EXPECT_EQ(kGuard, box.bytes[box.bytes.size() - 1 - i]);
  }
  return box;
}

size_t index(const Box& box, int x, int y) { return static_cast<size_t>(y) * static_cast<size_t>(box.width) + static_cast<size_t>(x); }

TEST(Formats, StoreTheSamePixels) {
  const Bytes jpeg = sample_jpeg(121, 83);
  const Box rgb = decode(jpeg, 121, 83, TAVIRPELO_RGB888, 0);
  ASSERT_EQ(1, rgb.result);
  const Box word = decode(jpeg, 121, 83, TAVIRPELO_RGB565, 0);
  const Box argb = decode(jpeg, 121, 83, TAVIRPELO_ARGB8888, 0);
  const Box rgba = decode(jpeg, 121, 83, TAVIRPELO_RGBA8888, 0);
  const Box bgra = decode(jpeg, 121, 83, TAVIRPELO_BGRA8888, 0);
  const Box dithered = decode(jpeg, 121, 83, TAVIRPELO_RGB565_DITHER, 0);
  for (size_t i = 0; i < 121 * 83; ++i) {
    const int r = rgb.at(3 * i), g = rgb.at(3 * i + 1), b = rgb.at(3 * i + 2);
    ASSERT_EQ((r >> 3) << 11 | (g >> 2) << 5 | b >> 3, word.at(2 * i) | word.at(2 * i + 1) << 8);
    const int pixel = dithered.at(2 * i) | dithered.at(2 * i + 1) << 8;
    ASSERT_EQ(0, pixel & 0x20);
    ASSERT_TRUE(pixel >> 11 >= r >> 3 && pixel >> 11 <= (std::min(r + 15, 255) >> 3));
    const int expected[] = {255, r, g, b, 255, b, g, r};
    for (size_t k = 0; k < 4; ++k) {
      ASSERT_EQ(expected[k], argb.at(4 * i + k));
      ASSERT_EQ(expected[k + 1], rgba.at(4 * i + k));
      ASSERT_EQ(k == 3 ? 255 : expected[5 + k], bgra.at(4 * i + k));
    }
  }
}

TEST(Formats, PlanarHoldsEvenSamplesAndNeutralGrey) {
  for (const bool grey : {false, true}) {
    const Bytes jpeg = sample_jpeg(33, 21, grey);
    const Box planar = decode(jpeg, 33, 21, TAVIRPELO_YUV420, TAVIRPELO_ROTATE_90);
    const Box rgb = decode(jpeg, 33, 21, TAVIRPELO_RGB888, 0);
    for (int y = 0; y < 21; ++y) {
      for (int x = 0; x < 33; ++x) {
        const size_t i = index(rgb, x, y);
        const size_t c = static_cast<size_t>(33 * 21 + y / 2 * 17 + x / 2);
        const int luma = planar.at(i), u = planar.at(c) - 128, v = planar.at(c + 17 * 11) - 128;
        if (grey) ASSERT_TRUE(u == 0 && v == 0);
        ASSERT_EQ(std::clamp(luma + (v * 91881 >> 16), 0, 255), rgb.at(3 * i));
        ASSERT_EQ(std::clamp(luma + (u * 116130 >> 16), 0, 255), rgb.at(3 * i + 2));
      }
    }
  }
  // A code that nobody writes leaves the buffer alone.
  const Box none = decode(sample_jpeg(16, 16), 16, 16, 3, 0);
  EXPECT_EQ(1, none.result);
  EXPECT_TRUE(std::all_of(none.bytes.begin(), none.bytes.end(), [](uint8_t b) { return b == kGuard; }));
}

TEST(Rotation, TurnsTheUprightPicture) {
  const Bytes jpeg = sample_jpeg(97, 61);
  const Box up = decode(jpeg, 97, 61, TAVIRPELO_RGB888, 0);
  for (const uint32_t rotation : {TAVIRPELO_ROTATE_90, TAVIRPELO_ROTATE_180, TAVIRPELO_ROTATE_270}) {
    const bool sideways = rotation != TAVIRPELO_ROTATE_180;
    for (const uint32_t fit : {TAVIRPELO_FIT_INSIDE, TAVIRPELO_FIT_TIGHT}) {
      const Box box = decode(jpeg, sideways ? 61 : 97, sideways ? 97 : 61, TAVIRPELO_RGB888, rotation | fit);
      for (int y = 0; y < 61; ++y) {
        for (int x = 0; x < 97; ++x) {
          const int tx = rotation == TAVIRPELO_ROTATE_90 ? 60 - y : sideways ? y : 96 - x;
          const int ty = rotation == TAVIRPELO_ROTATE_90 ? x : sideways ? 96 - x : 60 - y;
          for (size_t c = 0; c < 3; ++c) {
            ASSERT_EQ(up.at(3 * index(up, x, y) + c), box.at(3 * index(box, tx, ty) + c));
          }
        }
      }
    }
  }
}

TEST(Fitting, ProducesAndPlacesTheExpectedSize) {
  struct {
    int width, height, boxWidth, boxHeight;
    uint32_t fit;
    int outWidth, outHeight;
  } const cases[] = {
      {100, 50, 400, 400, TAVIRPELO_FIT_INSIDE, 100, 50},   {1000, 1000, 400, 400, TAVIRPELO_FIT_INSIDE, 400, 400},
      {200, 100, 50, 50, TAVIRPELO_FIT_INSIDE, 50, 25},     {200, 100, 50, 50, TAVIRPELO_FIT_FILL, 100, 50},
      {200, 100, 50, 50, TAVIRPELO_FIT_STRETCH, 50, 50},    {20, 10, 300, 70, TAVIRPELO_FIT_STRETCH, 300, 70},
      {200, 100, 50, 80, TAVIRPELO_FIT_TIGHT, 50, 25},      {2000, 1000, 300, 300, TAVIRPELO_FIT_FILL, 600, 300},
      {1000, 3, 30, 30, TAVIRPELO_FIT_INSIDE, 30, 1},       {101, 67, 33, 80, TAVIRPELO_FIT_FILL, 101, 67}};
  for (const auto& c : cases) {
    for (const int format : {TAVIRPELO_RGB888, TAVIRPELO_YUV420}) {
      for (const uint32_t rotation : {0u, 4u, 8u, 12u}) {
        if (rotation != 0 && format == TAVIRPELO_YUV420) continue;
        const bool sideways = rotation == 4 || rotation == 12;
        const Box box = decode(sample_jpeg(c.width, c.height), sideways ? c.boxHeight : c.boxWidth,
                               sideways ? c.boxWidth : c.boxHeight, format, c.fit | rotation);
        EXPECT_EQ(1, box.result);
        EXPECT_EQ(c.outWidth, box.outWidth) << c.width << " " << rotation;
        EXPECT_EQ(c.outHeight, box.outHeight) << c.width << " " << rotation;
      }
    }
  }
  // Inside the box: exactly the centred area is written.
  const Box box = decode(sample_jpeg(100, 50), 120, 90, TAVIRPELO_RGB888, 0);
  int written = 0;
  for (int y = 0; y < 90; ++y) {
    for (int x = 0; x < 120; ++x) {
      const bool inside = x >= 10 && x < 110 && y >= 20 && y < 70;
      const uint8_t* p = box.bytes.data() + kGuardBytes + 3 * index(box, x, y);
      const bool touched = p[0] != kGuard || p[1] != kGuard || p[2] != kGuard;
      if (touched) EXPECT_TRUE(inside);
      written += touched;
    }
  }
  EXPECT_GT(written, 4900);
}

// Every mode, scale and fitting stays inside the box and fills what it says.
TEST(Fitting, RandomRequestsStayInsideTheBox) {
  uint32_t seed = 7;
  const auto next = [&](uint32_t n) { return static_cast<int>((seed = seed * 1664525 + 1013904223) >> 8) % static_cast<int>(n); };
  for (int i = 0; i < 400; ++i) {
    const Bytes jpeg = sample_jpeg(1 + next(60), 1 + next(60), next(4) == 0);
    const uint32_t option = static_cast<uint32_t>(next(4)) << 2 | std::array<uint32_t, 4>{0, 0x100, 0x300, 0x700}[static_cast<size_t>(next(4))];
    const int formats[] = {0, 1, 2, 5, 8, 9};
    const int width = 1 + next(90);
    const int height = 1 + next(90);
    const Box box = decode(jpeg, width, height, formats[next(6)], option, next(5));
    EXPECT_EQ(1, box.result);
  }
}

TEST(Modes, CoarserModesEnlarge) {
  const Bytes jpeg = sample_jpeg(320, 240);
  const Box exact = decode(jpeg, 320, 240, TAVIRPELO_RGB888, 0);
  Bytes last;
  for (int mode = 1; mode <= 4; ++mode) {
    const Box box = decode(jpeg, 320, 240, TAVIRPELO_RGB888, 0, mode);
    EXPECT_EQ(1, box.result);
    EXPECT_EQ(320, box.outWidth);
    EXPECT_GT(psnr(box.bytes, exact.bytes), mode == 1 ? 20 : 10) << mode;
    EXPECT_NE(last, box.bytes);
    last = box.bytes;
  }
}

TEST(Thumbnails, NoneFailsAndKeepsSizesZero) {
  Bytes jpeg = sample_jpeg(40, 30);
  TAVIRPELO_DECINFO* info = TAVIRPELO_CreateDecInfo(1, jpeg.data(), static_cast<int>(jpeg.size()), 1, 0);
  Bytes out(40 * 30 * 3);
  int width = 9, height = 9;
  EXPECT_EQ(0, PELOJ_DecodeThumbnail(info, out.data(), 40, 30, &width, &height));
  EXPECT_EQ(0, width + height);
  TAVIRPELO_DestroyDecInfo(info);
}

// A JPEG inside an APP1 directory serves requests that it covers.
TEST(Thumbnails, ServeSmallRequests) {
  const Bytes small = sample_jpeg(64, 48, true);
  const Bytes large = sample_jpeg(400, 300);
  Bytes exif = {'E', 'x', 'i', 'f', 0, 0, 'I', 'I', 42, 0, 8, 0, 0, 0, 0, 0, 14, 0, 0, 0, 3, 0};
  const auto entry = [&](int tag, int type, uint32_t value) {
    for (const int b : {tag & 255, tag >> 8, type, 0, 1, 0, 0, 0}) exif.push_back(static_cast<uint8_t>(b));
    for (int i = 0; i < 4; ++i) exif.push_back(static_cast<uint8_t>(value >> 8 * i));
  };
  entry(259, 3, 6);
  entry(513, 4, 56);
  entry(514, 4, static_cast<uint32_t>(small.size()));
  exif.resize(6 + 56);
  exif.insert(exif.end(), small.begin(), small.end());
  Bytes jpeg = {0xFF, 0xD8, 0xFF, 0xE1, static_cast<uint8_t>((exif.size() + 2) >> 8), static_cast<uint8_t>(exif.size() + 2)};
  jpeg.insert(jpeg.end(), exif.begin(), exif.end());
  jpeg.insert(jpeg.end(), large.begin() + 2, large.end());

  const auto is_grey = [](const Box& box) {
    const size_t middle = 3 * index(box, box.width / 2 + 1, box.height / 2);
    return box.at(middle) == box.at(middle + 1) && box.at(middle) == box.at(middle + 2);
  };
  EXPECT_TRUE(is_grey(decode(jpeg, 64, 48, 1, TAVIRPELO_THUMBNAIL_IF_ENOUGH)));
  EXPECT_FALSE(is_grey(decode(jpeg, 65, 48, 1, TAVIRPELO_THUMBNAIL_IF_ENOUGH)));
  EXPECT_FALSE(is_grey(decode(jpeg, 64, 48, 1, TAVIRPELO_THUMBNAIL_NEVER)));
  EXPECT_TRUE(is_grey(decode(jpeg, 300, 300, 1, TAVIRPELO_THUMBNAIL_ANY)));
  TAVIRPELO_DECINFO* info = TAVIRPELO_CreateDecInfo(1, jpeg.data(), static_cast<int>(jpeg.size()), 1, 0);
  Bytes out(64 * 48 * 3);
  int width, height;
  EXPECT_EQ(1, PELOJ_DecodeThumbnail(info, out.data(), 64, 48, &width, &height));
  EXPECT_TRUE(width == 64 && height == 48);
  TAVIRPELO_DestroyDecInfo(info);
}

TEST(RotateBuffer, RoundTrips) {
  for (const int format : {TAVIRPELO_RGB565, TAVIRPELO_RGB888, TAVIRPELO_RGB565_DITHER}) {
    Bytes buffer(7 * 5 * 3);
    for (size_t i = 0; i < buffer.size(); ++i) buffer[i] = static_cast<uint8_t>(i * 7);
    const Bytes before = buffer;
    EXPECT_EQ(1, PELOJ_RotateImage90(buffer.data(), 7, 5, format));
    EXPECT_NE(before, buffer);
    EXPECT_EQ(1, PELOJ_RotateImage270(buffer.data(), 5, 7, format));
    EXPECT_EQ(before, buffer);
  }
  EXPECT_EQ(0, PELOJ_RotateImage90(nullptr, 7, 5, TAVIRPELO_BGRA8888));
}

}  // namespace
}  // namespace tests
