// What the EXIF reader takes from a segment: every member, both byte orders, and which entries it
// ignores.
#include "codec/formats/jpeg/exif/exif_reader.h"

#include <memory>

#include "codec/formats/jpeg/exif/exif_abi.h"
#include "tests/support/exif_builder.h"
#include "tests/support/failures.h"
#include "tests/support/jpeg_segments.h"
#include "tests/support/slideshow_files.h"

namespace tests {
namespace {

struct Destroy {
  void operator()(TAVIRPELO_EXIFINFO* info) const { TAVIRPELO_DestroyJpegExifInfo(info); }
};
using Exif = std::unique_ptr<TAVIRPELO_EXIFINFO, Destroy>;

Exif read(Bytes jpeg) {
  jpeg.shrink_to_fit();
  return Exif(TAVIRPELO_CreateJpegExifInfoFromBuffer(jpeg.data(), static_cast<int>(jpeg.size())));
}
Exif read(const ExifBuilder& exif) {
  return read(exif.jpeg(header_of({frame(9, 9)})));
}

class ExifReader : public testing::Test {
 protected:
  void SetUp() override {
    log_.clear();
    pelo::platform::set_log_sink([](const char* line) { log_ = line; });
  }
  void TearDown() override { pelo::platform::set_log_sink(nullptr); }
  static std::string log_;
};
std::string ExifReader::log_;

class ExifOrder : public testing::TestWithParam<bool> {};
INSTANTIATE_TEST_SUITE_P(BothOrders, ExifOrder, testing::Bool());

using Numbers = std::vector<int64_t>;
template <class Ratio>
Numbers parts(std::initializer_list<Ratio> ratios) {
  Numbers numbers;
  for (const Ratio& r : ratios) numbers.insert(numbers.end(), {r.numerator, r.denominator});
  return numbers;
}
std::string text_of(const uint8_t* bytes, size_t count) {
  return std::string(bytes, bytes + count);
}

TEST_P(ExifOrder, EveryMember) {
  const Bytes jpeg = full_exif_jpeg(GetParam());
  const Exif info = read(jpeg);
  ASSERT_TRUE(info && info->gps);
  const TAVIRPELO_EXIFINFO& e = *info;
  EXPECT_EQ((Numbers{8, 7, 6, 6, 6, 3, 2, 16, 1, 70000, 48, 1, 1, 400}),
            (Numbers{e.bitsPerSample[0], e.bitsPerSample[1], e.bitsPerSample[2], e.compression,
                     e.orientation, e.resolutionUnit, e.ycbcrPositioning, e.flash, e.colourSpace,
                     e.pixelXDimension, e.pixelYDimension, e.exposureMode, e.whiteBalance, e.isoSpeed}));
  EXPECT_EQ(
      (Numbers{300, 1, 301, 2, 1, 125, 3, 2, 50, 1, 28, 10}),
      parts({e.xResolution, e.yResolution, e.exposureTime, e.digitalZoom, e.focalLength, e.fNumber}));
  EXPECT_EQ((Numbers{-1, 3, -7, 2}), parts({e.exposureBias, e.shutterSpeed}));
  EXPECT_STREQ("Abc", e.make);
  EXPECT_STREQ("Model of five words, outside", e.model);
  EXPECT_STREQ("soft 1.0", e.software);
  EXPECT_STREQ("all rights", e.rights);
  EXPECT_EQ("0231", text_of(e.exifVersion, 4));
  EXPECT_STREQ("2021:02:03 04:05:06", e.captureTime);
  EXPECT_STREQ("2022:03:04 05:06:07", e.digitizingTime);

  const TAVIRPELO_GPSINFO& gps = *e.gps;
  EXPECT_EQ((Numbers{2, 3, 1}), (Numbers{gps.version[0], gps.version[1], gps.altitudeRef}));
  EXPECT_STREQ("N", gps.latitudeRef);
  EXPECT_STREQ("W", gps.longitudeRef);
  EXPECT_EQ((Numbers{48, 1, 1234, 100, 34, 1, 5195, 10, 7, 1}),
            parts({gps.latitude[0], gps.latitude[2], gps.longitude[1], gps.altitude, gps.timeStamp[2]}));
  EXPECT_STREQ("WGS-84", gps.mapDatum);
  ASSERT_EQ(11u, gps.processingMethodLength);
  EXPECT_EQ("GPS", text_of(gps.processingMethod + 8, 3));
  EXPECT_STREQ("2021:02:03", gps.dateStamp);

  const TAVIRPELO_EXIFTHUMBNAIL& t = e.thumbnail;
  const Bytes expected = sample_thumbnail();
  EXPECT_EQ((Numbers{1, 20, 12, 6, 6, 1, 9}), (Numbers{t.present, t.width, t.height, t.compression,
                                                       t.photometric, t.planarConfig, t.tag4173}));
  ASSERT_EQ(expected.size(), t.length);
  EXPECT_EQ(expected, prefix(suffix(jpeg, t.offset), t.length));
}

TEST_F(ExifReader, FileAndSegmentAndBufferAgree) {
  const Bytes jpeg = full_exif_jpeg(true);
  TempFile file(".jpg");
  file.write(jpeg);
  const Exif fromFile(TAVIRPELO_CreateJpegExifInfoFromFile(file.c_str()));
  const Exif fromSegment(
      PELOJ_CreatExifInfoUseExifBuffer(jpeg.data() + 2, static_cast<int>(jpeg.size()) - 2));
  ASSERT_TRUE(fromFile && fromSegment);
  EXPECT_STREQ("Model of five words, outside", fromFile->model);
  EXPECT_STREQ("WGS-84", fromSegment->gps->mapDatum);
  // Offsets count from the start of what was read.
  EXPECT_EQ(read(jpeg)->thumbnail.offset, fromFile->thumbnail.offset);
  EXPECT_EQ(fromFile->thumbnail.offset, fromSegment->thumbnail.offset + 2);
}

TEST_P(ExifOrder, EntriesOfOtherTypesAndCountsAreIgnored) {
  ExifBuilder exif(GetParam());
  const Ifd i0 = Ifd::k0, ex = Ifd::kExif, gps = Ifd::kGps;
  // Two SHORTs are never read; no type of TIFF; a value at offset 0: the header's own bytes.
  exif.shorts(i0, 274, {6, 6}).shorts(i0, 258, {8, 8}).longs(i0, 296, {2}).shorts(i0, 65000, {1});
  exif.entry(i0, 271, 13, 3, {'a', 'b', 0}).entry(i0, 272, 0, 3, {'a', 'b', 0});
  exif.entry(i0, 282, 5, 1, {0, 0, 0, 0}).rationals(i0, 283, {1, 2}, 10);
  exif.bytes(i0, 305, {'x', 'y'}, 2);  // no terminator: one is added
  exif.text(ex, 36867, "2021:02:03 04:05").shorts(ex, 34855, {100, 200});
  exif.shorts(ex, 271, {5});  // a tag of another directory
  exif.text(gps, 29, "2021:2:3").rationals(gps, 2, {1, 1, 2, 1}).text(gps, 1, "NN");
  const Exif info = read(exif);
  ASSERT_TRUE(info && info->gps);
  EXPECT_EQ(Numbers(8), (Numbers{info->orientation, info->bitsPerSample[0], info->resolutionUnit,
                                 info->yResolution.numerator, info->isoSpeed, info->gps->dateStamp[0],
                                 info->gps->latitudeRef[0], info->thumbnail.present}));
  EXPECT_EQ(nullptr, info->make);
  EXPECT_EQ(nullptr, info->model);
  EXPECT_NE(0u, info->xResolution.numerator);
  EXPECT_STREQ("xy", info->software);
  EXPECT_EQ(nullptr, info->captureTime);
  EXPECT_EQ(0u, info->gps->latitude[0].numerator);
}

// The last of repeated tags stands; directories are walked once each, whatever points at them.
TEST_P(ExifOrder, RepeatedTagsAndPointers) {
  ExifBuilder exif(GetParam());
  exif.text(Ifd::k0, 271, "first maker").text(Ifd::k0, 271, "second");
  exif.longs(Ifd::k0, 34853, {8}).longs(Ifd::k0, 34665, {8}).longs(Ifd::k0, 34665, {8});
  exif.shorts(Ifd::kExif, 37385, {1});
  exif.text(Ifd::kGps, 18, "unused").text(Ifd::kGps, 18, "datum");
  const Exif info = read(exif);
  ASSERT_TRUE(info);
  EXPECT_STREQ("second", info->make);
  EXPECT_EQ(0u, info->flash);  // the first pointer led back to IFD0, which has no such tags
  ASSERT_TRUE(info->gps);
  EXPECT_EQ(nullptr, info->gps->mapDatum);
}

TEST_P(ExifOrder, ASubDirectoryWithASuccessorEndsTheWalk) {
  for (const Ifd ifd : {Ifd::kExif, Ifd::kGps}) {
    ExifBuilder exif(GetParam());
    exif.shorts(Ifd::kExif, 37385, {7}).text(Ifd::kGps, 18, "datum").thumbnail(sample_thumbnail());
    EXPECT_EQ(1u, read(exif)->thumbnail.present);
    exif.successor(ifd, 8);
    const Exif info = read(exif);
    EXPECT_EQ(0u, info->thumbnail.present);
    EXPECT_EQ(7u, info->flash);
    EXPECT_EQ(ifd == Ifd::kGps, info->gps != nullptr);
  }
}

TEST_P(ExifOrder, ThumbnailEntriesApplyInTheirOrder) {
  ExifBuilder strips(GetParam());
  strips.shorts(Ifd::k1, 256, {160}).longs(Ifd::k1, 257, {120}).shorts(Ifd::k1, 259, {1});
  strips.longs(Ifd::k1, 273, {500}).shorts(Ifd::k1, 279, {600});
  Exif info = read(strips);
  const auto fields = [&] {
    const TAVIRPELO_EXIFTHUMBNAIL& t = info->thumbnail;
    return Numbers{t.present, t.width, t.height, t.compression, t.offset, t.length};
  };
  // Counted from the file's start: SOI, marker, length, identifier.
  EXPECT_EQ((Numbers{1, 160, 120, 0, 12 + 500, 600}), fields());
  strips.longs(Ifd::k1, 513, {0xFFFFFFFF}).longs(Ifd::k1, 514, {7}).shorts(Ifd::k1, 259, {9});
  info = read(strips);
  EXPECT_EQ((Numbers{1, 160, 120, 9, 0, 7}), fields());
}

TEST_F(ExifReader, FindsTheSegmentBehindOthers) {
  ExifBuilder exif(false);
  exif.text(Ifd::k0, 271, "maker");
  const Bytes xmp =
      segment(0xE1, ByteWriter().text("http://ns.adobe.com/xap/1.0/").u8(0).block(Bytes(9000, 7)));
  const Bytes tiny = segment(0xE1, ByteWriter().text("Exi"));
  const Bytes found = header_of(
      {segment(0xE0, Bytes(14)), tiny, xmp, Bytes{0xFF, 0xFF, 0x01}, frame(9, 9), exif.segment()});
  const Exif info = read(found);
  ASSERT_TRUE(info);
  EXPECT_STREQ("maker", info->make);

  EXPECT_FALSE(read(header_of({frame(9, 9), xmp})));
  EXPECT_NE(std::string::npos, log_.find("PELOJ_CreatExifInfo : PELOJ_GetExifInfo fail"));
  Bytes garbage = found;
  garbage.insert(garbage.begin(), 0);
  EXPECT_FALSE(read(garbage));  // only a source that begins with SOI
  EXPECT_FALSE(read(header_of({Bytes{0xFF, 0xE1, 0, 1}, exif.segment()})));
}

TEST_F(ExifReader, RefusesWhatIsNoTiff) {
  const auto app1 = [](const Bytes& tiff) {
    return segment(0xE1, ByteWriter().text({"Exif\0\0", 6}).block(tiff));
  };
  const Bytes bad[] = {{},
                       {'I', 'I', 42, 0, 8, 0, 0},
                       {'I', 'I', 42, 0, 8, 0, 0, 0},
                       {'I', 'M', 42, 0, 2, 0, 0, 0},
                       {'I', 'I', 43, 0, 2, 0, 0, 0},
                       {'M', 'M', 42, 0, 0, 0, 0, 2}};
  for (const Bytes& tiff : bad) {
    const Bytes block = app1(tiff);
    EXPECT_FALSE(read(header_of({block})));
    EXPECT_EQ(nullptr, PELOJ_CreatExifInfoUseExifBuffer(block.data(), static_cast<int>(block.size())));
  }
  // A sound header whose directory does not fit is EXIF without fields.
  const Exif info = read(header_of({app1({'I', 'I', 42, 0, 7, 0, 0, 0})}));
  ASSERT_TRUE(info);
  EXPECT_EQ(0u, info->orientation);
}

TEST_F(ExifReader, MissingArguments) {
  EXPECT_EQ(nullptr, TAVIRPELO_CreateJpegExifInfoFromFile(nullptr));
  EXPECT_EQ(nullptr, TAVIRPELO_CreateJpegExifInfoFromFile("/nonexistent"));
  EXPECT_EQ(nullptr, TAVIRPELO_CreateJpegExifInfoFromBuffer(nullptr, 5));
  EXPECT_EQ(nullptr, TAVIRPELO_CreateJpegExifInfoFromBuffer("x", 0));
  EXPECT_EQ(nullptr, TAVIRPELO_CreateJpegExifInfoFromBuffer("x", -1));
  EXPECT_EQ(nullptr, PELOJ_CreatExifInfo(nullptr));
  EXPECT_EQ(nullptr, PELOJ_CreatExifInfoUseExifBuffer(nullptr, 100));
  EXPECT_EQ(0, TAVIRPELO_DestroyJpegExifInfo(nullptr));
  EXPECT_EQ("", log_);
  EXPECT_EQ(0, PELOJ_DestroyExifInfo(nullptr));
  EXPECT_NE(std::string::npos, log_.find("PELOJ_DestroyExifInfo : TAVIRPELO_EXIFINFO is null"));
}

TEST(JpegResolution, NeedsAWholeHeader) {
  uint32_t width = 1, height = 2;
  const auto size = [&](const Bytes& jpeg) {
    return PELOJ_GetJPEGResolution(jpeg.data(), static_cast<uint32_t>(jpeg.size()), &width, &height);
  };
  const Bytes good =
      header_of({segment(0xDB, Bytes(65)), segment(0xE5, Bytes(5000)), frame(6000, 11, 0xC2)});
  for (size_t cut = 0; cut + 28 < good.size(); cut += cut < 5080 ? 97 : 1)
    EXPECT_EQ(201, size(prefix(good, cut))) << cut;
  EXPECT_EQ(1u, width);
  EXPECT_EQ(2u, height);
  EXPECT_EQ(200, size(good));
  EXPECT_EQ(6000u, width);
  EXPECT_EQ(11u, height);
  EXPECT_EQ(201, size(overwritten(header_of({frame(5, 5)}), 6, {12})));
  EXPECT_EQ(201, size(header_of({Bytes{0xFF, 0xC0, 0, 4, 8, 0}})));
  EXPECT_EQ(201, size(header_of({Bytes{0xFF, 0xDB, 0, 1}})));
}

}  // namespace
}  // namespace tests
