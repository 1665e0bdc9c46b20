// Decoding a JPEG band by band: the step that callers of the public functions do not see.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"
#include "tavirpelo/decode.h"

namespace pelo::jpeg {

// Lists the scans of a picture in several that the scale shows, before its first row. 200, or 201 with
// gTAVIRPELO_Error 2 or 4; the state stays the caller's.
int list_strip_scans(PELOJ_JDINFO* state);

// Behind the given names of the public headers, which say what they do.
PELOJ_JDINFO* begin_strips(TAVIRPELO_DECINFO* decInfo, int width, int height, int outFormat);
int decode_strip(PELOJ_JDINFO* state, uint8_t* const* planes, int rows);
void end_strips(PELOJ_JDINFO* state);

}  // namespace pelo::jpeg
