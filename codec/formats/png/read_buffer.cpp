#include "codec/formats/png/read_buffer.h"

#include <algorithm>
#include <cstdio>
#include <cstring>

#include "codec/base/errors.h"
#include "codec/base/io.h"

namespace pelo::png {
namespace {

constexpr const char* kStage = "PNG source";
constexpr int kReadFailed = 11;

// Reads up to `space` bytes behind the unread ones, which start at the base.
int fill(PELOI_PNGREADBUFFER& buffer, uint32_t space) {
  buffer.bufferPosition = buffer.consumed - buffer.remaining;
  buffer.cursor = 0;
  const int count = read_io(buffer.source, buffer.base + buffer.remaining, static_cast<int>(space));
  if (count <= 0 || static_cast<uint32_t>(count) > space) return kReadFailed;
  buffer.remaining += static_cast<uint32_t>(count);
  buffer.consumed += count;
  return 1;
}

}  // namespace

bool open_read_buffer(PELOI_PNGREADBUFFER& buffer, TAVIRPELO_IO* source) {
  if (source == nullptr) return refuse(Reason::kArgument, kStage);
  buffer.source = source;
  buffer.limit = static_cast<uint32_t>(std::max(source->size, 0));
  if (is_memory(buffer)) {
    buffer.base = static_cast<uint8_t*>(source->pSource);
    buffer.remaining = buffer.limit;
    buffer.consumed = buffer.limit;
    return buffer.base != nullptr || refuse(Reason::kEmpty, kStage);
  }
  if (!buffer.window.allocate(kReadWindow)) return refuse(Reason::kNoMemory, kStage);
  buffer.base = buffer.window.data();
  return seek_io(source, 0, SEEK_SET) == 0 || refuse(Reason::kSource, kStage);
}

bool need(PELOI_PNGREADBUFFER& buffer, uint32_t n) {
  while (buffer.remaining < n) {
    const uint32_t missing = n - buffer.remaining;
    const int result =
        buffer.remaining == 0 ? refill_empty(&buffer, missing) : refill_behind(&buffer, missing);
    if (result != 1) return false;
  }
  return true;
}

bool move_to(PELOI_PNGREADBUFFER& buffer, int64_t position) {
  const int64_t end = tell(buffer) + buffer.remaining;
  if (position >= buffer.bufferPosition && position <= end) {
    buffer.cursor = static_cast<uint32_t>(position - buffer.bufferPosition);
    buffer.remaining = static_cast<uint32_t>(end - position);
    return true;
  }
  const auto target = checked_int(position);
  if (is_memory(buffer) || !target || *target < 0) return false;
  if (seek_io(buffer.source, *target, SEEK_SET) != *target) return false;
  buffer.consumed = buffer.bufferPosition = position;
  buffer.cursor = buffer.remaining = 0;
  return true;
}

int refill_empty(PELOI_PNGREADBUFFER* buffer, uint32_t need) {
  if (need > kReadWindow || is_memory(*buffer)) return kReadFailed;
  buffer->remaining = 0;
  return fill(*buffer, kReadWindow);
}

int refill_behind(PELOI_PNGREADBUFFER* buffer, uint32_t need) {
  if (is_memory(*buffer) || need > kReadWindow - std::min(buffer->remaining, kReadWindow))
    return kReadFailed;
  std::memmove(buffer->base, buffer->base + buffer->cursor, buffer->remaining);
  return fill(*buffer, kReadWindow - buffer->remaining);
}

}  // namespace pelo::png
