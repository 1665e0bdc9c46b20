// Decoding by lines and by blocks, from every kind of source, and the merging of IDAT chunks.
#include <cstdio>
#include <fstream>

#include "tests/png/png_decode.h"

namespace tests {
namespace {

constexpr int kSide = 40;

// 31 x 33 pixels of four channels: blocks, chunks and rows end at different places.
PngImage picture(bool interlaced = false) {
  return random_png_image(3, 6, 8, 31, 33, interlaced, false);
}

Bytes in_pieces(const PngImage& image, size_t idatSize, size_t blockSize) {
  const Bytes lines = png_scanlines(image, [](size_t row) { return row % 5; });
  return build_png(image, zlib_fixed(lines, blockSize), idatSize);
}

Bytes whole(const Bytes& file, int width, int height, uint32_t option = 0) {
  const PngResult result = decode_png(file, width, height, 7, option);
  EXPECT_EQ(1, result.answer);
  return result.pixels;
}

TEST(PngResume, ChunksFromStreamsAsFromMemory) {
  for (const bool interlaced : {false, true}) {
    const PngImage image = picture(interlaced);
    const Bytes plain = whole(build_png(image), kSide, kSide);
    for (const size_t idatSize : {3u, 7u, 100u, 4096u}) {
      const Bytes file = in_pieces(image, idatSize, 500);
      ASSERT_EQ(plain, whole(file, kSide, kSide)) << idatSize;
      for (const int limit : {1, 3, 4096}) {  // a stream may deliver any part of what is asked
        MemoryStream stream{file};
        stream.limit = limit;
        GuardedPixels pixels(kSide, kSide, 7);
        ASSERT_EQ(1, TAVIRPELOI_DecodePNG(open_stream(stream, 7).get(), pixels.data(), kSide, kSide));
        ASSERT_EQ(plain, pixels.content()) << idatSize << " in reads of " << limit;
      }
    }
  }
}

// A chunk between IDAT chunks is passed over, also where it takes the next header over a read's border.
TEST(PngResume, OtherChunksBetween) {
  const PngImage image = picture();
  const Bytes plain = whole(build_png(image), kSide, kSide);
  for (const size_t filler : {1u, 4040u, 4070u, 4085u, 4100u}) {
    auto chunks = png_chunks(in_pieces(image, 900, SIZE_MAX));
    chunks.insert(chunks.begin() + 2, {"tEXt", Bytes(filler, 'x')});
    const Bytes file = join_png(chunks);
    MemoryStream stream{file};
    GuardedPixels pixels(kSide, kSide, 7);
    EXPECT_EQ(1, TAVIRPELOI_DecodePNG(open_stream(stream, 7).get(), pixels.data(), kSide, kSide));
    EXPECT_EQ(plain, pixels.content());
    EXPECT_EQ(plain, whole(file, kSide, kSide));
  }
}

TEST(PngResume, MergedChunksStandInTheCallersBuffer) {
  const PngImage image = picture();
  Bytes file = in_pieces(image, 700, SIZE_MAX);
  const size_t before = png_chunks(file).size();
  ASSERT_LT(4u, before);
  Bytes data;
  for (const PngChunk& chunk : png_chunks(file)) {
    if (chunk.type == "IDAT") data.insert(data.end(), chunk.data.begin(), chunk.data.end());
  }
  GuardedPixels pixels(kSide, kSide, 7);
  EXPECT_EQ(1, TAVIRPELOI_DecodePNG(open_memory(file, 7).get(), pixels.data(), kSide, kSide));
  const auto merged = png_chunks(file);
  ASSERT_EQ(3u, merged.size());
  EXPECT_EQ(data, merged[1].data);
  const Bytes rebuilt = join_png(merged);  // with checksums of its own
  EXPECT_TRUE(std::equal(rebuilt.begin(), rebuilt.end(), file.begin()));
  EXPECT_EQ(pixels.content(), whole(file, kSide, kSide));
}

// Rows by `lines` at a time, each call into a buffer of its own.
void expect_lines(DecInfo decInfo, const Bytes& expected, int width, int height, int outHeight,
                  int lines) {
  const size_t rowBytes = static_cast<size_t>(width) * 4;
  int done = 0;
  for (int answer = 4; answer == 4; done += lines) {
    GuardedPixels band(width, lines, 7);
    answer = TAVIRPELOI_DecodePNGLine(decInfo.get(), band.data(), width, height, lines);
    const int rows = std::min(lines, outHeight - done);
    ASSERT_EQ(done + lines >= outHeight ? 1 : 4, answer) << done;
    const Bytes got = band.content();
    ASSERT_TRUE(std::equal(got.begin(), got.begin() + static_cast<ptrdiff_t>(rowBytes) * rows,
                           expected.begin() + static_cast<ptrdiff_t>(rowBytes) * done))
        << done;
  }
  EXPECT_LE(outHeight, done);
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
}

TEST(PngResume, LinesEqualTheWhole) {
  const PngImage image = picture();
  Bytes file = in_pieces(image, 300, 200);
  struct Size {
    int width, height;
  };
  for (const Size size : {Size{31, 33}, Size{20, 70}, Size{50, 9}}) {  // as it is, taller, flatter
    const Bytes expected = whole(file, size.width, size.height, TAVIRPELO_FIT_STRETCH);
    for (int lines = 1; lines <= size.height + 1; ++lines) {
      expect_lines(open_memory(file, 7, TAVIRPELO_FIT_STRETCH), expected, size.width, size.height,
                   size.height, lines);
      MemoryStream stream{file};
      expect_lines(open_stream(stream, 7, TAVIRPELO_FIT_STRETCH), expected, size.width, size.height,
                   size.height, lines);
    }
  }
}

TEST(PngResume, BlocksEqualTheWhole) {
  for (const bool interlaced : {false, true}) {
    const PngImage image = picture(interlaced);
    for (const size_t blockSize : {1u, 50u, 124u, 126u, 4000u}) {
      Bytes file = in_pieces(image, 333, blockSize);
      const Bytes expected = whole(file, 25, 60, TAVIRPELO_FIT_STRETCH);
      const DecInfo decInfo = open_memory(file, 7, TAVIRPELO_FIT_STRETCH);
      GuardedPixels pixels(25, 60, 7);
      const size_t size = png_scanlines(image, [](size_t) { return 0; }).size();
      size_t calls = 1;
      while (TAVIRPELOI_DecodePNGIter(decInfo.get(), pixels.data(), 25, 60) == 4) ++calls;
      EXPECT_EQ((size + blockSize - 1) / blockSize, calls);
      EXPECT_EQ(expected, pixels.content());
    }
  }
}

TEST(PngResume, AnotherRequestEndsTheDecode) {
  const PngImage image = picture();
  Bytes file = build_png(image);
  const DecInfo decInfo = open_memory(file, 7);
  GuardedPixels pixels(kSide, kSide, 7);
  ASSERT_EQ(4, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels.data(), kSide, kSide, 5));
  EXPECT_EQ(0, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels.data(), kSide, kSide - 1, 5));
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  ASSERT_EQ(4, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels.data(), kSide, kSide, 5));
  // A whole decode starts over, whatever was going on.
  GuardedPixels small(10, 10, 7);
  EXPECT_EQ(1, TAVIRPELOI_DecodePNG(decInfo.get(), small.data(), 10, 10));
  ASSERT_EQ(4, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels.data(), kSide, kSide, 5));
  EXPECT_EQ(1, TAVIRPELOI_AbortPNGIter(decInfo.get()));
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  EXPECT_EQ(0, TAVIRPELOI_AbortPNGIter(nullptr));
}

TEST(PngResume, InterlacedPicturesHaveNoLines) {
  Bytes file = build_png(picture(true));
  const DecInfo decInfo = open_memory(file, 7);
  GuardedPixels pixels(31, 33, 7);
  EXPECT_EQ(0, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels.data(), 31, 33, 10));
  EXPECT_EQ(1, TAVIRPELOI_DecodePNGLine(decInfo.get(), pixels.data(), 31, 33, 33));
  EXPECT_EQ(whole(file, 31, 33), pixels.content());
}

}  // namespace
}  // namespace tests
