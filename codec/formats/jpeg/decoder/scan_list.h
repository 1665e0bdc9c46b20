// Pictures in several scans, progressive ones and sequential ones whose components come apart: the scans
// are listed first, then each iMCU row visits all of them in turn, each going on where it stopped. What
// is held does not grow with the picture's height.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Makes a record of the current scan header, entropy state and source position in the slot. 200 or 201.
int make_scan_record(PELOJ_JDINFO* jdInfo, pelo::OsPtr<pelo::jpeg::ScanRecord>* slot);

// Keeps where the scan's decoding stands.
void save_scan(PELOJ_JDINFO* jdInfo, pelo::jpeg::ScanRecord* record);

// Goes on with a scan. 1, or 0 with nothing changed when its data cannot be reached.
int load_scan(PELOJ_JDINFO* jdInfo, const pelo::jpeg::ScanRecord* record);

inline bool is_progressive(const PELOJ_JDINFO& jd) {
  return jd.marker->frameType == FrameType::kProgressive;
}

// True for pictures whose blocks several scans make up: progressive ones but at an eighth of their size,
// where the first scan alone is shown.
inline bool stores_coefficients(const PELOJ_JDINFO& jd) {
  return is_progressive(jd) && jd.sizes.scale != kEighth;
}

// True when a row takes more than the scan that the header ends with.
inline bool needs_all_scans(const PELOJ_JDINFO& jd) {
  if (is_progressive(jd)) return stores_coefficients(jd);
  return jd.scans.count > 0 || jd.scan.componentCount < jd.frame.componentCount;
}

// Lists the scans from the first one, which the decoder has just prepared, as far as the scale can show
// them. 200 or 201.
[[nodiscard]] int list_scans(PELOJ_JDINFO& jd);

}  // namespace pelo::jpeg
