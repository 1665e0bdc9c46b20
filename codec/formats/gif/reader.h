// The GIF decoder's buffered reader.
#pragma once

#include <cstdint>

#include "tavirpelo/api.h"
#include "tavirpelo/io.h"

namespace pelo::gif {

constexpr int kReaderBytes = 4096;

struct Reader {
  int remaining;    // unread bytes
  uint8_t* cursor;  // the next one
  TAVIRPELO_IO* source;
  uint8_t buffer[kReaderBytes];
};

// Consumes n bytes (up to kReaderBytes), which stay valid until the next call; null when the source has
// fewer, which are passed over.
const uint8_t* take(Reader& reader, int n);

// Consumes data sub-blocks up to and with the empty one; false when the source ends before.
[[nodiscard]] bool skip_sub_blocks(Reader& reader);

// Makes `need` bytes stand at *cursor, moving unread ones to the buffer's start and reading behind them.
// 1, or 0 when the source ends before.
int fill_buffer(int need, TAVIRPELO_IO* source, uint8_t* buffer, int* remaining, uint8_t** cursor);

}  // namespace pelo::gif
