// Light scans that measure a JPEG without preparing a decode: size, progressive flag, embedded
// thumbnail.
//
// How to read this folder: what its rooms share, and the scans that need none of them.
//   constants  marker_codes, tables (T.81 Annex K, the transform's factors); lanes: vectors of a block
//   markers    marker_walk finds them and their segments, for the scans here and the decoder's parser
//   scans      header_scan walks to the first scan; header_scan_jfif, _exif and _photoshop look into
//              the segments that can hold a thumbnail, over tiff and ifd1_thumbnail
//   answers    header_info fills the public record and tells format detection
// The rooms above: decoder and encoder, on these exif and strips, and on all of them transform.
#pragma once

#include <cstdint>

#include "codec/base/source.h"
#include "codec/formats/jpeg/marker_walk.h"
#include "tavirpelo/decinfo.h"
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

// True when the thumbnail's bytes can lie inside a source of `sourceSize` bytes.
[[nodiscard]] bool thumbnail_in_source(const PELOJ_THUMBNAIL& thumbnail, uint32_t sourceSize);

// The head of a file as format detection reads it (codec/formats/format.h).
bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

// The two at once, for rooms that take JPEG alone.
int detect(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::jpeg
