// The inverse DCT family: fixed-point transforms of one block at each output size, with members for
// sparse blocks. All are built on the scaled 8-point transform of Arai, Agui and Nakajima or, at scale
// 1/2, on a 4-point one; dequantisation is part of the multiplier table.
#pragma once

#include <cstdint>

#include "tavirpelo/api.h"

namespace pelo::jpeg {

// range: unused (clamping is arithmetic: hostile coefficients leave any table). multiplier: 64 factors,
// natural order. block: 64 coefficients, natural order, not dequantised. rows, column: where the samples
// go, one pointer for each output row of the block.
using InverseDct = void (*)(const uint8_t* range, const int32_t* multiplier, const int32_t* block,
                            uint8_t* const* rows, int column);

// The member for a block whose last non-zero coefficient stands at a zig-zag position.
InverseDct idct_full(int lastPosition);
InverseDct idct_half(int lastPosition);

// The single sample of a block at scale 1/8.
uint8_t idct_dc(int32_t multiplier, int32_t dc);

}  // namespace pelo::jpeg

#define PELOJ_IDCT(name)                                                                         \
  TAVIRPELO_API void name(const uint8_t* range, const int32_t* multiplier, const int32_t* block, \
                          uint8_t* const* rows, int column)

// 8x8 samples; NByM reads the first M rows and N columns of coefficients, 2By2 chooses between 1By2 and
// 2By2All. PELOJ_DoIdct reads all, for blocks of unknown extent.
PELOJ_IDCT(PELOJ_DoIdct8By8);
PELOJ_IDCT(PELOJ_DoIdct);
PELOJ_IDCT(PELOJ_DoIdct4By4);
PELOJ_IDCT(PELOJ_DoIdct3By3);
PELOJ_IDCT(PELOJ_DoIdct2By2);
PELOJ_IDCT(PELOJ_DoIdct2By2All);
PELOJ_IDCT(PELOJ_DoIdct2By1);
PELOJ_IDCT(PELOJ_DoIdct1By2);
PELOJ_IDCT(PELOJ_DoIdct1By1);

// 4x4 samples from the 4-point transform (scale 1/2).
PELOJ_IDCT(PELOJ_DoIdct4x4For4x4);
PELOJ_IDCT(PELOJ_DoIdct3x3For4x4);
PELOJ_IDCT(PELOJ_DoIdct2x2For4x4);
PELOJ_IDCT(PELOJ_DoIdct2x2AllFor4x4);
PELOJ_IDCT(PELOJ_DoIdct2x1For4x4);
PELOJ_IDCT(PELOJ_DoIdct1x2For4x4);
PELOJ_IDCT(PELOJ_DoIdct1x1For4x4);

// 4x4, 3x3 and 2x2 samples: means or picks of the 8-point transform's outputs.
PELOJ_IDCT(PELOJ_DoIdct_2to1);
PELOJ_IDCT(PELOJ_DoIdct_8to3);
PELOJ_IDCT(PELOJ_DoIdct_4to1);
