// The sizes of a zoom, fixed when it starts: arithmetic on the state alone, without pixels.
#pragma once

#include "codec/base/checked.h"
#include "codec/base/geometry.h"
#include "tavirpelo/zoom.h"

namespace pelo::zoom {

constexpr int64_t kDecoderBytes = 0x30000;  // of a memory budget, left to the decoder

// The rotation (TAVIRPELO_ROTATE_...) that an option word asks of a zoom.
uint32_t zoom_rotation(uint32_t option, Size picture, Size display);

// Fits into a box with proportions kept and sides of at least 1, never enlarging; sides rounded down
// (fit_floor) or up.
Size fit_floor(Size picture, Size box);
Size fit_ceil(Size picture, Size box);

// A tenth of a display's side, the width of a zoom step.
int step_of(int side);

// Fills every size and step of a zeroed state. `picture` is turned, its sides 1 to 5000; `bytes` a
// pixel. False when the budget is too small.
bool lay_out(TAVIRPELO_ZOOMINFO& zoom, Size picture, Size display, int64_t budget, int zoomFactor,
             int bytes);

// The largest size that the zoomed picture takes: a low budget's maximum may be below the fitted size.
Size largest_zoomed(const TAVIRPELO_ZOOMINFO& zoom);

// Bytes for the picture fitted into a square of `side` pixels, and for the decoder.
int64_t memory_requirement(Size picture, int64_t side, int bytes);

}  // namespace pelo::zoom
