// The thumbnail that an EXIF segment describes in its second directory, IFD1.
#include <climits>
#include <cstring>

#include "codec/formats/jpeg/header_scan_segments.h"
#include "codec/formats/jpeg/tiff.h"

namespace pelo::jpeg {
namespace {

constexpr uint32_t kIdentifier = 6;  // "Exif", two zeros

enum Tag : uint16_t {
  kWidth = 256,
  kHeight = 257,
  kCompression = 259,
  kPhotometric = 262,
  kStripOffsets = 273,
  kStripByteCounts = 279,
  kPlanarConfig = 284,
  kJpegOffset = 513,
  kJpegLength = 514,
  kTag4173 = 4173
};

// The segment's TIFF structure; offsets in it count from its header.
struct Exif {
  const Segment& segment;
  int64_t base;
  tiff::Header header;

  // True when a directory, which begins with a 16-bit count, can start there.
  bool inside(uint32_t offset) const { return base + offset + 2 <= segment.end; }
};

// Takes over one entry; false for an offset that no source can have.
bool store(PELOJ_THUMBNAIL& thumbnail, const Exif& exif, uint16_t tag, uint32_t value) {
  const auto number = static_cast<int32_t>(value);
  switch (tag) {
    case kWidth:
      thumbnail.width = number;
      break;
    case kHeight:
      thumbnail.height = number;
      break;
    case kCompression:
      thumbnail.type = number;
      break;
    case kPhotometric:
      thumbnail.layout = number;
      break;
    case kPlanarConfig:
      thumbnail.planarConfig = number;
      break;
    case kTag4173:
      thumbnail.tag4173 = number;
      break;
    case kStripOffsets:
    case kJpegOffset:
      thumbnail.offset = static_cast<uint32_t>(exif.base + value);
      return exif.base + value <= INT_MAX;  // positions in a source have 31 bits
    case kStripByteCounts:
    case kJpegLength:
      thumbnail.type = tag == kJpegLength ? PELOJ_THUMBNAIL_JPEG : PELOJ_THUMBNAIL_STRIP;
      thumbnail.length = value;
      break;
    default:
      break;
  }
  return true;
}

// Reads a directory's entry count at the current position; false when the data ends.
bool read_count(const Exif& exif, uint16_t& count) {
  if (!source_need(exif.segment.source, 2)) return false;
  count = tiff::load16(source_take(exif.segment.source, 2), exif.header.order);
  return true;
}

// Finds IFD1 behind IFD0; 0 when there is none inside the segment. False when the data ends.
bool find_ifd1(const Exif& exif, uint32_t& ifd1) {
  PELOJ_SOURCE& source = exif.segment.source;
  ifd1 = 0;
  if (exif.header.ifd0 < tiff::kHeaderSize || !exif.inside(exif.header.ifd0)) return true;
  uint16_t count;
  if (!source_skip(source, int64_t{exif.header.ifd0} - tiff::kHeaderSize) || !read_count(exif, count) ||
      !source_skip(source, int64_t{count} * tiff::kEntrySize) || !source_need(source, 4)) {
    return false;
  }
  ifd1 = tiff::load32(source_take(source, 4), exif.header.order);
  if (!exif.inside(ifd1)) ifd1 = 0;
  return true;
}

// Reads entries until their number, the segment or the known types end; false when the data ends.
bool read_ifd1(const Exif& exif, uint32_t ifd1, ThumbnailSearch& search) {
  PELOJ_SOURCE& source = exif.segment.source;
  uint16_t count;
  if (!source_reposition(source, exif.base + ifd1) || !read_count(exif, count)) return false;
  PELOJ_THUMBNAIL thumbnail{};
  bool reachable = true;
  for (; count > 0; --count) {
    if (!source_need(source, tiff::kEntrySize)) return false;
    if (exif.segment.left() < tiff::kEntrySize) break;
    const tiff::Entry entry =
        tiff::parse_entry(source_take(source, tiff::kEntrySize), exif.header.order);
    if (tiff::type_size(entry.type) == 0) break;
    const auto value = entry.first_value();
    if (value && !store(thumbnail, exif, entry.tag, *value)) reachable = false;
  }
  if (thumbnail.length != 0 && reachable) search.accept(thumbnail);
  return true;
}

}  // namespace

bool read_exif(const Segment& segment, ThumbnailSearch& search) {
  if (!segment.holds(kIdentifier + tiff::kHeaderSize)) return true;
  const uint8_t* bytes = source_take(segment.source, kIdentifier + tiff::kHeaderSize);
  if (std::memcmp(bytes, "Exif\0", kIdentifier) != 0) return true;
  const auto header = tiff::parse_header(bytes + kIdentifier);
  if (!header) return true;
  const Exif exif{segment, int64_t{source_offset(segment.source)} - tiff::kHeaderSize, *header};
  uint32_t ifd1;
  if (!find_ifd1(exif, ifd1)) return false;
  return ifd1 == 0 || read_ifd1(exif, ifd1, search);
}

}  // namespace pelo::jpeg
