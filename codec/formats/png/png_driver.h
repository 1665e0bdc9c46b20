// Driver of the PNG decoder, and the release of its state.
//
// How to read this room: png_driver.cpp is where each call of a decode begins and ends. parse.cpp reads
// the chunks; decompress.cpp runs the inflater (inflate.h, huffman_table.h) over the image data;
// scanlines.cpp cuts what it yields into rows and has row_filter.cpp restore them; output.cpp writes
// them, through expand.cpp. png_context.h has what all of these keep between calls, png_info.h what the
// chunks say. png_abi.h has the given names.
#pragma once

#include <cstdint>

#include "codec/formats/png/png_context.h"

namespace pelo::png {

// One call of a decode: whole (lines 0) or the next `lines` output rows, which then are all that
// `output` has room for. A Result; a picture too small to have any pixel is kDone. Only kMore leaves the
// state in place.
int decode_request(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines);

// Releases the object's PNG state, if it holds one; 1.
int release(TAVIRPELO_DECINFO* decInfo);

// 1 when the PNG needs alpha: its colour type carries some, or it has a tRNS chunk (as far as it can be
// parsed); 0 otherwise. Releases a PNG state that the object holds.
int needs_alpha(TAVIRPELO_DECINFO* decInfo);

// Behind the given names of the public headers, which say what they do.
int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines);
int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int end_decode(TAVIRPELO_DECINFO* decInfo);
int abort(TAVIRPELO_DECINFO* decInfo);

int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

}  // namespace pelo::png
