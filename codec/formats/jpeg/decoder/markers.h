// The decoding parser: fills the decoder state from the marker segments in front of a scan (ITU-T T.81
// Annex B) and refuses what the decoder cannot do.
#pragma once

#include "codec/formats/jpeg/decoder/jd_info.h"

namespace pelo::jpeg {

// The headers of a picture: frame, tables, first scan, colour space. 200, or 201 with the state emptied.
int parse_header(PELOJ_JDINFO* jdInfo);

// Goes on to where the next scan's data begin. *status tells whether there are any (200) or the picture
// has no further scan, or none that can be decoded (201); the answer is the marker that decided it.
int parse_to_scan(PELOJ_JDINFO* jdInfo, int* status);

}  // namespace pelo::jpeg
