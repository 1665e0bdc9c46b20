// Input sources, the buffered reader, format detection, raw images and the small services of the ground.
#include "codec/base/source.h"

#include <cstdio>

#include "codec/base/geometry.h"
#include "tests/support/failures.h"
#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

TEST(Sources, MemorySeeksAndReadsClamp) {
  Bytes bytes = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9};
  TAVIRPELO_IO* io = TAVIRPELO_Open_IO(TAVIRPELO_IO_MEMORY, bytes.data(), 10);
  uint8_t out[16];
  EXPECT_EQ(8, TAVIRPELO_Seek_IO(io, 8, SEEK_SET));
  EXPECT_EQ(2, TAVIRPELO_Read_IO(io, out, 5));
  EXPECT_EQ(10, TAVIRPELO_Tell_IO(io));
  EXPECT_EQ(0, TAVIRPELO_Read_IO(io, out, 5));
  EXPECT_EQ(10, TAVIRPELO_Seek_IO(io, 20, SEEK_SET));
  EXPECT_EQ(7, TAVIRPELO_Seek_IO(io, -3, SEEK_END));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, 1, SEEK_END));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, -11, SEEK_END));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, -8, SEEK_CUR));
  EXPECT_EQ(3, TAVIRPELO_Read_IO(io, out, INT32_MAX));
  EXPECT_EQ(0, TAVIRPELO_Read_IO(io, out, -1));
  EXPECT_EQ(1, TAVIRPELO_Close_IO(io));
  EXPECT_EQ(nullptr, TAVIRPELO_Open_IO(TAVIRPELO_IO_MEMORY, bytes.data(), 0));
  EXPECT_EQ(TAVIRPELO_ERROR_EMPTY_MEMORY, gTAVIRPELO_Error);
  EXPECT_EQ(nullptr, TAVIRPELO_Open_IO(3, bytes.data(), 5));
  EXPECT_EQ(TAVIRPELO_ERROR_IO_KIND, gTAVIRPELO_Error);
  EXPECT_EQ(nullptr, TAVIRPELO_OsMalloc(0));
}

TEST(Sources, FilesAreMeasuredAndDirectoriesRefused) {
  const TempFile file;
  file.write(Bytes{'0', '1', '2', '3', '4', '5', '6', '7', '8', '9'});
  const DecInfo info = open_file(file.path(), 0);
  ASSERT_NE(nullptr, info);
  EXPECT_EQ(10, info->pIO->size);
  uint8_t out[4];
  EXPECT_EQ(6, TAVIRPELO_Seek_IO(info->pIO, 6, SEEK_SET));
  EXPECT_EQ(4, TAVIRPELO_Read_IO(info->pIO, out, 4));
  EXPECT_EQ('6', out[0]);

  FILE* handle = std::fopen(file.c_str(), "rb");
  std::fseek(handle, 4, SEEK_SET);
  TAVIRPELO_IO* io = TAVIRPELO_Open_IO(TAVIRPELO_IO_HANDLE, handle, 6);
  ASSERT_NE(nullptr, io);
  EXPECT_EQ(2, TAVIRPELO_Seek_IO(io, 2, SEEK_SET));
  EXPECT_EQ(6, io->position);
  EXPECT_EQ(-1, TAVIRPELO_Read_IO(io, out, 1));
  TAVIRPELO_Close_IO(io);
  std::fclose(handle);
  EXPECT_EQ(nullptr, open_file(testing::TempDir(), 0));
  EXPECT_EQ(TAVIRPELO_ERROR_OPEN, gTAVIRPELO_Error);
  EXPECT_EQ(TAVIRPELO_INVALID_FILE, TAVIRPELO_OpenFile("no such file"));
}

// A window over more than its size, and a memory's own bytes: peeks, skips and jumps land on the right
// bytes.
TEST(Source, FindsEveryByte) {
  Bytes bytes = random_bytes(20000, 3);
  const DecInfo info = open_memory(bytes, 0);
  pelo::BufferedSource window, memory;
  ASSERT_TRUE(window.open(info->pIO));
  memory.open(bytes.data(), 20000);
  for (pelo::BufferedSource* source : {&window, &memory}) {
    pelo::Source& s = *source->get();
    std::mt19937 random(5);
    int64_t at = 0;
    for (int i = 0; i < 3000; ++i) {
      const int64_t step = random() & (i % 7 == 0 ? 4095 : 63);
      if (random() % 2 == 0) {
        at = (at + step * 17) % 19000;
        ASSERT_TRUE(s.move_to(at));
      } else if (at + step < 19900) {
        ASSERT_TRUE(s.skip(step));
        at += step;
      }
      ASSERT_EQ(at, s.tell());
      ASSERT_TRUE(s.need(20));
      ASSERT_EQ(bytes[static_cast<size_t>(at++)], *s.take(1));
    }
    EXPECT_FALSE(s.skip(-1));
    EXPECT_FALSE(s.skip(30000));
    EXPECT_TRUE(s.move_to(19990));
    EXPECT_FALSE(s.need(20));  // and a memory's bytes stay where they are
    EXPECT_TRUE(s.move_to(20000));
    EXPECT_FALSE(s.need(1));
    EXPECT_FALSE(s.need(5000));
  }
  EXPECT_TRUE(random_bytes(20000, 3) == bytes);
}

int parse(Bytes bytes, TAVIRPELO_HINFO* header = nullptr) {
  TAVIRPELO_HINFO own;
  bytes.shrink_to_fit();
  return TAVIRPELO_ParseFromBuffer(bytes.data(), static_cast<int>(bytes.size()),
                                   header != nullptr ? header : &own);
}

TEST(Detection, KnowsEveryFormat) {
  GifFile gif = sample_gif(30, 20, 2);
  const Bytes still = gif.bytes();
  gif.images.resize(3, gif.images[0]);
  const Bytes animation = gif.bytes();
  gif.images.clear();
  const Bytes png = ByteWriter().u32(0x89504E47).u32(0x0D0A1A0A).u32(13).text("IHDR").u32(256).u32(99);
  const Bytes bmp = overwritten(Bytes(26), 0, {'B', 'M'});
  struct {
    Bytes bytes;
    int format, width, height, frames = 1;
  } const cases[] = {{png, 3, 256, 99},
                     {overwritten(bmp, 18, ByteWriter(false).u32(7).u32(-2)), 2, 7, -2},
                     {still, 4, 30, 20},
                     {animation, 6, 30, 20, 3},
                     {{0, 0, 1, 1, 0}, 5, 1, 1},
                     {{0, 0, 0xA7, 0x08, 0xA7, 0x08}, 5, 5000, 5000},
                     {sample_jpeg(33, 17), 1, 33, 17}};
  for (const auto& c : cases) {
    TAVIRPELO_HINFO header;
    EXPECT_EQ(c.format, parse(c.bytes, &header));
    EXPECT_EQ(c.width, header.width);
    EXPECT_EQ(c.height, header.height);
    EXPECT_EQ(c.frames, header.frameCount);
    EXPECT_EQ(0, header.sourceSize);
    const Bytes head = prefix(c.bytes, std::min<size_t>(c.bytes.size(), 400));
    every_truncation(head, [](const Bytes& cut) { parse(cut); });
    every_flip(head, {0xFF}, [](const Bytes& damaged, size_t) { parse(damaged); });
  }
  for (const Bytes& unknown :
       {overwritten(png, 5, {0}), prefix(animation, animation.size() - 1), gif.bytes(),
        Bytes{'B', 'A', 0, 0, 0, 0, 0, 0}, Bytes{0, 0x80, 1, 1, 1}, Bytes{0, 0, 0xA7, 0x09, 10},
        Bytes{0, 0, 0x88, 0x80, 0x80, 0x80, 0x01, 1}}) {
    EXPECT_EQ(0, parse(unknown));
  }
}

TEST(Detection, ReportsReasons) {
  TAVIRPELO_HINFO header;
  uint8_t byte = 0;
  EXPECT_EQ(0, TAVIRPELO_ParseFromBuffer(&byte, 0, &header));
  EXPECT_EQ(TAVIRPELO_CODEC_SIZE, debug_PeloCodecError);
  EXPECT_EQ(0, TAVIRPELO_ParseFromFile(nullptr, &header));
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, debug_PeloCodecError);
  EXPECT_EQ(0, TAVIRPELO_Parser(nullptr, &header));
  EXPECT_EQ(TAVIRPELO_ERROR_NULL, gTAVIRPELO_Error);
  EXPECT_EQ(0, TAVIRPELO_DestroyDecInfo(nullptr));
  EXPECT_EQ(1, TAVIRPELO_GetErrorCode());
  TAVIRPELO_RAWINFO* raw = TAVIRPELO_CreateRawInfo(4, 4, 1);
  Bytes text(13, 'n');
  EXPECT_EQ(0, TAVIRPELO_DecodeImageFromBuffer(text.data(), 13, raw, 0));
  EXPECT_EQ(TAVIRPELO_CODEC_FORMAT, debug_PeloCodecError);
  TAVIRPELO_DestroyRawInfo(raw);
}

TEST(RawImages, SizesAndColours) {
  EXPECT_EQ(nullptr, TAVIRPELO_CreateRawInfo(5001, 1, 1));
  EXPECT_EQ(nullptr, TAVIRPELO_CreateRawInfo(0, 1, 1));
  for (const int format : {0, 1, 2, 3, 5, 6}) {
    TAVIRPELO_RAWINFO* raw = TAVIRPELO_CreateRawInfo(5, 3, format);
    ASSERT_NE(nullptr, raw);
    EXPECT_EQ(static_cast<uint32_t>(format == 3 ? 0 : format), raw->format);
    EXPECT_EQ(1, TAVIRPELO_FillRawImageWithRgb888(raw, 255, 128, 8));
    const auto* p = static_cast<const uint8_t*>(raw->pData);
    if (format == 1) EXPECT_TRUE(p[42] == 255 && p[43] == 128 && p[44] == 8);
    if (format == 0 || format == 3) EXPECT_EQ(31 << 11 | 32 << 5 | 1, p[28] | p[29] << 8);
    if (format == 2) EXPECT_TRUE(p[14] == 0 && p[15] == 128 && p[26] == 128);
    TAVIRPELO_DestroyRawInfo(raw);
  }
}

TEST(Services, RatiosModesAndCallbacks) {
  const int64_t cases[][3] = {{1, 4, 512}, {1, 64, 128}, {5, 4, 1024}, {0, 0, 0}, {-1, 4, 0}};
  for (const auto& [budget, need, ratio] : cases) EXPECT_EQ(ratio, PELO_GetMaxDecRatio(budget, need));
  EXPECT_NEAR(512, PELO_GetMaxDecRatio(16000000, 64000000), 1);
  uint8_t byte = 1;
  const DecInfo info(TAVIRPELO_CreateDecInfo(1, &byte, 1, 0, 5));
  for (const auto& [mode, kept] : {std::pair(-3, 0), {9, 4}}) {
    TAVIRPELO_SetDecMode(info.get(), mode);
    EXPECT_EQ(kept, info->decMode);
  }
  EXPECT_EQ(5u, info->userOption);
  static int reports;
  const auto count = [](intptr_t argument, int percent) { reports += argument == 7 && percent == 0; };
  EXPECT_EQ(1, PELOJ_SetCallback(info.get(), count, 7));
  for (int i = 1; i <= 10; ++i) {
    EXPECT_EQ(1, TAVIRPELO_ZoomCheckFn(info.get(), 3, 0));
    EXPECT_EQ(i < 4 ? 0 : (i - 1) / 3, reports);
  }
}

}  // namespace
}  // namespace tests
