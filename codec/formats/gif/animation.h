// Animated GIFs: frames composed on a canvas of the whole screen.
#pragma once

#include "codec/formats/gif/record.h"
#include "tavirpelo/api.h"

namespace pelo::gif {

// An unpainted canvas for the record's screen. False when it is too large or memory is short.
[[nodiscard]] bool create_canvas(Record& record);

// Composes the image row in the line buffer onto the current screen row, and points the row source at
// what is to be shown. 1.
int compose_row(pelo::gif::Record* record);

}  // namespace pelo::gif
