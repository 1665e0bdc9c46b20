// What the decoder information object leaves to the rooms above it.
#pragma once

#include "tavirpelo/decinfo.h"

namespace pelo {

// Frees an object's zoom state and clears pZoomInfo.
using ReleaseZoom = void (*)(TAVIRPELO_DECINFO&);

// The zoom engine says how its states are freed before it attaches one: an object that is destroyed while
// zooming takes its zoom with it.
void set_zoom_release(ReleaseZoom release);

}  // namespace pelo
