// The EXIF writer: its bytes, its bounds, what the reader and an independent reader make of it, and the
// way through the encoder.
#include "codec/formats/jpeg/exif/exif_writer.h"

#include <gmock/gmock.h>

#include <cstdio>

#include "codec/formats/jpeg/exif/exif_abi.h"
#include "tests/support/exif_builder.h"
#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

ELO_EXIFCONTENT full_content(const Bytes& thumbnail) {
  const auto size = static_cast<uint32_t>(thumbnail.size());
  return {"Maker", "some models", 0x10006, "2021:02:03 04:05:06", size, thumbnail.data()};
}

Bytes write_tiff(const ELO_EXIFCONTENT& content) {
  Bytes tiff(70000, 0xEE);
  tiff.resize(__elo_CreateExif(tiff.data(), &content));
  return tiff;
}

Bytes write_segment(const ELO_EXIFCONTENT& content, size_t capacity = 70000) {
  Bytes segment(capacity);
  segment.resize(
      pelo::jpeg::write_exif_segment(segment.data(), content, static_cast<uint32_t>(capacity)));
  return segment;
}

Bytes with_app1(const Bytes& segment) {
  const TAVIRPELO_APP1 app1{segment.data(), static_cast<int>(segment.size())};
  // A buffer smaller than the headers: the segment makes it grow.
  return encode_pixels(sample_pixels(24, 16), 24, 16, TAVIRPELO_RGB888, {80, &app1, 0}, 16);
}

TEST(ExifWriter, WithoutStringsItIsThisSegment) {
  ELO_EXIFCONTENT content{};
  content.orientation = 6;
  ByteWriter tiff(false);
  tiff.text("II").u16(42).u32(8).u16(8);
  tiff.u16(271).u16(2).u32(0).u32(0).u16(272).u16(2).u32(0).u32(0);
  tiff.u16(274).u16(3).u32(1).u32(6);
  tiff.u16(282).u16(5).u32(1).u32(110).u16(283).u16(5).u32(1).u32(118);
  tiff.u16(296).u16(3).u32(1).u32(2).u16(306).u16(2).u32(0).u32(0).u16(531).u16(3).u32(1).u32(2);
  tiff.u32(0).u32(72).u32(1).u32(72).u32(1);
  const Bytes expected = ByteWriter().u16(0xFFE1).u16(134).text({"Exif\0\0", 6}).block(tiff);
  EXPECT_EQ(expected, write_segment(content));
}

// Texts stand in the value area whatever their length; none leaves an empty entry.
TEST(ExifWriter, ShortAndAbsentTexts) {
  ELO_EXIFCONTENT content{};
  content.make = "AB";
  content.dateTime = "";
  const Bytes tiff = write_tiff(content);
  EXPECT_EQ(110u + 3 + 16 + 1, tiff.size());
  const auto entry = [&](size_t i) { return prefix(suffix(tiff, 10 + 12 * i), 12); };
  EXPECT_EQ((Bytes{0x0F, 1, 2, 0, 3, 0, 0, 0, 110, 0, 0, 0}), entry(0));
  EXPECT_EQ((Bytes{0x10, 1, 2, 0, 0, 0, 0, 0, 0, 0, 0, 0}), entry(1));
  EXPECT_EQ((Bytes{0x32, 1, 2, 0, 1, 0, 0, 0, 129, 0, 0, 0}), entry(6));
}

TEST(ExifWriter, NeverLeavesItsBuffer) {
  const Bytes thumbnail = sample_thumbnail();
  const ELO_EXIFCONTENT content = full_content(thumbnail);
  const size_t needed = write_segment(content).size();
  for (size_t capacity = 0; capacity < needed; ++capacity)
    EXPECT_EQ(0u, write_segment(content, capacity).size());
  EXPECT_EQ(needed, write_segment(content, needed).size());
  EXPECT_EQ(0u, __elo_CreateExif(nullptr, &content));

  // A segment's length has 16 bits.
  ELO_EXIFCONTENT large{};
  const Bytes block(66000);
  large.thumbnail = block.data();
  large.thumbnailLength = 65535 + 2 - 10 - 126 - 106;
  EXPECT_EQ(65537u, write_segment(large).size());
  EXPECT_EQ(65527u, write_tiff(large).size());
  ++large.thumbnailLength;
  EXPECT_EQ(0u, write_segment(large).size());
  EXPECT_EQ(0u, write_tiff(large).size());
  large.thumbnailLength = UINT32_MAX;
  EXPECT_EQ(0u, write_tiff(large).size());
}

using App1Mark = QuietTest;
TEST_F(App1Mark, CarriesTheOrientationOfTheSource) {
  uint8_t segment[PELO_APP1_SIZE];
  const auto mark = [&](Bytes source) {
    TAVIRPELO_APP1 app1{segment, 0};
    const DecInfo info = open_memory(source, 0);
    EXPECT_EQ(TAVIRPELO_FORMAT_JPEG,
              TAVIRPELO_Parser(info.get(), nullptr));  // the source need not be rewound
    return pelo_get_app1_mark(info.get(), &app1) == 1 ? app1.length : 0;
  };
  for (const bool big : {false, true}) {
    EXPECT_EQ(136, mark(full_exif_jpeg(big)));
    TAVIRPELO_EXIFINFO* info = PELOJ_CreatExifInfoUseExifBuffer(segment, sizeof segment);
    ASSERT_NE(nullptr, info);
    EXPECT_EQ(6u, info->orientation);
    TAVIRPELO_DestroyJpegExifInfo(info);
  }
  EXPECT_EQ(0, mark(encode_own(16, 16, 80)));
  TAVIRPELO_APP1 none{nullptr, 0};
  EXPECT_EQ(0, pelo_get_app1_mark(nullptr, &none));
  EXPECT_EQ(0, pelo_get_app1_mark(nullptr, nullptr));
}

// exiftool finds no fault with the structure and reads the same values.
TEST(ExifWriter, AnIndependentReaderAgrees) {
  const TempFile file(".jpg");
  file.write(with_app1(write_segment(full_content(sample_thumbnail()))));
  const std::string command =
      "exiftool -s -s -n -a -validate -warning -Make -Model -Orientation -XResolution -ModifyDate "
      "-ThumbnailLength -YCbCrPositioning \"" +
      file.path() + "\" 2>&1";
  std::FILE* pipe = popen(command.c_str(), "r");
  ASSERT_NE(nullptr, pipe);
  std::string text;
  char line[256];
  while (std::fgets(line, sizeof line, pipe) != nullptr) text += line;
  if (pclose(pipe) != 0) GTEST_SKIP() << "exiftool is not installed";
  for (const std::string& field : std::initializer_list<std::string>{
           "Make: Maker\n", "Model: some models\n", "Orientation: 6\n", "XResolution: 72\n",
           "ModifyDate: 2021:02:03 04:05:06\n", "YCbCrPositioning: 2\n",
           "ThumbnailLength: " + std::to_string(sample_thumbnail().size())}) {
    EXPECT_THAT(text, testing::HasSubstr(field));
  }
  EXPECT_EQ(std::string::npos, text.find("Warning")) << text;
}

}  // namespace
}  // namespace tests
