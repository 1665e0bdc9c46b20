// A caller's stream over bytes that counts its calls and can misbehave.
#pragma once

#include <algorithm>
#include <climits>

#include "tavirpelo/io.h"
#include "tests/support/bytes.h"

namespace tests {

struct MemoryStream {
  Bytes bytes;
  size_t at = 0;
  int limit = INT_MAX;  // most bytes a read delivers
  int lie = 0;          // added to what a read reports
  int resets = 0, skips = 0;
};

inline int stream_read(void* context, void* destination, int length) {
  auto& s = *static_cast<MemoryStream*>(context);
  const size_t count = std::min({static_cast<size_t>(std::min(length, s.limit)), s.bytes.size() - s.at});
  std::copy_n(s.bytes.begin() + static_cast<ptrdiff_t>(s.at), count, static_cast<uint8_t*>(destination));
  s.at += count;
  return static_cast<int>(count) + s.lie;
}

inline int stream_skip(void* context, int, int count) {
  auto& s = *static_cast<MemoryStream*>(context);
  ++s.skips;
  s.at = std::min(s.bytes.size(), s.at + static_cast<size_t>(count));
  return static_cast<int>(s.at);
}

inline int stream_reset(void* context, int, int) {
  auto& s = *static_cast<MemoryStream*>(context);
  ++s.resets;
  s.at = 0;
  return -1;
}

}  // namespace tests
