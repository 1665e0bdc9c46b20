// The 4096-byte window over a source: refilling, skipping, repositioning.
#include "codec/base/buffered_source.h"

#include <climits>
#include <cstddef>
#include <cstring>

#include "codec/base/io.h"

static_assert(sizeof(void*) != 4 ||
              (sizeof(PELOJ_SOURCE) == 24 && offsetof(PELOJ_SOURCE, consumed) == 4 &&
               offsetof(PELOJ_SOURCE, buffer) == 20));

namespace pelo {
namespace {

// One read of up to `room` bytes behind the unread ones, which go to the buffer's start.
bool read_behind(PELOJ_SOURCE& source, uint32_t room) {
  std::memmove(source.buffer, source.buffer + source.pos, source.avail);
  source.pos = 0;
  const int count =
      room == 0 ? 0 : read_io(source.io, source.buffer + source.avail, static_cast<int>(room));
  if (count <= 0) return false;
  source.avail += static_cast<uint32_t>(count);
  source.consumed += static_cast<uint32_t>(count);
  return true;
}

bool has_room(const PELOJ_SOURCE& source, int64_t n) {
  return source.avail + n <= kSourceBufferSize;
}

}  // namespace

bool source_need(PELOJ_SOURCE& source, uint32_t n) {
  if (source.avail < n && !has_room(source, int64_t{n} - source.avail)) return false;
  while (source.avail < n) {
    if (!read_behind(source, kSourceBufferSize - source.avail)) return false;
  }
  return true;
}

// A single read, into the room that taken bytes left: what source_need does as often as it must.
int check_buffer(PELOJ_SOURCE* source, int n) {
  if (source == nullptr || source->buffer == nullptr) return 0;
  if (int64_t{source->avail} >= n) return 2;
  if (!has_room(*source, n)) return 0;
  return read_behind(*source, source->avail == 0 ? kSourceBufferSize : source->pos) ? 1 : 0;
}

bool BufferedSource::open(TAVIRPELO_IO* io) {
  if (io == nullptr || !buffer_.allocate(kSourceBufferSize)) return false;
  source_ = PELOJ_SOURCE{io, 0, static_cast<uint32_t>(io->size), 0, 0, buffer_.data()};
  return true;
}

bool source_skip(PELOJ_SOURCE& source, int64_t k) {
  if (k < 0) return false;
  if (k <= source.avail) {
    (void)source_take(source, static_cast<uint32_t>(k));
    return true;
  }
  const int64_t distance = k - source.avail;
  const int64_t target = source.consumed + distance;
  if (target > INT_MAX) return false;
  // The window is given up even when the seek fails, so that a later repositioning seeks again.
  source.consumed = static_cast<uint32_t>(target);
  source.pos = source.avail = 0;
  return seek_io(source.io, static_cast<int>(distance), SEEK_CUR) >= target;
}

bool source_reposition(PELOJ_SOURCE& source, int64_t offset) {
  const uint32_t valid = source.pos + source.avail;
  const int64_t start = int64_t{source.consumed} - valid;
  if (offset >= start && offset < source.consumed) {
    source.pos = static_cast<uint32_t>(offset - start);
    source.avail = valid - source.pos;
    return true;
  }
  if (offset < 0 || offset > INT_MAX) return false;
  source.consumed = static_cast<uint32_t>(offset);
  source.pos = source.avail = 0;
  return seek_io(source.io, static_cast<int>(offset), SEEK_SET) >= 0;
}

}  // namespace pelo
