// The way to the EXIF data: the APP1 segment among a JPEG's markers, and the TIFF header inside it.
#include <algorithm>
#include <cstring>

#include "codec/formats/jpeg/exif/exif_reader.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

// Reads n bytes, more than the reader's window if need be.
bool read(PELOJ_SOURCE& source, uint8_t* bytes, uint32_t n) {
  while (n > 0) {
    if (!source.need(1)) return false;
    const uint32_t part = std::min(n, source.avail);
    std::memcpy(bytes, source.take(part), part);
    bytes += part;
    n -= part;
  }
  return true;
}

// True with the cursor at the TIFF header when the segment that `remaining` bytes are left of is EXIF;
// `remaining` then counts from there. Otherwise the segment has been passed; `lost` when that failed.
bool enter_exif(PELOJ_SOURCE& cursor, uint32_t& remaining, bool& lost) {
  const int64_t end = int64_t{cursor.tell()} + remaining;
  if (remaining >= kExifIdentifierSize && end <= cursor.size && cursor.need(kExifIdentifierSize)) {
    const bool found = is_exif_identifier(cursor.take(kExifIdentifierSize));
    remaining -= kExifIdentifierSize;
    if (found) return true;
  }
  lost = !cursor.skip(remaining);
  return false;
}

// Finds the EXIF segment; false when a length makes no sense or the source ends.
bool find_exif(PELOJ_SOURCE& cursor, uint32_t& remaining) {
  bool lost = false;
  uint8_t code;
  while (!lost && next_marker(cursor, code)) {
    const Marker marker{code};
    if (marker == Marker::kApp1) {
      lost = !segment_length(cursor, remaining);
      if (!lost && enter_exif(cursor, remaining, lost)) return true;
    } else if (has_segment(marker) || marker == Marker::kSof0 || marker == Marker::kSof2 ||
               marker == Marker::kSos) {
      lost = !skip_segment(cursor);
    }
  }
  return false;
}

}  // namespace

bool is_exif_identifier(const uint8_t* bytes) {
  return std::memcmp(bytes, "Exif\0", kExifIdentifierSize) == 0;
}

int find_and_read(PELOJ_SOURCE* cursor, TAVIRPELO_EXIFINFO* info) {
  constexpr uint8_t kStart[] = {0xFF, static_cast<uint8_t>(Marker::kSoi)};
  uint32_t remaining;
  if (!cursor->need(2) || std::memcmp(cursor->take(2), kStart, 2) != 0) return PELOJ_FAIL;
  if (!find_exif(*cursor, remaining)) return PELOJ_FAIL;
  const uint32_t base = cursor->tell();
  OsBuffer<uint8_t> tiff;
  if (!tiff.allocate(remaining) || !read(*cursor, tiff.data(), remaining)) return PELOJ_FAIL;
  return read_structure(tiff.data(), base, remaining, info);
}

int read_structure(const uint8_t* data, uint32_t base, uint32_t size, TAVIRPELO_EXIFINFO* info) {
  if (size < tiff::kHeaderSize) return PELOJ_FAIL;
  const auto header = tiff::parse_header(data);
  if (!header || header->ifd0 >= size) return PELOJ_FAIL;
  const tiff::Structure tiff{data, size, header->order, base};
  const uint32_t ifd1 = read_ifd0(&tiff, header->ifd0, info);
  if (ifd1 != 0) read_thumbnail_directory(tiff, ifd1, info->thumbnail);
  return PELOJ_OK;
}

}  // namespace pelo::jpeg
