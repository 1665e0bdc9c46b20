// The order in which an image's rows come.
#pragma once

#include "codec/formats/gif/record.h"

namespace pelo::gif {

// Moves the current row to the screen row of the next image row: the one below, or the next of the four
// interlace passes; behind the last pass the pass is 0. False for a pass that does not exist.
[[nodiscard]] bool advance_row(Record& record);

}  // namespace pelo::gif
