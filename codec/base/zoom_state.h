// The one thing that the ground asks of the zoom engine, which defines it.
#pragma once

#include "tavirpelo/decinfo.h"

namespace pelo {

// Ends the object's decode task, frees its zoom state and both buffers, if any, and clears pZoomInfo.
void release_zoom_state(TAVIRPELO_DECINFO& decInfo);

}  // namespace pelo
