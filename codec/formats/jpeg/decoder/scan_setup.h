// Preparation of a scan: MCU geometry, entropy tables, multipliers.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// MCU geometry and derived tables of the scan that was read last. 200 or 201.
int set_up_scan(PELOJ_JDINFO* jdInfo);

// set_up_scan, the multiplier tables and, before the first scan, the MCU buffer. 200 or 201.
int prepare_before_scan(PELOJ_JDINFO* jdInfo);

// The MCU layout of the current scan; false when an MCU would have more than ten blocks.
[[nodiscard]] bool set_scan_geometry(PELOJ_JDINFO& jd);

// Starts the next iMCU row.
void begin_imcu_row(PELOJ_JDINFO* jdInfo);

}  // namespace pelo::jpeg
