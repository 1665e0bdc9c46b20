#include "codec/formats/png/inflate.h"

#include <algorithm>
#include <cstring>

#include "codec/base/byte_order.h"

namespace pelo::png {
namespace {

// Order in which a dynamic block lists the lengths of the code-length code (RFC 1951, 3.2.7).
constexpr uint8_t kCodeLengthOrder[19] = {16, 17, 18, 0, 8,  7, 9,  6, 10, 5,
                                          11, 4,  12, 3, 13, 2, 14, 1, 15};

constexpr uint32_t code_bits(uint32_t entry) {
  return entry >> 8 & 15;
}
constexpr uint32_t drop_bits(uint32_t entry) {
  return entry & 0xFF;
}
// The value of an entry with extra bits, which stand behind its code in `bits`.
constexpr uint32_t with_extra(uint32_t entry, uint64_t bits) {
  const uint64_t whole = bits & ((uint64_t{1} << drop_bits(entry)) - 1);
  return (entry >> 16) + static_cast<uint32_t>(whole >> code_bits(entry));
}
inline uint32_t resolve(const uint32_t* table, int rootBits, uint64_t& bits, int& bitCount) {
  uint32_t entry = table[bits & ((1u << rootBits) - 1)];
  if ((entry & kEntryLink) != 0) [[unlikely]] {
    bits >>= rootBits;
    bitCount -= rootBits;
    entry = table[(entry >> 16) + (bits & ((1u << code_bits(entry)) - 1))];
  }
  return entry;
}

}  // namespace

bool Inflater::open() {
  fixedPool_ = os_new<PELOI_PNGHUFFMANPOOL>();
  return fixedPool_ != nullptr && window_.allocate(kHistory + kRoom + kMaxMatch + kCopySlack);
}

InflateStop Inflater::run() {
  if (out_ >= kHistory + kRoom) slide();
  for (;;) {
    Step step;
    switch (state_) {
      case State::kZlibHeader:
        step = zlib_header();
        break;
      case State::kBlockHeader:
        step = block_header();
        break;
      case State::kStored:
        step = stored_bytes();
        break;
      case State::kCodes:
        step = codes();
        break;
      default:
        return InflateStop::kStreamEnd;
    }
    switch (step) {
      case Step::kNext:
        break;
      case Step::kFull:
        return InflateStop::kWindowFull;
      case Step::kCorrupt:
        return InflateStop::kCorrupt;
      case Step::kInputEnded:
        return InflateStop::kInputEnded;
      case Step::kNoMemory:
        return InflateStop::kNoMemory;
      case Step::kBlockEnd:
        state_ = last_ ? State::kEnd : State::kBlockHeader;
        return last_ ? InflateStop::kStreamEnd : InflateStop::kBlockEnd;
    }
  }
}

// Keeps the last 32 KiB as history and makes the rest room again.
void Inflater::slide() {
  const size_t count = out_ - kHistory;
  std::memmove(window_.data(), window_.data() + count, kHistory);
  dropped_ += count;
  out_ = taken_ = kHistory;
}

// Bytes before the start of the stream read as its first byte.
void Inflater::set_history(uint8_t first) {
  std::memset(window_.data(), first, kHistory);
}

// ---- bits ----

// At least `count` bits. At the end of the data there may be fewer: false.
bool Inflater::fill(int count) {
  while (bitCount_ < count) {
    if (input_.next == input_.end && (input_.refill == nullptr || !input_.refill(input_.context)))
      return false;
    bits_ |= uint64_t{*input_.next++} << bitCount_;
    bitCount_ += 8;
  }
  return true;
}

bool Inflater::read(int count, uint32_t& value) {
  if (!fill(count)) return false;
  value = peek(count);
  drop(count);
  return true;
}

// One symbol, wherever the data end: bits beyond the end look like zeros, and only consuming one fails.
Inflater::Step Inflater::decode(const uint32_t* table, int rootBits, uint32_t& value, uint32_t& entry) {
  fill(kMaxCodeLength + 13);  // the longest code and the most extra bits
  uint64_t bits = bits_;
  int left = bitCount_;
  entry = resolve(table, rootBits, bits, left);
  const int used = static_cast<int>(drop_bits(entry));
  if ((entry & kEntryInvalid) != 0) return left < used ? Step::kInputEnded : Step::kCorrupt;
  if (left < used) return Step::kInputEnded;
  value = with_extra(entry, bits);
  bits_ = bits >> used;
  bitCount_ = left - used;
  return Step::kNext;
}

// ---- headers ----

Inflater::Step Inflater::zlib_header() {
  uint32_t method, flags;
  if (!read(8, method) || !read(8, flags)) return Step::kInputEnded;
  const bool deflate = (method & 0x0F) == 8 && method >> 4 <= 7;
  const bool dictionary = (flags & 0x20) != 0;
  if (!deflate || dictionary) return Step::kCorrupt;
  state_ = State::kBlockHeader;
  return Step::kNext;
}

Inflater::Step Inflater::block_header() {
  uint32_t header;
  if (!read(3, header)) return Step::kInputEnded;
  last_ = (header & 1) != 0;
  state_ = State::kCodes;
  switch (header >> 1) {
    case 0:
      return stored_header();
    case 1:
      return fixed_tables();
    case 2:
      return dynamic_tables();
    default:
      return Step::kCorrupt;
  }
}

Inflater::Step Inflater::stored_header() {
  drop(bitCount_ & 7);  // to the stream's byte boundary
  uint32_t length, complement;
  if (!read(16, length) || !read(16, complement)) return Step::kInputEnded;
  if ((length ^ complement) != 0xFFFF) return Step::kCorrupt;
  storedLeft_ = length;
  state_ = State::kStored;
  return Step::kNext;
}

// The codes of RFC 1951, 3.2.6, built at their first use.
Inflater::Step Inflater::fixed_tables() {
  if (fixedLiterals_ == nullptr) {
    std::array<uint8_t, 288> lengths;
    std::fill(lengths.begin(), lengths.begin() + 144, uint8_t{8});
    std::fill(lengths.begin() + 144, lengths.begin() + 256, uint8_t{9});
    std::fill(lengths.begin() + 256, lengths.begin() + 280, uint8_t{7});
    std::fill(lengths.begin() + 280, lengths.end(), uint8_t{8});
    fixedLiterals_ = build_table(lengths.data(), 288, 0, fixedPool_.get());
    std::fill(lengths.begin(), lengths.begin() + 30, uint8_t{5});
    fixedDistances_ = build_table(lengths.data(), 30, 1, fixedPool_.get());
  }
  literals_ = fixedLiterals_;
  distances_ = fixedDistances_;
  return Step::kNext;
}

Inflater::Step Inflater::dynamic_tables() {
  if (dynamicPool_ == nullptr) dynamicPool_ = os_new<PELOI_PNGHUFFMANPOOL>();
  if (dynamicPool_ == nullptr) return Step::kNoMemory;
  uint32_t hlit, hdist, hclen;
  if (!read(5, hlit) || !read(5, hdist) || !read(4, hclen)) return Step::kInputEnded;
  std::array<uint8_t, 320> lengths{};
  for (size_t i = 0; i < hclen + 4; ++i) {
    uint32_t length;
    if (!read(3, length)) return Step::kInputEnded;
    lengths[kCodeLengthOrder[i]] = static_cast<uint8_t>(length);
  }
  PELOI_PNGHUFFMANPOOL* pool = dynamicPool_.get();
  pool->used = 0;
  const uint32_t* table = build_table(lengths.data(), 19, 2, pool);
  if (table == nullptr) return Step::kCorrupt;
  const auto literalCount = static_cast<int>(hlit + 257);
  const auto distanceCount = static_cast<int>(hdist + 1);
  const Step step = read_code_lengths(lengths, static_cast<size_t>(literalCount + distanceCount), table);
  if (step != Step::kNext) return step;
  pool->used = 0;
  literals_ = build_table(lengths.data(), literalCount, 0, pool);
  distances_ = build_table(lengths.data() + literalCount, distanceCount, 1, pool);
  return literals_ != nullptr && distances_ != nullptr ? Step::kNext : Step::kCorrupt;
}

// Lengths of both alphabets in one run; repeats may cross from one into the other.
Inflater::Step Inflater::read_code_lengths(std::array<uint8_t, 320>& lengths, size_t count,
                                           const uint32_t* table) {
  struct Repeat {
    uint32_t extraBits, least;
  };
  constexpr Repeat kRepeats[3] = {{2, 3}, {3, 3}, {7, 11}};  // of symbols 16 to 18
  for (size_t i = 0; i < count;) {
    uint32_t symbol, entry;
    const Step step = decode(table, kCodeLengthRootBits, symbol, entry);
    if (step != Step::kNext) return step;
    if (symbol < 16) {
      lengths[i++] = static_cast<uint8_t>(symbol);
      continue;
    }
    const Repeat repeat = kRepeats[symbol - 16];
    uint32_t times;
    if (!read(static_cast<int>(repeat.extraBits), times)) return Step::kInputEnded;
    times += repeat.least;
    if (times > count - i || (symbol == 16 && i == 0)) return Step::kCorrupt;
    std::fill_n(lengths.begin() + static_cast<ptrdiff_t>(i), times,
                symbol == 16 ? lengths[i - 1] : uint8_t{0});
    i += times;
  }
  return Step::kNext;
}

// ---- data ----

Inflater::Step Inflater::stored_bytes() {
  while (storedLeft_ != 0) {
    if (out_ >= kHistory + kRoom) return Step::kFull;
    if (bitCount_ == 0 && input_.next != input_.end && total() != 0) {
      const size_t count = std::min(
          {size_t{storedLeft_}, kHistory + kRoom - out_, static_cast<size_t>(input_.end - input_.next)});
      std::memcpy(window_.data() + out_, input_.next, count);
      input_.next += count;
      out_ += count;
      storedLeft_ -= static_cast<uint32_t>(count);
      continue;
    }
    uint32_t byte;
    if (!read(8, byte)) return Step::kInputEnded;
    if (total() == 0) set_history(static_cast<uint8_t>(byte));
    window_[out_++] = static_cast<uint8_t>(byte);
    --storedLeft_;
  }
  return Step::kBlockEnd;
}

Inflater::Step Inflater::codes() {
  for (;;) {
    if (out_ >= kHistory + kRoom) return Step::kFull;
    Step step = Step::kNext;
    if (total() == 0 || !fast_codes(step)) step = one_symbol();
    if (step != Step::kNext) return step;
  }
}

Inflater::Step Inflater::one_symbol() {
  uint32_t value, entry;
  Step step = decode(literals_, kLiteralRootBits, value, entry);
  if (step != Step::kNext) return step;
  if ((entry & kEntryEnd) != 0) return Step::kBlockEnd;
  if ((entry & kEntryLiteral) != 0) {
    if (total() == 0) set_history(static_cast<uint8_t>(value));
    window_[out_++] = static_cast<uint8_t>(value);
    return Step::kNext;
  }
  uint32_t distance;
  step = decode(distances_, kDistanceRootBits, distance, entry);
  if (step != Step::kNext) return step;
  const uint8_t* from = window_.data() + out_ - distance;
  for (uint32_t i = 0; i < value; ++i) window_[out_ + i] = from[i];
  out_ += value;
  return Step::kNext;
}

namespace {

// A match of up to 258 bytes by words; up to 31 bytes behind it may be written.
inline void copy_words(uint8_t* out, const uint8_t* from, size_t length, size_t distance) {
  uint8_t* const end = out + length;
  if (distance >= 16) {
    do {
      std::memcpy(out, from, 16);
      out += 16;
      from += 16;
    } while (out < end);
  } else if (distance >= 8) {
    do {
      std::memcpy(out, from, 8);
      out += 8;
      from += 8;
    } while (out < end);
  } else if (distance == 1) {
    std::memset(out, *from, length);
  } else {
    do {
      *out++ = *from++;
    } while (out < end);
  }
}

}  // namespace

// Symbols while the input holds at least a word and the window has room for a match: no check inside.
// False when nothing could be done so.
bool Inflater::fast_codes(Step& step) {
  if (input_.end - input_.next < 16) return false;
  const uint8_t* next = input_.next;
  const uint8_t* const safe = input_.end - 16;
  uint8_t* out = window_.data() + out_;
  uint8_t* const full = window_.data() + kHistory + kRoom;
  const uint32_t* const literals = literals_;
  const uint32_t* const distances = distances_;
  uint64_t bits = bits_;
  int count = bitCount_;

  // Whole bytes up to 56 bits or more. Bits above `count` may already hold the next byte's; they are
  // read again as the same values.
  const auto refill = [&] {
    bits |= load_le64(next) << count;
    next += (63 - count) >> 3;
    count |= 56;
  };
  const auto use = [&](uint32_t entry) {
    bits >>= drop_bits(entry);
    count -= static_cast<int>(drop_bits(entry));
  };
  do {
    refill();
    uint32_t entry = resolve(literals, kLiteralRootBits, bits, count);
    if ((entry & kEntryLiteral) != 0) {  // up to three in a row: 45 of 56 bits
      use(entry);
      *out++ = static_cast<uint8_t>(entry >> 16);
      entry = resolve(literals, kLiteralRootBits, bits, count);
      if ((entry & kEntryLiteral) != 0) {
        use(entry);
        *out++ = static_cast<uint8_t>(entry >> 16);
        entry = resolve(literals, kLiteralRootBits, bits, count);
        if ((entry & kEntryLiteral) != 0) {
          use(entry);
          *out++ = static_cast<uint8_t>(entry >> 16);
          continue;
        }
      }
      // A length and a distance take up to 48 bits.
      if ((entry & (kEntryEnd | kEntryInvalid)) == 0) refill();
    }
    if ((entry & (kEntryEnd | kEntryInvalid)) != 0) [[unlikely]] {
      step = (entry & kEntryEnd) != 0 ? Step::kBlockEnd : Step::kCorrupt;
      use(entry);
      break;
    }
    const size_t length = with_extra(entry, bits);
    use(entry);
    entry = resolve(distances, kDistanceRootBits, bits, count);
    if ((entry & kEntryInvalid) != 0) [[unlikely]] {
      step = Step::kCorrupt;
      break;
    }
    const size_t distance = with_extra(entry, bits);
    use(entry);
    copy_words(out, out - distance, length, distance);
    out += length;
  } while (next < safe && out < full);

  input_.next = next;
  out_ = static_cast<size_t>(out - window_.data());
  bitCount_ = count;
  bits_ = bits & ((uint64_t{1} << count) - 1);  // nothing above the count, as fill() expects
  return true;
}

}  // namespace pelo::png
