// Replication of subsampled components to the full sampling grid, and the row loop above the converters.
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

}  // namespace pelo::jpeg
