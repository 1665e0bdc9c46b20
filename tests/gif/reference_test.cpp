// Stills and animations against giflib, pixel for pixel.
#ifdef TAVIR_HAVE_GIFLIB

#include <gif_lib.h>

#include <cstring>

#include "tests/gif/gif_decode.h"

namespace tests {
namespace {

struct Input {
  const Bytes& bytes;
  size_t at = 0;
};

int read_input(GifFileType* gif, GifByteType* target, int length) {
  auto& input = *static_cast<Input*>(gif->UserData);
  const size_t count = std::min(static_cast<size_t>(length), input.bytes.size() - input.at);
  std::memcpy(target, input.bytes.data() + input.at, count);
  input.at += count;
  return static_cast<int>(count);
}

// The file as giflib reads it, with all its images.
class Reference {
 public:
  explicit Reference(const Bytes& bytes) : input_{bytes} {
    int error = 0;
    gif_ = DGifOpen(&input_, read_input, &error);
    EXPECT_NE(nullptr, gif_);
    EXPECT_EQ(GIF_OK, DGifSlurp(gif_)) << gif_->Error;
  }
  ~Reference() { DGifCloseFile(gif_, nullptr); }
  const GifFileType* operator->() const { return gif_; }

  GraphicsControlBlock control(int image) const {
    GraphicsControlBlock control{0, false, 0, NO_TRANSPARENT_COLOR};
    DGifSavedExtensionToGCB(gif_, image, &control);
    return control;
  }
  Rgba colour(int image, int index) const {
    const ColorMapObject* map = gif_->SavedImages[image].ImageDesc.ColorMap;
    const GifColorType& c = (map ? map : gif_->SColorMap)->Colors[index];
    return {c.Red, c.Green, c.Blue, 255};
  }

 private:
  Input input_;
  GifFileType* gif_;
};

// The first image in its place on a filled screen.
void expect_equal(const GifFile& file) {
  const Bytes bytes = file.bytes();
  const Reference gif(bytes);
  const SavedImage& image = gif->SavedImages[0];
  const GifImageDesc& d = image.ImageDesc;
  for (const int format : {0, 1, 5, 7, 8, 10, 11}) {
    const Placement place{{gif->SWidth, gif->SHeight}, {d.Width, d.Height}, 0, d.Left, d.Top};
    const Bytes want = placed(place, format, [&](int x, int y) {
      const int index = image.RasterBits[y * d.Width + x];
      const bool clear = index == gif.control(0).TransparentColor;
      return pixel_bytes(clear ? Rgba{0, 0, 0, 0} : gif.colour(0, index), format);
    });
    const Decode result = decode_gif(bytes, file.width, file.height, format);
    EXPECT_EQ(1, result.answer);
    ASSERT_EQ(want, result.pixels) << format;
  }
}

TEST(GifReference, EveryCodeSizeAndRowOrder) {
  for (int bits = 1; bits <= 8; ++bits) {
    for (const bool interlaced : {false, true}) {
      SCOPED_TRACE(bits);
      expect_equal(sample_gif(201, 97, bits, interlaced));
    }
  }
  for (int height = 1; height <= 20; ++height) {
    SCOPED_TRACE(height);
    expect_equal(sample_gif(7, height, 4, true));
    expect_equal(sample_gif(1, height, 2, false));
  }
}

TEST(GifReference, ClearCodesAndBlocksOfAnyLength) {
  GifFile file = sample_gif(320, 240);
  LzwStyle& style = file.images[0].lzw;
  expect_equal(file);
  style.deferClear = true;
  expect_equal(file);
  for (const int every : {1, 2, 700, 3838, 3839, 3840}) {
    style.clearEvery = every;
    expect_equal(file);
  }
  style = {};
  for (const int blockBytes : {1, 2, 7, 254}) {
    style.blockBytes = blockBytes;
    expect_equal(file);
  }
  // One colour: the longest strings, each used as soon as it exists.
  file.images[0].indices.assign(file.images[0].indices.size(), 77);
  style = {};
  expect_equal(file);
}

TEST(GifReference, PlacesPalettesAndTransparency) {
  GifFile file = sample_gif(60, 40, 5);
  GifImage& image = file.images[0];
  image.control = GifControl{0, 7, 3};
  expect_equal(file);
  image.palette = sample_palette(32, 99);
  expect_equal(file);
  file.palette.clear();
  expect_equal(file);
  for (const auto& [left, top] : {std::pair(10, 5), {0, 39}, {59, 0}, {50, 30}, {60, 40}, {65535, 0}}) {
    image.left = left, image.top = top;
    expect_equal(file);
  }
  file.loops = true;
  expect_equal(file);
  GifFile larger = sample_gif(90, 70, 4);
  larger.width = 50, larger.height = 40;
  expect_equal(larger);
}

// Frames of any place, palette, transparency, disposal and row order, composed by the format's rules.
TEST(GifReference, AnimationsComposed) {
  uint32_t seed = 5;
  const auto random = [&seed](int below) {
    seed = seed * 1664525 + 1013904223;
    return static_cast<int>((seed >> 8) % static_cast<uint32_t>(below));
  };
  const auto put = [](Bytes& canvas, int x, int y, const Rgba& c) {
    if (x >= 50 || y >= 31) return;  // beyond the screen
    canvas = overwritten(std::move(canvas), static_cast<size_t>(4 * (y * 50 + x)), pixel_bytes(c, 7));
  };
  for (int round = 0; round < 30; ++round) {
    GifFile file{50, 31, sample_palette(16), {}, 5, "89a", true};
    for (int i = 0; i < 6; ++i) {
      GifImage image{.left = random(52), .top = random(33)};
      image.width = 1 + random(60 - image.left);
      image.height = 1 + random(40 - image.top);
      image.indices = sample_indices(image.width, image.height, 16, seed);
      image.interlaced = random(2) == 1;
      image.lzw.minimumCodeSize = 4;
      if (random(2) == 1) image.palette = sample_palette(16, seed);
      image.control = GifControl{random(5), random(9), random(3) == 0 ? -1 : random(16)};
      file.images.push_back(image);
    }
    const Bytes bytes = file.bytes();
    const Reference reference(bytes);
    const GifFrames result = decode_frames(bytes, 50, 31);
    EXPECT_EQ(3, result.answer);
    ASSERT_EQ(6u, result.frames.size());
    Bytes canvas(50 * 31 * 4, 0);
    for (int i = 0; i < 6; ++i) {
      const SavedImage& image = reference->SavedImages[i];
      const GraphicsControlBlock control = reference.control(i);
      const int clear = control.TransparentColor, disposal = control.DisposalMode;
      const uint8_t* background = &file.palette[15];
      const Rgba under =
          clear >= 0 ? Rgba{0, 0, 0, 0} : Rgba{background[0], background[1], background[2], 255};
      Bytes shown = canvas;
      for (int p = 0; p < image.ImageDesc.Width * image.ImageDesc.Height; ++p) {
        const int x = image.ImageDesc.Left + p % image.ImageDesc.Width;
        const int y = image.ImageDesc.Top + p / image.ImageDesc.Width;
        const int index = image.RasterBits[p];
        if (index != clear) put(shown, x, y, reference.colour(i, index));
        if (disposal == 2) put(canvas, x, y, under);
      }
      ASSERT_EQ(shown, result.frames[static_cast<size_t>(i)]) << round << " " << i;
      if (disposal < 2 || disposal > 3) canvas = shown;
    }
  }
}

}  // namespace
}  // namespace tests

#endif
