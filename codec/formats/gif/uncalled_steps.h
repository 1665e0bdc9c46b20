// Exported helpers that nothing in the library calls.
#pragma once

#include <cstdint>

#include "tavirpelo/api.h"

// Returns its argument.
TAVIRPELO_API uint32_t PELOI_DecoderBufferToOutBit(uint32_t value);

// The R, G, B value between four neighbouring pixels (left, right of the upper row, then of the lower),
// `x` and `y` 256ths of the way right and down (0 to 256), rounded to the nearest.
TAVIRPELO_API void _interpolate_rgb888(const uint8_t* upperLeft, const uint8_t* upperRight,
                                       const uint8_t* lowerLeft, const uint8_t* lowerRight, uint32_t x,
                                       uint32_t y, uint8_t* result);
