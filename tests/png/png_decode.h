// One PNG decode from memory.
#pragma once

#include "codec/formats/png/png_driver.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/png_builder.h"

namespace tests {

// The standard's colour types and depths.
struct PngKind {
  uint8_t type, depth;
};
constexpr PngKind kPngKinds[] = {{0, 1}, {0, 2}, {0, 4}, {0, 8}, {0, 16}, {2, 8}, {2, 16}, {3, 1},
                                 {3, 2}, {3, 4}, {3, 8}, {4, 8}, {4, 16}, {6, 8}, {6, 16}};

inline Decode decode_png(const Bytes& file, int width, int height, int format, uint32_t option = 0) {
  return decode(TAVIRPELOI_DecodePNG, file, width, height, format, option);
}

}  // namespace tests
