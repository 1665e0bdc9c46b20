// From sample rows to output rows: replication of subsampled components to the full grid, conversion of
// full-grid rows to the target size (copied, picked at centres, or averaged from four points), and the
// row functions that drive both: an iMCU row is decoded when the last one is used up, then shown row by
// row.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// From a component's input rows of one row group (v rows) to the pointers of its vMax full-grid rows, as
// they are or replicated. Nothing is interpolated; equal rows share one buffer.
void use_rows_as_they_are(int vMax, uint8_t** input, uint8_t** grid);
void replicate_rows(const Component& component, int vMax, uint8_t** input, uint8_t** grid);

// Converts up to `capacity - *rowCounter` rows of the current row group, replicating it first when the
// last one is used up, and advances *rowCounter. The skipping form moves on without converting.
void convert_rows(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity);
void skip_rows_unconverted(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity);

// Sets every component's replication, and allocates sample rows and full-grid rows. 200 or 201.
int prepare_upsampling(Frame& frame, Scale scale, Progress& progress);

// `rows` row pointers and their samples in one block, freed with TAVIRPELO_OsFree; null for zero sizes
// or when memory is short.
uint8_t** allocate_rows(int width, int rows);

// Converters. Output column x of outW draws on input columns floor((x * inW + q) / outW): q = inW/2 for
// the centre point, inW/4 and 3*inW/4 for the two points of the averages; rows likewise.
//
// Each converts `rows` rows of the current row group from the read position on. The plain members and
// the fast enlarging one finish their rows in one call; the averaging enlarging ones return after every
// output row. All clear the continue flag when the input row is used up, and keep it, one row a call,
// when the band of output rows is full before.
void average_ycc(PELOJ_JDINFO* jdInfo, int rows);
void enlarge_ycc(PELOJ_JDINFO* jdInfo, int rows);
void pick_ycc(PELOJ_JDINFO* jdInfo, int rows);
void pick_enlarging_ycc(PELOJ_JDINFO* jdInfo, int rows);
void average_grey(PELOJ_JDINFO* jdInfo, int rows);
void enlarge_grey(PELOJ_JDINFO* jdInfo, int rows);
void average_rgb(PELOJ_JDINFO* jdInfo, int rows);
void enlarge_rgb(PELOJ_JDINFO* jdInfo, int rows);

// Picks the converter of a colour space, sizes and a decode mode; false for a colour space that has
// none.
[[nodiscard]] bool choose_converter(ColourSpace colourSpace, const Sizes& sizes, int decMode,
                                    Resampling& resampling);

// Makes the column table that the chosen converter needs, and room for its sums.
[[nodiscard]] bool prepare_resampling(const Sizes& sizes, Resampling& resampling);

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
