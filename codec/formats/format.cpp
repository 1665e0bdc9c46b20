#include "codec/formats/format.h"

#include "codec/base/io.h"

namespace pelo {

int parse_source(TAVIRPELO_DECINFO& decInfo, TAVIRPELO_HINFO* hinfo, Detect detect) {
  if (hinfo != nullptr) *hinfo = {};
  BufferedSource source;
  if (!source.open(decInfo.pIO)) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_MEMORY);
    return TAVIRPELO_FORMAT_UNKNOWN;
  }
  if (seek_io(decInfo.pIO, 0, SEEK_SET) < 0) return TAVIRPELO_FORMAT_UNKNOWN;
  decInfo.imageFormat = detect(decInfo, *source.get(), hinfo);
  if (hinfo != nullptr) {
    hinfo->width = decInfo.imageWidth;
    hinfo->height = decInfo.imageHeight;
    hinfo->sourceSize = static_cast<int>(source->size);
  }
  return decInfo.imageFormat;
}

}  // namespace pelo
