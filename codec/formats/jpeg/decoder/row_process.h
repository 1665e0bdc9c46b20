// The row functions: one iMCU row is decoded when the last one is used up, then shown row by row.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// Produce up to `rowsWanted` full-grid rows (minus *rowCounter, which advances) at full size and at
// reduced scales. 201: failed or aborted by CheckFn; 101: the picture's last rows have been produced, or
// its data has ended quietly; another value: more to come.
int process_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted);
int process_rows_scaled(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted);

// The same for progressive pictures.
int process_progressive_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted);
int process_progressive_rows_scaled(PELOJ_JDINFO* jdInfo, int* rowCounter, int rowsWanted);

using RowFunction = int (*)(PELOJ_JDINFO*, int*, int);

// The row function of the state's frame type and scale.
[[nodiscard]] RowFunction row_function(const PELOJ_JDINFO& jd);

// Delivers rows up to the end of the band. 101 when the picture is complete or its data has ended
// quietly, 201 when a row could not be decoded; the rows written stand.
int show_rows(PELOJ_JDINFO& jd);

}  // namespace pelo::jpeg
