// The head of a GIF file as format detection reads it: the screen's size, and how many images follow.
#pragma once

#include "codec/formats/format.h"

namespace pelo::gif {

bool sniff(const uint8_t* head);
int parse_head(TAVIRPELO_DECINFO& decInfo, Source& source, TAVIRPELO_HINFO* hinfo);

}  // namespace pelo::gif
