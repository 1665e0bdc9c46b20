// The head of a JPEG file as format detection reads it.
#pragma once

#include "codec/formats/format.h"

namespace pelo::jpeg {

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo);

// The two at once, for rooms that take JPEG alone.
int detect(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::jpeg
