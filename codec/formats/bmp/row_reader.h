// Rows of an uncompressed picture in a file or in memory, each bounded by the source's end.
#pragma once

#include <cstdint>

#include "codec/base/os_memory.h"
#include "tavirpelo/io.h"

namespace pelo::bmp {

class RowReader {
 public:
  // Row i stands at dataOffset + i * rowSize and has pixelBytes bytes that count. Memory rows are read
  // in place, file rows in chunks of about readSize bytes, whole rows each. False when memory is short
  // or the source is of neither kind.
  [[nodiscard]] bool open(TAVIRPELO_IO* io, int64_t dataOffset, int64_t rowSize, int64_t pixelBytes,
                          int readSize);

  // The row's bytes, good until the next call; null when the source does not hold all of them.
  const uint8_t* row(int64_t index);

  // True when nothing is left to read at the source's position, or it is memory.
  bool at_end() const { return io_->ioType == TAVIRPELO_IO_MEMORY || io_->position >= io_->size; }

 private:
  bool fill(int64_t index);

  TAVIRPELO_IO* io_ = nullptr;
  int64_t dataOffset_ = 0, rowSize_ = 0, pixelBytes_ = 0;
  OsBuffer<uint8_t> chunk_;
  int64_t chunkFirst_ = 0;  // row that the chunk begins with
  int64_t chunkBytes_ = 0;
};

}  // namespace pelo::bmp
