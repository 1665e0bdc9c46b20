// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/bmp/bmp_record.h"

// Reads and checks headers and palette, and places the picture. The object's source is at its start.
// Null on failure.
TAVIRPELO_API PELOI_BMPRECORD* PELOI_BMP_Initialize(TAVIRPELO_DECINFO* decInfo, int width, int height,
                                                    void* output);

// Frees a record; null is ignored.
TAVIRPELO_API void PELOI_BMP_DeleteDecInfo(PELOI_BMPRECORD* record);

// Frees the object's record, if it holds one; 1.
TAVIRPELO_API int PELOI_BMP_DestroyBMP(TAVIRPELO_DECINFO* decInfo);

// Write one row of finished accumulator words, opaque or with their alpha.
TAVIRPELO_API void PELOI_BMP_WriteResizedOutput(const uint32_t* accumulatorRow, uint8_t* output,
                                                int outWidth, ptrdiff_t pixelStep, int format);
TAVIRPELO_API void PELOI_BMP_WriteResizedOutputWithAlpha(const uint32_t* accumulatorRow, uint8_t* output,
                                                         int outWidth, ptrdiff_t pixelStep, int format);

// Packs the groups of the integer at *position, one after another from the highest bit of packed[0], so
// that n groups fill n bytes and end in n zero bits; moves *position behind them and stores n. Stops at
// `size` and after 20 groups, which is what packed must hold.
TAVIRPELO_API void PELOI_WBMPdecodeMultibyte(const uint8_t* data, int size, int* position,
                                             int* groupCount, uint8_t* packed);

// The big-endian value of byteCount bytes, divided by 2 to the power of shift.
TAVIRPELO_API uint32_t PELOI_WBMPgetMultibyte2Int(const uint8_t* packed, int byteCount, int shift);

// base to a power; 1 for exponents below 1.
TAVIRPELO_API uint64_t PELOI_WBMPpow(uint64_t base, int exponent);

// Decode the next `rows` output rows. 1, 5 when the source could not give a row before its end, or 0
// when the caller ends the decode.
TAVIRPELO_API int PELOI_BMP_Decode1bitBMP(PELOI_BMPRECORD* record, int rows);
TAVIRPELO_API int PELOI_BMP_Decode4bitBMP(PELOI_BMPRECORD* record, int rows);
TAVIRPELO_API int PELOI_BMP_Decode8bitBMP(PELOI_BMPRECORD* record, int rows);
TAVIRPELO_API int PELOI_BMP_Decode16bitBMP(PELOI_BMPRECORD* record, int rows);
TAVIRPELO_API int PELOI_BMP_Decode24bitBMP(PELOI_BMPRECORD* record, int rows);
TAVIRPELO_API int PELOI_BMP_Decode32bitBMP(PELOI_BMPRECORD* record, int rows);

// Write one file row of `width` pixels, `pixelStep` bytes apart, in an output format (0, 1, 5 to 8;
// others write nothing).
TAVIRPELO_API void PELOI_BMP_Write1bitOutput(const uint8_t* row, uint8_t* output, int width,
                                             ptrdiff_t pixelStep, int format,
                                             const PELOI_BMPCOLOURS* colours);
TAVIRPELO_API void PELOI_BMP_Write4bitOutput(const uint8_t* row, uint8_t* output, int width,
                                             ptrdiff_t pixelStep, int format,
                                             const PELOI_BMPCOLOURS* colours);
TAVIRPELO_API void PELOI_BMP_Write8bitOutput(const uint8_t* row, uint8_t* output, int width,
                                             ptrdiff_t pixelStep, int format,
                                             const PELOI_BMPCOLOURS* colours);
TAVIRPELO_API void PELOI_BMP_Write16bitOutput(const uint8_t* row, uint8_t* output, int width,
                                              ptrdiff_t pixelStep, int format,
                                              const PELOI_BMPCOLOURS* colours);
TAVIRPELO_API void PELOI_BMP_Write24bitOutput(const uint8_t* row, uint8_t* output, int width,
                                              ptrdiff_t pixelStep, int format,
                                              const PELOI_BMPCOLOURS* colours);
TAVIRPELO_API void PELOI_BMP_Write32bitOutput(const uint8_t* row, uint8_t* output, int width,
                                              ptrdiff_t pixelStep, int format,
                                              const PELOI_BMPCOLOURS* colours);
