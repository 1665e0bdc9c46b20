// Progressive pictures (ITU-T T.81 Annex G): the listed scans add up to one iMCU row of coefficients at
// a time, which is all that is in memory.
#pragma once

#include "codec/formats/jpeg/decoder/scan_list.h"

namespace pelo::jpeg {

// First pass and refinement of one MCU; 1, or 0 when the source failed.
int decode_mcu_first(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);
int decode_mcu_refine(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);

// All scans of the next iMCU row, then its inverse transform. As decode_imcu_row.
int decode_progressive_row(PELOJ_JDINFO* jdInfo);

// Transforms the row's coefficients; 100, or 101 after the last row.
int transform_stored_row(PELOJ_JDINFO* jdInfo);

// False when that first scan is not a first pass over DC, without which the rest is nothing.
inline bool first_scan_suffices(const PELOJ_JDINFO& jd) {
  const bool firstAlone = is_progressive(jd) && jd.sizes.scale == kEighth;
  return !firstAlone || (jd.scan.ss == 0 && jd.scan.ah == 0);
}

// Memory for one iMCU row of coefficients.
[[nodiscard]] bool allocate_store(const Frame& frame, ScanList& scans);

// All scans of the next iMCU row into the coefficient store, without its transform; the caller moves
// jd.progress.imcuRow on. 100; 102 when a scan's data fail, or 101 when they do so within the picture's
// last rows: neither happens with jd.entropy.endIsMarker.
int decode_coefficient_row(PELOJ_JDINFO& jd);

// A block of that store, by block row and column of the component in the iMCU row.
int32_t* stored_block(PELOJ_JDINFO& jd, const Component& component, int row, int column);

}  // namespace pelo::jpeg
