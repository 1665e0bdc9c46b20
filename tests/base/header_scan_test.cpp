// The JPEG header scans: sizes, marker rules, and thumbnails in every kind of segment, sound and
// hostile.
#include "codec/formats/jpeg/header_scan.h"

#include <gtest/gtest.h>

#include "codec/formats/jpeg/jpeg_abi.h"
#include "tests/support/exif_builder.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

using Scan = int (*)(PELOJ_SOURCE*, int, PELOJ_FILEHEADER*);

struct Outcome {
  int status;
  PELOJ_FILEHEADER header;
};

// Scans a heap block of exactly the bytes' length, so that a sanitizer sees every step beyond it.
Outcome scan(Bytes bytes, Scan scanner = PELOJ_ParseFileHeader, int mode = 8) {
  Outcome outcome{0, {}};
  const DecInfo info = open_memory(bytes, 0);
  pelo::BufferedSource source;
  if (source.open(info->pIO)) outcome.status = scanner(source.get(), mode, &outcome.header);
  return outcome;
}

Bytes jfif(int width, int height, size_t data) {
  ByteWriter w;
  w.text({"JFIF\0", 5}).u16(0x0102).u8(0).u32(0x00480048).u8(width).u8(height).block(Bytes(data, 7));
  return segment(0xE0, w);
}

Bytes jfxx(uint32_t code, const Bytes& data) {
  return segment(0xE0, ByteWriter().text({"JFXX\0", 5}).u8(code).block(data));
}

// A resource with an odd name, then a thumbnail of `size` data bytes that claims `length` in its header.
Bytes photoshop(uint32_t format, const Bytes& data, uint32_t size) {
  ByteWriter w;
  w.text({"Photoshop 3.0\0", 14}).text("8BIM").u16(0x03ED).u8(1).text("x").u32(3).text("abc").u8(0);
  w.text("8BIM").u16(0x040C).u16(0).u32(size);
  w.u32(format).u32(160).u32(120).u32(480).u32(57600).u32(static_cast<uint32_t>(data.size()));
  return segment(0xED, w.u16(24).u16(1).block(data));
}

// An EXIF segment whose IFD1 begins at 26 and whose thumbnail, when there is one, follows its entries.
ExifBuilder exif(bool big = false) {
  return ExifBuilder(big).shorts(Ifd::k0, 0x0112, {1});
}

TEST(HeaderScan, MeasuresBetweenGarbageAndFillBytes) {
  const Bytes header = header_of({segment(0xDB, Bytes(65)), segment(0xE2, Bytes(9000)),
                                  Bytes{0xFF, 0xFF, 0xFF, 0x01, 0xFF, 0x00, 0x12, 0xFF},
                                  frame(4321, 17, 0xC2), segment(0xFE, Bytes(3))});
  const Bytes jpeg = ByteWriter().text("junk\xFF\x01").u8(0xFF).block(header);
  for (const Scan scanner : {PELOJ_ParseFileHeader, PELOJ_ParseExifThumbnail, PELOJ_SimpleParser}) {
    for (const int mode : {2, 8}) {
      const Outcome outcome = scan(jpeg, scanner, mode);
      EXPECT_EQ(PELOJ_OK, outcome.status);
      EXPECT_EQ(4321, outcome.header.width);
      EXPECT_EQ(17, outcome.header.height);
      EXPECT_EQ(1, outcome.header.progressive);
      EXPECT_EQ(0, outcome.header.thumbnail.present);
    }
    EXPECT_EQ(PELOJ_FAIL, scan(jpeg, scanner, 4).status);
  }
}

TEST(HeaderScan, RefusesBadFramesAndLengths) {
  EXPECT_EQ(PELOJ_OK, scan(header_of({frame(5000, 5000)})).status);
  Bytes twelveBits = frame(8, 8);
  twelveBits[4] = 12;
  const Bytes shortLength = {0xFF, 0xDB, 0, 1};
  const Bytes longApp1 = {0xFF, 0xE1, 0xFF, 0xFF, 'E', 'x', 'i', 'f', 0, 0};
  const Bytes shortFrame = {0xFF, 0xC0, 0, 6, 8, 0, 9, 0, 9};
  for (const Bytes& bad : {frame(5001, 1), frame(1, 5001), frame(0, 1), frame(1, 0), twelveBits,
                           shortLength, longApp1, shortFrame}) {
    EXPECT_EQ(PELOJ_FAIL, scan(header_of({bad, frame(8, 8)})).status);
  }
  EXPECT_EQ(PELOJ_FAIL, scan(Bytes(3000, 0xFF)).status);
}

TEST(HeaderScan, JfifPixelsMustFillTheSegment) {
  const auto thumbnail = [](std::initializer_list<Bytes> segments) {
    ByteWriter all;
    for (const Bytes& s : segments) all.block(s);
    return scan(header_of({all, frame(40, 50)})).header.thumbnail;
  };
  const auto pixels = thumbnail({jfif(4, 5, 60)});
  EXPECT_EQ(1, pixels.present);
  EXPECT_EQ(PELOJ_THUMBNAIL_PIXELS, pixels.type);
  EXPECT_EQ(2, pixels.layout);
  EXPECT_EQ(4, pixels.width);
  EXPECT_EQ(5, pixels.height);
  EXPECT_EQ(60u, pixels.length);
  EXPECT_EQ(20u, pixels.offset);
  for (const size_t data : {0, 59, 61}) EXPECT_EQ(0, thumbnail({jfif(4, 5, data)}).present);

  // An extension with pixels relies on the size that the JFIF segment gave.
  const Bytes sized = jfif(4, 5, 0);
  EXPECT_EQ(60u, thumbnail({sized, jfxx(0x13, Bytes(60))}).length);
  EXPECT_EQ(1, thumbnail({sized, jfxx(0x11, Bytes(20))}).present);
  EXPECT_EQ(0, thumbnail({jfxx(0x13, {})}).present);
  EXPECT_EQ(0, thumbnail({sized, jfxx(0x11, Bytes(60))}).present);
}

TEST(HeaderScan, ExifDirectoriesInBothOrders) {
  const Bytes small = header_of({frame(160, 120)});
  const auto size = static_cast<uint32_t>(small.size());
  for (const bool big : {false, true}) {
    ExifBuilder segment = exif(big).shorts(Ifd::k1, 259, {6}).rationals(Ifd::k1, 282, {72, 1});
    const Bytes jpeg = header_of({segment.thumbnail(small).segment(), frame(640, 480)});
    for (const Scan scanner : {PELOJ_ParseFileHeader, PELOJ_ParseExifThumbnail}) {
      const Outcome outcome = scan(jpeg, scanner);
      EXPECT_EQ(PELOJ_OK, outcome.status);
      EXPECT_EQ(1, outcome.header.thumbnail.present);
      EXPECT_EQ(PELOJ_THUMBNAIL_JPEG, outcome.header.thumbnail.type);
      EXPECT_EQ(size, outcome.header.thumbnail.length);
      EXPECT_EQ(12u + 32 + 48 + 8, outcome.header.thumbnail.offset);
      EXPECT_EQ(640, outcome.header.width);
    }
    TAVIRPELO_HINFO info;
    Bytes copy = jpeg;
    EXPECT_EQ(TAVIRPELO_FORMAT_JPEG,
              TAVIRPELO_ParseFromBuffer(copy.data(), static_cast<int>(copy.size()), &info));
    EXPECT_EQ(1, info.hasThumbnail);
    EXPECT_EQ(160, info.thumbnailWidth);
    EXPECT_EQ(120, info.thumbnailHeight);
    EXPECT_EQ(640, info.width);
    EXPECT_EQ(0, scan(jpeg, PELOJ_SimpleParser).header.thumbnail.present);
  }
}

TEST(HeaderScan, ExifOffsetsThatLeadNowhere) {
  const auto thumbnail = [](const ExifBuilder& builder, size_t at = 0, Bytes damage = {}) {
    // Behind marker, length and identifier.
    const Bytes app1 = overwritten(builder.segment(), 10 + at, damage);
    const Outcome outcome = scan(header_of({app1, frame(64, 48)}));
    EXPECT_EQ(PELOJ_OK, outcome.status);
    EXPECT_EQ(64, outcome.header.width);
    return outcome.header.thumbnail;
  };
  const auto sized = [](uint32_t offset, uint32_t length) {
    return exif().longs(Ifd::k1, 513, {offset}).longs(Ifd::k1, 514, {length});
  };
  // Data behind the end of the file is reported, but no decoder may follow it.
  EXPECT_EQ(5000u, thumbnail(sized(1000, 5000)).length);
  EXPECT_FALSE(pelo::jpeg::thumbnail_in_source(thumbnail(sized(1000, 5000)), 4000));
  // Sums that leave 32 bits.
  EXPECT_EQ(0, thumbnail(sized(0xFFFFFFF0, 5000)).present);
  EXPECT_FALSE(pelo::jpeg::thumbnail_in_source(thumbnail(sized(1000, 0xFFFFFFF0)), 1u << 31));
  // Nothing without a length, behind an unknown type, or from directories outside the segment.
  EXPECT_EQ(0, thumbnail(exif().longs(Ifd::k1, 513, {1000})).present);
  ExifBuilder unknown = exif();
  unknown.entry(Ifd::k1, 256, 13, 1, {1}).longs(Ifd::k1, 513, {1000}).longs(Ifd::k1, 514, {5000});
  EXPECT_EQ(0, thumbnail(unknown).present);
  for (const uint8_t ifd0 : {0, 7, 250}) EXPECT_EQ(0, thumbnail(sized(1000, 5000), 4, {ifd0}).present);
  EXPECT_EQ(0, thumbnail(sized(1000, 5000), 25, {0x7F}).present);
  EXPECT_EQ(0, thumbnail(sized(1000, 5000), 2, {43}).present);
  // IFD1 that claims more entries than its segment holds ends with it.
  EXPECT_EQ(1, thumbnail(sized(1000, 5000), 26, {200}).present);
  // IFD0 that claims more than the file holds: the data has run out.
  const Bytes endless = overwritten(sized(1000, 5000).segment(), 19, {0xFF});
  EXPECT_EQ(PELOJ_FAIL, scan(header_of({endless, frame(64, 48)})).status);
}

TEST(HeaderScan, PhotoshopResources) {
  const Bytes data = ByteWriter().text("THUMBNAILBYTES");
  Bytes jpeg = header_of({photoshop(1, data, 28 + 14), frame(640, 480)});
  Outcome outcome = scan(jpeg);
  EXPECT_EQ(PELOJ_OK, outcome.status);
  EXPECT_EQ(PELOJ_THUMBNAIL_PHOTOSHOP, outcome.header.thumbnail.type);
  EXPECT_EQ(160, outcome.header.thumbnail.width);
  EXPECT_EQ(120, outcome.header.thumbnail.height);
  EXPECT_EQ(14u, outcome.header.thumbnail.length);
  EXPECT_EQ(data, prefix(suffix(jpeg, outcome.header.thumbnail.offset), 14));
  EXPECT_EQ(PELOJ_THUMBNAIL_PIXELS,
            scan(header_of({photoshop(0, data, 42), frame(6, 4)})).header.thumbnail.type);
  EXPECT_EQ(0, scan(jpeg, PELOJ_ParseExifThumbnail).header.thumbnail.present);

  // Sizes beyond the segment, wrapping when padded, or too small for the resource's own header.
  for (const uint32_t size : {43u, 5000u, 0x7FFFFFFFu, 0xFFFFFFFFu, 27u, 0u}) {
    outcome = scan(header_of({photoshop(1, data, size), frame(640, 480)}));
    EXPECT_EQ(PELOJ_OK, outcome.status) << size;
    EXPECT_EQ(0, outcome.header.thumbnail.present) << size;
  }
  // The first thumbnail found is kept before a Photoshop one.
  outcome = scan(header_of({jfif(4, 5, 60), photoshop(1, data, 42), frame(640, 480)}));
  EXPECT_EQ(PELOJ_THUMBNAIL_PIXELS, outcome.header.thumbnail.type);
}

// Readers test a prefix and then take fixed fields: none may walk out of a segment cut to any length.
TEST(HeaderScan, ShortSegmentsAreStepped) {
  const Bytes payloads[] = {
      ByteWriter().text({"JFIF\0", 5}).block(Bytes(9)), ByteWriter().text({"JFXX\0", 5}).u8(0x13),
      suffix(exif(true).longs(Ifd::k1, 513, {50}).segment(), 4),
      ByteWriter().text({"Photoshop 3.0\0", 14}).text("8BIM").u16(0x0409).u16(0).u32(28)};
  const uint8_t codes[] = {0xE0, 0xE0, 0xE1, 0xED};
  for (size_t i = 0; i < std::size(payloads); ++i) {
    every_truncation(
        ByteWriter().block(payloads[i]).u8(0),
        [&](const Bytes& cut) {
          const Outcome outcome =
              scan(header_of({segment(codes[i], cut), frame(64, 48), segment(0xFE, Bytes(300))}));
          EXPECT_EQ(PELOJ_OK, outcome.status) << i << " cut to " << cut.size();
          EXPECT_EQ(64, outcome.header.width) << i << " cut to " << cut.size();
        },
        0);
  }
}

TEST(HeaderScan, EveryCutAndEveryDamagedByte) {
  const Bytes small = header_of({frame(16, 12)});
  const Bytes exifSegment = exif(true).shorts(Ifd::k1, 256, {160}).thumbnail(small).segment();
  const Bytes jpeg = header_of({jfif(2, 2, 12), jfxx(0x10, small), frame(64, 48), exifSegment,
                                photoshop(1, small, 28 + static_cast<uint32_t>(small.size()))});
  const auto parse = [](Bytes bytes) {
    bytes.shrink_to_fit();
    TAVIRPELO_HINFO info;
    return TAVIRPELO_ParseFromBuffer(bytes.data(), static_cast<int>(bytes.size()), &info);
  };
  EXPECT_EQ(TAVIRPELO_FORMAT_JPEG, parse(jpeg));
  const size_t sos = jpeg.size() - 2 - 16 - 10;
  const auto expect_cut = [&](const Bytes& cut) {
    EXPECT_EQ(cut.size() < sos + 2 ? 0 : TAVIRPELO_FORMAT_JPEG, parse(cut)) << cut.size();
  };
  every_truncation(jpeg, expect_cut, 2);
  every_flip(
      jpeg, {0x01, 0x80, 0xFF}, [&](const Bytes& damaged, size_t) { parse(damaged); }, 2);
}

}  // namespace
}  // namespace tests
