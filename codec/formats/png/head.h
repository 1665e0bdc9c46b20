// The head of a PNG file as format detection reads it (ISO/IEC 15948, 5.2 and 11.2.2).
#pragma once

#include "codec/formats/format.h"

namespace pelo::png {

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::png
