#include "codec/formats/bmp/head.h"

#include "codec/base/byte_order.h"
#include "codec/base/errors.h"

namespace pelo::bmp {
namespace {

constexpr uint32_t kMaxWbmpSide = 5000;
constexpr uint32_t kWbmpSizeBytes =
    17;  // both sizes end within so many bytes of the two that open the file

enum class Multibyte { kRead, kTooLong, kCut };

// A multi-byte integer of at most `room` bytes: seven bits each, most significant first, bit 7 set on
// all but the last. Bits above the 32nd are lost.
Multibyte read_multibyte(Source& source, uint32_t& room, uint32_t& value) {
  value = 0;
  for (uint8_t byte = 0x80; byte & 0x80;) {
    if (room-- == 0) return Multibyte::kTooLong;
    if (!source.need(1)) return Multibyte::kCut;
    byte = *source.take(1);
    value = value << 7 | (byte & 0x7F);
  }
  return Multibyte::kRead;
}

}  // namespace

bool sniff(const uint8_t* head) {
  return head[0] == 'B' && head[1] == 'M';
}

int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (!source.need(26)) return cut_head("BMP header");
  const uint8_t* head = source.next();
  return found(decInfo, hinfo, TAVIRPELO_FORMAT_BMP, load_le32(head + 18), load_le32(head + 22));
}

bool sniff_wbmp(const uint8_t* head) {
  return head[0] == 0 && head[1] < 0x80;
}

int parse_wbmp_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo) {
  if (hinfo != nullptr) hinfo->frameCount = 1;
  return parse_wbmp_sizes(decInfo, source);
}

int parse_wbmp_sizes(TAVIRPELO_DECINFO& decInfo, Source& source) {
  if (source.size <= 3) return TAVIRPELO_FORMAT_UNKNOWN;
  if (!source.need(2)) return cut_head("WBMP header");
  source.take(2);
  uint32_t room = kWbmpSizeBytes;
  uint32_t size[2];
  for (uint32_t& side : size) {
    const Multibyte result = read_multibyte(source, room, side);
    if (result == Multibyte::kCut) return cut_head("WBMP header");
    if (result == Multibyte::kTooLong) return TAVIRPELO_FORMAT_UNKNOWN;
  }
  found(decInfo, nullptr, TAVIRPELO_FORMAT_WBMP, size[0], size[1]);
  if (size[0] <= kMaxWbmpSide && size[1] <= kMaxWbmpSide) return TAVIRPELO_FORMAT_WBMP;
  return TAVIRPELO_FORMAT_UNKNOWN;
}

}  // namespace pelo::bmp
