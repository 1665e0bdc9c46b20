// Setting up a GIF decode, and the record that its calls share.
//
// How to read this room: driver.cpp is where a decode starts and where each call of it ends;
// animation.cpp does that for frames. stream.h finds the next image (and reads the head for format
// detection), rows.h loops over its rows, for which lzw.h decompresses as much as is asked, and output.h
// writes them. record.h has what all of these keep between calls, and how large a picture comes out.
// gif_abi.h has the given names.
#pragma once

#include "codec/formats/gif/record.h"
#include "tavirpelo/api.h"
#include "tavirpelo/decinfo.h"

namespace pelo::gif {

// The object's record when a decode of this kind and request goes on, or a new one for its first image.
// Null, with nothing held, when the request differs from the first call's, or for a failure. Another
// decoder's state is left alone and answered with null.
Record* continue_or_start(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, Mode mode);

// A record for the object's source with header read and output geometry computed; null for null
// arguments, negative sizes, a source that is no GIF, a canvas that is too large, or short memory.
Record* make_record(TAVIRPELO_DECINFO* decInfo, int width, int height, int animated, void* output);

// ---- animations: frames composed on a canvas of the whole screen ----

// An unpainted canvas for the record's screen. False when it is too large or memory is short.
[[nodiscard]] bool create_canvas(Record& record);

// Composes the image row in the line buffer onto the current screen row, and points the row source at
// what is to be shown. 1.
int compose_row(Record* record);

// ---- behind the given names of the public headers, which say what they do ----

int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines);
int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int abort(TAVIRPELO_DECINFO* decInfo);
int decode_frame(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int decode_frame_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int abort_animation(TAVIRPELO_DECINFO* decInfo);

}  // namespace pelo::gif
