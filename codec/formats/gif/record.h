// The GIF decoder record: everything that a decode keeps between rows, calls and frames. How large a GIF
// comes out, and which screen pixels it is made of.
#pragma once

#include <cstdint>

#include "codec/base/os_memory.h"
#include "codec/base/output_grid.h"
#include "codec/formats/format.h"
#include "codec/formats/gif/lzw.h"
#include "codec/formats/gif/stream.h"
#include "codec/pixel/row_stores.h"

namespace pelo::gif {

enum class Mode { kWhole, kLines, kIterative, kAnimated };

// A colour in memory order; a transparent or unpainted pixel is all zeros.
struct alignas(4) Rgba {
  uint8_t r, g, b, a;
};

// Where an image lies on the logical screen, pixels.
struct Frame {
  int left, top, width, height;
};

struct GraphicControl {
  int disposal;
  bool transparent;
  int transparentIndex;  // -1: none
  int delay;             // milliseconds
};

// Which pixels of the screen make up a picture of another size: the ones under its pixels' centres.
struct Sampling {
  Size from, to;
  OsBuffer<uint16_t> columns;  // a screen column for each picture column; empty at 1:1
  int begin, end;              // picture columns that the current frame covers
};

struct OutputRows {
  int begin, end;
};

// The rows of the picture in the caller's buffer, as long as calls name the same.
struct Target {
  void* bytes;
  int lines;  // of a call by lines
  OutputGrid grid;
};

// Sampled rows of indices, kept until they can be written.
struct IndexPlane {
  Size size;
  OsBuffer<uint8_t> indices;
  OsBuffer<uint8_t>
      painted;  // per row: 1 once it is there; alone, of rows that go straight to the output

  // Both stay empty for an empty plane. False when it is too large or memory is short.
  [[nodiscard]] bool allocate(Size wanted);
  uint8_t* row(int y) {
    return indices.data() + static_cast<size_t>(y) * static_cast<size_t>(size.width);
  }
  const uint8_t* row(int y) const { return const_cast<IndexPlane*>(this)->row(y); }
};

struct Record : FormatState {
  static constexpr FormatKind kKind = FormatKind::kGif;

  Size screen;
  int backgroundIndex;
  uint32_t globalTable[256];  // packed lanes, see pixel/quad_sampler.h
  Frame frame;
  int interlacePass;  // 0: rows in order
  uint32_t localTable[256];
  int minimumCodeSize;
  GraphicControl control;
  const uint32_t* colours;  // the current image's table
  Rgba palette[256];        // the same with transparency
  TranslationTable table;
  Source reader;
  uint8_t window[kSourceBufferSize];  // the reader's

  TAVIRPELO_DECINFO* decInfo;  // of the current call; null: nobody to ask
  Mode mode;
  DecodeRequest request;
  uint32_t option;  // the option word that the output is placed by
  StoreRgba store;  // null: the output format has no writer
  Size picture;     // produced size before rotation
  Sampling sampling;
  IndexPlane plane;
  Target target;
  OsBuffer<uint8_t> line;  // indices of the current row and the rest of the string behind it
  int currentRow;          // on the screen
  int rowsWritten;         // output rows of the image or frame
  bool ended;              // by the caller
  LzwState lzw;

  int lineRow;     // line mode: the next output row
  int lines;       // output rows that the current call has room for
  int linesHere;   // those done
  bool imageDone;  // line mode: only rows below the image are left

  bool animated;
  OsBuffer<Rgba> canvas;    // the screen as the frames so far left it
  OsBuffer<Rgba> frameRow;  // the shown row where it differs from what stays on the canvas
  const Rgba* rowSource;    // the row to write
  bool inImage;             // animation: image rows are being decoded
};

// An empty record; null when memory is short.
Record* new_record(void);

// Frees a record and all it owns; null is ignored.
void delete_record(Record* record);

// ---- size and place ----

// The box that a picture is fitted into: a request's sides exchanged when it is turned sideways.
Size box_of(const Record& record);

// The produced size, before rotation, of a screen in a box. Never enlarges unless stretched.
Size fit_screen(Size screen, Size box, uint32_t option);

// Whether a still image comes out smaller than its screen on both sides.
bool is_reduced(const Record& record);

// The size to which a still image is sampled before its pixels are averaged: a whole fraction of the
// screen's width. The picture's own size when it is not reduced.
Size reduced_size(const Record& record);

// Fits the record's screen for an option word: picture size, sampling. False when memory is short.
[[nodiscard]] bool set_geometry(Record& record, uint32_t option);

// Samples `from` down or up to `to`. False when memory is short.
[[nodiscard]] bool set_sampling(Sampling& sampling, Size from, Size to);

// The picture columns that a frame covers, for the rows to come.
void cover_frame(Sampling& sampling, const Frame& frame);

// The picture rows that are made of a screen row (0 to from.height - 1).
OutputRows rows_of(const Sampling& sampling, int screenRow);

// The picture in the caller's buffer: placed once, and again when a call comes with another.
const OutputGrid& grid_of(Record& record, void* output);

// Line mode: rows of the picture, the first of a call in the buffer's first row.
const OutputGrid& line_grid_of(Record& record, void* output);

}  // namespace pelo::gif
