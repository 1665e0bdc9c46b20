// What the encoder takes over from the source: tables, sampling factors, restart markers.
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
void parameters_of_source(pelo::jpeg::CoefficientSource* source,
                          pelo::jpeg::TransformParameters* parameters);

// Exchanges vertical and horizontal: sampling factors and the tables' rows and columns.
void transpose_parameters(pelo::jpeg::TransformParameters* parameters);

}  // namespace pelo::jpeg
