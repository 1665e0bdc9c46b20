// Thumbnails in JFIF and JFXX segments (ITU-T T.871 clauses 10.1 and 10.2).
#include <cstring>

#include "codec/formats/jpeg/header_scan_segments.h"

namespace pelo::jpeg {
namespace {

constexpr uint32_t kIdentifier = 5;  // four letters and a zero
constexpr uint32_t kJfifFields = 9;  // version, units, densities, thumbnail width and height

enum ExtensionCode : uint8_t { kJpegThumbnail = 0x10, kPaletteThumbnail = 0x11, kRgbThumbnail = 0x13 };

// A thumbnail of what is left of the segment.
PELOJ_THUMBNAIL rest_of(const Segment& segment, int32_t type) {
  PELOJ_THUMBNAIL thumbnail{};
  thumbnail.type = type;
  thumbnail.layout = type == PELOJ_THUMBNAIL_PIXELS ? 2 : 0;
  thumbnail.length = static_cast<uint32_t>(segment.left());
  thumbnail.offset = segment.source.tell();
  return thumbnail;
}

void read_jfif_thumbnail(const Segment& segment, ThumbnailSearch& search) {
  if (!segment.holds(kJfifFields)) return;
  const uint8_t* fields = segment.source.take(kJfifFields);
  PELOJ_THUMBNAIL thumbnail = rest_of(segment, PELOJ_THUMBNAIL_PIXELS);
  thumbnail.width = fields[7];
  thumbnail.height = fields[8];
  search.jfifPixels = uint32_t{fields[7]} * fields[8];
  if (search.jfifPixels != 0 && thumbnail.length == 3 * search.jfifPixels) search.accept(thumbnail);
}

void accept_pixels(const Segment& segment, ThumbnailSearch& search, uint32_t bytes) {
  if (bytes != 0 && segment.left() == bytes) search.accept(rest_of(segment, PELOJ_THUMBNAIL_PIXELS));
}

// Pixels are believed only when they fill the size that an earlier JFIF segment gave.
void read_jfxx_thumbnail(const Segment& segment, ThumbnailSearch& search) {
  if (!segment.holds(1)) return;
  switch (*segment.source.take(1)) {
    case kJpegThumbnail:
      return search.accept(rest_of(segment, PELOJ_THUMBNAIL_JPEG));
    case kPaletteThumbnail:
      return accept_pixels(segment, search, search.jfifPixels);
    case kRgbThumbnail:
      return accept_pixels(segment, search, 3 * search.jfifPixels);
    default:
      return search.accept(rest_of(segment, PELOJ_THUMBNAIL_STRIP));
  }
}

}  // namespace

bool read_jfif(const Segment& segment, ThumbnailSearch& search) {
  if (!segment.holds(kIdentifier)) return true;
  const uint8_t* identifier = segment.source.take(kIdentifier);
  if (std::memcmp(identifier, "JFIF", kIdentifier) == 0) read_jfif_thumbnail(segment, search);
  if (std::memcmp(identifier, "JFXX", kIdentifier) == 0) read_jfxx_thumbnail(segment, search);
  return true;
}

}  // namespace pelo::jpeg
