// Input sources, the buffered reader, format detection, raw images and the small services of the ground.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>

#include "codec/core/ground/buffered_source.h"
#include "codec/core/ground/geometry.h"
#include "platform/fault_injection.h"
#include "tavirpelo/tavirpelo.h"
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
  const std::string path = testing::TempDir() + "tavir_source_file";
  FILE* file = std::fopen(path.c_str(), "wb");
  std::fputs("0123456789", file);
  std::fclose(file);
  TAVIRPELO_IO* io = TAVIRPELO_Open_IO(TAVIRPELO_IO_FILE, const_cast<char*>(path.c_str()), 0);
  ASSERT_NE(nullptr, io);
  EXPECT_EQ(10, io->size);
  uint8_t out[4];
  EXPECT_EQ(6, TAVIRPELO_Seek_IO(io, 6, SEEK_SET));
  EXPECT_EQ(4, TAVIRPELO_Read_IO(io, out, 4));
  EXPECT_EQ('6', out[0]);
  TAVIRPELO_Close_IO(io);

  FILE* handle = std::fopen(path.c_str(), "rb");
  std::fseek(handle, 4, SEEK_SET);
  io = TAVIRPELO_Open_IO(TAVIRPELO_IO_HANDLE, handle, 6);
  ASSERT_NE(nullptr, io);
  EXPECT_EQ(2, TAVIRPELO_Seek_IO(io, 2, SEEK_SET));
  EXPECT_EQ(6, io->position);
  EXPECT_EQ(-1, TAVIRPELO_Read_IO(io, out, 1));
  TAVIRPELO_Close_IO(io);
  std::fclose(handle);
  std::remove(path.c_str());

  EXPECT_EQ(nullptr, TAVIRPELO_Open_IO(TAVIRPELO_IO_FILE, const_cast<char*>(testing::TempDir().c_str()), 0));
  EXPECT_EQ(TAVIRPELO_ERROR_OPEN, gTAVIRPELO_Error);
  EXPECT_EQ(TAVIRPELO_INVALID_FILE, TAVIRPELO_OpenFile(path.c_str()));
}

// A window over more than its size: peeks, skips and jumps land on the right bytes.
TEST(BufferedReader, FindsEveryByte) {
  Bytes bytes(20000);
  for (size_t i = 0; i < bytes.size(); ++i) bytes[i] = static_cast<uint8_t>(i * 7 + i / 256);
  TAVIRPELO_IO* io = TAVIRPELO_Open_IO(TAVIRPELO_IO_MEMORY, bytes.data(), 20000);
  pelo::BufferedSource source;
  ASSERT_TRUE(source.open(io));
  uint32_t seed = 5;
  int64_t at = 0;
  for (int i = 0; i < 3000; ++i) {
    seed = seed * 1664525 + 1013904223;
    const int64_t step = seed >> 8 & (i % 7 == 0 ? 4095 : 63);
    if (seed >> 31) {
      at = (at + step * 17) % 19000;
      ASSERT_TRUE(pelo::source_reposition(*source.get(), at));
    } else if (at + step < 19900) {
      ASSERT_TRUE(pelo::source_skip(*source.get(), step));
      at += step;
    }
    ASSERT_EQ(at, pelo::source_offset(*source.get()));
    ASSERT_TRUE(pelo::source_need(*source.get(), 20));
    ASSERT_EQ(bytes[static_cast<size_t>(at)], *pelo::source_take(*source.get(), 1));
    ++at;
  }
  EXPECT_FALSE(pelo::source_skip(*source.get(), -1));
  EXPECT_FALSE(pelo::source_skip(*source.get(), 30000));
  EXPECT_FALSE(pelo::source_need(*source.get(), 5000));
  TAVIRPELO_Close_IO(io);
}

int parse(Bytes bytes, TAVIRPELO_HINFO* header = nullptr) {
  TAVIRPELO_HINFO own;
  bytes.shrink_to_fit();
  return TAVIRPELO_ParseFromBuffer(bytes.data(), static_cast<int>(bytes.size()), header != nullptr ? header : &own);
}

Bytes gif(int images, bool trailer) {
  Bytes g = {'G', 'I', 'F', '8', '9', 'a', 30, 0, 20, 0, 0x80, 0, 0, 1, 2, 3, 4, 5, 6, 0x21, 0xF9, 4, 0, 0, 0, 0, 0, 0x21, 0xFA};
  for (int i = 0; i < images; ++i) {
    for (const int b : {0x2C, 0, 0, 0, 0, 30, 0, 20, 0, 0, 2, 2, 0x4C, 1, 0}) g.push_back(static_cast<uint8_t>(b));
  }
  if (trailer) g.push_back(0x3B);
  return g;
}

TEST(Detection, KnowsEveryFormat) {
  Bytes png = {0x89, 'P', 'N', 'G', 0x0D, 0x0A, 0x1A, 0x0A, 0, 0, 0, 13, 'I', 'H', 'D', 'R', 0, 0, 1, 0, 0, 0, 0, 99};
  Bytes bmp(26);
  bmp[0] = 'B', bmp[1] = 'M', bmp[18] = 7, bmp[22] = 0xFE, bmp[23] = bmp[24] = bmp[25] = 0xFF;
  struct { Bytes bytes; int format, width, height, frames; } const cases[] = {
      {png, 3, 256, 99, 1}, {bmp, 2, 7, -2, 1}, {gif(1, true), 4, 30, 20, 1}, {gif(3, true), 6, 30, 20, 3},
      {{0, 0, 1, 1, 0}, 5, 1, 1, 1}, {{0, 0, 0xA7, 0x08, 0xA7, 0x08}, 5, 5000, 5000, 1}, {sample_jpeg(33, 17), 1, 33, 17, 1}};
  for (const auto& c : cases) {
    TAVIRPELO_HINFO header;
    EXPECT_EQ(c.format, parse(c.bytes, &header));
    EXPECT_EQ(c.width, header.width);
    EXPECT_EQ(c.height, header.height);
    EXPECT_EQ(c.frames, header.frameCount);
    EXPECT_EQ(0, header.sourceSize);
    // Cut anywhere, on a heap block of exactly that size: no crash; flipped: likewise.
    for (size_t length = 1; length < c.bytes.size() && length < 400; ++length) {
      parse(Bytes(c.bytes.begin(), c.bytes.begin() + static_cast<ptrdiff_t>(length)));
      Bytes flipped = c.bytes;
      flipped[length] ^= 0xFF;
      parse(flipped);
    }
  }
  png[5] = 0;
  for (const Bytes& unknown : {png, gif(2, false), gif(0, true), Bytes{'B', 'A', 0, 0, 0, 0, 0, 0}, Bytes{0, 0x80, 1, 1, 1},
                               Bytes{0, 0, 0xA7, 0x09, 10}, Bytes{0, 0, 0x88, 0x80, 0x80, 0x80, 0x01, 1}}) {
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
  Bytes jpeg = sample_jpeg(9, 9);
  for (long k = 1; k <= 4; ++k) {
    pelo::faults::allocations.arm(k);
    EXPECT_EQ(0, parse(jpeg)) << k;
    pelo::faults::allocations.arm(0);
  }
  TAVIRPELO_RAWINFO* raw = TAVIRPELO_CreateRawInfo(4, 4, 1);
  Bytes text{'n', 'o', 't', ' ', 'a', ' ', 'p', 'i', 'c', 't', 'u', 'r', 'e'};
  EXPECT_EQ(0, TAVIRPELO_DecodeImageFromBuffer(text.data(), static_cast<int>(text.size()), raw, 0));
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
  EXPECT_EQ(512, PELO_GetMaxDecRatio(1, 4));
  EXPECT_EQ(128, PELO_GetMaxDecRatio(1, 64));
  EXPECT_EQ(1024, PELO_GetMaxDecRatio(5, 4));
  EXPECT_EQ(0, PELO_GetMaxDecRatio(0, 0));
  EXPECT_EQ(0, PELO_GetMaxDecRatio(-1, 4));
  EXPECT_NEAR(512, PELO_GetMaxDecRatio(16000000, 64000000), 1);
  uint8_t byte = 1;
  TAVIRPELO_DECINFO* info = TAVIRPELO_CreateDecInfo(1, &byte, 1, 0, 5);
  TAVIRPELO_SetDecMode(info, -3);
  EXPECT_EQ(0, info->decMode);
  TAVIRPELO_SetDecMode(info, 9);
  EXPECT_EQ(4, info->decMode);
  EXPECT_EQ(5u, info->userOption);
  static int reports;
  reports = 0;
  EXPECT_EQ(1, PELOJ_SetCallback(info, [](intptr_t argument, int percent) { reports += argument == 7 && percent == 0; }, 7));
  for (int i = 1; i <= 10; ++i) {
    EXPECT_EQ(1, TAVIRPELO_ZoomCheckFn(info, 3, 0));
    EXPECT_EQ(i < 4 ? 0 : (i - 1) / 3, reports);
  }
  EXPECT_EQ(1, TAVIRPELO_DestroyDecInfo(info));
}

}  // namespace
}  // namespace tests
