// Driver of the PNG decoder, and the release of its state.
#pragma once

#include <cstdint>

#include "codec/formats/png/png_context.h"

// Decodes into `output`; lines > 0: that many output rows, into a buffer that receives only these. 1
// done (also for a computed output size of 0), 9 more to come, 7 parse failure or out of memory, 10 line
// mode of an interlaced image, or the decompressor's 6, 8. Every answer but 9 releases the state.
TAVIRPELO_API int PELOI_FastImgDecodePng(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                         int lines);

// Releases the object's PNG state, if it holds one; 1.
TAVIRPELO_API int PELOI_DestroyDecodePng(TAVIRPELO_DECINFO* decInfo);

// 1 when the PNG needs alpha: its colour type carries some, or it has a tRNS chunk (as far as it can be
// parsed); 0 otherwise. Releases a PNG state that the object holds.
TAVIRPELO_API int PELOI_GetAlphaTrFlag(TAVIRPELO_DECINFO* decInfo);
