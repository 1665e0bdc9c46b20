// The MSB-first bit writer of entropy-coded segments, with byte stuffing (ITU-T T.81 F.1.2.3).
#pragma once

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "codec/formats/jpeg/encoder/destination.h"

struct ELO_ENCODER;

namespace pelo::jpeg {

// The widest word that shifts in one instruction.
using BitWord = std::conditional_t<sizeof(size_t) == 8, uint64_t, uint32_t>;
constexpr int kBitWordSize = static_cast<int>(sizeof(BitWord) * 8);

// Bits not yet written: the lowest `count` bits of `bits`.
struct PendingBits {
  BitWord bits;
  int count;
};

// Writes into a block whose size its owner has proven sufficient; a word leaves as two bytes a byte at
// most.
struct BitWriter {
  BitWord bits;
  int free;  // bits of the word not yet taken
  uint8_t* next;

  BitWriter(PendingBits pending, uint8_t* out)
      : bits(pending.bits), free(kBitWordSize - pending.count), next(out) {}
  PendingBits pending() const { return {bits, kBitWordSize - free}; }

  // The low `length` bits of `code`, which has none above them; length 0 to 31.
  void put(uint32_t code, int length) {
    free -= length;
    if (free >= 0) [[likely]] {
      bits = bits << length | code;
      return;
    }
    // The word ends inside the code: its upper bits complete it, the others open the next word. Bits
    // already written stay above them and are shifted out.
    bits = bits << (length + free) | code >> -free;
    flush_word();
    bits = code;
    free += kBitWordSize;
  }

  // Writes the complete bytes and keeps the rest.
  void flush_bytes() {
    while (free <= kBitWordSize - 8) {
      free += 8;
      put_byte(static_cast<uint8_t>(bits >> (kBitWordSize - free)));
    }
  }

 private:
  void put_byte(uint8_t byte) {
    *next++ = byte;
    if (byte == 0xFF) *next++ = 0;
  }
  // A byte of 0xFF makes its top bit survive this test; a carry may add a false alarm.
  static bool may_have_ff(BitWord word) {
    constexpr BitWord kOnes = static_cast<BitWord>(0x0101010101010101u);
    return (word & (kOnes << 7) & ~(word + kOnes)) != 0;
  }
  void flush_word() {
    if (may_have_ff(bits)) [[unlikely]] {
      for (int shift = kBitWordSize - 8; shift >= 0; shift -= 8) {
        put_byte(static_cast<uint8_t>(bits >> shift));
      }
      return;
    }
    for (int shift = kBitWordSize - 8; shift >= 0; shift -= 8) {
      *next++ = static_cast<uint8_t>(bits >> shift);
    }
  }
};

// Writes the low `length` (0 to 16) bits of `code`; 1, or 0 when the destination cannot take them.
int write_bits(ELO_ENCODER* encoder, uint32_t code, int length);

// Ends the entropy-coded data: completes the last byte with 1-bits. Nothing pending: writes nothing.
int flush_bits(ELO_ENCODER* encoder);

}  // namespace pelo::jpeg
