// Row writers: from colour indices or screen pixels into the caller's buffer.
#pragma once

#include "codec/base/output_grid.h"
#include "codec/formats/gif/record.h"
#include "tavirpelo/api.h"

namespace pelo::gif {

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
int write_row(pelo::gif::Record* record, void* output);
int write_sampled_rows(pelo::gif::Record* record, void* output);
int write_screen_pixels(pelo::gif::Record* record, void* output);
int write_sampled_screen(pelo::gif::Record* record, void* output);

// Writes the current row where the record's mode wants it and moves on to the next image row. 1, or 0
// when the caller ends the decode or there is no such interlace pass.
int write_line(pelo::gif::Record* record, void* output);

// Line mode: writes the next output row, unrotated, when it is made of the current image row. *consumed
// becomes 1 when no further output row is; the current row has then moved on. Answers as the one above.
int write_output_row(pelo::gif::Record* record, void* output, int* consumed);

}  // namespace pelo::gif
