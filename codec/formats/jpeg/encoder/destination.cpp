#include "codec/formats/jpeg/encoder/destination.h"

#include <algorithm>
#include <cerrno>
#include <climits>

#include "codec/base/checked.h"
#include "codec/base/errors.h"
#include "codec/base/os.h"
#include "tavirpelo/io.h"

namespace pelo::jpeg {

uint8_t* grow_block(uint8_t* old, int oldSize, int extra) {
  if (oldSize < 0 || extra < 1 || oldSize > INT_MAX - extra) return nullptr;
  const auto size = static_cast<size_t>(oldSize) + static_cast<size_t>(extra);
  return static_cast<uint8_t*>(os_realloc(old, size));
}

namespace {

bool grow(ELO_DESTINATION& destination, int extra) {
  uint8_t* block = grow_block(destination.buffer, destination.capacity, extra);
  if (block == nullptr) {
    return refuse(Reason::kNoMemory, "encoder output");
  }
  destination.buffer = block;
  destination.capacity += extra;
  return true;
}

bool flush(ELO_DESTINATION& destination) {
  const auto count = static_cast<size_t>(destination.used);
  const auto total = checked_int(int64_t{destination.total} + destination.used);
  if (!total || destination.file == nullptr) return false;
  errno = 0;
  if (count != 0 && os_write(destination.buffer, 1, count, destination.file) != count) {
    const bool full = errno == ENOSPC || errno == EDQUOT || errno == EFBIG;
    return refuse(full ? Reason::kDiskFull : Reason::kNotWritable, "encoder output");
  }
  destination.total = *total;
  destination.used = 0;
  return true;
}

// `shortfall` rounded up to whole steps; 0 when that exceeds an int.
int growth_for(size_t shortfall) {
  const size_t steps = (shortfall - 1) / kDestinationStep + 1;
  return steps > INT_MAX / kDestinationStep ? 0 : static_cast<int>(steps) * kDestinationStep;
}

bool append_to_memory(ELO_DESTINATION& destination, const uint8_t* bytes, size_t count) {
  const auto room = static_cast<size_t>(destination.capacity - destination.used);
  if (count > room && !grow(destination, growth_for(count - room))) return false;
  os_memcpy(destination.buffer + destination.used, bytes, count);
  destination.used += static_cast<int>(count);
  return true;
}

bool append_to_file(ELO_DESTINATION& destination, const uint8_t* bytes, size_t count) {
  if (destination.buffer == nullptr && !grow(destination, kDestinationStep)) return false;
  while (count != 0) {
    if (destination.used == destination.capacity && !flush(destination)) return false;
    const size_t part = std::min(count, static_cast<size_t>(destination.capacity - destination.used));
    os_memcpy(destination.buffer + destination.used, bytes, part);
    destination.used += static_cast<int>(part);
    bytes += part;
    count -= part;
  }
  return true;
}

}  // namespace

bool append(ELO_DESTINATION& destination, const uint8_t* bytes, size_t count) {
  if (count == 0) return true;
  return destination.kind == ELO_TO_MEMORY ? append_to_memory(destination, bytes, count)
                                           : append_to_file(destination, bytes, count);
}

bool keep_margin(ELO_DESTINATION& destination, int margin, int step) {
  if (destination.capacity - destination.used > margin) return true;
  return destination.kind == ELO_TO_MEMORY ? grow(destination, step) : flush(destination);
}

bool finish(ELO_DESTINATION& destination) {
  if (destination.kind == ELO_TO_FILE) return flush(destination);
  destination.total = destination.used;
  return true;
}

void discard(ELO_DESTINATION& destination) {
  os_free(destination.buffer);
  destination.buffer = nullptr;
  destination.capacity = destination.used = destination.total = 0;
}

}  // namespace pelo::jpeg
