// Preparation of a scan: MCU geometry, entropy tables, multipliers.
#pragma once

#include "codec/jpeg/decoder/jd_info.h"

// MCU geometry and derived tables of the scan that was read last. 200 or 201.
TAVIRPELO_API int PELOJ_SetupScan(PELOJ_JDINFO* jdInfo);

// PELOJ_SetupScan, the multiplier tables and, before the first scan, the MCU buffer. 200 or 201.
TAVIRPELO_API int PELOJ_InitDecBeforeScan(PELOJ_JDINFO* jdInfo);

// Starts the next iMCU row.
TAVIRPELO_API void PELOJ_SetupiMcu(PELOJ_JDINFO* jdInfo);
