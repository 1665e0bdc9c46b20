// The codec's entries for foreign bytes, a line each: what the hostile suite, the suite of decodes in
// pieces and the fuzz target run. Nothing here depends on a test framework.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>

#include "tavirpelo/tavirpelo.h"

namespace tests {

struct Request {
  int width = 23, height = 19;
  int format = TAVIRPELO_RGB888;  // one of packed pixels
  uint32_t option = 0;
  int lines = 5;  // rows of a band or a call, where an entry takes them; turns and targets elsewhere
  int mode = 0;   // of JPEG decodes
};

// An object's memory, which must be its source.
inline std::span<uint8_t> memory_of(const TAVIRPELO_DECINFO& d) {
  return {static_cast<uint8_t*>(d.pIO->pSource), static_cast<size_t>(d.pIO->size)};
}

struct Entry {
  const char* name;    // begins with the format that it reads
  const char* format;  // "" for any
  // Goes through the source to its end or to the first failure, as a caller would, and ends what it
  // began. Entries of pixels write width x height of them. 0 for a failure.
  int (*run)(TAVIRPELO_DECINFO*, uint8_t* pixels, const Request&);
  bool pixels;  // writes them, as the format's decoder in one call does
};

std::span<const Entry> entries();

// The entry of a name, which must be there.
const Entry& entry(std::string_view name);

// Gives the chunks of a PNG their right checksums: damage reaches what lies behind them. Other files
// stay.
void repair_checksums(std::span<uint8_t> file);

}  // namespace tests
