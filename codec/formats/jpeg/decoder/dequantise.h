// Multiplier tables of the inverse transforms, and the requantisation of very finely quantised pictures.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// The component's table: in sequential pictures that of its scan, in progressive ones the latest. Null
// for none.
QuantTable* quant_table(const Tables& tables, const Component& component);

// Sets the requantisation flag (decode mode 1 only) and the multipliers of the scans so far. False when
// a quantisation table is missing.
[[nodiscard]] bool prepare_multipliers(PELOJ_JDINFO& jd);

}  // namespace pelo::jpeg
