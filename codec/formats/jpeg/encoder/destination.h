// Where encoded bytes go: a memory block that grows, or a file behind a working buffer.
#pragma once

#include <cstddef>
#include <cstdint>

#include "tavirpelo/encode.h"

namespace pelo::jpeg {

// The block moved into one `extra` bytes larger; null, with the old block untouched, when memory is
// short or the new size exceeds an int.
uint8_t* grow_block(uint8_t* old, int oldSize, int extra);

constexpr int kDestinationStep = 4096;  // growth of a memory block, size of a file's working buffer

// Appends `count` bytes, growing or flushing as often as needed: the only way into the buffer.
[[nodiscard]] bool append(ELO_DESTINATION& destination, const uint8_t* bytes, size_t count);

// Makes room ahead of need: when no more than `margin` bytes are free, a memory block grows by `step`
// bytes and a file's buffer is flushed.
[[nodiscard]] bool keep_margin(ELO_DESTINATION& destination, int margin, int step);

// Settles `total`, and writes what a file's working buffer still holds.
[[nodiscard]] bool finish(ELO_DESTINATION& destination);

// Frees the buffer and empties the record.
void discard(ELO_DESTINATION& destination);

}  // namespace pelo::jpeg
