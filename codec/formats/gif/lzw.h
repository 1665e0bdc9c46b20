// LZW decompression of one image's data, as far as the next row asks for, and its translation table:
// what each code stands for.
#pragma once

#include <cstdint>

#include "codec/base/byte_order.h"
#include "codec/base/lsb_bits.h"
#include "tavirpelo/api.h"

namespace pelo::gif {

struct Record;

constexpr uint32_t kCodes = 4096;
constexpr int kMaxCodeSize = 12;         // bits
constexpr int kMaxMinimumCodeSize = 11;  // bits
// The longest string that one code can add to a row, and how far past a string's end its last group may
// be written.
constexpr int kMaxString = kCodes + 1;
constexpr int kStringSlack = 7;

// Strings are kept in groups of eight indices, so that one store writes a group:
//   tail    the last 1 to 8 indices, the first of them in the low byte
//   before  the code of all groups before that one, when length > 8
struct TranslationTable {
  struct Entry {
    uint64_t tail;
    uint16_t before;
    uint16_t length;
    uint8_t first;  // the string's first index
  };
  Entry entries[kCodes];
};

// Writes one index.
void write_index(uint32_t character, int position, uint8_t* lineBuffer);

// Writes the string of a code from `position` on, and up to kStringSlack bytes of anything behind it;
// returns its first index. *errorFlag becomes 1 for a code that cannot exist.
uint8_t translate(uint32_t code, const TranslationTable* table, int position, uint8_t* lineBuffer,
                  int* errorFlag);

// Makes `code` stand for the string of `prefix` (an existing code) with one more index.
void add_entry(uint32_t prefix, uint8_t character, uint32_t code, TranslationTable* table);

// Fills in the codes 0 to 2^minimumCodeSize + 1, each of one index. 1, or 0 for a size above 11.
int init_table(int minimumCodeSize, TranslationTable* table);

// The first three run once a code, so they are inline.

inline void write_index(uint32_t character, int position, uint8_t* lineBuffer) {
  lineBuffer[position] = static_cast<uint8_t>(character);
}

inline uint8_t translate(uint32_t code, const TranslationTable* table, int position, uint8_t* lineBuffer,
                         int* errorFlag) {
  if (code >= kCodes) {
    *errorFlag = 1;
    return 0;
  }
  const auto* entry = &table->entries[code];
  const uint8_t first = entry->first;
  for (int offset = (entry->length + 7) & ~7; offset > 0;) {
    offset -= 8;
    store_le64(lineBuffer + position + offset, entry->tail);
    entry = &table->entries[entry->before];
  }
  return first;
}

inline void add_entry(uint32_t prefix, uint8_t character, uint32_t code, TranslationTable* table) {
  const auto& old = table->entries[prefix];
  auto& entry = table->entries[code];
  const int inTail = old.length & 7;  // 0: the last group is full
  entry.tail = (inTail != 0 ? old.tail : 0) | uint64_t{character} << 8 * inTail;
  entry.before = inTail != 0 ? old.before : static_cast<uint16_t>(prefix);
  entry.length = static_cast<uint16_t>(old.length + 1);
  entry.first = old.first;
}

// ---- decompression ----

// The decompressor between two codes.
struct LzwState {
  LsbBits bits;
  const uint8_t* next;  // the unread part of the current sub-block, in the reader's buffer
  const uint8_t* end;
  int codeSize;       // bits
  uint32_t nextCode;  // the code that gets the next entry
  uint32_t previous;  // the code before; kNoCode behind a clear code
  int start, fill;    // indices in the line buffer that no row has taken yet
  int rows;           // image rows finished
};
constexpr uint32_t kNoCode = kCodes;

enum class Supply {
  kReady,       // what was asked for is there
  kEnded,       // an end code, or one that means the same
  kTerminated,  // the data's last sub-block is behind the reader
  kCut,         // the source ends inside the data
  kBroken,      // a code that cannot exist
};

// Ready for the data that the reader stands at: table, line buffer and state. False for a minimum code
// size above 11 or when memory is short.
[[nodiscard]] bool start_lzw(Record& record);

// Makes the next image row stand in the line buffer from lzw.start on.
Supply fill_row(Record& record);

// Lets the next image row go by; what is not written is only counted.
Supply skip_row(Record& record);

// Moves the reader behind the image's data after its last row or its end code.
void skip_rest(Record& record);

}  // namespace pelo::gif
