// The state of one BMP decode, its row decoders and row writers.
#pragma once

#include <array>
#include <cstdint>

#include "codec/formats/bmp/row_reader.h"
#include "codec/base/format_state.h"
#include "codec/base/output_grid.h"
#include "tavirpelo/decode.h"

// What pixels of up to 16 bits mean.
typedef struct PELOI_BMPCOLOURS {
  std::array<std::array<uint8_t, 4>, 256> palette;  // R, G, B, 255; missing entries are black
  struct Field {
    uint32_t mask;
    uint32_t shift;  // to the left, into the field's place in RGB565
  } red, green, blue;
} PELOI_BMPCOLOURS;

typedef struct PELOI_BMPRECORD : pelo::FormatState {
  static constexpr pelo::FormatKind kKind = pelo::FormatKind::kBmp;

  int width, height;
  bool topDown;
  int bitCount;
  uint32_t compression;
  uint32_t dataOffset;
  PELOI_BMPCOLOURS colours;

  TAVIRPELO_DECINFO* decInfo;  // of the current call
  // The request of the first call, which later ones must repeat.
  void* output;
  int requestWidth, requestHeight;
  int outFormat;
  uint32_t option;

  int outWidth, outHeight;
  bool oneToOne;
  int rowsDone;  // output rows
  pelo::OutputGrid grid;
  pelo::bmp::RowReader reader;
  pelo::OsBuffer<uint32_t> columns;  // resized: source columns a quarter into each output pixel,
                                     // and behind these, three quarters
  pelo::OsBuffer<uint32_t>
      accumulators;  // of one output row: B, G, R, A in bits 0-7, 8-15, 16-23, 24-31
} PELOI_BMPRECORD;

// Reads and checks headers and palette, and places the picture. The object's source is at its start.
// Null on failure.
TAVIRPELO_API PELOI_BMPRECORD* PELOI_BMP_Initialize(TAVIRPELO_DECINFO* decInfo, int width, int height,
                                                    void* output);

// Frees a record; null is ignored.
TAVIRPELO_API void PELOI_BMP_DeleteDecInfo(PELOI_BMPRECORD* record);

// Frees the object's record, if it holds one; 1.
TAVIRPELO_API int PELOI_BMP_DestroyBMP(TAVIRPELO_DECINFO* decInfo);

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

// Write one row of finished accumulator words, opaque or with their alpha.
TAVIRPELO_API void PELOI_BMP_WriteResizedOutput(const uint32_t* accumulatorRow, uint8_t* output,
                                                int outWidth, ptrdiff_t pixelStep, int format);
TAVIRPELO_API void PELOI_BMP_WriteResizedOutputWithAlpha(const uint32_t* accumulatorRow, uint8_t* output,
                                                         int outWidth, ptrdiff_t pixelStep, int format);

namespace pelo::bmp {

// Output formats that BMP pictures are written in.
constexpr bool writes(int format) {
  return format == TAVIRPELO_RGB565 || format == TAVIRPELO_RGB888 ||
         (format >= TAVIRPELO_ARGB8888 && format <= TAVIRPELO_BGRA8888);
}

// Bytes of a row with its padding to four.
constexpr int64_t row_size(int64_t width, int64_t bitCount) {
  return (width * bitCount + 31) / 32 * 4;
}

}  // namespace pelo::bmp
