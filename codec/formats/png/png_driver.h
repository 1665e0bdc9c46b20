// Driver of the PNG decoder, and the release of its state.
#pragma once

#include <cstdint>

#include "codec/formats/png/png_context.h"

// One call of a decode: whole (lines 0) or the next `lines` output rows, which then are all that
// `output` has room for. A Result; a picture too small to have any pixel is kDone. Only kMore leaves the
// state in place.
TAVIRPELO_API int PELOI_FastImgDecodePng(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                         int lines);

// Releases the object's PNG state, if it holds one; 1.
TAVIRPELO_API int PELOI_DestroyDecodePng(TAVIRPELO_DECINFO* decInfo);

// 1 when the PNG needs alpha: its colour type carries some, or it has a tRNS chunk (as far as it can be
// parsed); 0 otherwise. Releases a PNG state that the object holds.
TAVIRPELO_API int PELOI_GetAlphaTrFlag(TAVIRPELO_DECINFO* decInfo);
