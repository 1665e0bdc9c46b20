#include "codec/zoom/view.h"

#include <algorithm>
#include <climits>

#include "codec/zoom/layout.h"

namespace pelo::zoom {
namespace {

constexpr int kLevelAtMaximum = 20;
constexpr int kLevelAtFit = 1;

int saturated(int64_t value) {
  return static_cast<int>(std::clamp<int64_t>(value, INT_MIN, INT_MAX));
}

// Half of what a zoom step adds to the width. Displays narrower than six pixels have a step of 0, which
// would never arrive anywhere.
int64_t half_growth(const TAVIRPELO_ZOOMINFO& zoom) {
  return std::min<int64_t>(int64_t{std::max(1, zoom.zoomStep)} * zoom.zoomScale, INT_MAX / 2);
}

// The height that belongs to a width, by the maximum's proportions.
int64_t height_for(const TAVIRPELO_ZOOMINFO& zoom, int64_t width) {
  return width * zoom.maxHeight / zoom.maxWidth;
}

enum class Reached { kNone, kFit, kMaximum };

// Makes the zoomed picture about `width` wide, within its limits. The width alone decides about them.
Reached set_zoomed(TAVIRPELO_ZOOMINFO& zoom, int64_t width) {
  const Size most = largest_zoomed(zoom);
  if (width <= zoom.minWidth) {
    zoom.zoomedWidth = zoom.minWidth;
    zoom.zoomedHeight = zoom.minHeight;
    return Reached::kFit;
  }
  if (width >= most.width) {
    zoom.zoomedWidth = most.width;
    zoom.zoomedHeight = most.height;
    return Reached::kMaximum;
  }
  zoom.zoomedWidth = static_cast<int>(width);
  zoom.zoomedHeight =
      static_cast<int>(std::clamp<int64_t>(height_for(zoom, width), zoom.minHeight, most.height));
  return Reached::kNone;
}

// The same for a percentage of the fitted size, each side for itself.
Reached set_ratio(TAVIRPELO_ZOOMINFO& zoom, int ratio) {
  const Size most = largest_zoomed(zoom);
  const auto side = [ratio](int fitted, int largest) {
    return static_cast<int>(std::clamp<int64_t>(int64_t{fitted} * ratio / 100, fitted, largest));
  };
  zoom.zoomedWidth = side(zoom.minWidth, most.width);
  zoom.zoomedHeight = side(zoom.minHeight, most.height);
  if (zoom.zoomedWidth == zoom.minWidth && zoom.zoomedHeight == zoom.minHeight) return Reached::kFit;
  const bool largest = zoom.zoomedWidth == most.width || zoom.zoomedHeight == most.height;
  return largest ? Reached::kMaximum : Reached::kNone;
}

// After a change of the zoom: the view's size, the ratio and the view's corner.
void settle(TAVIRPELO_ZOOMINFO& zoom, Size display, int64_t x, int64_t y) {
  zoom.viewWidth = std::min(display.width, zoom.zoomedWidth);
  zoom.viewHeight = std::min(display.height, zoom.zoomedHeight);
  zoom.zoomRatio = saturated(ceil_div(int64_t{zoom.zoomedWidth} * 100, zoom.minWidth));
  place_view(zoom, x, y);
}

int inside(int64_t at, int zoomed, int view) {
  return static_cast<int>(std::clamp<int64_t>(at, 0, std::max(0, zoomed - view)));
}

// Stops a moving view at the first pixel and at the last: true when it was stopped.
bool stop_at_edges(int64_t wanted, int zoomed, int view, int32_t& at) {
  at = inside(wanted, zoomed, view);
  return wanted < 1 || wanted + view >= zoomed;
}

// n * of / from for a position in one size of the picture, carried to another.
int64_t carry(int64_t n, int of, int from) {
  return n * of / from;
}

}  // namespace

int zoom_in(TAVIRPELO_ZOOMINFO& zoom, Size display) {
  const int64_t half = half_growth(zoom);
  const int width = zoom.zoomedWidth, height = zoom.zoomedHeight;
  if (set_zoomed(zoom, width + 2 * half) == Reached::kMaximum) {
    zoom.zoomLevel = kLevelAtMaximum;
    settle(zoom, display, int64_t{zoom.viewX} + (zoom.zoomedWidth - width) / 2,
           int64_t{zoom.viewY} + (zoom.zoomedHeight - height) / 2);
    return kLimited;
  }
  zoom.zoomLevel = saturated(int64_t{zoom.zoomLevel} + 1);
  settle(zoom, display, zoom.viewX + half, zoom.viewY + height_for(zoom, half));
  return kTaken;
}

int zoom_out(TAVIRPELO_ZOOMINFO& zoom, Size display) {
  const int64_t half = half_growth(zoom);
  const bool arrived = set_zoomed(zoom, zoom.zoomedWidth - 2 * half) == Reached::kFit;
  zoom.zoomLevel = arrived ? kLevelAtFit : saturated(int64_t{zoom.zoomLevel} - 1);
  settle(zoom, display, zoom.viewX - half, zoom.viewY - height_for(zoom, half));
  return arrived ? kLimited : kTaken;
}

int zoom_to_ratio(TAVIRPELO_ZOOMINFO& zoom, Size display, int ratio) {
  const int hiddenX = zoom.zoomedWidth - zoom.viewWidth, hiddenY = zoom.zoomedHeight - zoom.viewHeight;
  const Reached reached = set_ratio(zoom, ratio);
  zoom.zoomLevel = reached == Reached::kFit       ? kLevelAtFit
                   : reached == Reached::kMaximum ? kLevelAtMaximum
                                                  : 0;
  const int nowX = std::max(0, zoom.zoomedWidth - display.width);
  const int nowY = std::max(0, zoom.zoomedHeight - display.height);
  settle(zoom, display, int64_t{zoom.viewX} + (nowX - hiddenX) / 2,
         int64_t{zoom.viewY} + (nowY - hiddenY) / 2);
  return reached == Reached::kFit ? kLimited : kTaken;
}

void jump(TAVIRPELO_ZOOMINFO& zoom, Size display, int level, int x, int y) {
  zoom.zoomLevel = level;
  set_zoomed(zoom, zoom.minWidth + 2 * half_growth(zoom) * level);
  settle(zoom, display, x, y);
}

int move_view(TAVIRPELO_ZOOMINFO& zoom, int dx, int dy) {
  bool stopped = false;
  if (dx != 0) {
    stopped |= stop_at_edges(int64_t{zoom.viewX} + dx, zoom.zoomedWidth, zoom.viewWidth, zoom.viewX);
  }
  if (dy != 0) {
    stopped |= stop_at_edges(int64_t{zoom.viewY} + dy, zoom.zoomedHeight, zoom.viewHeight, zoom.viewY);
  }
  return stopped ? kLimited : kTaken;
}

int refresh_view(TAVIRPELO_ZOOMINFO& zoom, int64_t x, int64_t y) {
  const bool stoppedX = stop_at_edges(x, zoom.zoomedWidth, zoom.viewWidth, zoom.viewX);
  const bool stoppedY = stop_at_edges(y, zoom.zoomedHeight, zoom.viewHeight, zoom.viewY);
  zoom.mapStepX = zoom.mapStepY = kMove;
  return stoppedX || stoppedY ? kLimited : kTaken;
}

void place_view(TAVIRPELO_ZOOMINFO& zoom, int64_t x, int64_t y) {
  zoom.viewX = inside(x, zoom.zoomedWidth, zoom.viewWidth);
  zoom.viewY = inside(y, zoom.zoomedHeight, zoom.viewHeight);
}

int max_level(const TAVIRPELO_ZOOMINFO& zoom) {
  const int64_t growth = std::max(0, zoom.maxWidth - zoom.minWidth);
  return static_cast<int>(ceil_div(growth, 2 * half_growth(zoom)));
}

int max_ratio(const TAVIRPELO_ZOOMINFO& zoom) {
  return saturated(ceil_div(int64_t{zoom.maxWidth} * 100, zoom.minWidth));
}

Area visible_region(const TAVIRPELO_ZOOMINFO& zoom, Size shown) {
  const auto axis = [](int view, int length, int image, int zoomed, int& at, int& count) {
    at = static_cast<int>(std::clamp<int64_t>(carry(view, image, zoomed), 0, image - 1));
    const int64_t wanted = ceil_div(int64_t{image} * length, zoomed);
    count = static_cast<int>(std::clamp<int64_t>(wanted, 1, image - at));
  };
  Area region{};
  axis(zoom.viewX, shown.width, zoom.imageWidth, zoom.zoomedWidth, region.x, region.width);
  axis(zoom.viewY, shown.height, zoom.imageHeight, zoom.zoomedHeight, region.y, region.height);
  return region;
}

Area view_in_map(const TAVIRPELO_ZOOMINFO& zoom, Size map) {
  const auto axis = [](int view, int length, int fitted, int zoomed, int side, int& at, int& count) {
    const int64_t first = (side - fitted) / 2 + carry(view, fitted, zoomed);
    count = static_cast<int>(std::max<int64_t>(1, ceil_div(int64_t{length} * fitted, zoomed)));
    at = static_cast<int>(std::min<int64_t>(first, side - 1));
  };
  const Size fitted = fit_floor({zoom.sourceWidth, zoom.sourceHeight}, map);
  Area area{};
  axis(zoom.viewX, zoom.viewWidth, fitted.width, zoom.zoomedWidth, map.width, area.x, area.width);
  axis(zoom.viewY, zoom.viewHeight, fitted.height, zoom.zoomedHeight, map.height, area.y, area.height);
  return area;
}

Position from_map(const TAVIRPELO_ZOOMINFO& zoom, Size map, int x, int y, Position& source) {
  source = {saturated(carry(x, zoom.sourceWidth, map.width)),
            saturated(carry(y, zoom.sourceHeight, map.height))};
  return {carry(source.x, zoom.zoomedWidth, zoom.sourceWidth),
          carry(source.y, zoom.zoomedHeight, zoom.sourceHeight)};
}

}  // namespace pelo::zoom
