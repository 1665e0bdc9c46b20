// BMP pictures of every depth and layout, from memory and files, at their size and averaged, and
// damaged.
#include <bit>
#include <random>

#include "codec/bmp/bmp_record.h"
#include "platform/fault_injection.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

using Pixel = std::array<uint8_t, 4>;  // R, G, B, A

void put(Bytes& out, uint32_t value, int bytes) {
  for (int i = 0; i < bytes; ++i) out.push_back(static_cast<uint8_t>(value >> 8 * i));
}

struct Bmp {
  int width = 1, height = 1, bits = 24;
  bool topDown = false;
  uint32_t headerSize = 40, compression = 0;
  std::array<uint32_t, 3> masks{0x7C00, 0x03E0, 0x001F};
  std::vector<Pixel> palette;
  std::vector<uint32_t> values;  // from the top row, left to right

  uint32_t value(int x, int y) const { return values[static_cast<size_t>(y * width + x)]; }

  Pixel pixel(int x, int y) const {
    const uint32_t v = value(x, y);
    if (bits <= 8) return v < palette.size() ? palette[v] : Pixel{0, 0, 0, 255};
    if (bits == 24)
      return {static_cast<uint8_t>(v >> 16), static_cast<uint8_t>(v >> 8), static_cast<uint8_t>(v), 255};
    if (bits == 32) {
      return {static_cast<uint8_t>(v >> 16), static_cast<uint8_t>(v >> 8), static_cast<uint8_t>(v),
              static_cast<uint8_t>(v >> 24)};
    }
    const auto field = [v](uint32_t mask) {  // as many high bits as the mask has
      const int low = std::countr_zero(mask), size = std::popcount(mask);
      return static_cast<uint8_t>(((v & mask) >> low) << (8 - size));
    };
    return {field(masks[0]), field(masks[1]), field(masks[2]), 255};
  }

  Bytes file() const {
    const bool core = headerSize == 12;
    const size_t paletteBytes = palette.size() * (core ? 3 : 4);
    const size_t maskBytes = compression == 3 ? 12 : 0;
    const size_t rowBytes = (static_cast<size_t>(width * bits) + 31) / 32 * 4;
    const size_t offset = std::max<size_t>(14 + headerSize + paletteBytes + maskBytes, 54);
    Bytes out{'B', 'M'};
    put(out, static_cast<uint32_t>(offset + rowBytes * static_cast<size_t>(height)), 4);
    put(out, 0, 4);
    put(out, static_cast<uint32_t>(offset), 4);
    put(out, headerSize, 4);
    put(out, static_cast<uint32_t>(width), core ? 2 : 4);
    put(out, static_cast<uint32_t>(topDown ? -height : height), core ? 2 : 4);
    put(out, 1, 2);
    put(out, static_cast<uint32_t>(bits), 2);
    if (!core) {
      put(out, compression, 4);
      out.resize(14 + headerSize);
    }
    for (uint32_t mask : masks) {
      if (maskBytes != 0) put(out, mask, 4);
    }
    for (const Pixel& p : palette)
      put(out, static_cast<uint32_t>(p[0] << 16 | p[1] << 8 | p[2]), core ? 3 : 4);
    out.resize(offset);
    for (int i = 0; i < height; ++i) {
      const int y = topDown ? i : height - 1 - i;
      Bytes row((rowBytes));
      for (int x = 0; x < width; ++x) {
        const uint32_t v = value(x, y);
        if (bits >= 8) {
          for (int b = 0; b < bits / 8; ++b)
            row[static_cast<size_t>(x * bits / 8 + b)] = static_cast<uint8_t>(v >> 8 * b);
        } else {
          const int shift = 8 - bits - x * bits % 8;
          row[static_cast<size_t>(x * bits / 8)] =
              static_cast<uint8_t>(row[static_cast<size_t>(x * bits / 8)] | v << shift);
        }
      }
      out.insert(out.end(), row.begin(), row.end());
    }
    return out;
  }
};

Bmp random_bmp(uint32_t seed, int bits, int width, int height) {
  std::mt19937 random(seed);
  Bmp bmp;
  bmp.width = width, bmp.height = height, bmp.bits = bits;
  for (int i = 0; bits <= 8 && i < 1 << bits; ++i) {
    bmp.palette.push_back({static_cast<uint8_t>(random()), static_cast<uint8_t>(random()),
                           static_cast<uint8_t>(random()), 255});
  }
  for (int i = 0; i < width * height; ++i) {
    bmp.values.push_back(bits == 32 ? static_cast<uint32_t>(random())
                                    : static_cast<uint32_t>(random()) % (1u << bits));
  }
  return bmp;
}

Bytes stored(const Pixel& p, int format) {
  const auto [r, g, b, a] = p;
  const auto word = static_cast<uint32_t>(r >> 3 << 11 | g >> 2 << 5 | b >> 3);
  const auto low = static_cast<uint8_t>(word), high = static_cast<uint8_t>(word >> 8);
  switch (format) {
    case 0:
      return {low, high};
    case 1:
      return {r, g, b};
    case 5:
      return {a, r, g, b};
    case 6:
      return {low, high, a};
    case 7:
      return {r, g, b, a};
    default:
      return {b, g, r, a};
  }
}

// The average of four pixels for output pixel (x, y), counted from below as the file is.
Pixel averaged(const Bmp& bmp, int x, int y, int outWidth, int outHeight) {
  const auto at = [](int k, int source, int target, int phase) { return (phase + k * source) / target; };
  const int up = outHeight - 1 - y;
  Pixel sum{0, 0, 0, static_cast<uint8_t>(bmp.bits == 32 ? 0 : 255)};
  for (const int py : {bmp.height / 4, 3 * bmp.height / 4}) {
    for (const int px : {bmp.width / 4, 3 * bmp.width / 4}) {
      const Pixel p =
          bmp.pixel(at(x, bmp.width, outWidth, px), bmp.height - 1 - at(up, bmp.height, outHeight, py));
      for (size_t c = 0; c < (bmp.bits == 32 ? 4u : 3u); ++c)
        sum[c] = static_cast<uint8_t>(sum[c] + (p[c] >> 2));
    }
  }
  return sum;
}

struct View {
  int boxWidth, boxHeight;
  uint32_t option = 0;
  int outWidth, outHeight;
  bool oneToOne;
};

Bytes expected(const Bmp& bmp, const View& v, int format) {
  const size_t bpp = static_cast<size_t>(pelo::bytes_per_pixel(format));
  Bytes out(static_cast<size_t>(v.boxWidth * v.boxHeight) * bpp, 0x33);
  const int turn = static_cast<int>(v.option >> 2 & 3);
  const int turnedWidth = turn % 2 ? v.outHeight : v.outWidth,
            turnedHeight = turn % 2 ? v.outWidth : v.outHeight;
  const int x0 = (v.boxWidth - turnedWidth) / 2, y0 = (v.boxHeight - turnedHeight) / 2;
  for (int y = 0; y < v.outHeight; ++y) {
    for (int x = 0; x < v.outWidth; ++x) {
      const int toX[] = {x, v.outHeight - 1 - y, v.outWidth - 1 - x, y};
      const int toY[] = {y, x, v.outHeight - 1 - y, v.outWidth - 1 - x};
      const Bytes p =
          stored(v.oneToOne ? bmp.pixel(x, y) : averaged(bmp, x, y, v.outWidth, v.outHeight), format);
      std::copy(p.begin(), p.end(),
                out.begin() + ((y0 + toY[turn]) * v.boxWidth + x0 + toX[turn]) * static_cast<int>(bpp));
    }
  }
  return out;
}

Bytes decode(Bytes file, const View& v, int format, int answer = 1) {
  GuardedPixels pixels(v.boxWidth, v.boxHeight, format);
  EXPECT_EQ(answer, TAVIRPELOI_DecodeBMP(open_memory(file, format, v.option).get(), pixels.data(),
                                         v.boxWidth, v.boxHeight));
  return pixels.content();
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
          for (View v : {View{24, 25, 0, 21, 14, true}, View{12, 12, 0, 12, 8, false},
                         View{17, 31, TAVIRPELO_FIT_STRETCH, 17, 31, false}}) {
            const bool stretch = v.option != 0;
            v.option |= turn << 2;
            if (stretch && turn % 2) std::swap(v.outWidth, v.outHeight);
            const Bytes want = expected(bmp, v, format);
            ASSERT_EQ(want, decode(file, v, format))
                << bits << " " << format << " " << turn << " " << topDown;
            GuardedPixels pixels(v.boxWidth, v.boxHeight, format);
            const DecInfo decInfo = open_file(onDisk.path(), format, v.option);
            TAVIRPELO_SetStreamReadSize(decInfo.get(), static_cast<int>(seed % 3) * 100 - 1);
            ASSERT_EQ(1, TAVIRPELOI_DecodeBMP(decInfo.get(), pixels.data(), v.boxWidth, v.boxHeight));
            ASSERT_EQ(want, pixels.content());
          }
        }
      }
    }
  }
}

TEST(Bmp, TightPicturesFollowThePictureSize) {
  const Bmp bmp = random_bmp(1, 24, 40, 24);
  const View tight{40, 24, TAVIRPELO_FIT_TIGHT | TAVIRPELO_ROTATE_90, 24, 14, false};
  const Bytes got = decode(bmp.file(), tight, 1);
  const View packed{14, 24, TAVIRPELO_ROTATE_90, 24, 14, false};
  const Bytes want = expected(bmp, packed, 1);
  EXPECT_TRUE(std::equal(want.begin(), want.end(), got.begin()));
}

TEST(Bmp, HeaderLayouts) {
  const View whole{9, 5, 0, 9, 5, true};
  for (const int bits : {1, 4, 8, 24}) {
    Bmp bmp = random_bmp(2, bits, 9, 5);
    for (const uint32_t size : {12u, 40u, 56u, 64u}) {
      bmp.headerSize = size;
      EXPECT_EQ(expected(bmp, whole, 1), decode(bmp.file(), whole, 1)) << bits << " " << size;
    }
    for (const uint32_t size : {16u, 52u, 108u, 124u}) {
      bmp.headerSize = size;
      decode(bmp.file(), whole, 1, 0);
    }
  }
  const std::array<std::array<uint32_t, 3>, 3> fields{
      {{0xF800, 0x07E0, 0x001F}, {0x0F00, 0x00F0, 0x000F}, {0x7C00, 0x03E0, 0x001F}}};
  Bmp bmp = random_bmp(3, 16, 9, 5);
  for (const auto& masks : fields) {
    bmp.masks = masks;
    for (const uint32_t compression : {3u}) {
      bmp.compression = compression;
      EXPECT_EQ(expected(bmp, whole, 7), decode(bmp.file(), whole, 7));
    }
  }
  bmp.masks = {0xFF00, 0xF0, 0xF};
  decode(bmp.file(), whole, 1, 0);
}

TEST(Bmp, RowsInBatches) {
  for (const bool topDown : {false, true}) {
    Bmp bmp = random_bmp(4, 24, 13, 33);
    bmp.topDown = topDown;
    Bytes file = bmp.file();
    for (const View& v :
         {View{13, 33, 0, 13, 33, true}, View{9, 20, TAVIRPELO_FIT_STRETCH, 9, 20, false}}) {
      const Bytes want = expected(bmp, v, 1);
      for (int lines = 1; lines <= v.outHeight + 1; ++lines) {
        const DecInfo decInfo = open_memory(file, 1, v.option);
        GuardedPixels pixels(v.boxWidth, v.boxHeight, 1);
        int calls = 0;
        do {
          ASSERT_EQ(
              1, TAVIRPELOI_DecodeBMPLine(decInfo.get(), pixels.data(), v.boxWidth, v.boxHeight, lines));
          ++calls;
        } while (decInfo->pFormatInfo != nullptr);
        EXPECT_EQ((v.outHeight + lines - 1) / lines, calls);
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
  const View whole{6, 4, 0, 6, 4, true};
  const Bmp bmp = random_bmp(6, 8, 6, 4);
  const Bytes file = bmp.file(), all = decode(file, whole, 1);
  const size_t pixelsAt = file.size() - 4 * 8;
  const TempFile onDisk;
  for (size_t size = 1; size < file.size(); ++size) {
    const Bytes cut(file.begin(), file.begin() + static_cast<ptrdiff_t>(size));
    const int answer = size >= pixelsAt ? 1 : 0;
    const Bytes got = decode(cut, whole, 1, answer);
    // The rows that are there, from below; the others keep what the buffer held.
    const size_t rows = answer == 0 ? 0 : (size - pixelsAt + 2) / 8;
    Bytes want(all.size(), 0x33);
    std::copy(all.end() - static_cast<ptrdiff_t>(rows * 18), all.end(),
              want.end() - static_cast<ptrdiff_t>(rows * 18));
    ASSERT_EQ(want, got) << size;
    onDisk.write(cut);
    GuardedPixels pixels(6, 4, 1);
    ASSERT_EQ(answer, TAVIRPELOI_DecodeBMP(open_file(onDisk.path(), 1).get(), pixels.data(), 6, 4));
    ASSERT_EQ(want, pixels.content()) << size;
  }
}

TEST(Bmp, EveryHeaderByte) {
  for (const int bits : kDepths) {
    const Bytes file = random_bmp(7, bits, 6, 4).file();
    for (size_t at = 0; at < std::min<size_t>(file.size(), 70); ++at) {
      for (const int value : {0x00, 0x01, 0x02, 0x7F, 0x80, 0xFE, 0xFF}) {
        Bytes damaged = file;
        damaged[at] = static_cast<uint8_t>(value);
        for (const uint32_t option : {0u, uint32_t{TAVIRPELO_FIT_STRETCH | TAVIRPELO_ROTATE_90}}) {
          GuardedPixels pixels(7, 5, 8);
          const int got =
              TAVIRPELOI_DecodeBMP(open_memory(damaged, 8, option).get(), pixels.data(), 7, 5);
          EXPECT_TRUE(got == 0 || got == 1);
        }
      }
    }
  }
}

TEST(Bmp, FieldsAtTheirLimits) {
  const Bmp bmp = random_bmp(8, 8, 6, 4);
  const auto with = [&](size_t at, uint32_t value, int bytes) {
    Bytes file = bmp.file(), field;
    put(field, value, bytes);
    std::copy(field.begin(), field.end(), file.begin() + static_cast<ptrdiff_t>(at));
    GuardedPixels pixels(7, 5, 1);
    return TAVIRPELOI_DecodeBMP(open_memory(file, 1).get(), pixels.data(), 7, 5);
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
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMP(nullptr, pixels, 1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMP(decInfo.get(), nullptr, 1, 1));
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMP(decInfo.get(), pixels, -1, 1));
  EXPECT_EQ(1, TAVIRPELOI_DecodeBMP(decInfo.get(), pixels, 0, 1));
  EXPECT_EQ(1, TAVIRPELOI_DecodeBMP(decInfo.get(), pixels, 1, 0));
  MemoryStream stream{file};
  EXPECT_EQ(0, TAVIRPELOI_DecodeBMP(open_stream(stream, 1).get(), pixels, 1, 1));
  const View whole{6, 4, 0, 6, 4, true};
  for (const int format : {9, 10, 11, 12}) {
    const Bytes got = decode(file, whole, format);
    EXPECT_EQ(Bytes(got.size(), 0x33), got);
  }
  for (int k = 1;; ++k) {
    const TempFile onDisk;
    onDisk.write(file);
    GuardedPixels small(3, 3, 1);
    pelo::faults::allocations.arm(k);
    const DecInfo source = open_file(onDisk.path(), 1);
    const int got = source ? TAVIRPELOI_DecodeBMP(source.get(), small.data(), 3, 3) : 0;
    const bool reached = pelo::faults::allocations.calls >= k;
    pelo::faults::allocations.arm(0);
    if (!reached) break;
    EXPECT_EQ(0, got) << k;
  }
}

}  // namespace
}  // namespace tests
