// The thumbnail that an EXIF segment describes in IFD1: where it is, and how large.
#include <climits>

#include "codec/formats/jpeg/exif/exif_members.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/jpeg/ifd1_thumbnail.h"

namespace pelo::jpeg {

namespace {

bool read_frame_size(Source& source, uint32_t& width, uint32_t& height) {
  FrameHead head;
  uint32_t remaining;
  if (!read_frame_head(source, head, remaining) || head.precision != 8) return false;
  height = static_cast<uint32_t>(head.height);
  width = static_cast<uint32_t>(head.width);
  return source.skip(remaining);
}

// Walks to the first scan; false when the data ends before it.
bool read_resolution(Source& source, uint32_t& width, uint32_t& height) {
  uint8_t code;
  while (next_marker(source, code)) {
    const Marker marker{code};
    if (marker == Marker::kSos) return true;
    if (marker == Marker::kSof0 || marker == Marker::kSof2) {
      if (!read_frame_size(source, width, height)) return false;
    } else if (has_segment(marker) && !skip_segment(source)) {
      return false;
    }
  }
  return false;
}

}  // namespace

int jpeg_size(const uint8_t* data, uint32_t size, uint32_t* width, uint32_t* height) {
  if (size < 2 || size > INT_MAX || data[0] != 0xFF || data[1] != static_cast<uint8_t>(Marker::kSoi)) {
    return PELOJ_FAIL;
  }
  Source source = Source::over(const_cast<uint8_t*>(data), size);
  source.take(2);
  uint32_t seenWidth = 0;
  uint32_t seenHeight = 0;
  if (!read_resolution(source, seenWidth, seenHeight)) return PELOJ_FAIL;
  *width = seenWidth;
  *height = seenHeight;
  return PELOJ_OK;
}

void read_thumbnail_directory(const tiff::Structure& tiff, uint32_t offset,
                              TAVIRPELO_EXIFTHUMBNAIL& thumbnail) {
  walk_directory(tiff, offset, [&](const Field& field) {
    const ThumbnailTag* tag = thumbnail_tag(field.tag);
    if (tag == nullptr || !tag->standard(field.type, field.count)) return true;
    if (!store_thumbnail(thumbnail, *tag, field.number, tiff.base)) thumbnail.offset = 0;
    if (tag->part == ThumbnailPart::kJpegOffset && tiff.holds(field.number, 0)) {
      jpeg_size(tiff.data + field.number, tiff.size - field.number, &thumbnail.width, &thumbnail.height);
    }
    return true;
  });
  thumbnail.present = thumbnail.length != 0;
}

}  // namespace pelo::jpeg
