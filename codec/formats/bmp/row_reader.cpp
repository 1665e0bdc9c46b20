#include "codec/formats/bmp/row_reader.h"

#include <cstdio>

#include "codec/base/io.h"
#include "codec/formats/format.h"

namespace pelo::bmp {
namespace {

constexpr int64_t kMaxChunk = 1 << 20;  // bytes

// The bytes at an offset; as many as there are, 0 when the source cannot be moved.
int read_at(TAVIRPELO_IO* io, int64_t offset, uint8_t* out, int64_t count) {
  const auto target = checked_int(offset);
  if (!target || seek_io(io, *target, SEEK_SET) != *target) return 0;
  return std::max(0, read_io(io, out, static_cast<int>(count)));
}

}  // namespace

bool RowReader::open(TAVIRPELO_IO* io, const RowLayout& layout, int readSize) {
  io_ = io;
  layout_ = layout;
  pieceWidth_ = kMaxChunk / layout.bits * 8;
  const int64_t rowSize = layout.rowSize;
  if (io->ioType == TAVIRPELO_IO_MEMORY) return true;
  if (io->ioType != TAVIRPELO_IO_FILE) return refuse(Reason::kSource, "bitmap rows");
  return obtain_block(rowSize, "bitmap rows", [&] {
    if (rowSize == 0) return true;
    const int64_t rows = std::max<int64_t>(1, std::min<int64_t>(readSize, kMaxChunk) / rowSize);
    return chunk_.allocate(static_cast<size_t>(std::min(rows * rowSize, kMaxChunk)));
  });
}

bool RowReader::holds(int64_t offset) {
  if (io_->ioType == TAVIRPELO_IO_MEMORY) return offset < io_->size;
  uint8_t byte;
  return read_at(io_, offset, &byte, 1) == 1;
}

const uint8_t* RowReader::read(int64_t offset, int64_t count) {
  if (io_->ioType == TAVIRPELO_IO_MEMORY) {
    if (offset + count > io_->size) return nullptr;
    return static_cast<const uint8_t*>(io_->pSource) + offset;
  }
  if (offset < chunkStart_ || offset + count > chunkStart_ + chunkBytes_) {
    chunkStart_ = offset;
    chunkBytes_ = read_at(io_, offset, chunk_.data(), static_cast<int64_t>(chunk_.size()));
    if (count > chunkBytes_) return nullptr;
  }
  return chunk_.data() + (offset - chunkStart_);
}

}  // namespace pelo::bmp
