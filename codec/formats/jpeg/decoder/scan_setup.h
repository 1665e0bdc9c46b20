// Preparation of a scan: MCU geometry, entropy tables, multipliers.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

// MCU geometry and derived tables of the scan that was read last. 200 or 201.
TAVIRPELO_API int PELOJ_SetupScan(PELOJ_JDINFO* jdInfo);

// PELOJ_SetupScan, the multiplier tables and, before the first scan, the MCU buffer. 200 or 201.
TAVIRPELO_API int PELOJ_InitDecBeforeScan(PELOJ_JDINFO* jdInfo);

namespace pelo::jpeg {

// The MCU layout of the current scan; false when an MCU would have more than ten blocks.
[[nodiscard]] bool set_scan_geometry(PELOJ_JDINFO& jd);

}  // namespace pelo::jpeg

// Starts the next iMCU row.
TAVIRPELO_API void PELOJ_SetupiMcu(PELOJ_JDINFO* jdInfo);
