// Adding one picture at any position, in the table and in the container.
#pragma once

#include "slideshow/SlideShow.h"
#include "slideshow/picture.h"

namespace pelo::slideshow {

// 0 <= position <= subfileCount. 1, or 0 with the show as it was and the container put back.
[[nodiscard]] int store_picture(SlideShow& show, const PictureSource& source, const char* name,
                                int position, char flag);

}  // namespace pelo::slideshow
