// The decoding parser: fills the decoder state from the marker segments in front of a scan (ITU-T T.81
// Annex B) and refuses what the decoder cannot do.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

// Finds SOI, reads up to the first scan header and settles the colour space. 200, or 201 with the
// state's allocations released.
TAVIRPELO_API int PELOJ_ParseHeader(PELOJ_JDINFO* jdInfo, int unused);

// Reads markers up to and including the next SOS. Returns the last marker code; *status is 200 when a
// scan header was accepted, else 201.
TAVIRPELO_API int PELOJ_ParseNextMarker(PELOJ_JDINFO* jdInfo, int* status);
