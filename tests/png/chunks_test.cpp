// IDAT chunks from every kind of source and their merging; blocks and lines.
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
  const Decode result = decode_png(file, width, height, 7, option);
  EXPECT_EQ(1, result.answer);
  return result.pixels;
}

void expect_from_every_source(const Bytes& want, const Bytes& file) {
  const auto same = [&](TAVIRPELO_DECINFO* decInfo) {
    ASSERT_EQ(want, decode(TAVIRPELOI_DecodePNG, decInfo, kSide, kSide).pixels);
  };
  // A stream may deliver any part of what is asked.
  from_every_source(file, 7, 0, same, {1, 3, 4096});
}

TEST(PngResume, ChunksFromEverySource) {
  for (const bool interlaced : {false, true}) {
    const PngImage image = picture(interlaced);
    const Bytes plain = whole(build_png(image), kSide, kSide);
    for (const size_t idatSize : {3u, 7u, 100u, 4096u})
      expect_from_every_source(plain, in_pieces(image, idatSize, 500));
    // A chunk between IDAT chunks is passed over, also where it takes the next header over a read's
    // border.
    for (const size_t filler : {1u, 4040u, 4070u, 4085u, 4100u}) {
      auto chunks = png_chunks(in_pieces(image, 900, SIZE_MAX));
      chunks.insert(chunks.begin() + 2, {"tEXt", Bytes(filler, 'x')});
      expect_from_every_source(plain, join_png(chunks));
    }
  }
}

TEST(PngResume, MergedChunksStandInTheCallersBuffer) {
  const PngImage image = picture();
  Bytes file = in_pieces(image, 700, SIZE_MAX);
  const size_t before = png_chunks(file).size();
  ASSERT_LT(4u, before);
  Bytes data;
  for (const PngChunk& chunk : png_chunks(file)) {
    if (chunk.type == "IDAT") append(data, chunk.data);
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
