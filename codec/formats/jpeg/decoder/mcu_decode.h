// Sequential Huffman decoding of one MCU: one member per decode scale, each keeping only the
// coefficients that its inverse transform reads.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Each decodes one MCU into `blocks` (64 coefficients a block, natural order, zeroed by the caller, not
// dequantised) and records every block's last non-zero zig-zag position. 1, or 0 when the source failed.
// A corrupt code ends its block only; behind a marker MCUs stay as they are.
int decode_mcu_full(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);           // all positions
int decode_mcu_requantised(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);    // requantising
int decode_mcu_half(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);           // below 19
int decode_mcu_three_eighths(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 9
int decode_mcu_quarter(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);        // below 5
int decode_mcu_dc(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);             // DC alone

// Synchronises with the next RSTn (T.81 F.2.2.4): drops the bits held, looks for a marker unless one is
// pending, resets the predictors. A marker with another number stays pending. `interval`: MCUs up to the
// next one. False at the end of the source.
[[nodiscard]] bool process_restart(PELOJ_SOURCE& source, Entropy& entropy, MarkerRecord& marker,
                                   int interval);

}  // namespace pelo::jpeg
