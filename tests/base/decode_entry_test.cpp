// One-call decoding: every format is detected and goes to its decoder; animations come frame by frame.
#include <functional>

#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"
#include "tests/support/png_builder.h"

namespace tests {
namespace {

struct RawDeleter {
  void operator()(TAVIRPELO_RAWINFO* raw) const { TAVIRPELO_DestroyRawInfo(raw); }
};
using Raw = std::unique_ptr<TAVIRPELO_RAWINFO, RawDeleter>;

Bytes pixels_of(const Raw& raw) {
  const auto* bytes = static_cast<const uint8_t*>(raw->pData);
  return Bytes(bytes, bytes + size_t{raw->width} * raw->height * 3);
}
Raw blank(int width = 9, int height = 9) {
  return Raw(TAVIRPELO_CreateRawInfo(width, height, 1));
}
int length(const Bytes& file) {
  return static_cast<int>(file.size());
}

Bytes sample_bmp() {
  ByteWriter bmp(false);
  bmp.text("BM").u32(0).u32(0).u32(54).u32(40).u32(4).u32(4).u16(1).u16(24).block(Bytes(24));
  return bmp.block(random_bytes(48, 1));
}

using FromFile = int (*)(const char*, TAVIRPELO_RAWINFO*, uint32_t);
using FromBuffer = int (*)(void*, int, TAVIRPELO_RAWINFO*, uint32_t);
struct Format {
  Bytes bytes;
  FromFile fromFile;
  FromBuffer fromBuffer;
  Decoder decoder;
};

std::vector<Format> formats() {
  return {
      {sample_jpeg(8, 6), TAVIRPELO_DecodeJpegFromFile, TAVIRPELO_DecodeJpegFromBuffer,
       TAVIRPELO_DecodeJPEG},
      {build_png(random_png_image(1, 2, 8, 8, 6, false, false)), TAVIRPELO_DecodePngFromFile,
       TAVIRPELO_DecodePngFromBuffer, TAVIRPELOI_DecodePNG},
      {sample_gif(8, 6).bytes(), TAVIRPELO_DecodeGifFromFile, TAVIRPELO_DecodeGifFromBuffer,
       TAVIRPELOI_DecodeGIF},
      {sample_bmp(), TAVIRPELO_DecodeBmpFromFile, TAVIRPELO_DecodeBmpFromBuffer, TAVIRPELOI_DecodeBMP},
      {{0, 0, 8, 2, 0xA5, 0x5A},
       TAVIRPELO_DecodeWBmpFromFile,
       TAVIRPELO_DecodeWBmpFromBuffer,
       TAVIRPELOI_DecodeWBMP}};
}

TEST(DecodeEntry, EveryFormatByNameAndByDetection) {
  for (Format& format : formats()) {
    const TempFile file;
    file.write(format.bytes);
    GuardedPixels direct(9, 9, 1, 0);
    ASSERT_EQ(1, format.decoder(open_memory(format.bytes, 1).get(), direct.data(), 9, 9));
    void* data = format.bytes.data();
    const int size = length(format.bytes);
    const std::function<int(TAVIRPELO_RAWINFO*)> ways[] = {
        [&](auto* raw) { return format.fromFile(file.c_str(), raw, 0); },
        [&](auto* raw) { return format.fromBuffer(data, size, raw, 0); },
        [&](auto* raw) { return TAVIRPELO_DecodeImageFromFile(file.c_str(), raw, 0); },
        [&](auto* raw) { return TAVIRPELO_DecodeImageFromBuffer(data, size, raw, 0); }};
    for (const auto& way : ways) {
      const Raw raw = blank();
      EXPECT_EQ(1, way(raw.get()));
      EXPECT_EQ(direct.content(), pixels_of(raw));
    }
    // Another format's file is refused by name.
    Bytes other =
        format.fromBuffer == TAVIRPELO_DecodePngFromBuffer ? sample_jpeg(8, 6) : formats()[1].bytes;
    const Raw raw = blank();
    EXPECT_EQ(0, format.fromBuffer(other.data(), length(other), raw.get(), 0));
  }
}

TEST(DecodeEntry, MissingArguments) {
  const Raw raw = blank();
  TAVIRPELO_DECINFO* handle = nullptr;
  uint8_t byte = 0;
  for (Format& format : formats()) {
    const DecInfo decInfo = open_memory(format.bytes, 1);
    EXPECT_EQ(0, format.decoder(nullptr, &byte, 1, 1));
    EXPECT_EQ(0, format.decoder(decInfo.get(), nullptr, 1, 1));
    EXPECT_EQ(0, format.decoder(decInfo.get(), &byte, -1, 1));
    EXPECT_EQ(0, format.decoder(decInfo.get(), &byte, 1, -1));
    EXPECT_EQ(0, format.fromFile(nullptr, raw.get(), 0));
    EXPECT_EQ(0, format.fromFile("x", nullptr, 0));
    EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
    EXPECT_EQ(0, format.fromBuffer(&byte, 0, raw.get(), 0));
    EXPECT_EQ(TAVIRPELO_CODEC_SIZE, debug_PeloCodecError);
  }
  EXPECT_EQ(0, TAVIRPELO_DecodeAGifFromBuffer(&byte, 0, raw.get(), 0, &handle));
  EXPECT_EQ(TAVIRPELO_CODEC_SIZE, debug_PeloCodecError);
  EXPECT_EQ(0, TAVIRPELO_DecodeAGifFromBuffer(&byte, 1, raw.get(), 0, nullptr));
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
  EXPECT_EQ(0, TAVIRPELO_DecodeAGifFromFile("no such file", raw.get(), 0, &handle));
  EXPECT_EQ(nullptr, handle);
}

Bytes animation(int frames) {
  GifFile gif = sample_gif(8, 6, 2);
  for (int i = 1; i < frames; ++i) {
    gif.images.push_back(gif.images[0]);
    gif.images.back().indices = sample_indices(8, 6, 4, static_cast<uint32_t>(i + 10));
  }
  return gif.bytes();
}

TEST(DecodeEntry, AnimationsFrameByFrame) {
  Bytes file = animation(3);
  const TempFile onDisk;
  onDisk.write(file);
  TAVIRPELO_DECINFO* memory = nullptr;
  TAVIRPELO_DECINFO* disk = nullptr;
  const Raw a = blank(8, 6), b = blank(8, 6), still = blank(8, 6);
  ASSERT_EQ(1, TAVIRPELO_DecodeImageFromBuffer(file.data(), length(file), still.get(), 0));
  int frame = 0;
  for (const int answer : {1, 1, 3}) {
    EXPECT_EQ(answer, TAVIRPELO_DecodeAGifFromBuffer(file.data(), length(file), a.get(), 0, &memory));
    EXPECT_EQ(answer, TAVIRPELO_DecodeAGifFromFile(onDisk.c_str(), b.get(), 0, &disk));
    EXPECT_EQ(pixels_of(a), pixels_of(b));
    if (frame++ == 0) EXPECT_EQ(pixels_of(still), pixels_of(a));
  }
  EXPECT_EQ(nullptr, memory);
  EXPECT_EQ(nullptr, disk);
}

// A frame of another size or format ends the animation; nothing leaks when a caller stops early.
TEST(DecodeEntry, AnimationsWantTheSameImage) {
  Bytes file = animation(3);
  TAVIRPELO_DECINFO* handle = nullptr;
  const Raw raw = blank(8, 6), small = blank(4, 4);
  const Raw words(TAVIRPELO_CreateRawInfo(8, 6, TAVIRPELO_RGB565));
  for (const Raw* other : {&small, &words}) {
    EXPECT_EQ(1, TAVIRPELO_DecodeAGifFromBuffer(file.data(), length(file), raw.get(), 0, &handle));
    EXPECT_EQ(0, TAVIRPELO_DecodeAGifFromBuffer(file.data(), length(file), other->get(), 0, &handle));
    EXPECT_EQ(nullptr, handle);
  }
  EXPECT_EQ(1, TAVIRPELO_DecodeAGifFromBuffer(file.data(), length(file), raw.get(), 0, &handle));
  EXPECT_EQ(1, TAVIRPELOI_AborAGIF(handle));
  EXPECT_EQ(1, TAVIRPELO_DestroyDecInfo(handle));
}

}  // namespace
}  // namespace tests
