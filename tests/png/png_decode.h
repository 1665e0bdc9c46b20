// One PNG decode from memory.
#pragma once

#include "codec/png/png_driver.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/png_builder.h"

namespace tests {

struct PngResult {
  int answer;
  Bytes pixels;
  int outWidth, outHeight;
};

inline PngResult decode_png(Bytes file, int width, int height, int format, uint32_t option = 0) {
  GuardedPixels pixels(width, height, format);
  const DecInfo decInfo = open_memory(file, format, option);
  if (decInfo == nullptr) return {0, {}, 0, 0};
  const int answer = TAVIRPELOI_DecodePNG(decInfo.get(), pixels.data(), width, height);
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  return {answer, pixels.content(), decInfo->outWidth, decInfo->outHeight};
}

}  // namespace tests
