// Progressive pictures (ITU-T T.81 Annex G) with one iMCU row of coefficients in memory: every scan is
// listed first, then each iMCU row visits all scans in turn, each going on where it stopped.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

// Makes a record of the current scan header, entropy state and source position in the slot. 200 or 201.
TAVIRPELO_API int PELOJ_SetupScanInfo(PELOJ_JDINFO* jdInfo, pelo::OsPtr<pelo::jpeg::ScanRecord>* slot);

// Keeps where the scan's decoding stands.
TAVIRPELO_API void PELOJ_SaveScanInfo(PELOJ_JDINFO* jdInfo, pelo::jpeg::ScanRecord* record);

// Goes on with a scan. 1, or 0 with nothing changed when its data cannot be reached.
TAVIRPELO_API int PELOJ_LoadScanInfo(PELOJ_JDINFO* jdInfo, const pelo::jpeg::ScanRecord* record);

// First pass and refinement of one MCU; 1, or 0 when the source failed.
TAVIRPELO_API int PELOJ_ProgDecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);
TAVIRPELO_API int PELOJ_ProgDecodeMcuRefine(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);

// All scans of the next iMCU row, then its inverse transform. As PELOJ_DecodeSingleiMcu.
TAVIRPELO_API int PELOJ_ProgDecodeSingleiMcu(PELOJ_JDINFO* jdInfo);

// Transforms the row's coefficients; 100, or 101 after the last row.
TAVIRPELO_API int PELOJ_ProgIDct(PELOJ_JDINFO* jdInfo);

namespace pelo::jpeg {

// True for progressive pictures but at an eighth of their size, which shows the first scan alone.
inline bool needs_all_scans(const PELOJ_JDINFO& jd) {
  return jd.marker->frameType == FrameType::kProgressive && jd.scale != kEighth;
}

// False when that first scan is not a first pass over DC, without which the rest is nothing.
inline bool first_scan_suffices(const PELOJ_JDINFO& jd) {
  const bool firstAlone = jd.marker->frameType == FrameType::kProgressive && jd.scale == kEighth;
  return !firstAlone || (jd.ss == 0 && jd.ah == 0);
}

// Lists the scans from the first one, which the decoder has just prepared, as far as the scale can show
// them. 200 or 201.
[[nodiscard]] int list_scans(PELOJ_JDINFO& jd);

// All scans of the next iMCU row into the coefficient store, without its transform; the caller moves
// jd.imcuRow on. 100; 102 when a scan's data fail, or 101 when they do so within the picture's last rows.
int decode_coefficient_row(PELOJ_JDINFO& jd);

// A block of that store, by block row and column of the component in the iMCU row.
int32_t* stored_block(PELOJ_JDINFO& jd, const Component& component, int row, int column);

}  // namespace pelo::jpeg
