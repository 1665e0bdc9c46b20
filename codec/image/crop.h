// Cropping and scaling of RGB565 pictures, and the sizes that a crop gets in a box.
#pragma once

#include "codec/base/geometry.h"
#include "tavirpelo/raw.h"

namespace pelo {

constexpr bool stretches(uint32_t option) {
  return (option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_STRETCH;
}

// a * b / c, at most a limit.
int scaled(int64_t a, int64_t b, int64_t c, int limit);

// The crop's size when it touches the box from inside, enlarged or reduced.
Size fit_inside(Size crop, Size box, uint32_t option);

// The smallest size of the crop that covers the box.
Size fit_outside(Size crop, Size box);

// True for a crop that has pixels, all of them the image's.
bool inside(const TAVIRPELO_CROPRECT& rect);

// Scales a region into the box's buffer, centred when the option names no fitting; `stride` in pixels.
void scale_into(const uint8_t* region, Size size, int stride, void* dst, Size box, uint32_t option,
                Size out);

// The whole of TAVIRPELO_Crop.
int crop(const void* src, const TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth, int dstHeight,
         uint32_t option);

}  // namespace pelo
