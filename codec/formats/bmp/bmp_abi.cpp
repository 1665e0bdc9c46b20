// The given names of this room; each forwards to the room's own function.
#include "codec/formats/bmp/bmp_abi.h"

#include "codec/base/errors.h"
#include "tavirpelo/api.h"
#include "tavirpelo/decode.h"
#include "tavirpelo/io.h"

namespace bmp = pelo::bmp;
using pelo::begin_operation;

PELOI_BMPRECORD* PELOI_BMP_Initialize(TAVIRPELO_DECINFO* decInfo, int width, int height, void* output) {
  return bmp::make_record(decInfo, width, height, output);
}

void PELOI_BMP_DeleteDecInfo(PELOI_BMPRECORD* record) {
  bmp::delete_record(record);
}

int PELOI_BMP_DestroyBMP(TAVIRPELO_DECINFO* decInfo) {
  return bmp::release(decInfo);
}

void PELOI_BMP_WriteResizedOutput(const uint32_t* accumulatorRow, uint8_t* output, int outWidth,
                                  ptrdiff_t pixelStep, int format) {
  bmp::write_opaque_words(accumulatorRow, output, outWidth, pixelStep, format);
}

void PELOI_BMP_WriteResizedOutputWithAlpha(const uint32_t* accumulatorRow, uint8_t* output, int outWidth,
                                           ptrdiff_t pixelStep, int format) {
  bmp::write_alpha_words(accumulatorRow, output, outWidth, pixelStep, format);
}

void PELOI_WBMPdecodeMultibyte(const uint8_t* data, int size, int* position, int* groupCount,
                               uint8_t* packed) {
  bmp::collect_groups(data, size, position, groupCount, packed);
}

uint32_t PELOI_WBMPgetMultibyte2Int(const uint8_t* packed, int byteCount, int shift) {
  return bmp::number_of_groups(packed, byteCount, shift);
}

uint64_t PELOI_WBMPpow(uint64_t base, int exponent) {
  return bmp::power(base, exponent);
}

int TAVIRPELOI_DecodeBMP(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return bmp::decode(decInfo, output, width, height);
}

int TAVIRPELOI_DecodeBMPIterLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                 int lines) {
  begin_operation();
  return bmp::decode_rows_step(decInfo, output, width, height, lines);
}

int TAVIRPELOI_DecodeBMPLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                             int lines) {
  begin_operation();
  return bmp::decode_lines(decInfo, output, width, height, lines);
}

int TAVIRPELOI_DecodeBMPIter(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return bmp::decode_step(decInfo, output, width, height);
}

int TAVIRPELOI_AbortBMPIter(TAVIRPELO_DECINFO* decInfo) {
  return bmp::abort(decInfo);
}

int TAVIRPELOI_DecodeWBMP(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height) {
  begin_operation();
  return bmp::decode_wbmp(decInfo, output, width, height);
}

// The members of the family by bit count.
#define PELOI_BMP_MEMBER(bits)                                                          \
  void PELOI_BMP_Write##bits##bitOutput(const uint8_t* row, uint8_t* output, int width, \
                                        ptrdiff_t pixelStep, int format,                \
                                        const PELOI_BMPCOLOURS* colours) {              \
    bmp::depth_of(bits)->write(row, output, width, pixelStep, format, colours);         \
  }                                                                                     \
  int PELOI_BMP_Decode##bits##bitBMP(PELOI_BMPRECORD* record, int rows) {               \
    return bmp::decode_rows(*record, rows, *bmp::depth_of(bits));                       \
  }
PELOI_BMP_MEMBER(1)
PELOI_BMP_MEMBER(4)
PELOI_BMP_MEMBER(8)
PELOI_BMP_MEMBER(16)
PELOI_BMP_MEMBER(24)
PELOI_BMP_MEMBER(32)
#undef PELOI_BMP_MEMBER
