// The state of one BMP decode, its row decoders and row writers.
//
// How to read this room: bmp_driver.cpp is where each call of a decode begins and ends, bmp_header.cpp
// sets a decode up, bmp_rows.cpp decodes rows that row_reader.h finds. wbmp.cpp is the decoder of
// wireless bitmaps, which have a reader of rows in common with these. bmp_abi.h has the given names.
#pragma once

#include <array>
#include <cstdint>

#include "codec/base/output_grid.h"
#include "codec/formats/bmp/row_reader.h"
#include "codec/formats/format.h"
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
  pelo::DecodeRequest request;

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

namespace pelo::bmp {

// Reads and checks headers and palette, and places the picture. The object's source is at its start.
// Null on failure.
PELOI_BMPRECORD* make_record(TAVIRPELO_DECINFO* decInfo, int width, int height, void* output);

// Frees a record; null is ignored.
void delete_record(PELOI_BMPRECORD* record);

// Frees the object's record, if it holds one; 1.
int release(TAVIRPELO_DECINFO* decInfo);

// How pixels of a bit count are read: the only things that differ between the members of the family.
struct Depth {
  int bits;
  // One file row of `width` pixels, `pixelStep` bytes apart, in an output format (0, 1, 5 to 8; others
  // write nothing).
  void (*write)(const uint8_t* row, uint8_t* output, int width, ptrdiff_t pixelStep, int format,
                const PELOI_BMPCOLOURS* colours);
  // Adds a quarter of pixels [first, end) of a row, whose bytes begin with the first, to the
  // accumulators.
  void (*add)(PELOI_BMPRECORD& record, const uint8_t* bytes, int64_t first, int64_t end);
  // A row of finished accumulator words.
  void (*write_averages)(const uint32_t* words, uint8_t* output, int width, ptrdiff_t pixelStep,
                         int format);
};

// The depth with so many bits a pixel, or null.
const Depth* depth_of(int bits);

// Decodes the next `rows` output rows. 1, 5 when the source could not give a row before its end, or 0
// when the caller ends the decode.
int decode_rows(PELOI_BMPRECORD& record, int rows, const Depth& depth);

// Write one row of finished accumulator words, opaque or with their alpha.
void write_opaque_words(const uint32_t* accumulatorRow, uint8_t* output, int outWidth,
                        ptrdiff_t pixelStep, int format);
void write_alpha_words(const uint32_t* accumulatorRow, uint8_t* output, int outWidth,
                       ptrdiff_t pixelStep, int format);

// Output formats that BMP pictures are written in.
constexpr bool writes(int format) {
  return format == TAVIRPELO_RGB565 || format == TAVIRPELO_RGB888 ||
         (format >= TAVIRPELO_ARGB8888 && format <= TAVIRPELO_BGRA8888);
}

// Bytes of a row with its padding to four.
constexpr int64_t row_size(int64_t width, int64_t bitCount) {
  return (width * bitCount + 31) / 32 * 4;
}

// Behind the given names of the public headers, which say what they do.
int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int decode_rows_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines);
int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines);
int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int abort(TAVIRPELO_DECINFO* decInfo);
int decode_wbmp(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

// ---- format detection ----

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

bool sniff_wbmp(const uint8_t* head);
int parse_wbmp_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

// The part of parse_wbmp_head that does not look at `hinfo`.
int parse_wbmp_sizes(TAVIRPELO_DECINFO& decInfo, Source& source);

// ---- integers of wireless bitmaps, which come in groups of seven bits ----

// Packs the groups of the integer at *position, one after another from the highest bit of packed[0], so
// that n groups fill n bytes and end in n zero bits; moves *position behind them and stores n. Stops at
// `size` and after 20 groups, which is what packed must hold.
void collect_groups(const uint8_t* data, int size, int* position, int* groupCount, uint8_t* packed);

// The big-endian value of byteCount bytes, divided by 2 to the power of shift.
uint32_t number_of_groups(const uint8_t* packed, int byteCount, int shift);

// base to a power; 1 for exponents below 1.
uint64_t power(uint64_t base, int exponent);

}  // namespace pelo::bmp
