// The one thing that the ground asks of the zoom engine.
#pragma once

#include "tavirpelo/decinfo.h"

namespace pelo {

// Frees the object's zoom state, if any, and clears pZoomInfo.
void release_zoom_state(TAVIRPELO_DECINFO& decInfo);

}  // namespace pelo
