#include "codec/formats/jpeg/transform/coding_parameters.h"

#include <algorithm>
#include <utility>

namespace pelo::jpeg {
namespace {

// A table is kept once, under its number.
void add_table(TransformParameters& parameters, const PELOJ_JDINFO& jd, uint8_t number) {
  const auto end = parameters.numbers.begin() + parameters.tableCount;
  if (std::find(parameters.numbers.begin(), end, number) != end) return;
  parameters.numbers[static_cast<size_t>(parameters.tableCount++)] = number;
  for (size_t i = 0; i < 64; ++i) {
    parameters.coding.quant[number][i] = static_cast<uint8_t>(jd.tables.quant[number]->value[i]);
  }
}

}  // namespace

void parameters_of_source(CoefficientSource* source, TransformParameters* parameters) {
  const PELOJ_JDINFO& jd = source->decoder();
  const McuGrid& grid = source->grid();
  *parameters = {};
  for (auto& ratios : parameters->ratio) ratios.fill(1024);
  parameters->coding.componentCount = grid.componentCount;
  for (size_t c = 0; c < static_cast<size_t>(grid.componentCount); ++c) {
    const uint8_t number = (*jd.frame.components)[c].quantTable;
    parameters->coding.components[c] = {number, static_cast<uint8_t>(grid.h[c]),
                                        static_cast<uint8_t>(grid.v[c])};
    add_table(*parameters, jd, number);
  }
}

void transpose_parameters(TransformParameters* parameters) {
  for (CodingParameters::Component& component : parameters->coding.components)
    std::swap(component.h, component.v);
  for (auto& table : parameters->coding.quant) {
    for (size_t r = 0; r < 8; ++r) {
      for (size_t c = 0; c < r; ++c) std::swap(table[8 * r + c], table[8 * c + r]);
    }
  }
}

}  // namespace pelo::jpeg
