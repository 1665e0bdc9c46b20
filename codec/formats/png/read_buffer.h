// The PNG decoder's reader: a memory source's own bytes, or a 4096-byte window over any other source.
#pragma once

#include <cstdint>

#include "codec/base/os_memory.h"
#include "tavirpelo/api.h"
#include "tavirpelo/io.h"

typedef struct PELOI_PNGREADBUFFER {
  TAVIRPELO_IO* source;
  int64_t consumed;        // stream position behind the last byte in the buffer
  int64_t bufferPosition;  // stream position of the buffer's first byte
  uint32_t limit;          // bytes of the source: no chunk may claim more
  uint32_t cursor;         // next unread byte, counted from the base
  uint32_t remaining;      // unread bytes from the cursor on
  uint8_t* base;           // a memory source's bytes, or the window
  pelo::OsBuffer<uint8_t> window;
} PELOI_PNGREADBUFFER;

namespace pelo::png {

// Refills an empty buffer; 1, or 11 when `need` exceeds 4096, the source is memory or has no more.
int refill_empty(PELOI_PNGREADBUFFER* buffer, uint32_t need);

// Moves the unread bytes to the base and fills the rest; 1, or 11 when `need` more bytes exceed 4096,
// the source is memory or has no more.
int refill_behind(PELOI_PNGREADBUFFER* buffer, uint32_t need);

constexpr uint32_t kReadWindow = 4096;

inline bool is_memory(const PELOI_PNGREADBUFFER& buffer) {
  return buffer.source->ioType == TAVIRPELO_IO_MEMORY;
}

// Attaches the reader to the start of a source. False when memory is short or the source cannot be
// moved.
[[nodiscard]] bool open_read_buffer(PELOI_PNGREADBUFFER& buffer, TAVIRPELO_IO* source);

// True when n unread bytes are in the buffer, after as many refills as that takes. n <= 4096.
[[nodiscard]] bool need(PELOI_PNGREADBUFFER& buffer, uint32_t n);

// Consumes n bytes that need() has promised; returns where they start.
inline const uint8_t* take(PELOI_PNGREADBUFFER& buffer, uint32_t n) {
  const uint8_t* bytes = buffer.base + buffer.cursor;
  buffer.cursor += n;
  buffer.remaining -= n;
  return bytes;
}

// Stream position of the next unread byte.
inline int64_t tell(const PELOI_PNGREADBUFFER& buffer) {
  return buffer.bufferPosition + buffer.cursor;
}

// Moves to a stream position: inside the buffer when it holds it, else by a seek that leaves the buffer
// empty. False when the source does not get there.
[[nodiscard]] bool move_to(PELOI_PNGREADBUFFER& buffer, int64_t position);

}  // namespace pelo::png
