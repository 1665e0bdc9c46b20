// The JPEG part of the header information record: the picture's size and its thumbnail's.
#include "codec/base/errors.h"
#include "codec/base/io.h"
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
    if (!source_reposition(*source.get(), header.thumbnail.offset)) {
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

}  // namespace pelo::jpeg
