#include "codec/formats/gif/reader.h"

#include <cstring>

#include "codec/base/io.h"

namespace pelo::gif {

int fill_buffer(int need, TAVIRPELO_IO* source, uint8_t* buffer, int* remaining, uint8_t** cursor) {
  if (*remaining >= need) return 1;
  if (need > kReaderBytes) return 0;
  if (*remaining > 0) std::memmove(buffer, *cursor, static_cast<size_t>(*remaining));
  *cursor = buffer;
  while (*remaining < need) {
    const int count = read_io(source, buffer + *remaining, kReaderBytes - *remaining);
    if (count < 1) return 0;
    *remaining += count;
  }
  return 1;
}

const uint8_t* take(Reader& reader, int n) {
  if (!fill_buffer(n, reader.source, reader.buffer, &reader.remaining, &reader.cursor)) {
    reader.remaining = 0;  // the rest of what was cut is no block
    return nullptr;
  }
  const uint8_t* bytes = reader.cursor;
  reader.cursor += n;
  reader.remaining -= n;
  return bytes;
}

bool skip_sub_blocks(Reader& reader) {
  for (;;) {
    const uint8_t* size = take(reader, 1);
    if (size == nullptr) return false;
    if (*size == 0) return true;
    if (take(reader, *size) == nullptr) return false;
  }
}

}  // namespace pelo::gif
