// Rows of an uncompressed picture in a file or in memory, each bounded by the source's end.
#pragma once

#include <algorithm>
#include <cstdint>

#include "codec/base/os_memory.h"
#include "tavirpelo/io.h"

namespace pelo::bmp {

// How rows lie in the source.
struct RowLayout {
  int64_t dataOffset;  // of row 0
  int64_t rowSize;     // bytes from row to row
  int64_t width;       // pixels
  int bits;            // a pixel; up to 32
};

class RowReader {
 public:
  // Memory rows are read in place, file rows in chunks of about readSize bytes: whole rows each, but
  // never more than a megabyte. False when memory is short or the source is of neither kind.
  [[nodiscard]] bool open(TAVIRPELO_IO* io, const RowLayout& layout, int readSize);

  // use(bytes, first, count) for the pixels first to first + count - 1 of a row, piece by piece from
  // left to right; the bytes begin with pixel `first`. False when the source lacks some of the row; then
  // nothing is used, unless a read fails in the middle.
  template <class Use>
  [[nodiscard]] bool for_pieces(int64_t row, Use use) {
    const int64_t start = layout_.dataOffset + row * layout_.rowSize;
    if (layout_.width > pieceWidth_ && !holds(start + pixel_bytes(layout_.width) - 1)) return false;
    for (int64_t first = 0; first < layout_.width; first += pieceWidth_) {
      const int64_t count = std::min(pieceWidth_, layout_.width - first);
      const uint8_t* bytes = read(start + pixel_bytes(first), pixel_bytes(count));
      if (bytes == nullptr) return false;
      use(bytes, first, count);
    }
    return true;
  }

  // True when nothing is left to read at the source's position, or it is memory.
  bool at_end() const { return io_->ioType == TAVIRPELO_IO_MEMORY || io_->position >= io_->size; }

 private:
  // Bytes of the first `count` pixels of a row.
  int64_t pixel_bytes(int64_t count) const { return (count * layout_.bits + 7) / 8; }
  // Whether the source has a byte.
  bool holds(int64_t offset);
  // Source bytes, good until the next call; null when they are not all there.
  const uint8_t* read(int64_t offset, int64_t count);

  TAVIRPELO_IO* io_ = nullptr;
  RowLayout layout_{};
  int64_t pieceWidth_ = 0;  // pixels; a multiple of eight, so that pieces begin with whole bytes
  OsBuffer<uint8_t> chunk_;
  int64_t chunkStart_ = 0;  // its place in the source
  int64_t chunkBytes_ = 0;
};

}  // namespace pelo::bmp
