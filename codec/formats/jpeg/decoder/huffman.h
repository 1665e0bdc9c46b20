// Huffman decoding tables: what a DHT segment lists (HuffmanSpec) made ready for table look-up
// (ITU-T T.81 Annex C and F.2.2.3).
#pragma once

#include <array>
#include <cstdint>

#include "codec/base/os_memory.h"
#include "codec/formats/jpeg/tables.h"

namespace pelo::jpeg {

// Bits looked at in one step. Most codes of a photograph are shorter; a table stays within 2 KiB, so
// that the tables of a scan share the first-level cache with the samples.
constexpr int kLookBits = 10;
constexpr uint32_t kLookSize = 1u << kLookBits;
constexpr int kMaxCodeLength = 16;

// By the next kSkipBits bits: how far the complete AC codes in them move the position. Wider than a look
// at single codes: the wait for one entry passes several of them. Four bytes for each of 2^12 values are
// half of a first-level cache, which the sample rows of reduced scales leave free; a bit more would take
// all of it.
//   bits 0-15   bits used, with the extra bits of the last code: up to kSkipBits + 15
//   bits 16-22  coefficient positions passed: below 64 before the last code, which passes up to 16
//   bit 23      an end-of-block code was reached
// 0: not even the first code fits.
constexpr int kSkipBits = 12;
constexpr uint32_t kSkipSize = 1u << kSkipBits;
using SkipTable = std::array<uint32_t, kSkipSize>;
constexpr uint32_t kSkipEndOfBlock = 1u << 23;
constexpr uint32_t skip_used(uint32_t entry) {
  return entry & 0xFFFF;
}
constexpr int skip_advance(uint32_t entry) {
  return static_cast<int>(entry >> 16 & 0x7F);
}

struct DerivedTable {
  std::array<int32_t, kMaxCodeLength + 2> maxcode;    // largest code of each length, -1 for none;
                                                      // entry 17 ends every search
  std::array<int32_t, kMaxCodeLength + 1> valoffset;  // index of a length's first symbol - its code
  const HuffmanSpec* raw;
  // By the next kLookBits bits: code length << 8 | symbol, or 0 for a longer code.
  std::array<uint16_t, kLookSize> lookup;
  // AC tables, by the next kLookBits bits, when a code and its extra bits fit in them:
  // value << 16 | run << 8 | bits used; 0 otherwise. The value is sign-extended (T.81 F.12).
  std::array<int32_t, kLookSize> coefficient;
  OsPtr<SkipTable> skip;  // AC tables of sequential pictures at reduced scales
};

struct EntropyState;
struct Tables;

// Makes the table of a class and number ready for a scan. It lives in the pool of `tables` and goes to
// *derivedOut; an AC table gets a skip table, which goes to `skipping`, unless that is null. 200; 201
// when there is nothing to derive from or memory is short; 0 when no encoder can have meant the table
// (T.81 C.2, F.1.2.1.1).
int derive_table(Tables& tables, bool isDc, int tableNumber, EntropyState* skipping,
                 const DerivedTable** derivedOut);

}  // namespace pelo::jpeg
