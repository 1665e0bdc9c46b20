// Coding a JPEG's coefficients again with coarser quantisation tables.
#pragma once

#include "codec/formats/jpeg/transform/coding_parameters.h"

namespace pelo::jpeg {

enum class Coarsening { kDone, kTooCoarse, kFailed };

// The finer the steps have to become, in 1024ths, when `size` bytes are to be `target`: 1024 keeps them.
int updated_gain(int size, int target);

// Makes the one or two tables those of Annex K at the source's own scale times gain / 1024, and
// multiplies the ratios by what that changes. kTooCoarse leaves everything as it was; other numbers of
// tables fail.
pelo::jpeg::Coarsening set_gained_table(pelo::jpeg::TransformParameters* parameters, int gain);

// Code a source's rows, each coefficient multiplied by its ratio: from baseline and from progressive
// data. 1 or 0.
int requantise_sequential(pelo::jpeg::CoefficientSource* source,
                          const pelo::jpeg::TransformParameters* parameters, ELO_ENCODER* encoder);
int requantise_progressive(pelo::jpeg::CoefficientSource* source,
                           const pelo::jpeg::TransformParameters* parameters, ELO_ENCODER* encoder);

}  // namespace pelo::jpeg
