// One PNG decode from memory.
#pragma once

#include "codec/png/png_driver.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/png_builder.h"

namespace tests {

inline Decode decode_png(const Bytes& file, int width, int height, int format, uint32_t option = 0) {
  return decode(TAVIRPELOI_DecodePNG, file, width, height, format, option);
}

}  // namespace tests
