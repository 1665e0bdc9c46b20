// Sequential Huffman decoding of one MCU: one member per decode scale, each keeping only the
// coefficients that its inverse transform reads.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

// Each decodes one MCU into `blocks` (64 coefficients a block, natural order, zeroed by the caller, not
// dequantised) and records every block's last non-zero zig-zag position. 1, or 0 when the source failed.
// A corrupt code ends its block only; behind a marker MCUs stay as they are.
TAVIRPELO_API int PELOJ_DecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);       // all positions
TAVIRPELO_API int PELOJ_FastDecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);   // requantising
TAVIRPELO_API int PELOJ_DecodeMcu_2to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 19
TAVIRPELO_API int PELOJ_DecodeMcu_8to3(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 9
TAVIRPELO_API int PELOJ_DecodeMcu_4to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 5
TAVIRPELO_API int PELOJ_DecodeMcu8to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);   // DC alone

// Synchronises with the next RSTn (T.81 F.2.2.4): drops the bits held, looks for a marker unless one is
// pending, resets the predictors. A marker with another number stays pending. 1, or 0 at the end of the
// source.
TAVIRPELO_API int PELOJ_ProcessRestartMarker(PELOJ_JDINFO* jdInfo);
