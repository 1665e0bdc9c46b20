// Preparation of a scan: MCU geometry, entropy tables, multipliers.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// MCU geometry and derived tables of the scan that was read last. 200 or 201.
int set_up_scan(PELOJ_JDINFO* jdInfo);

// set_up_scan, the multiplier tables and, before the first scan, the MCU buffer. 200 or 201.
int prepare_before_scan(PELOJ_JDINFO* jdInfo);

// Where the scan's skip tables go; null when its blocks are read whole.
EntropyState* skip_tables(PELOJ_JDINFO& jd);

// The MCU layout of a scan, in the scan and its components; false when an MCU would have more than ten
// blocks.
[[nodiscard]] bool set_scan_geometry(const Frame& frame, Scan& scan);

// Starts an iMCU row.
void begin_imcu_row(Scan& scan, int imcuRow);

}  // namespace pelo::jpeg
