// Sample rows of one MCU row from the pixels of each input format.
#pragma once

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {

// Fills the sample buffers with the next MCU row of the encoder's image. False for a format that the
// component layout cannot take.
[[nodiscard]] bool read_input_rows(ELO_ENCODER& encoder);

// True when the components are those of planar input: one alone, or 4:2:0.
bool takes_planes(const ELO_ENCODER& encoder);

}  // namespace pelo::jpeg
