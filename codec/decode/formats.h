// The formats that the library reads, and how one is recognised.
#pragma once

#include "codec/formats/format.h"

namespace pelo {

// The format with that code, or null.
const Format* format_of(int code);

// Detects the format at the source's start and reads its head: the object's image size, parts of `hinfo`
// (may be null). The format code; 0 when it is none of ours, or its head is cut.
int detect(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

// The whole of TAVIRPELO_Parser: a reader over the object's source, detection, and the record's sizes.
int parse(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo
