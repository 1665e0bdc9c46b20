// How large a GIF comes out, and which screen pixels it is made of.
#pragma once

#include "codec/base/output_grid.h"
#include "codec/formats/gif/record.h"

namespace pelo::gif {

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
