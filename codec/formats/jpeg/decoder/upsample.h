// Replication of subsampled components to the full sampling grid, and the row loop above the converters.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

// Per-component methods: from the input rows of one row group (v rows) to *slot, the pointers of its
// vMax full-grid rows. None interpolates; equal rows share one buffer.
TAVIRPELO_API void PELOJ_DoFullsizeUpsample(PELOJ_JDINFO* jdInfo, pelo::jpeg::Component* component,
                                            uint8_t** input, uint8_t*** slot);
TAVIRPELO_API void PELOJ_DoH2V1Upsample(PELOJ_JDINFO* jdInfo, pelo::jpeg::Component* component,
                                        uint8_t** input, uint8_t*** slot);
TAVIRPELO_API void PELOJ_DoH2V2Upsample(PELOJ_JDINFO* jdInfo, pelo::jpeg::Component* component,
                                        uint8_t** input, uint8_t*** slot);
TAVIRPELO_API void PELOJ_DoIntegralUpsample(PELOJ_JDINFO* jdInfo, pelo::jpeg::Component* component,
                                            uint8_t** input, uint8_t*** slot);

// Converts up to `capacity - *rowCounter` rows of the current row group, replicating it first when the
// last one is used up, and advances *rowCounter. The skipping form moves on without converting.
TAVIRPELO_API void PELOJ_SetupUpsample(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity);
TAVIRPELO_API void PELOJ_SkipRowUpsample(PELOJ_JDINFO* jdInfo, int* rowCounter, int capacity);

// Chooses every component's method, and allocates sample rows and full-grid rows. 200 or 201.
TAVIRPELO_API int PELOJ_InitUpsampler(PELOJ_JDINFO* jdInfo);

// `rows` row pointers and their samples in one block, freed with TAVIRPELO_OsFree; null for zero sizes or
// when memory is short.
TAVIRPELO_API uint8_t** PELOJ_AllocSampleArry(int width, int rows);
