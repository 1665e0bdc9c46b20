// Release of a zoom state that is still attached when its decoder information object goes.
#include "codec/core/ground/zoom_state.h"

void pelo::release_zoom_state(TAVIRPELO_DECINFO& decInfo) {
  TAVIRPELO_OsFree(decInfo.pZoomInfo);
  decInfo.pZoomInfo = nullptr;
}
