// The JPEG header scans: sizes, marker rules, and thumbnails in every kind of segment, sound and
// hostile.
#include "codec/jpeg/header_scan.h"

#include <gtest/gtest.h>

#include <functional>

#include "tavirpelo/tavirpelo.h"
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
  bytes.shrink_to_fit();
  Outcome outcome{0, {}};
  TAVIRPELO_IO* io =
      TAVIRPELO_Open_IO(TAVIRPELO_IO_MEMORY, bytes.data(), static_cast<int>(bytes.size()));
  pelo::BufferedSource source;
  if (io != nullptr && source.open(io)) outcome.status = scanner(source.get(), mode, &outcome.header);
  TAVIRPELO_Close_IO(io);
  return outcome;
}

uint32_t find(const Bytes& haystack, std::string_view needle) {
  const std::string_view text(reinterpret_cast<const char*>(haystack.data()), haystack.size());
  return static_cast<uint32_t>(text.find(needle));
}

Bytes jfif(uint32_t width, uint32_t height, size_t data) {
  return segment(0xE0, ByteWriter()
                           .text({"JFIF\0", 5})
                           .u16(0x0102)
                           .u8(0)
                           .u32(0x00480048)
                           .u8(width)
                           .u8(height)
                           .block(Bytes(data, 7)));
}

Bytes jfxx(uint32_t code, const Bytes& data) {
  return segment(0xE0, ByteWriter().text({"JFXX\0", 5}).u8(code).block(data));
}

// A resource with an odd name, then a thumbnail of `size` data bytes that claims `length` in its header.
Bytes photoshop(uint32_t format, const Bytes& data, uint32_t size) {
  return segment(0xED, ByteWriter()
                           .text({"Photoshop 3.0\0", 14})
                           .text("8BIM")
                           .u16(0x03ED)
                           .u8(1)
                           .text("x")
                           .u32(3)
                           .text("abc")
                           .u8(0)
                           .text("8BIM")
                           .u16(0x040C)
                           .u16(0)
                           .u32(size)
                           .u32(format)
                           .u32(160)
                           .u32(120)
                           .u32(480)
                           .u32(57600)
                           .u32(static_cast<uint32_t>(data.size()))
                           .u16(24)
                           .u16(1)
                           .block(data));
}

TEST(HeaderScan, MeasuresBetweenGarbageAndFillBytes) {
  Bytes jpeg = ByteWriter()
                   .text("junk\xFF\x01")
                   .u8(0xFF)
                   .block(header_of({segment(0xDB, Bytes(65)), segment(0xE2, Bytes(9000)),
                                     Bytes{0xFF, 0xFF, 0xFF, 0x01, 0xFF, 0x00, 0x12, 0xFF},
                                     frame(4321, 17, 0xC2), segment(0xFE, Bytes(3))}));
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
  Outcome outcome = scan(header_of({jfif(4, 5, 60), frame(40, 50)}));
  EXPECT_EQ(1, outcome.header.thumbnail.present);
  EXPECT_EQ(PELOJ_THUMBNAIL_PIXELS, outcome.header.thumbnail.type);
  EXPECT_EQ(2, outcome.header.thumbnail.layout);
  EXPECT_EQ(4, outcome.header.thumbnail.width);
  EXPECT_EQ(5, outcome.header.thumbnail.height);
  EXPECT_EQ(60u, outcome.header.thumbnail.length);
  EXPECT_EQ(20u, outcome.header.thumbnail.offset);
  for (const size_t data : {0, 59, 61}) {
    EXPECT_EQ(0, scan(header_of({jfif(4, 5, data), frame(40, 50)})).header.thumbnail.present);
  }

  // An extension with pixels relies on the size that the JFIF segment gave.
  outcome = scan(header_of({jfif(4, 5, 0), jfxx(0x13, Bytes(60)), frame(40, 50)}));
  EXPECT_EQ(60u, outcome.header.thumbnail.length);
  EXPECT_EQ(
      1,
      scan(header_of({jfif(4, 5, 0), jfxx(0x11, Bytes(20)), frame(40, 50)})).header.thumbnail.present);
  EXPECT_EQ(0, scan(header_of({jfxx(0x13, {}), frame(40, 50)})).header.thumbnail.present);
  EXPECT_EQ(
      0, scan(header_of({jfif(4, 5, 0), jfxx(0x11, Bytes(60)), frame(4, 5)})).header.thumbnail.present);
}

TEST(HeaderScan, ExifDirectoriesInBothOrders) {
  const Bytes small = header_of({frame(160, 120)});
  const auto size = static_cast<uint32_t>(small.size());
  for (const bool big : {false, true}) {
    const Bytes jpeg = header_of(
        {segment(0xE1, exif_payload(big, {{259, 3, 6}, {282, 5, 9}, {513, 4, 32 + 48}, {514, 4, size}},
                                    small)),
         frame(640, 480)});
    for (const Scan scanner : {PELOJ_ParseFileHeader, PELOJ_ParseExifThumbnail}) {
      const Outcome outcome = scan(jpeg, scanner);
      EXPECT_EQ(PELOJ_OK, outcome.status);
      EXPECT_EQ(1, outcome.header.thumbnail.present);
      EXPECT_EQ(PELOJ_THUMBNAIL_JPEG, outcome.header.thumbnail.type);
      EXPECT_EQ(size, outcome.header.thumbnail.length);
      EXPECT_EQ(12u + 32 + 48, outcome.header.thumbnail.offset);
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
  const auto thumbnail = [](std::initializer_list<TiffEntry> entries,
                            const std::function<void(Bytes&)>& damage = {}) {
    Bytes payload = exif_payload(false, entries);
    if (damage) damage(payload);
    const Outcome outcome = scan(header_of({segment(0xE1, payload), frame(64, 48)}));
    EXPECT_EQ(PELOJ_OK, outcome.status);
    EXPECT_EQ(64, outcome.header.width);
    return outcome.header.thumbnail;
  };
  const TiffEntry offset{513, 4, 1000}, length{514, 4, 5000}, unknownType{256, 13, 1};
  // Data behind the end of the file is reported, but no decoder may follow it.
  EXPECT_EQ(5000u, thumbnail({offset, length}).length);
  EXPECT_FALSE(pelo::jpeg::thumbnail_in_source(thumbnail({offset, length}), 4000));
  // Sums that leave 32 bits.
  EXPECT_EQ(0, thumbnail({{513, 4, 0xFFFFFFF0}, length}).present);
  EXPECT_FALSE(pelo::jpeg::thumbnail_in_source(thumbnail({offset, {514, 4, 0xFFFFFFF0}}), 1u << 31));
  // Nothing without a length, behind an unknown type, or from directories outside the segment.
  EXPECT_EQ(0, thumbnail({offset}).present);
  EXPECT_EQ(0, thumbnail({unknownType, offset, length}).present);
  for (const uint8_t ifd0 : {0, 7, 250}) {
    EXPECT_EQ(0, thumbnail({offset, length}, [=](Bytes& p) { p[10] = ifd0; }).present);
  }
  EXPECT_EQ(0, thumbnail({offset, length}, [](Bytes& p) { p[6 + 25] = 0x7F; }).present);
  EXPECT_EQ(0, thumbnail({offset, length}, [](Bytes& p) { p[8] = 43; }).present);

  // IFD1 that claims more entries than its segment holds ends with it.
  EXPECT_EQ(1, thumbnail({offset, length}, [](Bytes& p) { p[6 + 26] = 200; }).present);
  // IFD0 that claims more than the file holds: the data has run out.
  Bytes payload = exif_payload(false, {offset, length});
  payload[6 + 9] = 0xFF;
  EXPECT_EQ(PELOJ_FAIL, scan(header_of({segment(0xE1, payload), frame(64, 48)})).status);
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
  EXPECT_EQ(find(jpeg, "THUMBNAIL"), outcome.header.thumbnail.offset);
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
      exif_payload(true, {{513, 4, 50}}),
      ByteWriter().text({"Photoshop 3.0\0", 14}).text("8BIM").u16(0x0409).u16(0).u32(28)};
  const uint8_t codes[] = {0xE0, 0xE0, 0xE1, 0xED};
  for (size_t i = 0; i < std::size(payloads); ++i) {
    for (size_t length = 0; length <= payloads[i].size(); ++length) {
      const Bytes cut(payloads[i].begin(), payloads[i].begin() + static_cast<ptrdiff_t>(length));
      const Outcome outcome =
          scan(header_of({segment(codes[i], cut), frame(64, 48), segment(0xFE, Bytes(300))}));
      EXPECT_EQ(PELOJ_OK, outcome.status) << i << " cut to " << length;
      EXPECT_EQ(64, outcome.header.width) << i << " cut to " << length;
    }
  }
}

TEST(HeaderScan, EveryCutAndEveryDamagedByte) {
  const Bytes small = header_of({frame(16, 12)});
  const Bytes jpeg = header_of(
      {jfif(2, 2, 12), jfxx(0x10, small), frame(64, 48),
       segment(0xE1,
               exif_payload(true,
                            {{256, 3, 160}, {513, 4, 68}, {514, 4, static_cast<uint32_t>(small.size())}},
                            small)),
       photoshop(1, small, 28 + static_cast<uint32_t>(small.size()))});
  const auto parse = [](Bytes bytes) {
    bytes.shrink_to_fit();
    TAVIRPELO_HINFO info;
    return TAVIRPELO_ParseFromBuffer(bytes.data(), static_cast<int>(bytes.size()), &info);
  };
  EXPECT_EQ(TAVIRPELO_FORMAT_JPEG, parse(jpeg));
  const size_t sos = jpeg.size() - 2 - 16 - 10;
  for (size_t length = 2; length < jpeg.size(); ++length) {
    const Bytes cut(jpeg.begin(), jpeg.begin() + static_cast<ptrdiff_t>(length));
    EXPECT_EQ(length < sos + 2 ? 0 : TAVIRPELO_FORMAT_JPEG, parse(cut)) << length;
    for (const int change : {0x01, 0x80, 0xFF}) {
      Bytes damaged = jpeg;
      damaged[length] = static_cast<uint8_t>(damaged[length] ^ change);
      parse(damaged);
    }
  }
}

}  // namespace
}  // namespace tests
