// The EXIF information object: made from a file, a buffer, an open source or a segment; and its end.
#include <memory>

#include "codec/base/byte_order.h"
#include "codec/base/dec_info.h"
#include "codec/base/io.h"
#include "codec/base/os.h"
#include "codec/formats/jpeg/exif/exif_reader.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/jpeg/marker_codes.h"
#include "platform/android_log.h"

namespace pelo::jpeg {
namespace {

struct DestroyExif {
  void operator()(TAVIRPELO_EXIFINFO* info) const { destroy_info(info); }
};
using ExifInfo = std::unique_ptr<TAVIRPELO_EXIFINFO, DestroyExif>;

ExifInfo new_exif_info() {
  return ExifInfo(os_new<TAVIRPELO_EXIFINFO>().release());
}

TAVIRPELO_EXIFINFO* fail(const char* text) {
  log_error(text);
  return nullptr;
}

void destroy_gps(TAVIRPELO_GPSINFO* gps) {
  if (gps == nullptr) return;
  os_free(gps->mapDatum);
  os_free(gps->processingMethod);
  os_free(gps);
}

// Bytes of the TIFF data behind the ten of marker, length and identifier; 0 when they do not fit.
uint32_t segment_tiff_size(const uint8_t* segment, uint32_t size) {
  constexpr uint32_t kHead = 4 + kExifIdentifierSize;
  if (size < kHead || segment[0] != 0xFF || segment[1] != static_cast<uint8_t>(Marker::kApp1)) return 0;
  const uint32_t end = 2 + uint32_t{load_be16(segment + 2)};  // the length counts itself
  if (end < kHead || end > size || !is_exif_identifier(segment + 4)) return 0;
  return end - kHead;
}

}  // namespace

TAVIRPELO_EXIFINFO* create_info(TAVIRPELO_DECINFO* decInfo) {
  if (decInfo == nullptr) return nullptr;
  ExifInfo info = new_exif_info();
  if (!info) return fail("PELOJ_CreatExifInfo : TAVIRPELO_EXIFINFO is null");
  BufferedSource cursor;
  if (!cursor.open(decInfo->pIO)) return fail("PELOJ_CreatExifInfo : malloc fail");
  if (seek_io(decInfo->pIO, 0, SEEK_SET) < 0) {
    return fail("PELOJ_CreatExifInfo : seek fail");
  }
  if (find_and_read(cursor.get(), info.get()) != PELOJ_OK) {
    return fail("PELOJ_CreatExifInfo : PELOJ_GetExifInfo fail");
  }
  return info.release();
}

TAVIRPELO_EXIFINFO* create_info_of_source(int ioType, void* source, int size) {
  TAVIRPELO_DECINFO* decInfo = create_dec_info(ioType, source, size, TAVIRPELO_RGB565, 0);
  if (decInfo == nullptr) return nullptr;
  TAVIRPELO_EXIFINFO* info = create_info(decInfo);
  destroy_dec_info(decInfo);
  return info;
}

TAVIRPELO_EXIFINFO* create_info_of_segment(const uint8_t* segment, int size) {
  if (segment == nullptr || size < 0) return nullptr;
  const uint32_t length = segment_tiff_size(segment, static_cast<uint32_t>(size));
  ExifInfo info = length == 0 ? nullptr : new_exif_info();
  if (!info) return nullptr;
  constexpr uint32_t kTiff = 4 + kExifIdentifierSize;
  return read_structure(segment + kTiff, kTiff, length, info.get()) == PELOJ_OK ? info.release()
                                                                                : nullptr;
}

int destroy_info(TAVIRPELO_EXIFINFO* info) {
  if (info == nullptr) {
    log_error("PELOJ_DestroyExifInfo : TAVIRPELO_EXIFINFO is null");
    return 0;
  }
  for (char* text : {info->make, info->model, info->software, info->rights, info->captureTime,
                     info->digitizingTime}) {
    os_free(text);
  }
  os_free(info->exifVersion);
  destroy_gps(info->gps);
  os_free(info);
  return 1;
}

}  // namespace pelo::jpeg
