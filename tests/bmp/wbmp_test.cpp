// Wireless bitmaps: sizes in groups of seven bits, placement, averages, and sources that are too short.
#include "codec/bmp/wbmp.h"

#include <random>

#include "tests/support/guarded_decode.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

struct Wbmp {
  uint32_t width, height;
  Bytes rows;

  bool white(uint32_t x, uint32_t y) const {
    return (rows[y * ((width + 7) / 8) + x / 8] >> (7 - x % 8) & 1) != 0;
  }
  Bytes file() const {
    Bytes out{0, 0};
    for (const uint32_t side : {width, height}) {
      for (int group = side > 127 ? 1 : 0; group >= 0; --group) {
        out.push_back(static_cast<uint8_t>((side >> 7 * group & 127) | (group > 0 ? 128 : 0)));
      }
    }
    out.insert(out.end(), rows.begin(), rows.end());
    return out;
  }
};

Wbmp random_wbmp(uint32_t width, uint32_t height) {
  std::mt19937 random(width * 1000 + height);
  Wbmp wbmp{width, height, Bytes(size_t{(width + 7) / 8} * height)};
  for (uint8_t& byte : wbmp.rows) byte = static_cast<uint8_t>(random() | random());
  return wbmp;
}

// The picture at (x0, y0) of the box, at its size or averaged to outWidth x outHeight.
Bytes expected(const Wbmp& wbmp, int boxWidth, int boxHeight, int outWidth, int outHeight, int x0,
               int y0) {
  Bytes out(static_cast<size_t>(boxWidth * boxHeight) * 3, 0x33);
  const auto at = [](int k, uint32_t source, int target, uint32_t phase) {
    return static_cast<uint32_t>((phase + static_cast<uint64_t>(k) * source) /
                                 static_cast<uint32_t>(target));
  };
  const bool plain =
      outWidth == static_cast<int>(wbmp.width) && outHeight == static_cast<int>(wbmp.height);
  for (int y = 0; y < outHeight; ++y) {
    for (int x = 0; x < outWidth; ++x) {
      int level = 0;
      for (const uint32_t py : {wbmp.height / 4, 3 * wbmp.height / 4}) {
        for (const uint32_t px : {wbmp.width / 4, 3 * wbmp.width / 4}) {
          level +=
              wbmp.white(at(x, wbmp.width, outWidth, px), at(y, wbmp.height, outHeight, py)) ? 63 : 0;
        }
      }
      if (plain) level = wbmp.white(static_cast<uint32_t>(x), static_cast<uint32_t>(y)) ? 255 : 0;
      std::fill_n(out.begin() + ((y0 + y) * boxWidth + x0 + x) * 3, 3, static_cast<uint8_t>(level));
    }
  }
  return out;
}

void expect_everywhere(const Wbmp& wbmp, int boxWidth, int boxHeight, uint32_t option,
                       const Bytes& want) {
  Bytes file = wbmp.file();
  const TempFile onDisk;
  onDisk.write(file);
  for (const bool memory : {true, false}) {
    GuardedPixels pixels(boxWidth, boxHeight, 1);
    const DecInfo decInfo = memory ? open_memory(file, 1, option) : open_file(onDisk.path(), 1, option);
    ASSERT_EQ(1, TAVIRPELOI_DecodeWBMP(decInfo.get(), pixels.data(), boxWidth, boxHeight));
    ASSERT_EQ(want, pixels.content()) << wbmp.width << "x" << wbmp.height << " memory " << memory;
  }
}

TEST(WBmp, PlacedFittedAndStretched) {
  // Halves of the space left over are rounded up.
  const Wbmp small = random_wbmp(10, 9);
  expect_everywhere(small, 15, 10, 0, expected(small, 15, 10, 10, 9, 3, 1));
  expect_everywhere(small, 15, 10, TAVIRPELO_ROTATE_90, expected(small, 15, 10, 10, 9, 3, 1));
  expect_everywhere(small, 15, 20, TAVIRPELO_FIT_STRETCH, expected(small, 15, 20, 15, 20, 0, 0));
  expect_everywhere(small, 10, 9, TAVIRPELO_FIT_STRETCH, expected(small, 10, 9, 10, 9, 0, 0));
  const Wbmp wide = random_wbmp(200, 150);
  expect_everywhere(wide, 60, 50, 0, expected(wide, 60, 50, 60, 45, 0, 3));
  const Wbmp tall = random_wbmp(30, 300);
  expect_everywhere(tall, 70, 101, 0, expected(tall, 70, 101, 10, 101, 30, 0));
}

TEST(WBmp, WhiteIn565) {
  Bytes file{0, 0, 1, 1, 0x80};
  uint16_t pixel = 0;
  EXPECT_EQ(1, TAVIRPELOI_DecodeWBMP(open_memory(file, 0).get(), &pixel, 1, 1));
  EXPECT_EQ(0xFFDF, pixel);
}

TEST(WBmp, Integers) {
  const Bytes bytes{0x81, 0x00, 0x7F, 0xFF, 0xFF, 0xFF, 0x7F};
  int position = 0, groups = 0;
  uint8_t packed[20];
  const auto next = [&] {
    PELOI_WBMPdecodeMultibyte(bytes.data(), static_cast<int>(bytes.size()), &position, &groups, packed);
    return PELOI_WBMPgetMultibyte2Int(packed, groups, groups);
  };
  EXPECT_EQ(128u, next());
  EXPECT_EQ(127u, next());
  EXPECT_EQ((1u << 28) - 1, next());
  EXPECT_EQ(7, position);
  EXPECT_EQ(0u, next());
  EXPECT_EQ(0, groups);
}

TEST(WBmp, DamagedAndShort) {
  const Wbmp wbmp = random_wbmp(9, 5);
  const Bytes file = wbmp.file();
  const auto answer = [](Bytes bytes, int format = 1) {
    GuardedPixels pixels(6, 6, format);
    const DecInfo decInfo = open_memory(bytes, format);
    const int got = TAVIRPELOI_DecodeWBMP(decInfo.get(), pixels.data(), 6, 6);
    EXPECT_TRUE(got == 1 || pixels.content() == Bytes(pixels.content().size(), 0x33));
    return got;
  };
  EXPECT_EQ(1, answer(file));
  EXPECT_EQ(1, answer(file, 7));  // nothing is written
  for (size_t size = 1; size < file.size(); ++size) {
    EXPECT_EQ(0, answer(Bytes(file.begin(), file.begin() + static_cast<ptrdiff_t>(size)))) << size;
  }
  for (size_t at = 0; at < file.size(); ++at) {
    for (const uint8_t flip : {0x01, 0x80, 0xFF}) {
      Bytes damaged = file;
      damaged[at] ^= flip;
      answer(damaged);
    }
  }
  EXPECT_EQ(0, answer({1, 0, 1, 1, 0}));
  EXPECT_EQ(0, answer({0, 0x80, 1, 1, 0}));
  EXPECT_EQ(0, answer({0, 0, 0x81, 0x80, 0x80, 0x80, 0x00, 1, 0}));  // more than 28 bits
  EXPECT_EQ(0, answer({0, 0, 0xFF, 0xFF, 0xFF, 0x7F, 0xFF, 0xFF, 0xFF, 0x7F, 0}));
  EXPECT_EQ(1, answer({0, 0, 0, 5, 0}));  // no pixels
  uint8_t pixel[3];
  Bytes copy = file;
  const DecInfo decInfo = open_memory(copy, 1);
  EXPECT_EQ(0, TAVIRPELOI_DecodeWBMP(nullptr, pixel, 1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodeWBMP(decInfo.get(), nullptr, 1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodeWBMP(decInfo.get(), pixel, 1, -1));
  MemoryStream stream{file};
  EXPECT_EQ(0, TAVIRPELOI_DecodeWBMP(open_stream(stream, 1).get(), pixel, 1, 1));
}

}  // namespace
}  // namespace tests
