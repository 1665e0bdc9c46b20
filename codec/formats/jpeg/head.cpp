#include "codec/formats/jpeg/head.h"

#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {

bool sniff(const uint8_t* head) {
  return head[0] == 0xFF && head[1] == static_cast<uint8_t>(Marker::kSoi);
}

// Without a record to fill, the walk to the frame is spared, and the object's sizes stay.
int parse_head(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo) {
  if (hinfo == nullptr) return TAVIRPELO_FORMAT_JPEG;
  if (!header_info(source.io, hinfo)) return cut_head("JPEG headers");
  return found(decInfo, hinfo, TAVIRPELO_FORMAT_JPEG, static_cast<uint32_t>(hinfo->width),
               static_cast<uint32_t>(hinfo->height));
}

int detect(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo) {
  if (!source_need(source, kSniffBytes) && source.avail == 0) return cut_head("JPEG headers");
  if (sniff(source.buffer + source.pos)) return parse_head(decInfo, source, hinfo);
  return refuse(Reason::kUnknownFormat, "JPEG headers"), TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace pelo::jpeg
