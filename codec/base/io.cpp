// Input sources: one object through which a decoder reads a file, a memory block or a caller's stream.
#include "codec/base/io.h"

#include <algorithm>
#include <cerrno>
#include <climits>
#include <cstddef>
#include <cstdint>

#include "codec/base/checked.h"
#include "codec/base/errors.h"
#include "codec/base/os_memory.h"
#include "tavirpelo/decinfo.h"
#include "tavirpelo/io.h"

namespace pelo {

static_assert(sizeof(void*) != 4 || (sizeof(TAVIRPELO_IO) == 40 && offsetof(TAVIRPELO_IO, size) == 12 &&
                                     offsetof(TAVIRPELO_IO, pfRead) == 28));

namespace {

constexpr int kDefaultReadSize = 4096;  // bytes

bool refuse_with(int error) {
  record_error(ErrorWord::kDecoding, error);
  return false;
}

// What the system said of a file that did not open.
Reason reason_of_open(int systemError) {
  switch (systemError) {
    case ENOENT:
    case ENOTDIR:
      return Reason::kNotFound;
    case EACCES:
    case EPERM:
      return Reason::kPermission;
    case EISDIR:
    case ESPIPE:
      return Reason::kNotAFile;
    default:
      return Reason::kCannotOpen;
  }
}

bool open_path(TAVIRPELO_IO& io, const char* path, int size) {
  errno = 0;
  FILE* stream = open_file(path);
  if (stream == TAVIRPELO_INVALID_FILE) {
    refuse(reason_of_open(errno), "opening the source");
    return refuse_with(TAVIRPELO_ERROR_OPEN);
  }
  io.hFile = stream;
  io.size = size;
  if (size > 0) return true;
  io.size = seek_io(&io, 0, SEEK_END);
  if (io.size == 0) return refuse(Reason::kEmpty, "opening the source");
  return io.size > 0 && seek_io(&io, 0, SEEK_SET) == 0;
}

bool open_memory(TAVIRPELO_IO& io, void* block, int size) {
  if (size < 1) return refuse_with(TAVIRPELO_ERROR_EMPTY_MEMORY);
  if (block == nullptr) return refuse_with(TAVIRPELO_ERROR_NULL);
  io.pSource = block;
  io.size = size;
  return true;
}

// A handle is a pointer, not a descriptor. On 64-bit systems no object lies in the upper half of the
// address space; on 32-bit ones the heap may.
bool plausible_handle(const FILE* handle) {
  const auto value = reinterpret_cast<intptr_t>(handle);
  return sizeof value > 4 ? value > 0 : value != 0 && value != -1;
}

bool open_handle(TAVIRPELO_IO& io, FILE* handle, int size) {
  if (!plausible_handle(handle)) return refuse_with(TAVIRPELO_ERROR_OPEN);
  io.hFile = handle;
  io.base = seek_file(handle, 0, SEEK_CUR);
  if (io.base < 0) return refuse_with(TAVIRPELO_ERROR_OPEN);  // cannot seek, and nothing else is offered
  io.size = size;
  return size > 0;
}

bool open_kind(TAVIRPELO_IO& io, void* source, int size) {
  switch (io.ioType) {
    case TAVIRPELO_IO_FILE:
      return open_path(io, static_cast<const char*>(source), size);
    case TAVIRPELO_IO_MEMORY:
      return open_memory(io, source, size);
    case TAVIRPELO_IO_HANDLE:
      return open_handle(io, static_cast<FILE*>(source), size);
    default:
      return refuse_with(TAVIRPELO_ERROR_IO_KIND);
  }
}

OsPtr<TAVIRPELO_IO> new_io(int kind) {
  auto io = os_new<TAVIRPELO_IO>();
  if (io == nullptr) {
    record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_MEMORY);
    return io;
  }
  io->readSize = kDefaultReadSize;
  io->ioType = kind;
  return io;
}

int read_memory(const TAVIRPELO_IO& io, void* destination, int length) {
  const int count = std::min(length, io.size - io.position);
  if (count < 1) return 0;
  os_memcpy(destination, static_cast<const uint8_t*>(io.pSource) + io.position,
            static_cast<size_t>(count));
  return count;
}

int read_stream(const TAVIRPELO_IO& io, void* destination, int length) {
  return io.pfRead == nullptr ? 0 : std::min(io.pfRead(io.pSource, destination, length), length);
}

// Where a seek of a source that counts its own positions leads; negative when it is refused. An unknown
// `whence` stays.
int64_t seek_target(const TAVIRPELO_IO& io, int offset, int whence) {
  switch (whence) {
    case SEEK_SET:
      return offset;
    case SEEK_CUR:
      return int64_t{io.position} + offset;
    case SEEK_END:
      return offset > 0 ? -1 : int64_t{io.size} + offset;
    default:
      return io.position;
  }
}

int seek_memory(TAVIRPELO_IO& io, int offset, int whence) {
  const int64_t target = seek_target(io, offset, whence);
  if (target < 0) return -1;
  return io.position = static_cast<int>(std::min<int64_t>(target, io.size));
}

int seek_handle(TAVIRPELO_IO& io, int offset, int whence) {
  int64_t target = offset;
  int from = SEEK_SET;
  switch (whence) {
    case SEEK_SET:
      target += io.base;
      break;
    case SEEK_CUR:
      from = SEEK_CUR;
      break;
    case SEEK_END:
      target += int64_t{io.base} + io.size;
      break;
    default:
      return io.position - io.base;
  }
  const auto inRange = checked_int(target);
  const int reached = inRange ? seek_file(io.hFile, *inRange, from) : -1;
  if (reached < 0) return -1;
  io.position = reached;
  return reached - io.base;
}

// A stream starts over for every absolute seek; what its skip answers is then the position.
int seek_stream_from_start(TAVIRPELO_IO& io, int offset) {
  if (offset < 0 || io.pfReset == nullptr) return -1;
  io.pfReset(io.pSource, 0, 0);
  io.position = 0;
  if (offset == 0) return 0;
  if (io.pfSkip == nullptr) return -1;
  const int reached = io.pfSkip(io.pSource, 0, offset);
  if (reached < 0) return -1;
  return io.position = reached;
}

int seek_stream(TAVIRPELO_IO& io, int offset, int whence) {
  if (whence == SEEK_SET) return seek_stream_from_start(io, offset);
  if (whence != SEEK_CUR && whence != SEEK_END) return io.position;
  const int64_t target = seek_target(io, offset, whence);
  const auto distance = checked_int(target - io.position);
  if (target < 0 || target > INT_MAX || !distance || io.pfSkip == nullptr) return -1;
  io.pfSkip(io.pSource, 0, *distance);
  return io.position = static_cast<int>(target);
}

}  // namespace

TAVIRPELO_IO* open_io(int ioType, void* source, int size) {
  auto io = new_io(ioType);
  if (io == nullptr) return nullptr;
  if (open_kind(*io, source, size)) return io.release();
  if (ioType == TAVIRPELO_IO_FILE) close_file(io->hFile);
  return nullptr;
}

TAVIRPELO_IO* open_stream(void* context, TAVIRPELO_READFN pfRead, TAVIRPELO_SKIPFN pfSkip,
                          TAVIRPELO_RESETFN pfReset, int size) {
  auto io = new_io(TAVIRPELO_IO_STREAM);
  if (io == nullptr) return nullptr;
  io->pSource = context;
  io->size = std::max(size, 0);
  io->pfRead = pfRead;
  io->pfSkip = pfSkip;
  io->pfReset = pfReset;
  return io.release();
}

int read_io(TAVIRPELO_IO* io, void* destination, int length) {
  if (io == nullptr) return -1;
  length = destination == nullptr ? 0 : std::max(length, 0);
  int count;
  switch (io->ioType) {
    case TAVIRPELO_IO_FILE:
      count = read_file(io->hFile, destination, length);
      break;
    case TAVIRPELO_IO_MEMORY:
      count = read_memory(*io, destination, length);
      break;
    case TAVIRPELO_IO_STREAM:
      count = read_stream(*io, destination, length);
      break;
    default:
      return -1;
  }
  if (count > 0)
    io->position = static_cast<int>(std::min<int64_t>(int64_t{io->position} + count, INT_MAX));
  return count;
}

int seek_io(TAVIRPELO_IO* io, int offset, int whence) {
  if (io == nullptr) return -1;
  switch (io->ioType) {
    case TAVIRPELO_IO_FILE:
      return io->position = seek_file(io->hFile, offset, whence);
    case TAVIRPELO_IO_MEMORY:
      return seek_memory(*io, offset, whence);
    case TAVIRPELO_IO_HANDLE:
      return seek_handle(*io, offset, whence);
    case TAVIRPELO_IO_STREAM:
      return seek_stream(*io, offset, whence);
    default:
      return -1;
  }
}

int tell_io(const TAVIRPELO_IO* io) {
  return io == nullptr ? -1 : io->position - io->base;
}

int close_io(TAVIRPELO_IO* io) {
  if (io == nullptr) return 0;
  switch (io->ioType) {
    case TAVIRPELO_IO_FILE:
      close_file(io->hFile);
      break;
    case TAVIRPELO_IO_MEMORY:
    case TAVIRPELO_IO_HANDLE:
      break;
    case TAVIRPELO_IO_STREAM:
      if (io->pfReset != nullptr) io->pfReset(io->pSource, 0, 0);
      break;
    default:
      return 0;
  }
  os_free(io);
  return 1;
}

int set_read_size(TAVIRPELO_DECINFO* decInfo, int readSize) {
  if (decInfo == nullptr || decInfo->pIO == nullptr) return 0;
  decInfo->pIO->readSize = readSize;
  return 1;
}

}  // namespace pelo
