// Scans: preparing one (MCU geometry, entropy tables, multipliers of the inverse transforms), and the
// list of those that make up a picture in several. Progressive pictures have several, and sequential
// ones whose components come apart: the scans are listed first, then each iMCU row visits all of them in
// turn, each going on where it stopped. What is held does not grow with the picture's height.
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

// The component's table: in sequential pictures that of its scan, in progressive ones the latest. Null
// for none.
QuantTable* quant_table(const Tables& tables, const Component& component);

// Sets the requantisation flag (decode mode 1 only) and the multipliers of the scans so far. False when
// a quantisation table is missing.
[[nodiscard]] bool prepare_multipliers(PELOJ_JDINFO& jd);

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
