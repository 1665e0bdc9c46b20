// The application segments in which a header scan finds embedded thumbnails.
#pragma once

#include <cstdint>

#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {

// The rest of a segment behind its length. Everything read from it is first checked against its end.
struct Segment {
  PELOJ_SOURCE& source;
  int64_t end;  // source offset of the byte behind the segment

  int64_t left() const { return end - source.tell(); }
  // True when n more bytes belong to the segment and are in the buffer.
  [[nodiscard]] bool holds(uint32_t n) const { return left() >= n && source.need(n); }
  // Consumes to the segment's end from wherever its reader stopped, before or behind it.
  [[nodiscard]] bool leave() const { return left() >= 0 ? source.skip(left()) : source.move_to(end); }
};

// What a scan collects: the last usable thumbnail.
struct ThumbnailSearch {
  PELOJ_THUMBNAIL& found;
  uint32_t jfifPixels = 0;  // width x height that a JFIF segment gave for its thumbnail

  void accept(const PELOJ_THUMBNAIL& thumbnail) {
    found = thumbnail;
    found.present = 1;
  }
};

// One reader a kind of segment. It may stop anywhere; false refuses the whole file.
using SegmentReader = bool (*)(const Segment& segment, ThumbnailSearch& search);

bool read_jfif(const Segment& segment, ThumbnailSearch& search);       // APP0: T.871 clause 10
bool read_exif(const Segment& segment, ThumbnailSearch& search);       // APP1: IFD1
bool read_photoshop(const Segment& segment, ThumbnailSearch& search);  // APP13: image resources

}  // namespace pelo::jpeg
