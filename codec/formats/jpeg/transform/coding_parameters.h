// What the encoder takes over from the source: tables, sampling factors, restart markers. And coding the
// source's coefficients again with coarser tables.
#pragma once

#include "codec/formats/jpeg/encoder/encoder.h"
#include "codec/formats/jpeg/transform/coefficient_source.h"

namespace pelo::jpeg {

struct TransformParameters {
  CodingParameters coding;
  int tableCount;                             // distinct quantisation tables in use
  std::array<uint8_t, kQuantTables> numbers;  // theirs, in the order of first use
  int sourceSize;                             // bytes
  // What coefficients are multiplied by, 1024 = 1.0, by table number in natural order.
  std::array<std::array<int64_t, 64>, kQuantTables> ratio;
};

// Takes components, sampling factors and each distinct quantisation table of the source; ratios are 1.
void parameters_of_source(CoefficientSource* source, TransformParameters* parameters);

// Exchanges vertical and horizontal: sampling factors and the tables' rows and columns.
void transpose_parameters(TransformParameters* parameters);

// ---- coarser tables ----

enum class Coarsening { kDone, kTooCoarse, kFailed };

// The finer the steps have to become, in 1024ths, when `size` bytes are to be `target`: 1024 keeps them.
int updated_gain(int size, int target);

// Makes the one or two tables those of Annex K at the source's own scale times gain / 1024, and
// multiplies the ratios by what that changes. kTooCoarse leaves everything as it was; other numbers of
// tables fail.
Coarsening set_gained_table(TransformParameters* parameters, int gain);

// Code a source's rows, each coefficient multiplied by its ratio: from baseline and from progressive
// data. 1 or 0.
int requantise_sequential(CoefficientSource* source, const TransformParameters* parameters,
                          ELO_ENCODER* encoder);
int requantise_progressive(CoefficientSource* source, const TransformParameters* parameters,
                           ELO_ENCODER* encoder);

}  // namespace pelo::jpeg
