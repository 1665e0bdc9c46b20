// The heads of BMP and WBMP files as format detection reads them.
#pragma once

#include "codec/formats/format.h"

namespace pelo::bmp {

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

bool sniff_wbmp(const uint8_t* head);
int parse_wbmp_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

// The part of parse_wbmp_head that does not look at `hinfo`.
int parse_wbmp_sizes(TAVIRPELO_DECINFO& decInfo, Source& source);

}  // namespace pelo::bmp
