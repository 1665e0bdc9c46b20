// Damaged EXIF segments, contradictory entries, and memory that runs out: every read ends, inside its
// buffers, and gives everything back.
#include "codec/formats/jpeg/exif/exif_reader.h"
#include "tests/support/exif_builder.h"
#include "tests/support/failures.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

class HostileExif : public QuietTest, public testing::WithParamInterface<bool> {
 protected:
  const Bytes jpeg_ = full_exif_jpeg(GetParam());
  const Bytes whole_ = prefix(suffix(jpeg_, 2), 2 + (size_t{jpeg_[4]} << 8 | jpeg_[5]));  // segment
};
INSTANTIATE_TEST_SUITE_P(BothOrders, HostileExif, testing::Bool());

// Reads what the record says, as a caller would; 1 when there is one.
int use(TAVIRPELO_EXIFINFO* info) {
  if (info == nullptr) return 0;
  size_t sum = info->exifVersion != nullptr ? info->exifVersion[3] : 0;
  const TAVIRPELO_GPSINFO none{}, &gps = info->gps != nullptr ? *info->gps : none;
  for (uint32_t i = 0; i < gps.processingMethodLength; ++i) sum += gps.processingMethod[i];
  for (const char* text : std::initializer_list<const char*>{
           info->make, info->model, info->software, info->rights, info->captureTime,
           info->digitizingTime, gps.mapDatum, gps.dateStamp, gps.latitudeRef}) {
    sum += text != nullptr ? std::string_view(text).size() : 0;
  }
  EXPECT_GE(sum, 0u);
  return TAVIRPELO_DestroyJpegExifInfo(info);
}

// Blocks end where their data ends.
int read(Bytes jpeg) {
  jpeg.shrink_to_fit();
  return use(TAVIRPELO_CreateJpegExifInfoFromBuffer(jpeg.data(), static_cast<int>(jpeg.size())));
}
int read_segment(Bytes segment) {
  segment.shrink_to_fit();
  return use(PELOJ_CreatExifInfoUseExifBuffer(segment.data(), static_cast<int>(segment.size())));
}

TEST_P(HostileExif, EveryTruncationAndFlippedByte) {
  const auto cut_segment = [](const Bytes& cut) {
    EXPECT_EQ(0, read_segment(cut));  // shorter than its length says
    EXPECT_EQ(0, read(ByteWriter().u16(0xFFD8).block(cut)));
    if (cut.size() < 4) return;
    // The same with a length that agrees: a TIFF structure that ends early.
    const Bytes agreeing = overwritten(cut, 2, ByteWriter().u16(cut.size() - 2));
    EXPECT_EQ(cut.size() >= 19 ? 1 : 0, read_segment(agreeing)) << cut.size();
  };
  every_truncation(whole_, cut_segment, 0);
  every_flip(whole_, {0xFF, 0x01, 0x80, 0x04}, [](const Bytes& bad, size_t) { read_segment(bad); });
}

// Counts and offsets of every entry at their extremes and around the size of the data, for every type.
TEST_P(HostileExif, EveryFieldOfEveryEntry) {
  const auto size = static_cast<uint32_t>(whole_.size()) - 10;
  const uint32_t numbers[] = {0,        1,          2,          size - 8,   size - 1,   size,
                              size + 1, 0x20000001, 0x40000000, 0x7FFFFFFF, 0x80000001, 0xFFFFFFFF};
  for (size_t at = 10; at + 12 <= whole_.size() && at < 900; at += 2) {
    for (const uint32_t number : numbers)
      read_segment(overwritten(whole_, at, ByteWriter(GetParam()).u32(number)));
  }
  for (uint16_t type = 0; type < 14; ++type) {
    for (const uint32_t count : numbers) {
      ExifBuilder exif(GetParam());
      for (const uint16_t tag : {258, 271, 274, 282, 34665, 34853}) {
        exif.entry(Ifd::k0, tag, type, count, Bytes(4, 0));
      }
      for (const uint16_t tag : {273, 279, 513, 514, 257}) {
        exif.entry(Ifd::k1, tag, type, count, {0, 0, 0, 1});
      }
      for (const uint16_t tag : {0, 1, 2, 5, 7, 18, 27, 29}) {
        exif.entry(Ifd::kGps, tag, type, count, Bytes(4, 0xFF));
      }
      EXPECT_EQ(1, read_segment(exif.segment()));
    }
  }
}

// As many entries as a segment holds, all strings of the whole segment, all pointing at the directory
// they stand in: it is walked once for each use.
TEST_P(HostileExif, AFullDirectoryThatPointsAtItself) {
  constexpr size_t kEntries = 5400;
  ExifBuilder exif(GetParam());
  for (size_t i = 0; i < kEntries; ++i) {
    const uint16_t tag = i % 3 == 0 ? 34665 : i % 3 == 1 ? 34853 : 271;
    const Bytes offset = ByteWriter(GetParam()).u32(8);
    exif.entry(Ifd::k0, tag, tag == 271 ? 2 : 4, tag == 271 ? 60000 : 1, offset);
  }
  EXPECT_EQ(1, read_segment(exif.segment()));
}

TEST_P(HostileExif, MemoryRunsOutAtEveryAllocation) {
  long objects = 0;
  EXPECT_EQ(1, fail_each_allocation([&] { return read(jpeg_); }, [&](int got) { objects += got; }));
  // Strings and records that memory was short for are missing; the object is there.
  EXPECT_GT(objects, 8);
}

}  // namespace
}  // namespace tests
