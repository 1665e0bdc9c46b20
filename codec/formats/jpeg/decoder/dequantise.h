// Multiplier tables of the inverse transforms, and the requantisation of very finely quantised pictures.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Sets the requantisation flag (decode mode 1 only) and every component's multipliers. False when a
// component's quantisation table is missing.
[[nodiscard]] bool prepare_multipliers(PELOJ_JDINFO& jd);

}  // namespace pelo::jpeg
