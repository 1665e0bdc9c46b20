// Zooming and moving: what each operation makes of a zoom's state, without pixels. The view always stays
// inside the zoomed picture, and the zoomed picture between the fitted and the largest size.
#pragma once

#include "codec/base/geometry.h"
#include "tavirpelo/zoom.h"

namespace pelo::zoom {

// Results of the operations.
constexpr int kTaken = 1;    // in full
constexpr int kLimited = 2;  // a limit was reached

constexpr int kMove = 30;  // pixels

int zoom_in(TAVIRPELO_ZOOMINFO& zoom, Size display);
int zoom_out(TAVIRPELO_ZOOMINFO& zoom, Size display);

// Zooms to a percentage of the fitted size about the view's centre.
int zoom_to_ratio(TAVIRPELO_ZOOMINFO& zoom, Size display, int ratio);

// Zooms to `level` steps from the fitted size with the view's corner at (x, y).
void jump(TAVIRPELO_ZOOMINFO& zoom, Size display, int level, int x, int y);

// Moves the view, along an axis where the distance is not 0, and stops it at the picture's edges.
int move_view(TAVIRPELO_ZOOMINFO& zoom, int dx, int dy);

// Places the view's corner and stops it at the picture's edges as a move does, on both axes.
int refresh_view(TAVIRPELO_ZOOMINFO& zoom, int64_t x, int64_t y);

// Places the view's corner, kept inside the picture.
void place_view(TAVIRPELO_ZOOMINFO& zoom, int64_t x, int64_t y);

// Zoom-in steps from the fitted size to the largest, and the ratio there.
int max_level(const TAVIRPELO_ZOOMINFO& zoom);
int max_ratio(const TAVIRPELO_ZOOMINFO& zoom);

// A rectangle in pixels.
struct Area {
  int x, y, width, height;
};

// What the zoom image holds of the view's upper left `shown` pixels: never empty, never outside.
Area visible_region(const TAVIRPELO_ZOOMINFO& zoom, Size shown);

// The view in a map that shows the whole picture fitted and centred.
Area view_in_map(const TAVIRPELO_ZOOMINFO& zoom, Size map);

// The zoomed picture's position of a point of a map that shows the whole picture; `source` receives the
// point in the picture's own pixels.
struct Position {
  int64_t x, y;
};
Position from_map(const TAVIRPELO_ZOOMINFO& zoom, Size map, int x, int y, Position& source);

}  // namespace pelo::zoom
