// Wireless bitmaps: sizes in groups of seven bits, placement, averages, and sources that are too short.
#include "codec/formats/bmp/bmp_record.h"
#include "tests/support/guarded_decode.h"

namespace tests {
namespace {

struct Wbmp {
  int width, height;
  Bytes rows;

  bool white(int x, int y) const {
    return (rows[static_cast<size_t>(y * ((width + 7) / 8) + x / 8)] >> (7 - x % 8) & 1) != 0;
  }
  Bytes file() const {
    ByteWriter out;
    out.u16(0);
    for (const int side : {width, height}) {
      for (int shift = 21; shift > 0; shift -= 7) {
        if (side >> shift != 0) out.u8((side >> shift & 127) | 128);
      }
      out.u8(side & 127);
    }
    return out.block(rows);
  }
};

Wbmp random_wbmp(int width, int height) {
  return {width, height, random_bytes(static_cast<size_t>((width + 7) / 8 * height), 7)};
}

// The picture at (x, y) of the box, at its size or averaged to `out`, from memory and files.
void expect_everywhere(const Wbmp& wbmp, Size box, uint32_t option, Size out, int x0, int y0) {
  const Size size{wbmp.width, wbmp.height};
  const bool plain = out.width == size.width && out.height == size.height;
  const Bytes want = placed({box, out, 0, x0, y0}, 1, [&](int x, int y) {
    int level = plain && wbmp.white(x, y) ? 255 : 0;
    if (!plain) four_points(size, out, x, y, [&](int u, int v) { level += wbmp.white(u, v) ? 63 : 0; });
    return Bytes(3, static_cast<uint8_t>(level));
  });
  from_every_source(wbmp.file(), 1, option,
                    [&](TAVIRPELO_DECINFO* decInfo) {
                      const Decode got = decode(TAVIRPELOI_DecodeWBMP, decInfo, box.width, box.height);
                      ASSERT_EQ(1, got.answer);
                      ASSERT_EQ(want, got.pixels) << wbmp.width << "x" << wbmp.height;
                    },
                    {});
}

TEST(WBmp, PlacedFittedAndStretched) {
  // Halves of the space left over are rounded up.
  const Wbmp small = random_wbmp(10, 9);
  for (const uint32_t option : {0, TAVIRPELO_ROTATE_90 + 0})
    expect_everywhere(small, {15, 10}, option, {10, 9}, 3, 1);
  for (const Size size : {Size{15, 20}, {10, 9}})
    expect_everywhere(small, size, TAVIRPELO_FIT_STRETCH, size, 0, 0);
  expect_everywhere(random_wbmp(200, 150), {60, 50}, 0, {60, 45}, 0, 3);
  expect_everywhere(random_wbmp(30, 300), {70, 101}, 0, {10, 101}, 30, 0);
  // Rows of more than a megabyte are read in pieces.
  expect_everywhere(random_wbmp((8 << 20) + 77, 1), {99, 2}, TAVIRPELO_FIT_STRETCH, {99, 2}, 0, 0);
}

TEST(WBmp, WhiteIn565) {
  Bytes file{0, 0, 1, 1, 0x80};
  uint16_t pixel = 0;
  EXPECT_EQ(1, TAVIRPELOI_DecodeWBMP(open_memory(file, 0).get(), &pixel, 1, 1));
  EXPECT_EQ(0xFFDF, pixel);
}

TEST(WBmp, DamagedAndShort) {
  const Bytes file = random_wbmp(9, 5).file();
  const auto answer = [](const Bytes& bytes, int format = 1) {
    const Decode got = decode(TAVIRPELOI_DecodeWBMP, bytes, 6, 6, format);
    EXPECT_TRUE(got.answer == 1 || got.pixels == Bytes(got.pixels.size(), kFill));
    return got.answer;
  };
  EXPECT_EQ(1, answer(file));
  EXPECT_EQ(1, answer(file, 7));  // nothing is written
  EXPECT_EQ(0, answer(prefix(file, file.size() - 1)));
  EXPECT_EQ(0, answer({1, 0, 1, 1, 0}));
  EXPECT_EQ(0, answer({0, 0x80, 1, 1, 0}));
  EXPECT_EQ(0, answer({0, 0, 0x81, 0x80, 0x80, 0x80, 0x00, 1, 0}));  // more than 28 bits
  EXPECT_EQ(0, answer({0, 0, 0x80, 0x80, 0x80, 0x80, 0x01, 1, 0}));
  EXPECT_EQ(0, answer({0, 0, 0xFF, 0xFF, 0xFF, 0x7F, 0xFF, 0xFF, 0xFF, 0x7F, 0}));
  EXPECT_EQ(1, answer({0, 0, 0, 5, 0}));  // no pixels
  uint8_t pixel[3];
  MemoryStream stream{file};
  EXPECT_EQ(0, TAVIRPELOI_DecodeWBMP(open_stream(stream, 1).get(), pixel, 1, 1));
}

}  // namespace
}  // namespace tests
