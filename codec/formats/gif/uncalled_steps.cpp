#include "codec/formats/gif/uncalled_steps.h"

uint32_t PELOI_DecoderBufferToOutBit(uint32_t value) {
  return value;
}

void _interpolate_rgb888(const uint8_t* upperLeft, const uint8_t* upperRight, const uint8_t* lowerLeft,
                         const uint8_t* lowerRight, uint32_t x, uint32_t y, uint8_t* result) {
  for (int c = 0; c < 3; ++c) {
    const uint32_t upper = upperLeft[c] * (256 - x) + upperRight[c] * x;
    const uint32_t lower = lowerLeft[c] * (256 - x) + lowerRight[c] * x;
    result[c] = static_cast<uint8_t>((upper * (256 - y) + lower * y + 0x8000) >> 16);
  }
}
