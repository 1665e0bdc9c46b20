#include "codec/formats/jpeg/marker_walk.h"

#include "codec/base/byte_order.h"

namespace pelo::jpeg {

bool find_soi(PELOJ_SOURCE& source) {
  bool afterFf = false;
  while (source.need(1)) {
    const uint8_t byte = *source.take(1);
    if (afterFf && byte == static_cast<uint8_t>(Marker::kSoi)) return true;
    afterFf = byte == 0xFF;
  }
  return false;
}

bool next_marker(PELOJ_SOURCE& source, uint8_t& code) {
  bool afterFf = false;
  while (source.need(1)) {
    const uint8_t byte = *source.take(1);
    if (afterFf && byte != 0xFF) {
      code = byte;
      return true;
    }
    afterFf = byte == 0xFF;
  }
  return false;
}

bool segment_length(PELOJ_SOURCE& source, uint32_t& remaining) {
  if (!source.need(2)) return false;
  const uint32_t length = load_be16(source.take(2));
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
  return segment_length(source, remaining) && source.skip(remaining);
}

FrameHead load_frame_head(const uint8_t* bytes) {
  return {bytes[0], load_be16(bytes + 1), load_be16(bytes + 3)};
}

bool read_frame_head(PELOJ_SOURCE& source, FrameHead& head, uint32_t& remaining) {
  if (!segment_length(source, remaining) || remaining < kFrameHeadBytes ||
      !source.need(kFrameHeadBytes)) {
    return false;
  }
  head = load_frame_head(source.take(kFrameHeadBytes));
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
      const bool known = source.need(kPrecision + 1);
      const bool twelve = known && source.buffer[source.pos + kPrecision] == 12;
      return twelve ? Reason::kTwelveBit : Reason::kVariant;
    }
    default:
      return Reason::kNone;
  }
}

}  // namespace pelo::jpeg
