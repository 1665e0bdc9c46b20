// Where a still picture lands and what it is made of: fitting, rotation, sampling, averaging.
#include "tests/gif/gif_decode.h"

namespace tests {
namespace {

// The screen's pixel that stands for pixel (x, y) of a picture: the one at its centre.
Rgba centre_pixel(const GifFile& file, Size picture, int x, int y) {
  return file.pixel(position(x, file.width, picture.width, file.width / 2),
                    position(y, file.height, picture.height, file.height / 2));
}

void expect_sampled(const GifFile& file, Size box, Size picture, uint32_t option) {
  Placement place = centred(box, picture, static_cast<int>(option >> 2 & 3));
  if ((option & 0x700) == 0x100) {  // tight: rows follow each other
    place.box.width = place.turn % 2 ? picture.height : picture.width;
    place.box.height = box.width * box.height / place.box.width;
    place.x = place.y = 0;
  }
  for (const int format : {0, 1, 7, 11}) {
    const Decode result = decode_gif(file.bytes(), box.width, box.height, format, option);
    EXPECT_EQ(1, result.answer);
    EXPECT_EQ(picture.width, result.outWidth);
    EXPECT_EQ(picture.height, result.outHeight);
    const Bytes want = placed(place, format, [&](int x, int y) {
      return pixel_bytes(centre_pixel(file, picture, x, y), format);
    });
    ASSERT_EQ(want, prefix(result.pixels, want.size())) << format << " " << option;
  }
}

TEST(GifPlace, FitsAndTurns) {
  for (const bool interlaced : {false, true}) {
    GifFile file = sample_gif(100, 50, 6, interlaced);
    file.images[0].control = GifControl{0, 0, 3};
    for (const uint32_t turn : {0x0, 0x4, 0x8, 0xC}) {
      const auto size = [&](int width, int height) {
        return turn & 4 ? Size{height, width} : Size{width, height};
      };
      expect_sampled(file, {200, 200}, {100, 50}, turn);
      expect_sampled(file, {200, 200}, {100, 50}, turn | 0x300);
      expect_sampled(file, size(100, 50), {100, 50}, turn | 0x100);
      // Narrower or lower alone: sampled, not averaged.
      expect_sampled(file, size(33, 90), {33, 16}, turn);
      expect_sampled(file, size(300, 17), {34, 17}, turn);
      expect_sampled(file, {130, 177}, size(130, 177), turn | 0x700);
      expect_sampled(file, {100, 50}, size(100, 50), turn | 0x700);
    }
  }
  // When the reduction is a whole fraction of the size, the picture is just sampled.
  for (const uint32_t option : {0x0, 0x8, 0x104})
    expect_sampled(sample_gif(400, 300, 7), {100, 100}, {100, 75}, option);
}

// The samples of a reduced picture, averaged at their quarter points.
void expect_averaged(const GifFile& file, Size reduced, Size box) {
  const Bytes want = placed(centred(box, box), 7, [&](int x, int y) {
    int sums[4] = {};
    four_points(reduced, box, x, y, [&](int u, int v) {
      const Bytes channels = pixel_bytes(centre_pixel(file, reduced, u, v), 7);
      for (size_t i = 0; i < 4; ++i) sums[i] += channels[i];
    });
    Bytes pixel;
    for (const int sum : sums) pixel.push_back(static_cast<uint8_t>(sum / 4));
    return pixel;
  });
  ASSERT_EQ(want, decode_gif(file.bytes(), box.width, box.height).pixels);
}

TEST(GifPlace, AveragesWhatIsReducedOnBothSides) {
  for (const bool interlaced : {false, true}) {
    GifFile file = sample_gif(300, 300, 5, interlaced);
    file.images[0].control = GifControl{0, 0, 9};
    expect_averaged(file, {75, 75}, {70, 70});  // 300 / 70 is 4
    // A width without divisors is averaged from all its pixels, into the whole box.
    expect_averaged(sample_gif(293, 150, 5, interlaced), {293, 150}, {70, 30});
  }
}

// Reduced to 50 x 33, which is lower than the box: brought to the fitted size in its place.
TEST(GifPlace, ReducedButLargerInOneDirection) {
  GifFile file = sample_gif(300, 200, 5);
  file.images[0].indices.assign(300 * 200, 21);
  for (const uint32_t option : {0x0, 0x4, 0x8, 0xC, 0x104, 0x700}) {
    const Decode result = decode_gif(file.bytes(), 70, 190, 7, option);
    EXPECT_EQ(1, result.answer);
    const Bytes colour = pixel_bytes(file.pixel(0, 0), 7), empty(4, kFill);
    int painted = 0;
    for (size_t i = 0; i < result.pixels.size(); i += 4) {
      const Bytes pixel = prefix(suffix(result.pixels, i), 4);
      painted += pixel == colour;
      ASSERT_TRUE(pixel == colour || pixel == empty);
    }
    EXPECT_EQ(result.outWidth * result.outHeight, painted) << option;
  }
}

// What an image does not reach, or has no data for, is zero bytes, averaged or not; unless both sides
// shrink, it stays as it was.
TEST(GifPlace, MarginsOfReducedPictures) {
  GifFile file = sample_gif(8, 6, 6);
  file.width = 20, file.height = 16;
  file.images[0].left = 4, file.images[0].top = 4;
  const Bytes bytes = file.bytes(), cut = prefix(bytes, bytes.size() - 35), zero(4), kept(4, kFill);
  for (const uint32_t turn : {0x0, 0x8}) {
    for (const auto& [size, missing] :
         {std::pair(Size{5, 4}, zero), {Size{4, 3}, zero}, {Size{10, 8}, zero}, {Size{5, 16}, kept}}) {
      for (const Bytes& input : {bytes, cut}) {
        const Decode got = decode_gif(input, size.width, size.height, 7, TAVIRPELO_FIT_STRETCH | turn);
        EXPECT_EQ(1, got.answer);
        EXPECT_EQ(missing, prefix(got.pixels, 4)) << size.width << " " << turn;
        EXPECT_EQ(missing, suffix(got.pixels, got.pixels.size() - 4));
        const bool fills =
            std::search_n(got.pixels.begin(), got.pixels.end(), 4, kFill) != got.pixels.end();
        EXPECT_EQ(missing == kept, fills);
      }
    }
  }
  Bytes pixels(10 * 8 * 4, kFill), stepwise = bytes;
  const DecInfo decInfo = open_memory(stepwise, 7);
  while (TAVIRPELOI_DecodeGIFIter(decInfo.get(), pixels.data(), 10, 8) == 4) {
  }
  EXPECT_EQ(decode_gif(bytes, 10, 8).pixels, pixels);
}

TEST(GifPlace, EmptySidesAndUnknownFormatsWriteNothing) {
  const GifFile file = sample_gif(30, 20, 4);
  for (const auto& [width, height] : {std::pair(0, 10), {10, 0}, {0, 0}})
    EXPECT_EQ(1, decode_gif(file.bytes(), width, height).answer);
  const Decode thin = decode_gif(sample_gif(2, 1000, 2).bytes(), 60, 40);
  EXPECT_EQ(1, thin.answer);
  EXPECT_EQ(Bytes(60 * 40 * 4, kFill), thin.pixels);
  for (const int format : {2, 4, 6, 9, 12, 13, -1}) {
    Bytes pixels(30 * 20 * 4, kFill), bytes = file.bytes();
    const DecInfo decInfo = open_memory(bytes, format);
    EXPECT_EQ(1, TAVIRPELOI_DecodeGIF(decInfo.get(), pixels.data(), 30, 20));
    EXPECT_EQ(1, TAVIRPELOI_DecodeGIFLine(decInfo.get(), pixels.data(), 30, 20, 20));
    EXPECT_EQ(3, TAVIRPELOI_DecodeAGIF(decInfo.get(), pixels.data(), 30, 20));
    EXPECT_EQ(Bytes(30 * 20 * 4, kFill), pixels);
    EXPECT_EQ(30, decInfo->outWidth);
  }
  for (const Size screen : {Size{0, 20}, {30, 0}}) {
    GifFile empty = file;
    empty.width = screen.width, empty.height = screen.height;
    EXPECT_EQ(1, decode_gif(empty.bytes(), 10, 10).answer);
    EXPECT_EQ(1, decode_gif(empty.bytes(), 10, 10, 7, 0x700).answer);
    EXPECT_EQ(3, decode_frames(empty.bytes(), 10, 10, 7, 0x700).answer);
  }
}

}  // namespace
}  // namespace tests
