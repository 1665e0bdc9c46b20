// BMP pictures of every depth and layout, from memory and files, at their size and averaged, and
// damaged.
#include <bit>

#include "codec/formats/bmp/bmp_record.h"
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"

namespace tests {
namespace {

struct Bmp {
  int width = 1, height = 1, bits = 24;
  bool topDown = false;
  uint32_t headerSize = 40, compression = 0;
  std::array<uint32_t, 3> masks{0x7C00, 0x03E0, 0x001F};
  std::vector<Rgba> palette = {};
  std::vector<uint32_t> values = {};  // from the top row, left to right

  uint32_t value(int x, int y) const { return values[static_cast<size_t>(y * width + x)]; }

  Rgba pixel(int x, int y) const {
    const uint32_t v = value(x, y);
    if (bits <= 8) return v < palette.size() ? palette[v] : Rgba{};
    if (bits >= 24)
      return {uint8_t(v >> 16), uint8_t(v >> 8), uint8_t(v), uint8_t(bits == 24 ? 255 : v >> 24)};
    const auto field = [v](uint32_t mask) {  // as many high bits as the mask has
      return uint8_t(((v & mask) >> std::countr_zero(mask)) << (8 - std::popcount(mask)));
    };
    return {field(masks[0]), field(masks[1]), field(masks[2]), 255};
  }

  Bytes file() const {
    const bool core = headerSize == 12;
    const size_t paletteBytes = palette.size() * (core ? 3 : 4);
    const size_t maskBytes = compression == 3 ? 12 : 0;
    const size_t rowBytes = (static_cast<size_t>(width * bits) + 31) / 32 * 4;
    const size_t offset = std::max<size_t>(14 + headerSize + paletteBytes + maskBytes, 54);
    ByteWriter head(false);
    head.text("BM").u32(offset + rowBytes * static_cast<size_t>(height)).u32(0).u32(offset);
    head.u32(headerSize).put(width, core ? 2 : 4).put(topDown ? -height : height, core ? 2 : 4);
    head.u16(1).u16(bits);
    if (!core) head.u32(compression).block(Bytes(std::max(headerSize, 20u) - 20));
    for (uint32_t mask : masks) head.put(mask, maskBytes == 0 ? 0 : 4);
    for (const Rgba& p : palette) head.put(p.r << 16 | p.g << 8 | p.b, core ? 3 : 4);
    Bytes out = head;
    out.resize(offset);
    for (int i = 0; i < height; ++i) {
      const int y = topDown ? i : height - 1 - i;
      Bytes row((rowBytes));
      for (int x = 0; x < width; ++x) {
        const size_t at = static_cast<size_t>(x * bits / 8);
        if (bits < 8) row[at] |= value(x, y) << (8 - bits - x * bits % 8);
        for (size_t b = 0; b < static_cast<size_t>(bits / 8); ++b) row[at + b] = value(x, y) >> 8 * b;
      }
      append(out, row);
    }
    return out;
  }
};

Bmp random_bmp(uint32_t seed, int bits, int width, int height) {
  std::mt19937 random(seed);
  Bmp bmp{.width = width, .height = height, .bits = bits};
  const Bytes colours = random_bytes(3 << 8, seed);
  for (size_t i = 0; bits <= 8 && i < 1u << bits; ++i)
    bmp.palette.push_back({colours[3 * i], colours[3 * i + 1], colours[3 * i + 2]});
  for (int i = 0; i < width * height; ++i)
    bmp.values.push_back(static_cast<uint32_t>(random() % (uint64_t{1} << bits)));
  return bmp;
}

// The average of four pixels for output pixel (x, y), counted from below as the file is.
Rgba averaged(const Bmp& bmp, int x, int y, Size out) {
  Rgba sum{0, 0, 0, static_cast<uint8_t>(bmp.bits == 32 ? 0 : 255)};
  four_points({bmp.width, bmp.height}, out, x, out.height - 1 - y, [&](int column, int up) {
    const Rgba p = bmp.pixel(column, bmp.height - 1 - up);
    sum.r += p.r >> 2, sum.g += p.g >> 2, sum.b += p.b >> 2;
    if (bmp.bits == 32) sum.a += p.a >> 2;
  });
  return sum;
}

struct View {
  Size box, out;
  uint32_t option = 0;
};

Bytes expected(const Bmp& bmp, const View& v, int format) {
  const bool oneToOne = v.out.width == bmp.width && v.out.height == bmp.height;
  return placed(centred(v.box, v.out, static_cast<int>(v.option >> 2 & 3)), format, [&](int x, int y) {
    return pixel_bytes(oneToOne ? bmp.pixel(x, y) : averaged(bmp, x, y, v.out), format);
  });
}

Decode decode_bmp(const Bytes& file, const View& v, int format) {
  return decode(TAVIRPELOI_DecodeBMP, file, v.box.width, v.box.height, format, v.option);
}
void expect_pixels(const Bytes& want, const Bytes& file, const View& v, int format) {
  const Decode got = decode_bmp(file, v, format);
  EXPECT_EQ(1, got.answer);
  EXPECT_EQ(want, got.pixels);
}

constexpr int kDepths[] = {1, 4, 8, 16, 24, 32};

TEST(Bmp, EveryDepthFormatTurnAndSize) {
  uint32_t seed = 0;
  for (const int bits : kDepths) {
    for (const int format : {0, 1, 5, 6, 7, 8}) {
      for (const bool topDown : {false, true}) {
        Bmp bmp = random_bmp(++seed, bits, 21, 14);
        bmp.topDown = topDown;
        const Bytes file = bmp.file();
        const TempFile onDisk;
        onDisk.write(file);
        for (uint32_t turn = 0; turn < 4; ++turn) {
          const Size stretched = turn % 2 ? Size{31, 17} : Size{17, 31};
          for (View v : {View{{24, 25}, {21, 14}},
                         {{12, 12}, {12, 8}},
                         {{17, 31}, stretched, TAVIRPELO_FIT_STRETCH}}) {
            v.option |= turn << 2;
            const Bytes want = expected(bmp, v, format);
            SCOPED_TRACE(testing::Message() << bits << " " << format << " " << turn << " " << topDown);
            expect_pixels(want, file, v, format);
            const DecInfo decInfo = open_file(onDisk.path(), format, v.option);
            TAVIRPELO_SetStreamReadSize(decInfo.get(), static_cast<int>(seed % 3) * 100 - 1);
            ASSERT_EQ(want,
                      decode(TAVIRPELOI_DecodeBMP, decInfo.get(), v.box.width, v.box.height).pixels);
          }
        }
      }
    }
  }
}

// Rows of more than a megabyte are read in pieces.
TEST(Bmp, WideRows) {
  for (const int bits : {4, 24}) {
    const int width = (8 << 20) / bits + 77;
    const Bmp bmp = random_bmp(1, bits, width, 1);
    const TempFile onDisk;
    onDisk.write(bmp.file());
    for (const View& v : {View{{width, 1}, {width, 1}}, {{999, 2}, {999, 2}, TAVIRPELO_FIT_STRETCH}}) {
      const Bytes want = expected(bmp, v, 1);
      EXPECT_TRUE(want == decode_bmp(bmp.file(), v, 1).pixels) << bits;
      const DecInfo decInfo = open_file(onDisk.path(), 1, v.option);
      EXPECT_TRUE(want == decode(TAVIRPELOI_DecodeBMP, decInfo.get(), v.box.width, v.box.height).pixels);
    }
  }
  // None of 264 MB is there.
  const TempFile onDisk;
  onDisk.write(overwritten(random_bmp(1, 24, 20, 20).file(), 18, ByteWriter(false).u32(88'000'000)));
  const DecInfo decInfo = open_file(onDisk.path(), 1);
  const long before = peak_kib("VmPeak");
  const Decode got = decode(TAVIRPELOI_DecodeBMP, decInfo.get(), 40, 40);
  EXPECT_EQ(1, got.answer);
  EXPECT_EQ(Bytes(got.pixels.size(), kFill), got.pixels);
  EXPECT_LT(peak_kib("VmPeak") - before, 16 * 1024);
}

TEST(Bmp, TightPicturesFollowThePictureSize) {
  const Bmp bmp = random_bmp(1, 24, 40, 24);
  const View tight{{40, 24}, {24, 14}, TAVIRPELO_FIT_TIGHT | TAVIRPELO_ROTATE_90};
  const Bytes want = expected(bmp, {{14, 24}, {24, 14}, TAVIRPELO_ROTATE_90}, 1);
  EXPECT_EQ(want, prefix(decode_bmp(bmp.file(), tight, 1).pixels, want.size()));
}

TEST(Bmp, HeaderLayouts) {
  const View whole{{9, 5}, {9, 5}};
  for (const int bits : {1, 4, 8, 24}) {
    Bmp bmp = random_bmp(2, bits, 9, 5);
    for (const uint32_t size : {12u, 40u, 56u, 64u}) {
      bmp.headerSize = size;
      expect_pixels(expected(bmp, whole, 1), bmp.file(), whole, 1);
    }
    for (const uint32_t size : {16u, 52u, 108u, 124u}) {
      bmp.headerSize = size;
      EXPECT_EQ(0, decode_bmp(bmp.file(), whole, 1).answer);
    }
  }
  Bmp bmp = random_bmp(3, 16, 9, 5);
  bmp.compression = 3;
  using Masks = std::array<uint32_t, 3>;
  for (const Masks& masks :
       {Masks{0xF800, 0x07E0, 0x001F}, {0x0F00, 0xF0, 0xF}, {0x7C00, 0x03E0, 0x1F}}) {
    bmp.masks = masks;
    expect_pixels(expected(bmp, whole, 7), bmp.file(), whole, 7);
  }
  bmp.masks = {0xFF00, 0xF0, 0xF};
  EXPECT_EQ(0, decode_bmp(bmp.file(), whole, 1).answer);
}

TEST(Bmp, RowsInBatches) {
  for (const bool topDown : {false, true}) {
    Bmp bmp = random_bmp(4, 24, 13, 33);
    bmp.topDown = topDown;
    Bytes file = bmp.file();
    for (const View& v : {View{{13, 33}, {13, 33}}, {{9, 20}, {9, 20}, TAVIRPELO_FIT_STRETCH}}) {
      const auto [width, height] = v.box;
      const Bytes want = expected(bmp, v, 1);
      for (int lines = 1; lines <= height + 1; ++lines) {
        const DecInfo decInfo = open_memory(file, 1, v.option);
        GuardedPixels pixels(width, height, 1);
        int calls = 0;
        do {
          ASSERT_EQ(1, TAVIRPELOI_DecodeBMPLine(decInfo.get(), pixels.data(), width, height, lines));
          ++calls;
        } while (decInfo->pFormatInfo != nullptr);
        EXPECT_EQ((height + lines - 1) / lines, calls);
        ASSERT_EQ(want, pixels.content()) << lines;
      }
    }
  }
  Bytes file = random_bmp(5, 8, 4, 250).file();
  const DecInfo decInfo = open_memory(file, 1);
  GuardedPixels pixels(4, 250, 1), other(4, 250, 1);
  for (const int answer : {4, 4, 1})
    EXPECT_EQ(answer, TAVIRPELOI_DecodeBMPIter(decInfo.get(), pixels.data(), 4, 250));
  // Another buffer, or no lines.
  EXPECT_EQ(4, TAVIRPELOI_DecodeBMPIter(decInfo.get(), pixels.data(), 4, 250));
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMPIterLine(decInfo.get(), pixels.data(), 4, 250, 0));
  EXPECT_NE(nullptr, decInfo->pFormatInfo);
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMPIter(decInfo.get(), other.data(), 4, 250));
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  EXPECT_EQ(4, TAVIRPELOI_DecodeBMPIter(decInfo.get(), pixels.data(), 4, 250));
  EXPECT_EQ(1, TAVIRPELOI_AbortBMPIter(decInfo.get()));
  EXPECT_EQ(0, TAVIRPELOI_AbortBMPIter(nullptr));
}

// ---- damage ----

TEST(Bmp, EveryTruncation) {
  const View whole{{6, 4}, {6, 4}};
  const Bytes file = random_bmp(6, 8, 6, 4).file(), all = decode_bmp(file, whole, 1).pixels;
  const size_t pixelsAt = file.size() - 4 * 8;
  const TempFile onDisk;
  every_truncation(file, [&](const Bytes& cut) {
    const int answer = cut.size() >= pixelsAt ? 1 : 0;
    // The rows that are there, from below; the others keep what the buffer held.
    const size_t rows = answer == 0 ? 0 : (cut.size() - pixelsAt + 2) / 8;
    const Bytes want =
        ByteWriter().block(Bytes((4 - rows) * 18, kFill)).block(suffix(all, (4 - rows) * 18));
    onDisk.write(cut);
    const DecInfo source = open_file(onDisk.path(), 1);
    for (const Decode& got :
         {decode_bmp(cut, whole, 1), decode(TAVIRPELOI_DecodeBMP, source.get(), 6, 4)}) {
      ASSERT_EQ(answer, got.answer) << cut.size();
      ASSERT_EQ(want, got.pixels) << cut.size();
    }
  });
}

TEST(Bmp, EveryHeaderByte) {
  for (const int bits : kDepths) {
    const Bytes file = random_bmp(7, bits, 6, 4).file();
    for (size_t at = 0; at < std::min<size_t>(file.size(), 70); ++at) {
      for (const uint8_t value : {0x00, 0x01, 0x02, 0x7F, 0x80, 0xFE, 0xFF}) {
        for (const uint32_t option : {0u, uint32_t{TAVIRPELO_FIT_STRETCH | TAVIRPELO_ROTATE_90}})
          EXPECT_LE(decode_bmp(overwritten(file, at, {value}), {{7, 5}, {}, option}, 8).answer, 1);
      }
    }
  }
}

TEST(Bmp, FieldsAtTheirLimits) {
  const Bytes file = random_bmp(8, 8, 6, 4).file();
  const auto with = [&](size_t at, uint32_t value, int bytes) {
    const Bytes damaged = overwritten(file, at, ByteWriter(false).put(value, bytes));
    return decode_bmp(damaged, {{7, 5}, {}}, 1).answer;
  };
  for (const uint32_t width : {0u, 0x80000000u, 0xFFFFFFFFu}) EXPECT_EQ(0, with(18, width, 4)) << width;
  for (const uint32_t height : {0u, 0x80000000u}) EXPECT_EQ(0, with(22, height, 4)) << height;
  EXPECT_EQ(0, with(18, 0x7FFFFFFF, 4));
  EXPECT_EQ(1, with(18, 0x7FFFFFF0, 4));  // rows of 2 GiB: none is there
  EXPECT_EQ(1, with(22, 0x7FFFFFFF, 4));
  for (const uint32_t compression : {1u, 2u, 3u, 4u, 5u}) EXPECT_EQ(0, with(30, compression, 4));
  EXPECT_EQ(1, with(30, 6, 4));
  for (const uint32_t bits : {0u, 2u, 65535u}) EXPECT_EQ(1, with(28, bits, 2));  // nothing is decoded
  for (const uint32_t offset : {0u, 53u, 57u, 0xFFFFFFFFu}) EXPECT_EQ(0, with(10, offset, 4));
  EXPECT_EQ(1, with(10, 58, 4));  // one palette entry; the other indices are black
}

TEST(Bmp, ArgumentsAndSources) {
  Bytes file = random_bmp(9, 24, 6, 4).file();
  const DecInfo decInfo = open_memory(file, 1);
  uint8_t pixels[3];
  EXPECT_EQ(1, TAVIRPELOI_DecodeBMP(decInfo.get(), pixels, 0, 1));
  EXPECT_EQ(1, TAVIRPELOI_DecodeBMP(decInfo.get(), pixels, 1, 0));
  MemoryStream stream{file};
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMP(open_stream(stream, 1).get(), pixels, 1, 1));
  for (const int format : {9, 10, 11, 12}) {
    const Bytes got = decode_bmp(file, {{6, 4}, {}}, format).pixels;
    EXPECT_EQ(Bytes(got.size(), kFill), got);
  }
  const TempFile onDisk;
  onDisk.write(file);
  EXPECT_EQ(1, fail_each_allocation([&] {
              return decode(TAVIRPELOI_DecodeBMP, open_file(onDisk.path(), 1).get(), 3, 3).answer;
            }));
}

}  // namespace
}  // namespace tests
