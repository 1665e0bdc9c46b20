// Decoding of one iMCU row (8 x vMax picture rows) into the components' sample rows.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Full size, and reduced scales. 100: done, more rows; 101: the last row, or the data ended within the
// last 16 rows to be shown (then the row is not counted); 102: failed.
int decode_imcu_row(PELOJ_JDINFO* jdInfo);
int decode_imcu_row_scaled(PELOJ_JDINFO* jdInfo);

}  // namespace pelo::jpeg
