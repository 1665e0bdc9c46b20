// From an image's rows to the caller's buffer: the row writers, and the averaging of reduced still
// images.
#pragma once

#include <algorithm>

#include "codec/base/output_grid.h"
#include "codec/formats/gif/record.h"
#include "tavirpelo/api.h"

namespace pelo::gif {

// ---- pixels into spans of the output ----

// Stores `count` colours that stand in a row.
inline void store_colours(StoreRgba store, const Rgba* colours, int count, uint8_t* out,
                          ptrdiff_t step) {
  store(reinterpret_cast<const uint8_t*>(colours), count, out, step);
}

// Stores the colours that `pick(i)` yields for i = span.skip, span.skip + 1, ...
template <class Pick>
void store_span(StoreRgba store, const RowSpan& span, Pick pick) {
  constexpr int kChunk = 256;
  Rgba chunk[kChunk];
  for (int done = 0; done < span.count; done += kChunk) {
    const int count = std::min(kChunk, span.count - done);
    for (int i = 0; i < count; ++i) chunk[i] = pick(span.skip + done + i);
    store_colours(store, chunk, count, span.first + done * span.step, span.step);
  }
}

// ---- rows ----

// The row store of an output format that GIF pictures are written in (0, 1, 5, 7, 8, 10, 11); null for
// the others, which are decoded without writing.
StoreRgba gif_storer(int format);

// The colours of the current image's indices: opaque, but zeros for the transparent one.
void set_palette(Record& record);

// Asks the caller before the next `rows` output rows, if any, and counts them. False ends the decode.
[[nodiscard]] bool may_write(Record& record, int rows);

// Makes the rows of a reduced picture that no image row was written to zero bytes.
void clear_unpainted_rows(Record& record, void* output);

// True when some output is made of the current row.
bool row_is_wanted(const Record& record);

// Writes a row of the plane into picture row `row` of a grid, where the frame covers it.
void write_plane_row(const Record& record, int planeRow, const OutputGrid& grid, int row);

// Writes the current screen row from the row source. False when the caller ends the decode.
[[nodiscard]] bool write_screen_row(Record& record, void* output);

// Each writes the current row of an image (its indices stand in the line buffer) or of an animation's
// screen; rows below the screen are ignored. 1.
int write_row(Record* record, void* output);
int write_sampled_rows(Record* record, void* output);
int write_screen_pixels(Record* record, void* output);
int write_sampled_screen(Record* record, void* output);

// Writes the current row where the record's mode wants it and moves on to the next image row. 1, or 0
// when the caller ends the decode or there is no such interlace pass.
int write_line(Record* record, void* output);

// Line mode: writes the next output row, unrotated, when it is made of the current image row. *consumed
// becomes 1 when no further output row is; the current row has then moved on. Answers as the one above.
int write_output_row(Record* record, void* output, int* consumed);

// ---- averaging ----

// Reduced still images are averaged in a last step, unless sampling them is all there is to it.

// Prepares the plane of sampled indices when the picture is to be averaged, or the note of the rows that
// are there when it is sampled into the output. False when memory is short.
[[nodiscard]] bool plan_reduction(Record& record);

// Averages the plane, if there is one, into the caller's buffer, or clears the rows that did not come.
// False when the caller ends the decode.
bool finish_picture(Record& record, void* output);

}  // namespace pelo::gif
