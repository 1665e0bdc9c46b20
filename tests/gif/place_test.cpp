// Where a still picture lands and what it is made of: fitting, rotation, sampling, averaging.
#include "tests/gif/gif_decode.h"

namespace tests {
namespace {

struct Box {
  int width, height;
};

// What the formulas of fitting and placement give for an image that fills its screen, sampled at the
// centres of the picture's pixels.
Bytes sampled(const GifFile& file, Box box, Box picture, int format, uint32_t option) {
  const uint32_t turn = option & 0xC;
  const bool sideways = turn == 0x4 || turn == 0xC;
  const Box turned = sideways ? Box{picture.height, picture.width} : picture;
  Bytes out(static_cast<size_t>(box.width * box.height * pelo::bytes_per_pixel(format)), kFill);
  const int pitch = (option & 0x700) == 0x100 ? turned.width : box.width;
  const int left = (option & 0x700) == 0x100 ? 0 : (box.width - turned.width) / 2;
  const int top = (option & 0x700) == 0x100 ? 0 : (box.height - turned.height) / 2;
  for (int y = 0; y < picture.height; ++y) {
    for (int x = 0; x < picture.width; ++x) {
      const Colour c = colour_at(file, (file.width / 2 + x * file.width) / picture.width,
                                 (file.height / 2 + y * file.height) / picture.height);
      const int right = picture.width - 1 - x, below = picture.height - 1 - y;
      const int column = turn == 0 ? x : turn == 0x4 ? below : turn == 0x8 ? right : y;
      const int row = turn == 0 ? y : turn == 0x4 ? x : turn == 0x8 ? below : right;
      put_pixel(out, pitch, left + column, top + row, packed(c, format));
    }
  }
  return out;
}

void expect_sampled(const GifFile& file, Box box, Box picture, uint32_t option) {
  for (const int format : {0, 1, 7, 11}) {
    const GifResult result = decode_gif(file.bytes(), box.width, box.height, format, option);
    EXPECT_EQ(1, result.answer);
    EXPECT_EQ(picture.width, result.outWidth);
    EXPECT_EQ(picture.height, result.outHeight);
    ASSERT_EQ(sampled(file, box, picture, format, option), result.pixels) << format << " " << option;
  }
}

TEST(GifPlace, FitsAndTurns) {
  for (const bool interlaced : {false, true}) {
    GifFile file = sample_gif(100, 50, 6, interlaced);
    file.images[0].control = GifControl{0, 0, 3};
    for (const uint32_t turn : {0x0, 0x4, 0x8, 0xC}) {
      const bool sideways = (turn & 4) != 0;
      expect_sampled(file, {200, 200}, {100, 50}, turn);
      expect_sampled(file, {200, 200}, {100, 50}, turn | 0x300);
      expect_sampled(file, sideways ? Box{50, 100} : Box{100, 50}, {100, 50}, turn | 0x100);
      // Narrower or lower alone: sampled, not averaged.
      expect_sampled(file, sideways ? Box{90, 33} : Box{33, 90}, {33, 16}, turn);
      expect_sampled(file, sideways ? Box{17, 300} : Box{300, 17}, {34, 17}, turn);
      expect_sampled(file, {130, 177}, sideways ? Box{177, 130} : Box{130, 177}, turn | 0x700);
      expect_sampled(file, {100, 50}, sideways ? Box{50, 100} : Box{100, 50}, turn | 0x700);
    }
  }
}

// When the reduction is a whole fraction of the size, the picture is just sampled.
TEST(GifPlace, ReducedToAWholeFraction) {
  const GifFile file = sample_gif(400, 300, 7);
  expect_sampled(file, {100, 100}, {100, 75}, 0);
  expect_sampled(file, {100, 100}, {100, 75}, 0x8);
  expect_sampled(file, {100, 100}, {100, 75}, 0x104);
}

// 300 / 70 is 4: the 75 x 75 samples are averaged at their quarter points.
Bytes averaged(const GifFile& file, Box reduced, Box box) {
  Bytes out(static_cast<size_t>(box.width * box.height * 4), 0);
  for (int y = 0; y < box.height; ++y) {
    for (int x = 0; x < box.width; ++x) {
      int sums[4] = {};
      for (int sample = 0; sample < 4; ++sample) {
        const int u =
            ((sample & 1 ? 3 * reduced.width / 4 : reduced.width / 4) + x * reduced.width) / box.width;
        const int v = ((sample & 2 ? 3 * reduced.height / 4 : reduced.height / 4) + y * reduced.height) /
                      box.height;
        const Colour c = colour_at(file, (file.width / 2 + u * file.width) / reduced.width,
                                   (file.height / 2 + v * file.height) / reduced.height);
        const int channels[4] = {c.r, c.g, c.b, c.a};
        for (int i = 0; i < 4; ++i) sums[i] += channels[i];
      }
      const Colour c{static_cast<uint8_t>(sums[0] / 4), static_cast<uint8_t>(sums[1] / 4),
                     static_cast<uint8_t>(sums[2] / 4), static_cast<uint8_t>(sums[3] / 4)};
      put_pixel(out, box.width, x, y, packed(c, 7));
    }
  }
  return out;
}

TEST(GifPlace, AveragesWhatIsReducedOnBothSides) {
  for (const bool interlaced : {false, true}) {
    GifFile file = sample_gif(300, 300, 5, interlaced);
    file.images[0].control = GifControl{0, 0, 9};
    const GifResult result = decode_gif(file.bytes(), 70, 70);
    EXPECT_EQ(1, result.answer);
    EXPECT_EQ(70, result.outWidth);
    ASSERT_EQ(averaged(file, {75, 75}, {70, 70}), result.pixels);
    // A width without divisors is averaged from all its pixels, into the whole box.
    file = sample_gif(301, 150, 5, interlaced);
    file.images[0].width = file.width = 293;
    file.images[0].indices.resize(293 * 150);
    ASSERT_EQ(averaged(file, {293, 150}, {70, 30}), decode_gif(file.bytes(), 70, 30).pixels);
  }
}

// Reduced to 50 x 33, which is lower than the box: brought to the fitted size in its place.
TEST(GifPlace, ReducedButLargerInOneDirection) {
  GifFile file = sample_gif(300, 200, 5);
  file.images[0].indices.assign(300 * 200, 21);
  for (const uint32_t option : {0x0, 0x4, 0x8, 0xC, 0x104, 0x700}) {
    const GifResult result = decode_gif(file.bytes(), 70, 190, 7, option);
    EXPECT_EQ(1, result.answer);
    const Bytes colour = packed(colour_at(file, 0, 0), 7);
    size_t painted = 0;
    for (size_t i = 0; i < result.pixels.size(); i += 4) {
      if (std::equal(colour.begin(), colour.end(), result.pixels.begin() + static_cast<ptrdiff_t>(i))) {
        ++painted;
      } else {
        ASSERT_EQ(kFill, result.pixels[i]);
      }
    }
    EXPECT_EQ(static_cast<size_t>(result.outWidth * result.outHeight), painted) << option;
  }
}

TEST(GifPlace, EmptySidesAndUnknownFormatsWriteNothing) {
  const GifFile file = sample_gif(30, 20, 4);
  for (const auto& [width, height] : {std::pair(0, 10), {10, 0}, {0, 0}}) {
    EXPECT_EQ(1, decode_gif(file.bytes(), width, height).answer);
  }
  const GifResult thin = decode_gif(sample_gif(2, 1000, 2).bytes(), 60, 40);
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
  for (const int screen : {0, 1}) {
    GifFile empty = file;
    empty.width = screen == 0 ? 0 : 30;
    empty.height = screen == 0 ? 20 : 0;
    EXPECT_EQ(1, decode_gif(empty.bytes(), 10, 10).answer);
    EXPECT_EQ(1, decode_gif(empty.bytes(), 10, 10, 7, 0x700).answer);
    EXPECT_EQ(3, decode_frames(empty.bytes(), 10, 10, 7, 0x700).answer);
  }
}

// An image beside, partly beside and larger than the screen, at 1:1 and reduced.
TEST(GifPlace, ImagesThatDoNotFitTheScreen) {
  GifFile file = sample_gif(90, 70, 4);
  file.width = 50;
  file.height = 40;
  const Bytes whole = decode_gif(file.bytes(), 50, 40).pixels;
  for (int y = 0; y < 40; ++y) {
    for (int x = 0; x < 50; ++x) {
      const Bytes expected = packed(colour_at(file, x, y), 7);
      ASSERT_TRUE(std::equal(expected.begin(), expected.end(), whole.begin() + (y * 50 + x) * 4));
    }
  }
  for (const auto& [left, top] : {std::pair(49, 39), {50, 40}, {65535, 0}, {0, 65535}}) {
    file.images[0].left = left;
    file.images[0].top = top;
    EXPECT_EQ(1, decode_gif(file.bytes(), 50, 40).answer);
    EXPECT_EQ(1, decode_gif(file.bytes(), 49, 39).answer);
    const GifFrames frames = decode_frames(file.bytes(), 50, 40);
    EXPECT_EQ(3, frames.answer);
    const auto painted = std::count(frames.frames[0].begin(), frames.frames[0].end(), 255);
    EXPECT_EQ(left == 49, painted > 0);
  }
}

}  // namespace
}  // namespace tests
