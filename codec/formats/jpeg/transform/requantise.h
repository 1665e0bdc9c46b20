// Coding a JPEG's coefficients again with coarser quantisation tables.
#pragma once

#include "codec/formats/jpeg/transform/coding_parameters.h"

namespace pelo::jpeg {

enum class Coarsening { kDone, kTooCoarse, kFailed };

}  // namespace pelo::jpeg

// The finer the steps have to become, in 1024ths, when `size` bytes are to be `target`: 1024 keeps them.
TAVIRPELO_API int __elo_get_update_gain(int size, int target);

// Makes the one or two tables those of Annex K at the source's own scale times gain / 1024, and
// multiplies the ratios by what that changes. kTooCoarse leaves everything as it was; other numbers of
// tables fail.
TAVIRPELO_API pelo::jpeg::Coarsening __elo_set_qunat_table(pelo::jpeg::TransformParameters* parameters,
                                                           int gain);

// Code a source's rows, each coefficient multiplied by its ratio: from baseline and from progressive
// data. 1 or 0.
TAVIRPELO_API int __elo_bits_control(pelo::jpeg::CoefficientSource* source,
                                     const pelo::jpeg::TransformParameters* parameters,
                                     ELO_ENCODER* encoder);
TAVIRPELO_API int __elo_prog_bits_control(pelo::jpeg::CoefficientSource* source,
                                          const pelo::jpeg::TransformParameters* parameters,
                                          ELO_ENCODER* encoder);
