// Finding markers and segment lengths: the part of marker parsing that measuring and decoding share.
#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/header_scan.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {

bool find_soi(PELOJ_SOURCE& source) {
  bool afterFf = false;
  while (source_need(source, 1)) {
    const uint8_t byte = *source_take(source, 1);
    if (afterFf && byte == static_cast<uint8_t>(Marker::kSoi)) return true;
    afterFf = byte == 0xFF;
  }
  return false;
}

bool next_marker(PELOJ_SOURCE& source, uint8_t& code) {
  bool afterFf = false;
  while (source_need(source, 1)) {
    const uint8_t byte = *source_take(source, 1);
    if (afterFf && byte != 0xFF) {
      code = byte;
      return true;
    }
    afterFf = byte == 0xFF;
  }
  return false;
}

bool segment_length(PELOJ_SOURCE& source, uint32_t& remaining) {
  if (!source_need(source, 2)) return false;
  const uint32_t length = load_be16(source_take(source, 2));
  if (length < 2) return false;
  remaining = length - 2;
  return true;
}

bool has_segment(Marker code) {
  return (code >= Marker::kApp0 && code <= Marker::kApp15) || code == Marker::kDht ||
         code == Marker::kDqt || code == Marker::kDri || code == Marker::kCom || code == Marker::kDnl;
}

bool skip_segment(PELOJ_SOURCE& source) {
  uint32_t remaining;
  return segment_length(source, remaining) && source_skip(source, remaining);
}

}  // namespace pelo::jpeg
