// GIF decodes with guard bytes around the buffer.
#pragma once

#include "tests/support/gif_builder.h"
#include "tests/support/guarded_decode.h"

namespace tests {

inline Decode decode_gif(const Bytes& file, int width, int height, int format = 7, uint32_t option = 0) {
  return decode(TAVIRPELOI_DecodeGIF, file, width, height, format, option);
}

// Every frame that an animation gives, and the answer that ended it.
struct GifFrames {
  int answer = 0;
  std::vector<Bytes> frames;
};
inline GifFrames decode_frames(Bytes file, int width, int height, int format = 7, uint32_t option = 0) {
  GifFrames result;
  const DecInfo decInfo = open_memory(file, format, option);
  if (decInfo == nullptr) return result;
  do {
    GuardedPixels pixels(width, height, format);
    result.answer = TAVIRPELOI_DecodeAGIF(decInfo.get(), pixels.data(), width, height);
    result.frames.push_back(pixels.content());
  } while (result.answer == 1);
  EXPECT_EQ(nullptr, decInfo->pFormatInfo);
  return result;
}

}  // namespace tests
