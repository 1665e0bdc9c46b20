#include "codec/formats/jpeg/frame_head.h"

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/header_scan.h"

namespace pelo::jpeg {

FrameHead load_frame_head(const uint8_t* bytes) {
  return {bytes[0], load_be16(bytes + 1), load_be16(bytes + 3)};
}

bool read_frame_head(PELOJ_SOURCE& source, FrameHead& head, uint32_t& remaining) {
  if (!segment_length(source, remaining) || remaining < kFrameHeadBytes ||
      !source_need(source, kFrameHeadBytes)) {
    return false;
  }
  head = load_frame_head(source_take(source, kFrameHeadBytes));
  remaining -= kFrameHeadBytes;
  return true;
}

bool refuse_frame(const FrameHead& head, const char* stage) {
  if (head.precision == 12) return refuse(Reason::kTwelveBit, stage);
  if (head.precision != 8) return refuse(Reason::kVariant, stage, "bits a sample");
  if (head.width == 0 || head.height == 0) return refuse(Reason::kZeroSize, stage);
  return refuse_size(stage, head.width, head.height);
}

Reason foreign_process(PELOJ_SOURCE& source, uint8_t code) {
  switch (code) {
    case 0xC3:
    case 0xC7:
    case 0xCB:
      return Reason::kLossless;
    case 0xC9:
    case 0xCA:
    case 0xCD:
    case 0xCE:
    case 0xCF:
      return Reason::kArithmetic;
    case 0xC1:  // extended sequential: what frames of 12 bits come in
    case 0xC5:
    case 0xC6: {
      constexpr uint32_t kPrecision = 2;  // behind the segment's length
      const bool known = source_need(source, kPrecision + 1);
      const bool twelve = known && source.buffer[source.pos + kPrecision] == 12;
      return twelve ? Reason::kTwelveBit : Reason::kVariant;
    }
    default:
      return Reason::kNone;
  }
}

}  // namespace pelo::jpeg
