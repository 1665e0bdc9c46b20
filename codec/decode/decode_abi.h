// Given names of the decode room that no public header has.
#pragma once

#include "codec/base/source.h"
#include "tavirpelo/parse.h"

// Detects the format at the source's start; fills the object's image size and parts of `hinfo` (may be
// null). Format code, 0 when unreadable (gTAVIRPELO_Error 5) or unknown.
TAVIRPELO_API int PELO_Parse(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source, TAVIRPELO_HINFO* hinfo);

// 4 for one image, 6 for more; 0 without a trailer or without images.
TAVIRPELO_API int __PELO_ParserGIF(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source,
                                   TAVIRPELO_HINFO* hinfo);

// 5, or 0: larger than 5000 pixels in a direction, or cut short (gTAVIRPELO_Error 5).
TAVIRPELO_API int __PELO_ParserWBMP(TAVIRPELO_DECINFO* decInfo, PELOJ_SOURCE* source);
