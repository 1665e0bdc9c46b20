// The thumbnail that an EXIF segment describes in its second directory, IFD1.
#include <cstring>

#include "codec/formats/jpeg/header_scan_segments.h"
#include "codec/formats/jpeg/ifd1_thumbnail.h"
#include "codec/formats/jpeg/tiff.h"

namespace pelo::jpeg {
namespace {

constexpr uint32_t kIdentifier = 6;  // "Exif", two zeros

// The segment's TIFF structure; offsets in it count from its header.
struct Exif {
  const Segment& segment;
  int64_t base;
  tiff::Header header;

  // True when a directory, which begins with a 16-bit count, can start there.
  bool inside(uint32_t offset) const { return base + offset + 2 <= segment.end; }
};

// The ten words by the names that the scans' record has for them.
PELOJ_THUMBNAIL scanned(const TAVIRPELO_EXIFTHUMBNAIL& t) {
  const auto number = [](uint32_t value) { return static_cast<int32_t>(value); };
  return {0,
          number(t.width),
          number(t.height),
          number(t.compression),
          number(t.photometric),
          t.length,
          number(t.tag4173),
          number(t.planarConfig),
          t.offset,
          0};
}

// Reads a directory's entry count at the current position; false when the data ends.
bool read_count(const Exif& exif, uint16_t& count) {
  if (!exif.segment.source.need(2)) return false;
  count = tiff::load16(exif.segment.source.take(2), exif.header.order);
  return true;
}

// Finds IFD1 behind IFD0; 0 when there is none inside the segment. False when the data ends.
bool find_ifd1(const Exif& exif, uint32_t& ifd1) {
  PELOJ_SOURCE& source = exif.segment.source;
  ifd1 = 0;
  if (exif.header.ifd0 < tiff::kHeaderSize || !exif.inside(exif.header.ifd0)) return true;
  uint16_t count;
  if (!source.skip(int64_t{exif.header.ifd0} - tiff::kHeaderSize) || !read_count(exif, count) ||
      !source.skip(int64_t{count} * tiff::kEntrySize) || !source.need(4)) {
    return false;
  }
  ifd1 = tiff::load32(source.take(4), exif.header.order);
  if (!exif.inside(ifd1)) ifd1 = 0;
  return true;
}

// Reads entries until their number, the segment or the known types end; false when the data ends.
bool read_ifd1(const Exif& exif, uint32_t ifd1, ThumbnailSearch& search) {
  PELOJ_SOURCE& source = exif.segment.source;
  uint16_t count;
  if (!source.move_to(exif.base + ifd1) || !read_count(exif, count)) return false;
  TAVIRPELO_EXIFTHUMBNAIL thumbnail{};
  bool reachable = true;
  for (; count > 0; --count) {
    if (!source.need(tiff::kEntrySize)) return false;
    if (exif.segment.left() < tiff::kEntrySize) break;
    const tiff::Entry entry = tiff::parse_entry(source.take(tiff::kEntrySize), exif.header.order);
    if (tiff::type_size(entry.type) == 0) break;
    const auto value = entry.first_value();
    const ThumbnailTag* tag = thumbnail_tag(entry.tag);
    if (value && tag != nullptr && !store_thumbnail(thumbnail, *tag, *value, exif.base)) {
      reachable = false;
    }
  }
  if (thumbnail.length != 0 && reachable) search.accept(scanned(thumbnail));
  return true;
}

}  // namespace

bool read_exif(const Segment& segment, ThumbnailSearch& search) {
  if (!segment.holds(kIdentifier + tiff::kHeaderSize)) return true;
  const uint8_t* bytes = segment.source.take(kIdentifier + tiff::kHeaderSize);
  if (std::memcmp(bytes, "Exif\0", kIdentifier) != 0) return true;
  const auto header = tiff::parse_header(bytes + kIdentifier);
  if (!header) return true;
  const Exif exif{segment, int64_t{segment.source.tell()} - tiff::kHeaderSize, *header};
  uint32_t ifd1;
  if (!find_ifd1(exif, ifd1)) return false;
  return ifd1 == 0 || read_ifd1(exif, ifd1, search);
}

}  // namespace pelo::jpeg
