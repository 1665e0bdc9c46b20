// Light scans that measure a JPEG without preparing a decode: size, progressive flag, embedded
// thumbnail.
#pragma once

#include <cstdint>

#include "codec/base/source.h"
#include "codec/formats/jpeg/frame_head.h"
#include "codec/formats/jpeg/marker_codes.h"
#include "tavirpelo/parse.h"

// Results of the decoder's internal stages.
enum { PELOJ_OK = 200, PELOJ_FAIL = 201 };

// Thumbnail types (PELOJ_THUMBNAIL.type).
enum {
  PELOJ_THUMBNAIL_STRIP = 0,   // EXIF strip data
  PELOJ_THUMBNAIL_PIXELS = 1,  // uncompressed pixels
  PELOJ_THUMBNAIL_JPEG = 6,
  PELOJ_THUMBNAIL_PHOTOSHOP = 7  // JPEG inside a Photoshop resource
};

// An embedded thumbnail, ten 32-bit words, all 0 when none was found.
typedef struct PELOJ_THUMBNAIL {
  int32_t present;
  int32_t width;
  int32_t height;
  int32_t type;          // for EXIF the Compression tag first
  int32_t layout;        // 2 for 24-bit RGB; for EXIF PhotometricInterpretation
  uint32_t length;       // bytes of thumbnail data
  int32_t tag4173;       // EXIF tag 0x104D
  int32_t planarConfig;  // EXIF tag 284
  uint32_t offset;       // source offset of the data
  int32_t reserved;
} PELOJ_THUMBNAIL;

// What a scan found, thirteen 32-bit words.
typedef struct PELOJ_FILEHEADER {
  int32_t width;
  int32_t height;
  int32_t progressive;
  PELOJ_THUMBNAIL thumbnail;
} PELOJ_FILEHEADER;
static_assert(sizeof(PELOJ_FILEHEADER) == 13 * 4);

namespace pelo::jpeg {

// Each returns 200 at the first SOS, 201 for a refusal or when data runs out. `mode` is 2 or 8.
// scan_exif_thumbnail looks for EXIF thumbnails alone, scan_size fills only the first three
// words. A failed scan may have filled part of the record.
int scan_file_header(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result);
int scan_exif_thumbnail(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result);
int scan_size(PELOJ_SOURCE* source, int mode, PELOJ_FILEHEADER* result);

// The JPEG part of the header information; 1 or 0.
int header_info(TAVIRPELO_IO* io, TAVIRPELO_HINFO* hinfo);

constexpr int kScanMode = 8;

// The parts of marker walking that the header scans and the decoding parser share.

// Consumes bytes up to and including the first FF D8.
[[nodiscard]] bool find_soi(PELOJ_SOURCE& source);

// Consumes up to the next marker and its code; FF FF counts as a fill byte.
[[nodiscard]] bool next_marker(PELOJ_SOURCE& source, uint8_t& code);

// Reads a segment's 16-bit length and gives the bytes that follow it; false below 2 or at the end.
[[nodiscard]] bool segment_length(PELOJ_SOURCE& source, uint32_t& remaining);

// True for the application, comment and table markers that a length follows; frames and scans, which it
// follows too, are each caller's own concern. Behind other codes the search for markers just goes on.
[[nodiscard]] bool has_segment(Marker code);

// Passes over a segment by its length.
[[nodiscard]] bool skip_segment(PELOJ_SOURCE& source);

// True when the thumbnail's bytes can lie inside a source of `sourceSize` bytes.
[[nodiscard]] bool thumbnail_in_source(const PELOJ_THUMBNAIL& thumbnail, uint32_t sourceSize);

// ---- format detection ----

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

// The two at once, for rooms that take JPEG alone.
int detect(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::jpeg
