// Given names of this room that no public header has; each is what the room's own function says. Output
// rows and sample rows (`outRows`, `sampleRows`) are the state's own, so arguments that name them are
// not looked at.
#pragma once

#include "codec/formats/jpeg/decoder/bit_reader.h"
#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/formats/jpeg/decoder/headers.h"
#include "codec/formats/jpeg/decoder/huffman.h"
#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/imcu_row.h"
#include "codec/formats/jpeg/decoder/jd_info.h"
#include "codec/formats/jpeg/decoder/mcu_decode.h"
#include "codec/formats/jpeg/decoder/row_output.h"
#include "codec/formats/jpeg/decoder/rows.h"
#include "codec/formats/jpeg/decoder/scans.h"

// Refills reader->state from the given buffer and count. 1: the state holds `needed` bits, or zeros in
// place of those that a marker cut off; 0: the source ended and fewer than `needed` bits are real.
TAVIRPELO_API int PELOJ_ReadBits(pelo::jpeg::BitReader* reader, pelo::jpeg::BitBuffer buffer,
                                 int bitsLeft, int needed);

// Decodes one symbol from the given buffer and count, trying code lengths from minBits on; 0 for a code
// longer than 16 bits, -1 when the source failed. The reader's state stands behind the code.
TAVIRPELO_API int PELOJ_DecodeHuffMan(pelo::jpeg::BitReader* reader, pelo::jpeg::BitBuffer buffer,
                                      int bitsLeft, const pelo::jpeg::DerivedTable* derived,
                                      int minBits);

// Each converts `rows` rows of the current row group from the read position on. The plain members and
// the fast enlarging one finish their rows in one call; the averaging enlarging ones return after every
// output row. All clear the continue flag when the input row is used up, and keep it, one row a call,
// when the band of output rows is full before.
TAVIRPELO_API void PELOJ_DoYcbcrToRgb(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoYcbcrToUpscaleRgb(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoFastYcbcrToRgb(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoFastYcbcrToUpscaleRgb(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoGrayConvert(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoGrayUpscaleConvert(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoRgbConvert(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);
TAVIRPELO_API void PELOJ_DoRgbUpscaleConvert(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int rows);

// Parses the headers, chooses sizes and scale and prepares the first scan. The state is the caller's:
// end it with PELOJ_DeleteDecoderInfo and TAVIRPELO_OsFree (or pelo::jpeg::Decoder). Null on failure.
TAVIRPELO_API PELOJ_JDINFO* PELOJ_Initialize(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                             PELOJ_REQUEST* request);

// Chooses the converter, lays out the components, prepares upsampler and scan. 200 or 201.
TAVIRPELO_API int PELOJ_StartDecompression(PELOJ_JDINFO* jdInfo);

// Decodes a picture from the source's position. 200; 201; 0 when the data ends before the first wanted
// row.
TAVIRPELO_API int PELOJ_DecodeImage(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                    PELOJ_REQUEST* request);

// The same for a caller's buffer; 1 or 0.
TAVIRPELO_API int PELOJ_ValorenDecodeFrame(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                           void* outBuffer, int reqWidth, int reqHeight);

// Makes the table of a class and number ready for a scan. It lives in the state's pool and goes to
// *derivedOut, its skip table, where it has one, to `entropy`. 200; 201 when there is nothing to derive
// from or memory is short; 0 when no encoder can have meant the table (T.81 C.2, F.1.2.1.1).
TAVIRPELO_API int PELOJ_PrepareDerivedTbl(PELOJ_JDINFO* jdInfo, int isDC, int tableNumber,
                                          const pelo::jpeg::DerivedTable** derivedOut,
                                          pelo::jpeg::EntropyState* entropy);

// Full size, and reduced scales. 100: done, more rows; 101: the last row, or the data ended within the
// last 16 rows to be shown (then the row is not counted); 102: failed.
TAVIRPELO_API int PELOJ_DecodeSingleiMcu(PELOJ_JDINFO* jdInfo, uint8_t*** sampleRows);
TAVIRPELO_API int PELOJ_DecodeSingleiMcu_resize(PELOJ_JDINFO* jdInfo, uint8_t*** sampleRows);

// Frees what the state owns and clears it; a second call does nothing.
TAVIRPELO_API void PELOJ_DeleteDecoderInfo(PELOJ_JDINFO* jdInfo);

// The headers of a picture: frame, tables, first scan, colour space. 200, or 201 with the state emptied.
TAVIRPELO_API int PELOJ_ParseHeader(PELOJ_JDINFO* jdInfo, int unused);

// Goes on to where the next scan's data begin. *status tells whether there are any (200) or the picture
// has no further scan, or none that can be decoded (201); the answer is the marker that decided it.
TAVIRPELO_API int PELOJ_ParseNextMarker(PELOJ_JDINFO* jdInfo, int* status);

// Each decodes one MCU into `blocks` (64 coefficients a block, natural order, zeroed by the caller, not
// dequantised) and records every block's last non-zero zig-zag position. 1, or 0 when the source failed.
// A corrupt code ends its block only; behind a marker MCUs stay as they are.
TAVIRPELO_API int PELOJ_DecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);       // all positions
TAVIRPELO_API int PELOJ_FastDecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);   // requantising
TAVIRPELO_API int PELOJ_DecodeMcu_2to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 19
TAVIRPELO_API int PELOJ_DecodeMcu_8to3(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 9
TAVIRPELO_API int PELOJ_DecodeMcu_4to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);  // below 5
TAVIRPELO_API int PELOJ_DecodeMcu8to1(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);   // DC alone

// Synchronises with the next RSTn (T.81 F.2.2.4): drops the bits held, looks for a marker unless one is
// pending, resets the predictors. A marker with another number stays pending. 1, or 0 at the end of the
// source.
TAVIRPELO_API int PELOJ_ProcessRestartMarker(PELOJ_JDINFO* jdInfo);

// First pass and refinement of one MCU; 1, or 0 when the source failed.
TAVIRPELO_API int PELOJ_ProgDecodeMcu(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);
TAVIRPELO_API int PELOJ_ProgDecodeMcuRefine(PELOJ_JDINFO* jdInfo, int32_t* const* blocks);

// All scans of the next iMCU row, then its inverse transform. As PELOJ_DecodeSingleiMcu.
TAVIRPELO_API int PELOJ_ProgDecodeSingleiMcu(PELOJ_JDINFO* jdInfo, uint8_t*** sampleRows);

// Transforms the row's coefficients; 100, or 101 after the last row.
TAVIRPELO_API int PELOJ_ProgIDct(PELOJ_JDINFO* jdInfo, uint8_t*** sampleRows);

// One-row writers: `count` samples a row of each channel, one pixel each.
TAVIRPELO_API void PELOJ_YcbcrWriteOutput1to1(PELOJ_JDINFO* jdInfo, const uint8_t* y, const uint8_t* cb,
                                              const uint8_t* cr, int count);
TAVIRPELO_API void PELOJ_GrayWriteOutput1to1(PELOJ_JDINFO* jdInfo, const uint8_t* y, int count);
TAVIRPELO_API void PELOJ_RGBWriteOutput1to1(PELOJ_JDINFO* jdInfo, const uint8_t* r, const uint8_t* g,
                                            const uint8_t* b, int count);

// The sample nearest to each output column's centre; `count` is the number of output columns.
TAVIRPELO_API void PELOJ_FastYcbcrWriteOutput(PELOJ_JDINFO* jdInfo, const uint8_t* y, const uint8_t* cb,
                                              const uint8_t* cr, int count);
TAVIRPELO_API void PELOJ_FastYcbcrUpscaleWriteOutput(PELOJ_JDINFO* jdInfo, const uint8_t* y,
                                                     const uint8_t* cb, const uint8_t* cr, int count);

// Accumulator writers: `count` packed sums of four samples (codec/pixel/quad_sampler.h).
TAVIRPELO_API void PELOJ_YcbcrWriteOutput(PELOJ_JDINFO* jdInfo, const uint32_t* sums, int count);
TAVIRPELO_API void PELOJ_GrayWriteOutput(PELOJ_JDINFO* jdInfo, const uint32_t* sums, int count);
TAVIRPELO_API void PELOJ_RGBWriteOutput(PELOJ_JDINFO* jdInfo, const uint32_t* sums, int count);

// Produce up to `rowsWanted` full-grid rows (minus *rowCounter, which advances) at full size and at
// reduced scales. 201: failed or aborted by CheckFn; 101: the picture's last rows have been produced, or
// its data has ended quietly; another value: more to come.
TAVIRPELO_API int PELOJ_ProcessData(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int* rowCounter,
                                    int rowsWanted);
TAVIRPELO_API int PELOJ_ProcessData_resize(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int* rowCounter,
                                           int rowsWanted);

// The same for progressive pictures.
TAVIRPELO_API int PELOJ_ProgProcessData(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int* rowCounter,
                                        int rowsWanted);
TAVIRPELO_API int PELOJ_ProgProcessData_resize(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int* rowCounter,
                                               int rowsWanted);

// Makes a record of the current scan header, entropy state and source position in the slot. 200 or 201.
TAVIRPELO_API int PELOJ_SetupScanInfo(PELOJ_JDINFO* jdInfo, pelo::OsPtr<pelo::jpeg::ScanRecord>* slot);

// Keeps where the scan's decoding stands.
TAVIRPELO_API void PELOJ_SaveScanInfo(PELOJ_JDINFO* jdInfo, pelo::jpeg::ScanRecord* record);

// Goes on with a scan. 1, or 0 with nothing changed when its data cannot be reached.
TAVIRPELO_API int PELOJ_LoadScanInfo(PELOJ_JDINFO* jdInfo, const pelo::jpeg::ScanRecord* record);

// MCU geometry and derived tables of the scan that was read last. 200 or 201.
TAVIRPELO_API int PELOJ_SetupScan(PELOJ_JDINFO* jdInfo);

// PELOJ_SetupScan, the multiplier tables and, before the first scan, the MCU buffer. 200 or 201.
TAVIRPELO_API int PELOJ_InitDecBeforeScan(PELOJ_JDINFO* jdInfo);

// Starts the next iMCU row.
TAVIRPELO_API void PELOJ_SetupiMcu(PELOJ_JDINFO* jdInfo);

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
TAVIRPELO_API void PELOJ_SetupUpsample(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int* rowCounter,
                                       int capacity);
TAVIRPELO_API void PELOJ_SkipRowUpsample(PELOJ_JDINFO* jdInfo, uint8_t** outRows, int* rowCounter,
                                         int capacity);

// Chooses every component's method, and allocates sample rows and full-grid rows. 200 or 201.
TAVIRPELO_API int PELOJ_InitUpsampler(PELOJ_JDINFO* jdInfo);

// `rows` row pointers and their samples in one block, freed with TAVIRPELO_OsFree; null for zero sizes
// or when memory is short.
TAVIRPELO_API uint8_t** PELOJ_AllocSampleArry(int width, int rows);

// The inverse transforms. range: unused (clamping is arithmetic: hostile coefficients leave any table).
#define PELOJ_IDCT(name)                                                                         \
  TAVIRPELO_API void name(const uint8_t* range, const int32_t* multiplier, const int32_t* block, \
                          uint8_t* const* rows, int column)

// 8x8 samples; NByM reads the first M rows and N columns of coefficients, 2By2 chooses between 1By2 and
// 2By2All. PELOJ_DoIdct reads all, for blocks of unknown extent.
PELOJ_IDCT(PELOJ_DoIdct8By8);
PELOJ_IDCT(PELOJ_DoIdct);
PELOJ_IDCT(PELOJ_DoIdct4By4);
PELOJ_IDCT(PELOJ_DoIdct3By3);
PELOJ_IDCT(PELOJ_DoIdct2By2);
PELOJ_IDCT(PELOJ_DoIdct2By2All);
PELOJ_IDCT(PELOJ_DoIdct2By1);
PELOJ_IDCT(PELOJ_DoIdct1By2);
PELOJ_IDCT(PELOJ_DoIdct1By1);

// 4x4 samples from the 4-point transform (scale 1/2).
PELOJ_IDCT(PELOJ_DoIdct4x4For4x4);
PELOJ_IDCT(PELOJ_DoIdct3x3For4x4);
PELOJ_IDCT(PELOJ_DoIdct2x2For4x4);
PELOJ_IDCT(PELOJ_DoIdct2x2AllFor4x4);
PELOJ_IDCT(PELOJ_DoIdct2x1For4x4);
PELOJ_IDCT(PELOJ_DoIdct1x2For4x4);
PELOJ_IDCT(PELOJ_DoIdct1x1For4x4);

// 4x4, 3x3 and 2x2 samples: means or picks of the 8-point transform's outputs.
PELOJ_IDCT(PELOJ_DoIdct_2to1);
PELOJ_IDCT(PELOJ_DoIdct_8to3);
PELOJ_IDCT(PELOJ_DoIdct_4to1);
