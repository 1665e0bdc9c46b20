// The state of one PNG decode, held by the decoder information object between calls.
#pragma once

#include <array>
#include <cstdint>

#include "codec/base/axis_stepper.h"
#include "codec/base/output_grid.h"
#include "codec/formats/format.h"
#include "codec/formats/png/inflate.h"
#include "codec/formats/png/png_info.h"
#include "codec/pixel/row_stores.h"
#include "tavirpelo/decode.h"

namespace pelo::png {

// The pass of an Adam7 image being read (ISO/IEC 15948, 8.2).
struct PassState {
  int number;  // 1 to 7; 0 for an image that is not interlaced
  uint32_t width, height;
  uint32_t firstColumn, columnStep;
  uint32_t firstRow, rowStep;
  uint32_t columnCount;  // output columns that show a pixel of this pass (resampled images)
};

// Scanlines: the one being filled or just restored, and the one above it.
struct ScanlineState {
  OsBuffer<uint8_t> rows;  // two rows of a filter type and rowBytes bytes
  size_t rowBytes;         // of the current pass
  uint8_t* current;        // at its filter type byte
  uint8_t* above;
  size_t filled;            // bytes of the current row received
  uint32_t row;             // rows of the pass finished
  const uint8_t* finished;  // the restored row's bytes while output rows of it are pending
};

// What an image's samples mean.
struct SampleMeaning {
  std::array<std::array<uint8_t, 4>, 256> colours;  // of palette indices and grey samples
  std::array<uint16_t, 3> key;                      // truecolour: the transparent colour, or none
};

// Expands `count` pixels of a row: pixel begin + i, or with a column map pixel columns[begin + i].
using ExpandRow = void (*)(const SampleMeaning& meaning, const uint8_t* row, const uint32_t* columns,
                           uint32_t begin, int count, uint8_t* rgba);

struct Expander {
  ExpandRow consecutive;
  ExpandRow mapped;
};

struct OutputState {
  uint32_t width, height;  // of the picture, unrotated
  StoreRgba store;         // null: a format that has no writer
  int bytesPerPixel;
  Expander expand;
  SampleMeaning meaning;
  bool copiesRows;                 // scanlines are output rows already
  OsBuffer<uint32_t> columns;      // source column of each output column, when resampled
  OsBuffer<uint32_t> passColumns;  // of the pass: the pass's pixel, and behind these
  uint32_t* passTargets;           // the output columns that show it
  AxisStepper rows;                // source row of the next output row
  int64_t passRow, passRowsEnd;    // interlaced: the output rows that the finished scanline still gives
  uint32_t written;                // output rows finished
  uint32_t base;                   // of these, by earlier line-mode calls
  uint32_t stop;                   // line mode: rows after which to stop; 0 never
  OutputGrid grid;
  OsBuffer<uint8_t> wholeImage;  // R, G, B, A bytes, when the picture is gathered before it is written
};

}  // namespace pelo::png

typedef struct PELOI_PNGCONTEXT : pelo::FormatState {
  static constexpr pelo::FormatKind kKind = pelo::FormatKind::kPng;
  PELOI_PNGINFO info;
  pelo::DecodeRequest request;
  uint32_t iterFlag;
  pelo::BufferedSource reader;
  bool inputReady;     // memory: chunks merged
  uint32_t idatEntry;  // other sources: the entry being read
  pelo::png::Inflater inflater;
  bool inflaterOpen;
  pelo::png::InflateStop lastStop;
  uint32_t fullWidth, fullHeight;  // interlaced images: info holds the pass's size meanwhile
  pelo::png::PassState pass;
  pelo::png::ScanlineState scanline;
  pelo::png::OutputState output;
  TAVIRPELO_DECINFO* decInfo;  // of the current call
} PELOI_PNGCONTEXT;

namespace pelo::png {

// Undoes one scanline's filter in place; its type stands in the byte before `row`.
void unfilter_row(PELOI_PNGCONTEXT* context, uint8_t* row, const uint8_t* previousRow, size_t rowBytes);

// Writes the next output row that the finished scanline gives, if there is one.
void write_output_row(PELOI_PNGCONTEXT* context);

// Writes the gathered whole image, rotated, into the output. 1, or 0 when it is cancelled between rows.
int write_gathered_image(PELOI_PNGCONTEXT* context);

// Sets the pass's size in the information record, and answers the bytes of its rows (0 when it is
// empty).
uint32_t set_pass_size(PELOI_PNGCONTEXT* context, uint32_t fullWidth, uint32_t fullHeight, int pass);

// Reads the next piece of the image data, at most 4096 bytes and never beyond the chunk of `entryIndex`
// or, when that is used up, the next. 1, or 0 when there is none.
int refill_from_chunks(PELOI_PNGCONTEXT* context, Source* reader, uint32_t entryIndex);

// Decompress and write until the image ends or the mode says stop: a Result. `total` receives the number
// of bytes decompressed so far.
int inflate_memory(PELOI_PNGCONTEXT* context, uint32_t* total);
int inflate_stream(PELOI_PNGCONTEXT* context, uint32_t* total);
int inflate_interlaced_memory(PELOI_PNGCONTEXT* context, uint32_t* total);
int inflate_interlaced_stream(PELOI_PNGCONTEXT* context, uint32_t* total);

// ---- scanlines.cpp ----

// Begins the image's first scanline or, interlaced, its first pass that is not empty.
[[nodiscard]] bool begin_scanlines(PELOI_PNGCONTEXT& context);

// Takes decompressed bytes into scanlines and writes those that are complete: kDone when all bytes are
// used, kMore to stop after an output row, kFailed when cancelled. Bytes behind the last row are
// dropped.
Result consume(PELOI_PNGCONTEXT& context);

// True when no later pass has pixels in a source row.
bool completes_row(const PELOI_PNGCONTEXT& context, int64_t sourceRow);

// Asked after every output row: the external status may pause the decode; false cancels it.
bool host_agrees();

// ---- row_filter.cpp (clause 9) ----

// Restores a scanline in place from its filter type and the restored row above it. An unknown type
// leaves the row as it is but for its first byte, which becomes 0.
void unfilter(uint8_t type, uint8_t* row, const uint8_t* above, size_t rowBytes, int bytesPerPixel);

// ---- expand.cpp: scanlines of every colour type and depth into R, G, B, A bytes ----

SampleMeaning meaning_of(const PELOI_PNGINFO& info);
Expander expander_of(const PELOI_PNGINFO& info);

// True when some pixel may have an alpha below 255.
bool has_transparency(const PELOI_PNGINFO& info);

// ---- output.cpp ----

// Sizes, placement and writers for the request. kDone, or kNoMemory.
Result set_up_output(PELOI_PNGCONTEXT& context);

// The output of this call: a whole picture, or `lines` rows.
void aim_output(PELOI_PNGCONTEXT& context, void* output, int lines);

// Lists the output columns that show a pixel of the current pass.
void begin_pass_output(PELOI_PNGCONTEXT& context);

// Finds the output rows of the scanline just finished.
void begin_row_output(PELOI_PNGCONTEXT& context);

// Whether the finished scanline gives another output row.
bool has_output_row(const PELOI_PNGCONTEXT& context);

}  // namespace pelo::png
