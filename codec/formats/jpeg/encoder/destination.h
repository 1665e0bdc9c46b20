// Where encoded bytes go: a memory block that grows, or a file behind a working buffer.
#pragma once

#include <cstddef>
#include <cstdint>

#include "tavirpelo/encode.h"

// The block moved into one `extra` bytes larger; null, with the old block untouched, when memory is
// short or the new size exceeds an int.
TAVIRPELO_API uint8_t* elo_jpeg_enc_realloc(uint8_t* old, int oldSize, int extra);

// Takes the reason of a failure; keeps none.
TAVIRPELO_API void elo_SetError(int code);

namespace pelo::jpeg {

constexpr int kDestinationStep = 4096;  // growth of a memory block, size of a file's working buffer

// Reasons given to elo_SetError.
constexpr int kErrorMemory = 3;
constexpr int kErrorFormat = 6;
constexpr int kErrorSampling = 7;
constexpr int kErrorSize = 14;

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
