// Blocks of bytes: written piece by piece, cut and damaged at every place.
#pragma once

#include <cstddef>
#include <cstdint>
#include <initializer_list>
#include <random>
#include <string_view>
#include <vector>

namespace tests {

using Bytes = std::vector<uint8_t>;

inline void append(Bytes& to, const Bytes& from) {
  to.insert(to.end(), from.begin(), from.end());
}
inline Bytes prefix(const Bytes& bytes, size_t count) {
  return Bytes(bytes.begin(), bytes.begin() + static_cast<ptrdiff_t>(count));
}
inline Bytes suffix(const Bytes& bytes, size_t from) {
  return Bytes(bytes.begin() + static_cast<ptrdiff_t>(from), bytes.end());
}
inline Bytes random_bytes(size_t count, uint32_t seed) {
  std::mt19937 random(seed);
  Bytes bytes(count);
  for (uint8_t& b : bytes) b = static_cast<uint8_t>(random());
  return bytes;
}

// Appends integers in either byte order, text, and other blocks.
class ByteWriter {
 public:
  explicit ByteWriter(bool big = true) : big_(big) {}
  ByteWriter& u8(int64_t v) { return put(v, 1); }
  ByteWriter& u16(int64_t v) { return put(v, 2); }
  ByteWriter& u24(int64_t v) { return put(v, 3); }
  ByteWriter& u32(int64_t v) { return put(v, 4); }
  ByteWriter& text(std::string_view t) { return block(Bytes(t.begin(), t.end())); }
  ByteWriter& block(const Bytes& b) {
    append(bytes_, b);
    return *this;
  }
  ByteWriter& put(int64_t v, int count) {
    for (int i = 0; i < count; ++i) {
      const int place = big_ ? count - 1 - i : i;
      bytes_.push_back(static_cast<uint8_t>(v >> 8 * place));
    }
    return *this;
  }
  size_t size() const { return bytes_.size(); }
  operator Bytes() const { return bytes_; }

 private:
  bool big_;
  Bytes bytes_;
};

// Writes a value over what stands at `at`.
inline Bytes overwritten(Bytes bytes, size_t at, const Bytes& value) {
  for (size_t i = 0; i < value.size() && at + i < bytes.size(); ++i) bytes[at + i] = value[i];
  return bytes;
}

// use(the bytes cut to a length), for every `step`-th length that is shorter than the whole.
template <class Use>
void every_truncation(const Bytes& whole, Use use, size_t first = 1, size_t step = 1) {
  for (size_t length = first; length < whole.size(); length += step) use(prefix(whole, length));
}

// use(the bytes with one of them changed, its place), for every `step`-th place and every mask.
template <class Use>
void every_flip(const Bytes& whole, std::initializer_list<uint8_t> masks, Use use, size_t first = 0,
                size_t step = 1) {
  for (size_t at = first; at < whole.size(); at += step) {
    for (const uint8_t mask : masks) {
      Bytes damaged = whole;
      damaged[at] ^= mask;
      use(damaged, at);
    }
  }
}

}  // namespace tests
