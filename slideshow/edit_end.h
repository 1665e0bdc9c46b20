// The last steps of an edit that has moved a container's contents about.
#pragma once

#include <cstdint>

#include "slideshow/SlideShow.h"

namespace pelo::slideshow {

// Writes the header, the pictures' headers and an end mark at `end`, then cuts the file behind the mark.
// Until the cut everything can be put back, and when it is made nothing is left to fail. False when a
// step fails twice.
[[nodiscard]] bool finish_file(SlideShow& show, int64_t end);

}  // namespace pelo::slideshow
