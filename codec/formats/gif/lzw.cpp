#include "codec/formats/gif/lzw.h"

#include <cstring>

#include "codec/base/errors.h"
#include "codec/formats/gif/record.h"

namespace pelo::gif {

int init_table(int minimumCodeSize, TranslationTable* table) {
  if (minimumCodeSize < 0 || minimumCodeSize > kMaxMinimumCodeSize) return 0;
  const uint32_t count = (1u << minimumCodeSize) + 2;
  for (uint32_t code = 0; code < count; ++code) {
    const auto character = static_cast<uint8_t>(code);
    table->entries[code] = {character, 0, 1, character};
  }
  return 1;
}

namespace {

struct Block {
  Supply supply;
  const uint8_t* next;
  const uint8_t* end;
};

// Enters the next sub-block. The empty one ends the image even without an end code. (By value: the
// state of the caller's loop then lives in registers.)
Block next_block(Source& reader) {
  const uint8_t* size = take_block(reader, 1);
  if (size == nullptr) return {Supply::kCut, nullptr, nullptr};
  if (*size == 0) return {Supply::kTerminated, nullptr, nullptr};
  const int count = *size;
  const uint8_t* bytes = take_block(reader, count);
  if (bytes == nullptr) return {Supply::kCut, nullptr, nullptr};
  return {Supply::kReady, bytes, bytes + count};
}

inline Supply need_bits(Source& reader, LzwState& s) {
  while (s.bits.count() < s.codeSize) {
    if (s.next == s.end) {
      const Block block = next_block(reader);
      if (block.supply != Supply::kReady) return block.supply;
      s.next = block.next;
      s.end = block.end;
    }
    s.bits.fill(s.next, s.end);
  }
  return Supply::kReady;
}

inline void clear_table(const Record& record, LzwState& s) {
  s.codeSize = record.minimumCodeSize + 1;
  s.nextCode = (1u << record.minimumCodeSize) + 2;
  s.previous = kNoCode;
}

// The string before, with one more index, becomes the next code's. A full table stays as it is until a
// clear code; codes that stood for nothing start no strings.
inline void add_entry(TranslationTable& table, LzwState& s, uint8_t character) {
  if (s.previous >= s.nextCode || s.nextCode >= kCodes) return;
  add_entry(s.previous, character, s.nextCode, &table);
  ++s.nextCode;
  if (s.nextCode >= 1u << s.codeSize && s.codeSize < kMaxCodeSize) ++s.codeSize;
}

// What one code adds to the row.
struct Piece {
  uint32_t code;  // its string; kNoCode: only the index `last`
  int length;     // the index `last` included
  bool hasLast;   // one more index behind the string
  uint8_t last;
};

// A code that has no entry yet: behind a clear code it is an index, whatever its value; otherwise the
// string before and that string's first index again. False when there was no string before, which ends a
// still image quietly and lets an animated one go on with code 0.
inline bool unknown_code(const Record& record, LzwState& s, uint32_t code, Piece& piece) {
  if (s.previous == kNoCode) {
    piece = {kNoCode, 1, true, static_cast<uint8_t>(code)};
    return true;
  }
  if (s.previous >= s.nextCode) {
    if (!record.animated) return false;
    s.previous = 0;
  }
  const auto& entry = record.table.entries[s.previous];
  piece = {s.previous, entry.length + 1, true, entry.first};
  return true;
}

// Writes the piece at the fill position; its first index, or -1 for a code that cannot exist.
inline int write_piece(const Record& record, LzwState& s, uint8_t* line, const Piece& piece) {
  int error = 0;
  int first = piece.last;
  if (piece.code != kNoCode) first = translate(piece.code, &record.table, s.fill, line, &error);
  if (error != 0) return -1;
  if (piece.hasLast) write_index(piece.last, s.fill + piece.length - 1, line);
  s.fill += piece.length;
  return first;
}

// Decodes until `count` indices are in the line buffer (kKeep) or until `count` more have gone by, of
// which only the end of the last string is kept.
template <bool kKeep>
Supply decode(Record& record, int count) {
  LzwState s = record.lzw;
  uint8_t* line = record.line.data();
  const uint32_t clear = 1u << record.minimumCodeSize;
  Supply supply = Supply::kReady;
  while (kKeep ? s.fill < count : count > 0) {
    supply = need_bits(record.reader, s);
    if (supply != Supply::kReady) break;
    const uint32_t code = s.bits.take(s.codeSize);
    if (code - clear < 2) [[unlikely]] {
      if (code != clear) {
        supply = Supply::kEnded;
        break;
      }
      clear_table(record, s);
      continue;
    }
    Piece piece{code, record.table.entries[code].length, false, 0};
    if (code >= s.nextCode && !unknown_code(record, s, code, piece)) [[unlikely]] {
      supply = Supply::kEnded;
      break;
    }
    int first;
    if (!kKeep && piece.length <= count) {
      count -= piece.length;
      first = piece.code == kNoCode ? piece.last : record.table.entries[piece.code].first;
    } else {
      first = write_piece(record, s, line, piece);
      if (!kKeep) {
        s.start = count;
        count = 0;
      }
    }
    if (first < 0) [[unlikely]] {
      supply = Supply::kBroken;
      break;
    }
    add_entry(record.table, s, static_cast<uint8_t>(first));
    s.previous = code;
  }
  record.lzw = s;
  return supply;
}

// Moves the indices that no row has taken to the line buffer's start.
void compact(Record& record) {
  LzwState& s = record.lzw;
  std::memmove(record.line.data(), record.line.data() + s.start, static_cast<size_t>(s.fill - s.start));
  s.fill -= s.start;
  s.start = 0;
}

}  // namespace

bool start_lzw(Record& record) {
  if (!init_table(record.minimumCodeSize, &record.table))
    return refuse(Reason::kDamaged, "GIF image data", "minimum code size");
  const int needed = record.frame.width + kMaxString + kStringSlack;
  if (record.line.size() < static_cast<size_t>(needed) &&
      !record.line.allocate(static_cast<size_t>(needed))) {
    return refuse(Reason::kNoMemory, "GIF image data");
  }
  record.lzw = {};
  clear_table(record, record.lzw);
  return true;
}

Supply fill_row(Record& record) {
  if (record.lzw.fill - record.lzw.start >= record.frame.width) return Supply::kReady;
  compact(record);
  return decode<true>(record, record.frame.width);
}

Supply skip_row(Record& record) {
  LzwState& s = record.lzw;
  const int missing = record.frame.width - (s.fill - s.start);
  if (missing <= 0) {
    s.start += record.frame.width;
    return Supply::kReady;
  }
  s.start = s.fill = 0;
  return decode<false>(record, missing);
}

void skip_rest(Record& record) {
  record.lzw.next = record.lzw.end = nullptr;
  (void)skip_sub_blocks(record.reader);
}

}  // namespace pelo::gif
