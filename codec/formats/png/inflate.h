// The zlib and DEFLATE decompressor (RFC 1950, RFC 1951): one resumable state over an input that comes
// in pieces and a window that the caller empties.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "codec/base/os_memory.h"
#include "codec/formats/png/huffman_table.h"

namespace pelo::png {

// Where compressed bytes come from. refill() puts the next piece in [next, end) and returns true, or
// returns false at the end of the data.
struct InflateInput {
  const uint8_t* next = nullptr;
  const uint8_t* end = nullptr;
  bool (*refill)(void* context) = nullptr;
  void* context = nullptr;
};

enum class InflateStop {
  kWindowFull,  // empty unread() and go on
  kBlockEnd,    // a block that is not the last has ended
  kStreamEnd,   // the last block has ended
  kCorrupt,
  kInputEnded,
  kNoMemory
};

class Inflater {
 public:
  // Allocates window and tables.
  [[nodiscard]] bool open();
  InflateInput& input() { return input_; }

  // Decompresses until one of the reasons to stop. All bytes handed out by unread() must have been
  // taken before. After an error the bytes before it are still there.
  InflateStop run();

  // Decompressed bytes not yet taken.
  const uint8_t* unread() const { return window_.data() + taken_; }
  size_t unread_size() const { return out_ - taken_; }
  void take(size_t count) { taken_ += count; }

  uint64_t total() const { return dropped_ + (out_ - kHistory); }

 private:
  // Distances reach 32 KiB back, also before the start of the stream: that much history always stands
  // before the output.
  static constexpr size_t kHistory = 32768;
  static constexpr size_t kMaxMatch = 258;
  static constexpr size_t kCopySlack = 32;  // what whole-word copies may write past a match
  static constexpr size_t kRoom = 32768;    // output between two slides of the window

  enum class State { kZlibHeader, kBlockHeader, kStored, kCodes, kEnd };
  // What a step found: go on, or why not.
  enum class Step { kNext, kFull, kBlockEnd, kCorrupt, kInputEnded, kNoMemory };

  void slide();
  void set_history(uint8_t first);
  Step zlib_header();
  Step block_header();
  Step stored_header();
  Step fixed_tables();
  Step dynamic_tables();
  Step read_code_lengths(std::array<uint8_t, 320>& lengths, size_t count, const uint32_t* table);
  Step stored_bytes();
  Step codes();
  bool fast_codes(Step& step);
  Step one_symbol();

  // ---- bits: the lowest of `bits_` is the next of the stream ----
  bool fill(int count);
  uint32_t peek(int count) const { return static_cast<uint32_t>(bits_ & ((uint64_t{1} << count) - 1)); }
  void drop(int count) {
    bits_ >>= count;
    bitCount_ -= count;
  }
  bool read(int count, uint32_t& value);
  Step decode(const uint32_t* table, int rootBits, uint32_t& value, uint32_t& entry);

  InflateInput input_;
  uint64_t bits_ = 0;
  int bitCount_ = 0;

  OsBuffer<uint8_t> window_;
  size_t out_ = kHistory;    // end of the output
  size_t taken_ = kHistory;  // first byte that the caller has not taken
  uint64_t dropped_ = 0;     // output bytes that have left the window's room

  State state_ = State::kZlibHeader;
  bool last_ = false;  // the block is the stream's last
  uint32_t storedLeft_ = 0;
  const uint32_t* literals_ = nullptr;
  const uint32_t* distances_ = nullptr;
  OsPtr<PELOI_PNGHUFFMANPOOL> fixedPool_, dynamicPool_;
  const uint32_t* fixedLiterals_ = nullptr;
  const uint32_t* fixedDistances_ = nullptr;
};

}  // namespace pelo::png
