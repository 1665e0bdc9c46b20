// The MSB-first bit reader of entropy-coded segments: removes byte stuffing, stops at markers, and
// supplies zeros behind the end so that the decoders need no checks inside a block.
#pragma once

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "codec/base/byte_order.h"
#include "codec/base/source.h"
#include "codec/formats/jpeg/decoder/huffman.h"

namespace pelo::jpeg {

struct Entropy;

// The widest word that shifts in one instruction.
using BitBuffer = std::conditional_t<sizeof(size_t) == 8, uint64_t, uint32_t>;
constexpr int kBitBufferSize = static_cast<int>(sizeof(BitBuffer) * 8);

// Held after every fill. In 64 bits 32 are enough for a code and its extra bits (16 + 15), and fewer
// than 32 leave room for four bytes at once. In 32 bits whole bytes fit in while at most 24 are held, so
// that 25 are sure: a code, or its extra bits after another fill. A code that is none takes 17 bits and
// has no extra bits; an entry of the skip table (huffman.h) takes up to 27, which 32-bit buffers are
// asked about.
constexpr int kFilledBits = kBitBufferSize == 64 ? 32 : 25;
constexpr int kMaxExtraBits = 15;
static_assert(kFilledBits >= kMaxCodeLength + (kBitBufferSize == 64 ? kMaxExtraBits : 1));

// What outlives an MCU. The unread bits are the lowest `left` bits of `bits`; of these the lowest
// `invented` are zeros that no source delivered. left < invented: the decoder has consumed some of them.
struct BitState {
  BitBuffer bits;
  int left;
  int invented;
};

// The state with the window it reads from, kept in locals by the decoders.
struct BitReader {
  BitState state;
  const uint8_t* next;
  const uint8_t* end;
  const uint8_t* plainEnd;  // end, or next once a marker was met: what may be read without looking
  PELOJ_SOURCE* source;
  Entropy* entropy;

  void fill();
  // n: 1 to 17, and no more than are held. Shifts stay below the width: at most all bits are held, and
  // one at least is asked for.
  uint32_t peek(int n) const {
    return static_cast<uint32_t>(state.bits >> (state.left - n)) & ((1u << n) - 1);
  }
  void drop(int n) { state.left -= n; }
  uint32_t take(int n) {
    drop(n);
    return static_cast<uint32_t>(state.bits >> state.left) & ((1u << n) - 1);
  }
};

// The value of s extra bits (T.81 F.12 EXTEND): below 2^(s-1) they stand for v - 2^s + 1.
inline int32_t extend(uint32_t v, int s) {
  const int32_t low = PELOJ_HUFF_EXTEND_TEST[s];
  const int32_t value = static_cast<int32_t>(v);
  return value - ((value - low) >> 31 & (2 * low - 1));
}

// The source has ended: for a picture in several scans, as if an EOI had been met.
void meet_end(Entropy& entropy);

// Takes the reader's window from the source, and gives it back.
BitReader open_bits(PELOJ_SOURCE& source, Entropy& entropy);
void close_bits(const BitReader& reader);

// Fills by single bytes: stuffing, markers, the window's edge, the end. Returns the filled reader.
BitReader fill_by_bytes(BitReader reader);

// True when any byte of the word is 0xFF: the zero-byte test of A. Mycroft on the complement.
constexpr bool has_ff(uint32_t word) {
  return ((~word - 0x01010101u) & word & 0x80808080u) != 0;
}

inline void BitReader::fill() {
  if (state.left >= kFilledBits) return;
  if constexpr (kBitBufferSize == 64) {
    if (plainEnd - next >= 4) {
      const uint32_t word = load_be32(next);
      if (!has_ff(word)) {
        state.bits = state.bits << 32 | word;
        state.left += 32;
        next += 4;
        return;
      }
    }
  }
  *this = fill_by_bytes(*this);
}

// The symbol of a code longer than kLookBits; 0, as an end of block, for one longer than 16.
uint32_t decode_long_code(BitReader& reader, const DerivedTable& table);

// One symbol of a filled reader.
inline uint32_t decode_symbol(BitReader& reader, const DerivedTable& table) {
  const uint32_t entry = table.lookup[reader.peek(kLookBits)];
  if (entry != 0) [[likely]] {
    reader.drop(static_cast<int>(entry >> 8));
    return entry & 0xFF;
  }
  return decode_long_code(reader, table);
}

// Refills reader->state from the given buffer and count. 1: the state holds `needed` bits, or zeros in
// place of those that a marker cut off; 0: the source ended and fewer than `needed` bits are real.
int refill_bits(pelo::jpeg::BitReader* reader, pelo::jpeg::BitBuffer buffer, int bitsLeft, int needed);

// Decodes one symbol from the given buffer and count, trying code lengths from minBits on; 0 for a code
// longer than 16 bits, -1 when the source failed. The reader's state stands behind the code.
int decode_code(pelo::jpeg::BitReader* reader, pelo::jpeg::BitBuffer buffer, int bitsLeft,
                const pelo::jpeg::DerivedTable* derived, int minBits);

}  // namespace pelo::jpeg
