#include "codec/formats/bmp/row_reader.h"

#include <algorithm>
#include <cstdio>

namespace pelo::bmp {
namespace {

constexpr int64_t kMaxChunk = 1 << 20;  // unless one row takes more

}  // namespace

bool RowReader::open(TAVIRPELO_IO* io, int64_t dataOffset, int64_t rowSize, int64_t pixelBytes,
                     int readSize) {
  io_ = io;
  dataOffset_ = dataOffset;
  rowSize_ = rowSize;
  pixelBytes_ = pixelBytes;
  if (io->ioType == TAVIRPELO_IO_MEMORY) return true;
  if (io->ioType != TAVIRPELO_IO_FILE || rowSize > kMaxPictureBlock) return false;
  const int64_t wanted = std::min<int64_t>(readSize, kMaxChunk);
  const int64_t rows = std::max<int64_t>(1, rowSize == 0 ? 1 : wanted / rowSize);
  return rowSize == 0 || chunk_.allocate(static_cast<size_t>(rows * rowSize));
}

const uint8_t* RowReader::row(int64_t index) {
  const int64_t offset = dataOffset_ + index * rowSize_;
  if (io_->ioType == TAVIRPELO_IO_MEMORY) {
    if (offset + pixelBytes_ > io_->size) return nullptr;
    return static_cast<const uint8_t*>(io_->pSource) + offset;
  }
  const auto held = [&] {
    const int64_t at = (index - chunkFirst_) * rowSize_;
    return index >= chunkFirst_ && at + pixelBytes_ <= chunkBytes_;
  };
  if (!held() && !(fill(index) && held())) return nullptr;
  return chunk_.data() + (index - chunkFirst_) * rowSize_;
}

// Reads the chunk that begins with a row.
bool RowReader::fill(int64_t index) {
  chunkFirst_ = index;
  chunkBytes_ = 0;
  const auto offset = checked_int(dataOffset_ + index * rowSize_);
  if (!offset || TAVIRPELO_Seek_IO(io_, *offset, SEEK_SET) != *offset) return false;
  chunkBytes_ = std::max(0, TAVIRPELO_Read_IO(io_, chunk_.data(), static_cast<int>(chunk_.size())));
  return chunkBytes_ > 0;
}

}  // namespace pelo::bmp
