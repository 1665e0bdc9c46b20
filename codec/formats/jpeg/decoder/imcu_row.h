// Decoding of one iMCU row (8 x vMax picture rows) into the components' sample rows. The scans of a
// progressive picture (ITU-T T.81 Annex G) add up to one such row of coefficients at a time, which is
// all that is in memory.
#pragma once

#include "codec/formats/jpeg/decoder/scans.h"

namespace pelo::jpeg {

// Full size, and reduced scales. 100: done, more rows; 101: the last row, or the data ended within the
// last 16 rows to be shown (then the row is not counted); 102: failed.
int decode_imcu_row(PELOJ_JDINFO* jdInfo);
int decode_imcu_row_scaled(PELOJ_JDINFO* jdInfo);

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
