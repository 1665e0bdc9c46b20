// Setting up a GIF decode, and the record that its calls share.
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
pelo::gif::Record* make_record(TAVIRPELO_DECINFO* decInfo, int width, int height, int animated,
                               void* output);

// Behind the given names of the public headers, which say what they do.
int decode(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int decode_lines(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height, int lines);
int decode_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int abort(TAVIRPELO_DECINFO* decInfo);
int decode_frame(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int decode_frame_step(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);
int abort_animation(TAVIRPELO_DECINFO* decInfo);

}  // namespace pelo::gif
