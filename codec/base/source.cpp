#include "codec/base/source.h"

#include <algorithm>
#include <climits>
#include <cstddef>
#include <cstring>

#include "codec/base/io.h"

namespace pelo {

static_assert(sizeof(void*) != 4 || (sizeof(Source) == 24 && offsetof(Source, consumed) == 4 &&
                                     offsetof(Source, buffer) == 20));

namespace {

bool has_room(const Source& source, int64_t n) {
  return source.avail + n <= kSourceBufferSize;
}

}  // namespace

void Source::attach(TAVIRPELO_IO* input) {
  io = input;
  size = static_cast<uint32_t>(std::max(input->size, 0));
  consumed = pos = avail = 0;
}

bool Source::refill(uint32_t room) {
  if (is_memory()) return false;
  std::memmove(buffer, buffer + pos, avail);
  pos = 0;
  const int count = room == 0 ? 0 : read_io(io, buffer + avail, static_cast<int>(room));
  if (count <= 0) return false;
  avail += static_cast<uint32_t>(count);
  consumed += static_cast<uint32_t>(count);
  return true;
}

bool Source::fetch(uint32_t n) {
  if (!has_room(*this, int64_t{n} - avail)) return false;
  while (avail < n) {
    if (!refill(kSourceBufferSize - avail)) return false;
  }
  return true;
}

bool Source::skip(int64_t k) {
  if (k < 0) return false;
  if (k <= avail) {
    (void)take(static_cast<uint32_t>(k));
    return true;
  }
  const int64_t distance = k - avail;
  const int64_t target = consumed + distance;
  if (is_memory() || target > INT_MAX) return false;
  // The window is given up even when the seek fails, so that a later move seeks again.
  consumed = static_cast<uint32_t>(target);
  pos = avail = 0;
  return seek_io(io, static_cast<int>(distance), SEEK_CUR) >= target;
}

bool Source::move_to(int64_t offset) {
  const uint32_t valid = pos + avail;
  const int64_t start = int64_t{consumed} - valid;
  // The end of a memory is a place in it; behind a window's last byte the input stands.
  const int64_t end = is_memory() ? int64_t{consumed} + 1 : consumed;
  if (offset >= start && offset < end) {
    pos = static_cast<uint32_t>(offset - start);
    avail = valid - pos;
    return true;
  }
  if (is_memory() || offset < 0 || offset > INT_MAX) return false;
  consumed = static_cast<uint32_t>(offset);
  pos = avail = 0;
  return seek_io(io, static_cast<int>(offset), SEEK_SET) >= 0;
}

bool BufferedSource::open(TAVIRPELO_IO* io) {
  if (io == nullptr || !window_.allocate(kSourceBufferSize)) return false;
  source_.buffer = window_.data();
  source_.attach(io);
  return true;
}

// A single read, into the room that taken bytes left: what need() does as often as it must.
int check_buffer(Source* source, int n) {
  if (source == nullptr || source->buffer == nullptr) return 0;
  if (int64_t{source->avail} >= n) return 2;
  if (!has_room(*source, n)) return 0;
  return source->refill(source->avail == 0 ? kSourceBufferSize : source->pos) ? 1 : 0;
}

}  // namespace pelo
