// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/jpeg/strips/strips.h"

// Lists the scans of a picture in several that the scale shows, before its first row. 200, or 201 with
// gTAVIRPELO_Error 2 or 4; the state stays the caller's.
TAVIRPELO_API int __elo_jpeg_dec_line_init_progressive(PELOJ_JDINFO* state);
