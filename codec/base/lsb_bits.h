// Bits packed into bytes least significant first, as GIF and DEFLATE pack them.
#pragma once

#include <cstdint>

#include "codec/base/byte_order.h"

namespace pelo {

// A queue of up to 63 bits. It is a value: keeping a copy keeps the place in the data.
class LsbBits {
 public:
  int count() const { return count_; }

  // Moves whole bytes of [next, end) into the queue: at least 56 bits are then there, or the range is
  // used up. The branchless refill of F. Giesen, "Reading bits in far too many ways" (variant 4).
  void fill(const uint8_t*& next, const uint8_t* end) {
    if (end - next >= 8) {
      // Of the last byte loaded only some bits may fit. They stay above count_ and are there already
      // when the byte is loaded again.
      bits_ |= load_le64(next) << count_;
      next += (63 - count_) >> 3;
      count_ |= 56;
      return;
    }
    for (; count_ < 56 && next < end; count_ += 8) bits_ |= uint64_t{*next++} << count_;
  }

  // Takes `width` bits (1 to 31), which must be there.
  uint32_t take(int width) {
    const auto value = static_cast<uint32_t>(bits_ & ((uint64_t{1} << width) - 1));
    bits_ >>= width;
    count_ -= width;
    return value;
  }

 private:
  uint64_t bits_ = 0;
  int count_ = 0;
};

}  // namespace pelo
