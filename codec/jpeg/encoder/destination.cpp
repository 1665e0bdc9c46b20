// Where the encoder's bytes go: a memory buffer that grows, or a file through a working buffer.
#include <algorithm>
#include <climits>

#include "codec/jpeg/encoder/encoder.h"

using namespace pelo::jpeg;

uint8_t* elo_jpeg_enc_realloc(uint8_t* old, int oldSize, int extra) {
  if (oldSize < 0 || extra < 0 || extra > INT_MAX - oldSize) return nullptr;
  auto* grown = static_cast<uint8_t*>(TAVIRPELO_OsMalloc(static_cast<size_t>(oldSize + extra)));
  if (grown == nullptr) return nullptr;
  TAVIRPELO_OsMemcpy(grown, old, static_cast<size_t>(oldSize));
  TAVIRPELO_OsFree(old);
  return grown;
}

int elo_jpeg_enc_reserve(ELO_ENCODER* encoder, int bytes) {
  ELO_DESTINATION& destination = *encoder->destination;
  if (encoder->failed) return 0;
  if (destination.capacity - destination.used >= bytes) return 1;
  if (!destination.toMemory) {
    const auto used = static_cast<size_t>(destination.used);
    encoder->failed = TAVIRPELO_OsFwrite(destination.buffer, 1, used, destination.file) != used;
    destination.total += destination.used;
    destination.used = 0;
    if (encoder->failed) return 0;
    if (destination.capacity >= bytes) return 1;
  }
  // By half at least: large pictures must not copy themselves thousands of times.
  const int extra = std::max({4096, bytes, destination.capacity / 2});
  uint8_t* grown = elo_jpeg_enc_realloc(destination.buffer, destination.capacity, extra);
  if (grown == nullptr) {
    elo_SetError(kNoMemory);
    encoder->failed = 1;
    return 0;
  }
  destination.buffer = grown;
  destination.capacity += extra;
  return 1;
}
