// Decoding tables for the prefix codes of DEFLATE (RFC 1951, 3.2.2).
//
// A table is looked up with the next bits of the stream, first bit lowest. Codes longer than the root's
// index continue in a subtable, so that any symbol takes two look-ups at most.
//
// Entry:  bits  0-7   bits to drop: the code, and for lengths and distances their extra bits
//         bits  8-11  bits of the code alone (inside a subtable: of its rest); of a link: the subtable's
//                     index bits
//         bits 12-15  kind
//         bits 16-31  literal, base length, base distance, or offset of the subtable
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "tavirpelo/api.h"

namespace pelo::png {

enum class Alphabet { kLiteralLength = 0, kDistance = 1, kCodeLength = 2 };

constexpr uint32_t kEntryLiteral = 1u << 12;  // also distances and code lengths: a value, no match
constexpr uint32_t kEntryEnd = 1u << 13;
constexpr uint32_t kEntryLink = 1u << 14;
constexpr uint32_t kEntryInvalid = 1u << 15;  // no code reaches here, or its symbol may not be used

constexpr int kLiteralRootBits = 11;
constexpr int kDistanceRootBits = 8;
constexpr int kCodeLengthRootBits = 7;
constexpr int root_bits(Alphabet alphabet) {
  switch (alphabet) {
    case Alphabet::kLiteralLength:
      return kLiteralRootBits;
    case Alphabet::kDistance:
      return kDistanceRootBits;
    default:
      return kCodeLengthRootBits;
  }
}

constexpr int kMaxCodeLength = 15;
constexpr size_t kMaxSymbols = 288;

// Room for one table of each alphabet: roots of 2048, 256 and 128 entries, and subtables, which codes in
// canonical order fill but for a few at their changes of length.
constexpr size_t kPoolEntries = 4096;

}  // namespace pelo::png

// Tables of one kind of block. `used` entries are taken; a new set begins by setting it to 0.
typedef struct PELOI_PNGHUFFMANPOOL {
  uint32_t used;
  std::array<uint32_t, pelo::png::kPoolEntries> entries;
} PELOI_PNGHUFFMANPOOL;

namespace pelo::png {

// Builds the table of `count` symbols (at most 288) whose code lengths are given (0 to 15; 0 unused) in
// the pool. Alphabet 0 literal/length, 1 distance, 2 code length. Returns its root; null when the
// lengths are over-subscribed or the pool is full. Incomplete sets are accepted: their unassigned codes
// lead to invalid entries.
const uint32_t* build_table(const uint8_t* lengths, int count, int alphabet, PELOI_PNGHUFFMANPOOL* pool);

// Frees a pool and clears its slot.
void free_table(PELOI_PNGHUFFMANPOOL** pool);

}  // namespace pelo::png
