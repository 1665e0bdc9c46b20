#include "codec/formats/png/head.h"

#include <cstring>

#include "codec/base/byte_order.h"

namespace pelo::png {

bool sniff(const uint8_t* head) {
  constexpr uint8_t kSignature[8] = {0x89, 'P', 'N', 'G', 0x0D, 0x0A, 0x1A, 0x0A};
  return std::memcmp(head, kSignature, sizeof kSignature) == 0;
}

int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  // The last byte of the height may lie behind the source's end: the buffer holds a zero there.
  if (!source.need(23)) return cut_head("PNG header");
  const uint8_t* head = source.next();
  return found(decInfo, hinfo, TAVIRPELO_FORMAT_PNG, load_be32(head + 16), load_be32(head + 20));
}

}  // namespace pelo::png
