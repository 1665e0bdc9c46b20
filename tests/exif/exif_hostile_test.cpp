// Damaged EXIF segments, contradictory entries, and memory that runs out: every read ends, inside its
// buffers, and gives everything back.
#include <gtest/gtest.h>

#include "platform/android_log.h"
#include "platform/fault_injection.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/exif_builder.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

class HostileExif : public testing::TestWithParam<bool> {
 protected:
  void SetUp() override {
    pelo::platform::set_log_sink([](const char*) {});
  }
  void TearDown() override {
    pelo::platform::set_log_sink(nullptr);
    pelo::faults::allocations.arm(0);
  }
};
INSTANTIATE_TEST_SUITE_P(BothOrders, HostileExif, testing::Bool());

// Reads what the record says, as a caller would.
size_t use(const TAVIRPELO_EXIFINFO& info) {
  size_t sum = info.exifVersion != nullptr ? info.exifVersion[3] : 0;
  for (const char* text :
       {info.make, info.model, info.software, info.rights, info.captureTime, info.digitizingTime}) {
    sum += text != nullptr ? std::string_view(text).size() : 0;
  }
  if (const TAVIRPELO_GPSINFO* gps = info.gps) {
    for (uint32_t i = 0; i < gps->processingMethodLength; ++i) sum += gps->processingMethod[i];
    for (const char* text : {gps->mapDatum, static_cast<char*>(nullptr)}) {
      sum += text != nullptr ? std::string_view(text).size() : 0;
    }
    sum += std::string_view(gps->dateStamp).size() + std::string_view(gps->latitudeRef).size();
  }
  return sum;
}

// 1 when the read gave an object. The block ends where the data ends.
int read(Bytes jpeg) {
  jpeg.shrink_to_fit();
  TAVIRPELO_EXIFINFO* info =
      TAVIRPELO_CreateJpegExifInfoFromBuffer(jpeg.data(), static_cast<int>(jpeg.size()));
  if (info == nullptr) return 0;
  use(*info);
  return TAVIRPELO_DestroyJpegExifInfo(info);
}

int read_segment(Bytes segment) {
  segment.shrink_to_fit();
  TAVIRPELO_EXIFINFO* info =
      PELOJ_CreatExifInfoUseExifBuffer(segment.data(), static_cast<int>(segment.size()));
  if (info == nullptr) return 0;
  use(*info);
  return TAVIRPELO_DestroyJpegExifInfo(info);
}

Bytes segment_of(const Bytes& jpeg) {
  const size_t length = static_cast<size_t>(jpeg[4]) << 8 | jpeg[5];
  return Bytes(jpeg.begin() + 2, jpeg.begin() + 4 + static_cast<ptrdiff_t>(length));
}

TEST_P(HostileExif, EveryTruncation) {
  const Bytes whole = segment_of(full_exif_jpeg(GetParam()));
  for (size_t length = 0; length < whole.size(); ++length) {
    Bytes cut(whole.begin(), whole.begin() + static_cast<ptrdiff_t>(length));
    EXPECT_EQ(0, read_segment(cut));  // shorter than its length says
    EXPECT_EQ(0, read(ByteWriter().u16(0xFFD8).block(cut)));
    if (length < 4) continue;
    // The same with a length that agrees: a TIFF structure that ends early.
    cut[2] = static_cast<uint8_t>((length - 2) >> 8);
    cut[3] = static_cast<uint8_t>(length - 2);
    EXPECT_EQ(length >= 19 ? 1 : 0, read_segment(cut)) << length;
  }
}

TEST_P(HostileExif, FlippedBytes) {
  const Bytes whole = segment_of(full_exif_jpeg(GetParam()));
  for (size_t i = 0; i < whole.size(); ++i) {
    for (const uint8_t mask : {0xFF, 0x01, 0x80, 0x04}) {
      Bytes bad = whole;
      bad[i] ^= mask;
      read_segment(bad);
    }
  }
}

// Counts and offsets of every entry at their extremes and around the size of the data, for every type.
TEST_P(HostileExif, EveryFieldOfEveryEntry) {
  const Bytes whole = segment_of(full_exif_jpeg(GetParam()));
  const auto size = static_cast<uint32_t>(whole.size()) - 10;
  const uint32_t numbers[] = {0,        1,          2,          size - 8,   size - 1,   size,
                              size + 1, 0x20000001, 0x40000000, 0x7FFFFFFF, 0x80000001, 0xFFFFFFFF};
  for (size_t at = 10; at + 12 <= whole.size() && at < 900; at += 2) {
    for (const uint32_t number : numbers) {
      Bytes bad = whole;
      const Bytes word = ByteWriter(GetParam()).u32(number);
      std::copy(word.begin(), word.end(), bad.begin() + static_cast<ptrdiff_t>(at));
      read_segment(bad);
    }
  }
  for (uint32_t type = 0; type < 14; ++type) {
    for (const uint32_t count : numbers) {
      ExifBuilder exif(GetParam());
      for (const uint16_t tag : {258, 271, 274, 282, 34665, 34853}) {
        exif.entry(Ifd::k0, tag, static_cast<uint16_t>(type), count, Bytes(4, 0));
      }
      for (const uint16_t tag : {273, 279, 513, 514, 257}) {
        exif.entry(Ifd::k1, tag, static_cast<uint16_t>(type), count, {0, 0, 0, 1});
      }
      for (const uint16_t tag : {0, 1, 2, 5, 7, 18, 27, 29}) {
        exif.entry(Ifd::kGps, tag, static_cast<uint16_t>(type), count, Bytes(4, 0xFF));
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
  const Bytes jpeg = full_exif_jpeg(GetParam());
  long objects = 0;
  for (long k = 1;; ++k) {
    ASSERT_LT(k, 100);
    pelo::faults::allocations.arm(k);
    const int result = read(jpeg);
    const bool spent = pelo::faults::allocations.calls >= k;
    pelo::faults::allocations.arm(0);
    objects += spent && result == 1;
    if (!spent) {
      EXPECT_EQ(1, result);
      break;
    }
  }
  // Strings and records that memory was short for are missing; the object is there.
  EXPECT_GT(objects, 8);
}

}  // namespace
}  // namespace tests
