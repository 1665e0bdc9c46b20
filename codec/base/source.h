// The reader of every decoder: a window of 4096 bytes over an input object, or a memory's own bytes.
#pragma once

#include <cstdint>

#include "codec/base/os_memory.h"
#include "tavirpelo/api.h"
#include "tavirpelo/io.h"

namespace pelo {

constexpr uint32_t kSourceBufferSize = 4096;

// The buffer's valid bytes are [0, pos + avail); its last one stands at source offset consumed - 1.
struct Source {
  TAVIRPELO_IO* io;   // null: the buffer is all there is, and not ours to write
  uint32_t consumed;  // bytes read from io so far: the offset behind the last valid byte
  uint32_t size;      // bytes in the whole source
  uint32_t pos;       // index of the next unread byte
  uint32_t avail;     // unread bytes from pos on
  uint8_t* buffer;    // kSourceBufferSize bytes, or the memory's own

  // A source over bytes that are all in memory.
  static Source over(uint8_t* bytes, uint32_t count) { return {nullptr, count, count, 0, count, bytes}; }
  bool is_memory() const { return io == nullptr; }

  // Goes on with an input object, nothing of which is in the window. Offsets count from 0, so the caller
  // moves the object to its start.
  void attach(TAVIRPELO_IO* input);

  // True when n unread bytes are in the buffer, after as many reads as an input of short ones needs.
  [[nodiscard]] bool need(uint32_t n) { return avail >= n || fetch(n); }

  // Consumes n bytes that need() has promised; returns where they start.
  const uint8_t* take(uint32_t n) {
    const uint8_t* bytes = next();
    pos += n;
    avail -= n;
    return bytes;
  }

  // The next unread byte, and its offset in the source.
  const uint8_t* next() const { return buffer + pos; }
  uint32_t tell() const { return consumed - avail; }

  // Passes k bytes, by a relative seek when they are not in the buffer. False for a negative k, a target
  // beyond 31 bits, or one that the source does not get to.
  [[nodiscard]] bool skip(int64_t k);

  // Moves to an offset, inside the buffer when it holds it. False when the source does not get there.
  [[nodiscard]] bool move_to(int64_t offset);

  // One read of up to `room` bytes behind the unread ones, which go to the buffer's start first. `room`
  // is within what they leave of the window. False when there was nothing to read.
  [[nodiscard]] bool refill(uint32_t room);

 private:
  bool fetch(uint32_t n);  // need(), when the buffer has fewer
};

// A source with its own zero-filled window.
class BufferedSource {
 public:
  // As Source::attach(). False when memory is short.
  [[nodiscard]] bool open(TAVIRPELO_IO* io);
  // Reads the bytes where they are instead.
  void open(uint8_t* bytes, uint32_t count) { source_ = Source::over(bytes, count); }
  Source* get() { return &source_; }
  Source* operator->() { return &source_; }

 private:
  Source source_{};
  OsBuffer<uint8_t> window_;
};

// Makes n unread bytes available by one read at the most: 2 already there, 1 after a read that delivered
// at least one byte (possibly fewer than n in all), 0 when there was nothing to read or no room for it.
int check_buffer(Source* source, int n);

}  // namespace pelo

// The record's order is that of the interface.
typedef pelo::Source PELOJ_SOURCE;
