// Compaction: the marked pictures leave the container, the others close up.
#pragma once

#include "slideshow/SlideShow.h"

namespace pelo::slideshow {

// subfileInfo.state, bit 0: to be removed by the next compaction. Never outlives an open show: what a
// file says of it is ignored.
constexpr int kMarked = 1;

// File mode. False with the show as it was, and what that leaves of the container; see
// SlideShow::RemoveSubfile.
[[nodiscard]] bool compact(SlideShow& show);

}  // namespace pelo::slideshow
