// Decoding a JPEG band by band: the step that callers of the public functions do not see.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"
#include "tavirpelo/decode.h"

// Lists the scans of a picture in several that the scale shows, before its first row. 200, or 201 with
// gTAVIRPELO_Error 2 or 4; the state stays the caller's.
TAVIRPELO_API int __elo_jpeg_dec_line_init_progressive(PELOJ_JDINFO* state);
