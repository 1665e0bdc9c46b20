// Decoding of one iMCU row (8 x vMax picture rows) into the components' sample rows.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

// Full size, and reduced scales. 100: done, more rows; 101: the last row, or the data ended within the
// last 16 rows to be shown (then the row is not counted); 102: failed.
TAVIRPELO_API int PELOJ_DecodeSingleiMcu(PELOJ_JDINFO* jdInfo);
TAVIRPELO_API int PELOJ_DecodeSingleiMcu_resize(PELOJ_JDINFO* jdInfo);
