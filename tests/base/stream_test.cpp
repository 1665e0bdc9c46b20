// Callback streams as sources, and short memory in every step of opening and parsing one.
#include "codec/base/base_abi.h"
#include "codec/base/source.h"
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

TAVIRPELO_IO* open(MemoryStream& s) {
  return TAVIRPELO_Open_Stream(&s, stream_read, stream_skip, stream_reset,
                               static_cast<int>(s.bytes.size()));
}
Bytes numbered(size_t size) {
  Bytes bytes;
  while (bytes.size() < size) bytes.push_back(static_cast<uint8_t>(bytes.size() % 251));
  return bytes;
}

TEST(Streams, SeekByResettingAndSkipping) {
  MemoryStream s{numbered(100)};
  TAVIRPELO_IO* io = open(s);
  uint8_t out[8];
  EXPECT_EQ(8, TAVIRPELO_Read_IO(io, out, 8));
  EXPECT_EQ(0, TAVIRPELO_Seek_IO(io, 0, SEEK_SET));
  EXPECT_EQ(1, s.resets);
  EXPECT_EQ(0, s.skips);
  EXPECT_EQ(30, TAVIRPELO_Seek_IO(io, 30, SEEK_SET));
  EXPECT_EQ(40, TAVIRPELO_Seek_IO(io, 10, SEEK_CUR));
  EXPECT_EQ(95, TAVIRPELO_Seek_IO(io, -5, SEEK_END));
  EXPECT_EQ(5, TAVIRPELO_Read_IO(io, out, 8));
  EXPECT_EQ(95, out[0]);
  EXPECT_EQ(100, TAVIRPELO_Tell_IO(io));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, -1, SEEK_SET));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, 1, SEEK_END));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, INT_MAX, SEEK_CUR));
  EXPECT_EQ(100, TAVIRPELO_Tell_IO(io));
  const int resets = s.resets;
  EXPECT_EQ(1, TAVIRPELO_Close_IO(io));
  EXPECT_EQ(resets + 1, s.resets);
}

// What callbacks report is not believed beyond what was asked for.
TEST(Streams, LiesAndMissingCallbacks) {
  MemoryStream s{Bytes(100, 9)};
  TAVIRPELO_IO* io = open(s);
  uint8_t out[8];
  s.lie = 50;
  EXPECT_EQ(8, TAVIRPELO_Read_IO(io, out, 8));
  EXPECT_EQ(8, TAVIRPELO_Tell_IO(io));
  pelo::BufferedSource source;
  ASSERT_TRUE(source.open(io));
  EXPECT_EQ(1, PELOJ_CheckBuffer(source.get(), 1));
  EXPECT_LE(source->avail, 4096u);
  s.lie = -1000;
  const int before = TAVIRPELO_Tell_IO(io);
  EXPECT_GT(0, TAVIRPELO_Read_IO(io, out, 8));
  EXPECT_EQ(before, TAVIRPELO_Tell_IO(io));
  TAVIRPELO_Close_IO(io);

  io = TAVIRPELO_Open_Stream(nullptr, nullptr, nullptr, nullptr, 10);
  EXPECT_EQ(0, TAVIRPELO_Read_IO(io, out, 8));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, 0, SEEK_SET));
  EXPECT_EQ(-1, TAVIRPELO_Seek_IO(io, 1, SEEK_CUR));
  TAVIRPELO_Close_IO(io);
  EXPECT_EQ(-1, TAVIRPELO_Read_IO(nullptr, out, 1));
  EXPECT_EQ(0, TAVIRPELO_Close_IO(nullptr));
}

// A reader reads on until it has what was asked for, behind the bytes that are there; when the stream
// ends before, nobody may consume more than there are, and those stay readable.
TEST(Streams, ShortReadsNeverInventBytes) {
  MemoryStream s{numbered(6000)};
  s.limit = 100;
  TAVIRPELO_IO* io = open(s);
  pelo::BufferedSource source;
  ASSERT_TRUE(source.open(io));
  EXPECT_EQ(1, PELOJ_CheckBuffer(source.get(), 250));
  EXPECT_EQ(100u, source->avail);  // one read, and no room in front of the unread bytes for another
  EXPECT_EQ(0, PELOJ_CheckBuffer(source.get(), 250));
  EXPECT_TRUE(source.get()->need(250));
  EXPECT_EQ(300u, source->avail);
  ASSERT_TRUE(source.get()->skip(60));
  ASSERT_TRUE(source.get()->need(3800));
  EXPECT_EQ(60u, source.get()->tell());
  for (int i = 60; i < 150; ++i) ASSERT_EQ(i % 251, *source.get()->take(1)) << i;
  ASSERT_TRUE(source.get()->move_to(5920));
  EXPECT_EQ(1, PELOJ_CheckBuffer(source.get(), 90));
  EXPECT_FALSE(source.get()->need(90));
  EXPECT_EQ(80u, source->avail);
  EXPECT_EQ(5920 % 251, *source.get()->take(1));
  EXPECT_EQ(2, PELOJ_CheckBuffer(source.get(), 0));
  EXPECT_EQ(0, PELOJ_CheckBuffer(source.get(), 4097));
  TAVIRPELO_Close_IO(io);
}

TEST(Streams, PicturesDecodeAsFromMemory) {
  std::vector<Bytes> pictures = {encode_own(150, 120, 90)};
#ifdef TAVIR_HAVE_LIBJPEG
  for (const JpegStyle& style : {JpegStyle{.restartInterval = 2, .progressive = true},
                                 {.scans = JpegScans::kSeparate, .optimise = true}}) {
    pictures.push_back(encode_libjpeg(150, 120, style));
  }
#endif
  for (const Bytes& jpeg : pictures) {
    const auto use = [&](TAVIRPELO_DECINFO* info) {
      TAVIRPELO_HINFO header;
      EXPECT_EQ(TAVIRPELO_FORMAT_JPEG, TAVIRPELO_Parser(info, &header));
      EXPECT_EQ(150, header.width);
      EXPECT_EQ(static_cast<int>(jpeg.size()), header.sourceSize);
      EXPECT_EQ(1, TAVIRPELO_SetStreamReadSize(info, 512));
      for (const int eighths : {8, 4, 3, 2, 1}) {
        const int width = 150 * eighths / 8, height = 120 * eighths / 8;
        const Decode want = decode(TAVIRPELO_DecodeJPEG, jpeg, width, height, 1);
        const Decode got = decode(TAVIRPELO_DecodeJPEG, info, width, height);
        EXPECT_EQ(1, got.answer) << eighths;
        EXPECT_TRUE(want.pixels == got.pixels) << eighths;
      }
    };
    from_every_source(jpeg, 1, 0, use, {INT_MAX, 1, 2, 7, 100});
  }
}

// Each allocation of create, callback and parse fails in turn; the error words say which kind it was.
TEST(Streams, ShortMemoryAtEveryStep) {
  MemoryStream s{sample_jpeg(20, 10)};
  int failures = 0;
  for (long k = 1; k < 10; ++k) {
    gTAVIRPELO_Error = 0;
    pelo::faults::allocations.arm(k);
    const DecInfo info = open_stream(s, 1);
    const bool callback = PELOJ_SetCallback(
                              info.get(), [](intptr_t, int) {}, 1) != 0;
    TAVIRPELO_HINFO header;
    const int format = info != nullptr ? TAVIRPELO_Parser(info.get(), &header) : 0;
    pelo::faults::allocations.arm(0);
    if (info == nullptr)
      EXPECT_TRUE(gTavirError == TAVIRPELO_ERROR_MEMORY || gTAVIRPELO_Error == TAVIRPELO_ERROR_MEMORY);
    if (info != nullptr && !callback) EXPECT_EQ(nullptr, info->pCallback);
    if (info != nullptr && format == 0) EXPECT_NE(0, gTAVIRPELO_Error);
    failures += info == nullptr || !callback || format == 0;
  }
  EXPECT_EQ(5, failures) << "object, source, record, the parser's buffer, the header scan's buffer";
}

}  // namespace
}  // namespace tests
