// The loop over an image's rows, in the order in which they come: whole, in batches of image rows, or by
// output rows.
#pragma once

#include "codec/base/errors.h"
#include "codec/formats/gif/record.h"
#include "tavirpelo/api.h"

namespace pelo::gif {

// Answers of the decode operations.
constexpr int kFailure = 0;
constexpr int kDone = 1;
constexpr int kMore = 4;

// The answer of an operation on image data, which are to blame when nothing else is.
inline int answer(int result) {
  if (result == kFailure) refuse(Reason::kDamaged, "GIF image data");
  return result;
}

// Ready to decode the image that the reader stands at. False for a minimum code size above 11 or when
// memory is short.
[[nodiscard]] bool begin_image(Record& record);

// Each decodes the image that seek_image found. 1 when its rows are done or its data end early
// (the rest keeps what the output holds), 0 for damaged data, a minimum code size above 11, data that
// end before the source does, or when memory is short.
int decode_image(TAVIRPELO_IO* source, Record* record, void* output);

// Decodes 16 more image rows, 4 while there are more; with `start` 1 only prepares, and answers 4.
int decode_image_step(TAVIRPELO_IO* source, Record* record, void* output, int start);

// Writes the next `lines` output rows to the start of `output`, 4 while there are more; `start` 1
// prepares first. An interlaced image is decoded whole then, into a plane of its indices.
int decode_image_lines(TAVIRPELO_IO* source, Record* record, void* output, int lines, int start);

// Moves the current row to the screen row of the next image row: the one below, or the next of the four
// interlace passes; behind the last pass the pass is 0. False for a pass that does not exist.
[[nodiscard]] bool advance_row(Record& record);

}  // namespace pelo::gif
