// From the zoom image to the caller's display.
#pragma once

#include "codec/zoom/session.h"

namespace pelo::zoom {

enum class Quality { kNearest, kAverage };

// A part of a picture in memory; the stride in pixels.
struct Pixels {
  const void* first;
  Size size;
  int stride;
};

// Scales into a packed picture. RGB888 is always averaged.
void scale_to(const Pixels& source, void* target, Size size, int stride, int format, Quality quality);

void fill(const Display& display, int format, uint32_t colour);

// Where a view stands in a display, centred; the rest of the display gets the background.
struct Shown {
  uint8_t* first;
  Size size;  // no larger than the display
};
Shown prepare(const TAVIRPELO_ZOOMINFO& zoom, const Display& display);

// Draws the view, or the background when there is no zoom image.
void draw(const TAVIRPELO_ZOOMINFO& zoom, const Display& display, Quality quality = Quality::kAverage);

}  // namespace pelo::zoom
