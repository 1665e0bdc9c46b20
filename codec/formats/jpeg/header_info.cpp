// What others learn of a file's head: the JPEG part of the header information record, and the format.
#include "codec/base/errors.h"
#include "codec/base/io.h"
#include "codec/formats/format.h"
#include "codec/formats/jpeg/header_scan.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

int fail(const char* message) {
  log_error(message);
  return 0;
}

}  // namespace

int header_info(TAVIRPELO_IO* io, TAVIRPELO_HINFO* hinfo) {
  if (io == nullptr || hinfo == nullptr) return 0;
  BufferedSource source;
  if (!source.open(io)) {
    refuse(Reason::kNoMemory, "JPEG headers");
    return fail("PELOJ_GetHInfo : malloc Fail");
  }
  if (seek_io(io, 0, SEEK_SET) < 0) return fail("PELOJ_GetHInfo : seek Fail");
  PELOJ_FILEHEADER header{};
  if (scan_file_header(source.get(), kScanMode, &header) != PELOJ_OK) {
    return fail("PELOJ_GetHInfo : PELOJ_SimpleParser Fail");
  }

  PELOJ_FILEHEADER small{};
  if (header.thumbnail.type == PELOJ_THUMBNAIL_JPEG &&
      thumbnail_in_source(header.thumbnail, source->size)) {
    if (!source.get()->move_to(header.thumbnail.offset)) {
      return fail("TAVIRPELO_DecodeJPEG : seek Fail");
    }
    if (scan_size(source.get(), kScanMode, &small) != PELOJ_OK) {
      begin_operation();  // a picture without a readable thumbnail has not failed
      small = {};
    }
  }
  hinfo->width = header.width;
  hinfo->height = header.height;
  hinfo->progressive = header.progressive;
  hinfo->hasThumbnail = header.thumbnail.present;
  hinfo->thumbnailWidth = small.width;
  hinfo->thumbnailHeight = small.height;
  return 1;
}

// ---- format detection ----

bool sniff(const uint8_t* head) {
  return head[0] == 0xFF && head[1] == static_cast<uint8_t>(Marker::kSoi);
}

// Without a record to fill, the walk to the frame is spared, and the object's sizes stay.
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (hinfo == nullptr) return TAVIRPELO_FORMAT_JPEG;
  if (!header_info(source.io, hinfo)) return cut_head("JPEG headers");
  return found(decInfo, hinfo, TAVIRPELO_FORMAT_JPEG, static_cast<uint32_t>(hinfo->width),
               static_cast<uint32_t>(hinfo->height));
}

int detect(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (!source.need(kSniffBytes) && source.avail == 0) return cut_head("JPEG headers");
  if (sniff(source.next())) return parse_head(decInfo, source, hinfo);
  return refuse(Reason::kUnknownFormat, "JPEG headers"), TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace pelo::jpeg
