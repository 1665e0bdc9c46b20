// The three header scans: one walk over the markers up to the first scan, which differ in the segments
// that are searched for thumbnails.
#include "codec/formats/jpeg/header_scan.h"

#include <cstddef>

#include "codec/formats/jpeg/header_scan_segments.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {

static_assert(sizeof(PELOJ_THUMBNAIL) == 40 && offsetof(PELOJ_THUMBNAIL, length) == 20 &&
              offsetof(PELOJ_THUMBNAIL, offset) == 32);

namespace {

// Segments that a scan looks into; null: skipped like any other.
struct ScanPolicy {
  SegmentReader app0;
  SegmentReader app1;
  SegmentReader app13;

  constexpr SegmentReader reader(Marker code) const {
    switch (code) {
      case Marker::kApp0:
        return app0;
      case Marker::kApp1:
        return app1;
      case Marker::kApp13:
        return app13;
      default:
        return nullptr;
    }
  }
};
constexpr ScanPolicy kEverything{read_jfif, read_exif, read_photoshop};
constexpr ScanPolicy kExifOnly{nullptr, read_exif, nullptr};
constexpr ScanPolicy kSizeOnly{nullptr, nullptr, nullptr};

constexpr const char* kStage = "JPEG headers";

bool valid_side(int side) {
  return side >= 1 && side <= kMaxSide;
}

// SOF0, SOF2.
bool read_frame(PELOJ_SOURCE& source, Marker code, PELOJ_FILEHEADER& result) {
  FrameHead head;
  uint32_t remaining;
  if (!read_frame_head(source, head, remaining)) return false;
  if (head.precision != 8 || !valid_side(head.height) || !valid_side(head.width)) {
    return refuse_frame(head, kStage);
  }
  result.width = head.width;
  result.height = head.height;
  if (code == Marker::kSof2) result.progressive = 1;
  return source.skip(remaining);
}

bool search_segment(PELOJ_SOURCE& source, SegmentReader reader, ThumbnailSearch& search) {
  uint32_t remaining;
  if (!segment_length(source, remaining)) return false;
  const Segment segment{source, int64_t{source.tell()} + remaining};
  if (segment.end >= source.size) return false;
  if (!reader(segment, search)) return refuse(Reason::kDamaged, kStage, "an application segment");
  return segment.leave();
}

int scan(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result, const ScanPolicy& policy) {
  if (source == nullptr || result == nullptr || (mode != 2 && mode != kScanMode)) return PELOJ_FAIL;
  if (!find_soi(*source)) return refuse(Reason::kUnknownFormat, kStage), PELOJ_FAIL;
  ThumbnailSearch search{result->thumbnail};
  uint8_t code;
  while (next_marker(*source, code)) {
    const Marker marker{code};
    bool passed = true;
    if (marker == Marker::kSos) return PELOJ_OK;
    if (marker == Marker::kSof0 || marker == Marker::kSof2) {
      passed = read_frame(*source, marker, *result);
    } else if (const SegmentReader reader = policy.reader(marker)) {
      passed = search_segment(*source, reader, search);
    } else if (has_segment(marker)) {
      passed = skip_segment(*source);
    }
    if (!passed) break;
  }
  // Whatever has given no reason ran out of data.
  return refuse(Reason::kTruncated, kStage), PELOJ_FAIL;
}

}  // namespace

bool thumbnail_in_source(const PELOJ_THUMBNAIL& thumbnail, uint32_t sourceSize) {
  return thumbnail.present != 0 && thumbnail.offset != 0 &&
         uint64_t{thumbnail.offset} + thumbnail.length < sourceSize;
}

int scan_file_header(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result) {
  return scan(source, mode, result, kEverything);
}

int scan_exif_thumbnail(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result) {
  return scan(source, mode, result, kExifOnly);
}

int scan_size(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result) {
  return scan(source, mode, result, kSizeOnly);
}

}  // namespace pelo::jpeg
