#include "codec/formats/png/huffman_table.h"

#include <algorithm>

#include "codec/base/os_memory.h"

namespace pelo::png {
namespace {

struct Based {
  uint16_t base;
  uint8_t extraBits;
};

// RFC 1951, 3.2.5. Length symbols from 257, distance symbols from 0.
constexpr std::array<Based, 29> kLengths = {
    {{3, 0},  {4, 0},  {5, 0},  {6, 0},   {7, 0},   {8, 0},   {9, 0},   {10, 0},  {11, 1}, {13, 1},
     {15, 1}, {17, 1}, {19, 2}, {23, 2},  {27, 2},  {31, 2},  {35, 3},  {43, 3},  {51, 3}, {59, 3},
     {67, 4}, {83, 4}, {99, 4}, {115, 4}, {131, 5}, {163, 5}, {195, 5}, {227, 5}, {258, 0}}};
constexpr std::array<Based, 30> kDistances = {
    {{1, 0},     {2, 0},     {3, 0},     {4, 0},      {5, 1},      {7, 1},     {9, 2},     {13, 2},
     {17, 3},    {25, 3},    {33, 4},    {49, 4},     {65, 5},     {97, 5},    {129, 6},   {193, 6},
     {257, 7},   {385, 7},   {513, 8},   {769, 8},    {1025, 9},   {1537, 9},  {2049, 10}, {3073, 10},
     {4097, 11}, {6145, 11}, {8193, 12}, {12289, 12}, {16385, 13}, {24577, 13}}};
constexpr size_t kEndOfBlock = 256;

// The upper half of a symbol's entry, and its extra bits where the code's length is still to be added.
template <size_t N>
uint32_t based_entry(const std::array<Based, N>& table, size_t index) {
  if (index >= N) return kEntryInvalid;  // built like any other, refused when it occurs
  return uint32_t{table[index].base} << 16 | table[index].extraBits;
}
uint32_t symbol_entry(Alphabet alphabet, size_t symbol) {
  if (alphabet == Alphabet::kDistance) return based_entry(kDistances, symbol);
  if (symbol == kEndOfBlock) return kEntryEnd;
  if (symbol > kEndOfBlock) return based_entry(kLengths, symbol - 257);
  return static_cast<uint32_t>(symbol) << 16 | kEntryLiteral;
}

uint32_t reversed(uint32_t code, int length) {
  uint32_t result = 0;
  for (int i = 0; i < length; ++i) result |= (code >> i & 1) << (length - 1 - i);
  return result;
}

using LengthCounts = std::array<uint32_t, kMaxCodeLength + 1>;

// Kraft's sum may not exceed 1.
bool over_subscribed(const LengthCounts& counts) {
  uint32_t taken = 0;
  for (size_t length = 1; length <= kMaxCodeLength; ++length) {
    taken += counts[length] << (kMaxCodeLength - length);
  }
  return taken > 1u << kMaxCodeLength;
}

class TableBuilder {
 public:
  TableBuilder(PELOI_PNGHUFFMANPOOL& pool, Alphabet alphabet)
      : pool_(pool), alphabet_(alphabet), rootBits_(root_bits(alphabet)) {}

  const uint32_t* build(const uint8_t* lengths, size_t count) {
    LengthCounts counts{};
    for (size_t i = 0; i < count; ++i) ++counts[lengths[i] & 15];
    counts[0] = 0;
    if (over_subscribed(counts) || !take_root()) return nullptr;
    assign_codes(counts);
    longest_.fill(0);
    for (size_t i = 0; i < count; ++i) note_long_code(lengths[i] & 15);
    return place_symbols(lengths, count) ? root_ : nullptr;
  }

 private:
  bool take_root() {
    root_ = take(size_t{1} << rootBits_);
    return root_ != nullptr;
  }
  uint32_t* take(size_t entries) {
    if (entries > pool_.entries.size() - pool_.used) return nullptr;
    uint32_t* first = pool_.entries.data() + pool_.used;
    pool_.used += static_cast<uint32_t>(entries);
    std::fill_n(first, entries, kEntryInvalid | 1);
    return first;
  }

  // The first code of each length (RFC 1951, 3.2.2).
  void assign_codes(const LengthCounts& counts) {
    uint32_t code = 0;
    for (size_t length = 1; length <= kMaxCodeLength; ++length) {
      code = (code + counts[length - 1]) << 1;
      next_[length] = code;
    }
    walk_ = next_;
  }

  // The longest code under each root entry decides the size of its subtable. Codes come in ascending
  // order of length and symbol, so a second walk through them meets the same codes.
  void note_long_code(int length) {
    if (length == 0) return;
    const uint32_t code = walk_[static_cast<size_t>(length)]++;
    if (length <= rootBits_) return;
    const uint32_t index = reversed(code, length) & ((1u << rootBits_) - 1);
    longest_[index] = std::max(longest_[index], static_cast<uint8_t>(length));
  }

  bool place_symbols(const uint8_t* lengths, size_t count) {
    for (size_t symbol = 0; symbol < count; ++symbol) {
      const int length = lengths[symbol] & 15;
      if (length == 0) continue;
      const uint32_t code = reversed(next_[static_cast<size_t>(length)]++, length);
      if (!place(symbol_entry(alphabet_, symbol), code, length)) return false;
    }
    return true;
  }

  bool place(uint32_t entry, uint32_t code, int length) {
    if (length <= rootBits_) {
      spread(root_, rootBits_, finish(entry, length), code, length);
      return true;
    }
    const uint32_t index = code & ((1u << rootBits_) - 1);
    const int subBits = longest_[index] - rootBits_;
    if ((root_[index] & kEntryLink) == 0) {
      const uint32_t* subtable = take(size_t{1} << subBits);
      if (subtable == nullptr) return false;
      root_[index] = static_cast<uint32_t>(subtable - root_) << 16 | kEntryLink |
                     static_cast<uint32_t>(subBits) << 8 | static_cast<uint32_t>(rootBits_);
    }
    spread(root_ + (root_[index] >> 16), subBits, finish(entry, length - rootBits_), code >> rootBits_,
           length - rootBits_);
    return true;
  }

  static uint32_t finish(uint32_t entry, int length) {
    return entry + (static_cast<uint32_t>(length) << 8) + static_cast<uint32_t>(length);
  }
  // Every index that ends in the code.
  static void spread(uint32_t* table, int indexBits, uint32_t entry, uint32_t code, int length) {
    for (size_t i = code; i < size_t{1} << indexBits; i += size_t{1} << length) table[i] = entry;
  }

  PELOI_PNGHUFFMANPOOL& pool_;
  Alphabet alphabet_;
  int rootBits_;
  uint32_t* root_ = nullptr;
  LengthCounts next_{}, walk_{};
  std::array<uint8_t, size_t{1} << kLiteralRootBits> longest_;
};

}  // namespace
const uint32_t* build_table(const uint8_t* lengths, int count, int alphabet,
                            PELOI_PNGHUFFMANPOOL* pool) {
  using namespace pelo::png;
  if (count < 0 || static_cast<size_t>(count) > kMaxSymbols || alphabet < 0 || alphabet > 2)
    return nullptr;
  return TableBuilder(*pool, static_cast<Alphabet>(alphabet)).build(lengths, static_cast<size_t>(count));
}

void free_table(PELOI_PNGHUFFMANPOOL** pool) {
  os_free(*pool);
  *pool = nullptr;
}

}  // namespace pelo::png
