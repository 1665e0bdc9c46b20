// The buffered source reader shared by format detection and the JPEG decoder: a 4096-byte window over a
// TAVIRPELO_IO.
#pragma once

#include <cstdint>

#include "codec/base/os_memory.h"
#include "tavirpelo/api.h"
#include "tavirpelo/io.h"

// The buffer's valid bytes are [0, pos + avail); its last one stands at source offset consumed - 1.
typedef struct PELOJ_SOURCE {
  TAVIRPELO_IO* io;
  uint32_t consumed;  // bytes read from io so far: the offset behind the last valid byte
  uint32_t size;      // bytes in the whole source
  uint32_t pos;       // index of the next unread byte
  uint32_t avail;     // unread bytes from pos on
  uint8_t* buffer;    // 4096 bytes
} PELOJ_SOURCE;

namespace pelo {

// Makes n unread bytes available by one read at the most: 2 already there, 1 after a read that delivered
// at least one byte (possibly fewer than n in all), 0 when there was nothing to read or no room for it.
int check_buffer(PELOJ_SOURCE* source, int n);

constexpr uint32_t kSourceBufferSize = 4096;

// A reader with its own zero-filled buffer.
class BufferedSource {
 public:
  // Offsets count from 0, so the caller moves the I/O object to its start. False when memory is short.
  [[nodiscard]] bool open(TAVIRPELO_IO* io);
  PELOJ_SOURCE* get() { return &source_; }
  PELOJ_SOURCE* operator->() { return &source_; }

 private:
  PELOJ_SOURCE source_{};
  OsBuffer<uint8_t> buffer_;
};

// True when n unread bytes are in the buffer, after as many reads as a source of short ones needs.
[[nodiscard]] bool source_need(PELOJ_SOURCE& source, uint32_t n);

// Consumes n bytes that source_need has promised; returns where they start.
inline const uint8_t* source_take(PELOJ_SOURCE& source, uint32_t n) {
  const uint8_t* bytes = source.buffer + source.pos;
  source.pos += n;
  source.avail -= n;
  return bytes;
}

// Source offset of the next unread byte.
inline uint32_t source_offset(const PELOJ_SOURCE& source) {
  return source.consumed - source.avail;
}

// Skips k bytes forward, by a relative seek when they are not in the buffer. False for a negative k, a
// target beyond 31 bits, or a seek that does not get there.
[[nodiscard]] bool source_skip(PELOJ_SOURCE& source, int64_t k);

// Moves to an absolute source offset, inside the buffer when it holds it. False when the seek fails.
[[nodiscard]] bool source_reposition(PELOJ_SOURCE& source, int64_t offset);

}  // namespace pelo
