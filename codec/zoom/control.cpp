// The operations that change the view and draw it.
#include <iterator>

#include "codec/zoom/draw.h"
#include "codec/zoom/session.h"
#include "codec/zoom/view.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {
namespace {

// Finds the zoom, takes a step, step(zoom), and draws the view.
template <class Step>
int act(TAVIRPELO_DECINFO* decInfo, const Display& display, const Messages& messages, Step step,
        Quality quality = Quality::kAverage) {
  TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, messages);
  if (zoom == nullptr) return 0;
  if (!display.usable()) return fail(TAVIRPELO_ERROR_NULL);
  const int result = step(*zoom);
  if (result != 0) draw(*zoom, display, quality);
  return result;
}

constexpr Size kMoves[] = {{0, -kMove},      {0, kMove},      {-kMove, 0},    {kMove, 0},
                           {-kMove, -kMove}, {kMove, -kMove}, {kMove, kMove}, {-kMove, kMove}};
static_assert(std::size(kMoves) == TAVIRPELO_ZOOM_REFRESH - TAVIRPELO_ZOOM_UP);

int control_view(TAVIRPELO_ZOOMINFO& zoom, Size display, int control) {
  if (control == TAVIRPELO_ZOOM_IN) return zoom_in(zoom, display);
  if (control == TAVIRPELO_ZOOM_OUT) return zoom_out(zoom, display);
  if (control == TAVIRPELO_ZOOM_REFRESH) return refresh_view(zoom, zoom.viewX, zoom.viewY);
  if (control < 0 || control > TAVIRPELO_ZOOM_REFRESH) {
    return fail("TAVIRPELO_ControlZoom : invalid control!", TAVIRPELO_ERROR_ZOOM_CONTROL);
  }
  const Size move = kMoves[control - TAVIRPELO_ZOOM_UP];
  return move_view(zoom, move.width, move.height);
}

}  // namespace

int control(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int control) {
  return act(decInfo, {display, {width, height}}, kControlMessages, [=](TAVIRPELO_ZOOMINFO& zoom) {
    return control_view(zoom, {width, height}, control);
  });
}

int zoom_ratio(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int ratio, int fast) {
  return act(
      decInfo, {display, {width, height}}, kRatioMessages,
      [=](TAVIRPELO_ZOOMINFO& zoom) {
        return zoom_to_ratio(zoom, {width, height}, ratio);
      },
      fast != 0 ? Quality::kNearest : Quality::kAverage);
}

int pan(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x, int y, int fast) {
  return act(
      decInfo, {display, {width, height}}, kControlMessages,
      [=](TAVIRPELO_ZOOMINFO& zoom) {
        place_view(zoom, x, y);
        return kTaken;
      },
      fast != 0 ? Quality::kNearest : Quality::kAverage);
}

int jump_to(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, const int target[3]) {
  return act(decInfo, {display, {width, height}}, kJumpMessages, [=](TAVIRPELO_ZOOMINFO& zoom) {
    if (target == nullptr) return fail(TAVIRPELO_ERROR_NULL);
    jump(zoom, {width, height}, target[0], target[1], target[2]);
    return kTaken;
  });
}

int shift_display(TAVIRPELO_DECINFO* decInfo, void* display, int, int width, int height, int dx,
                  int dy) {
  return act(decInfo, {display, {width, height}}, kControlMessages, [=](TAVIRPELO_ZOOMINFO& zoom) {
    return refresh_view(zoom, int64_t{zoom.viewX} + dx, int64_t{zoom.viewY} + dy);
  });
}

int centre_on_map(TAVIRPELO_DECINFO* decInfo, void* display, const int mapSize[2], int width, int height,
                  int x, int y) {
  return act(decInfo, {display, {width, height}}, kControlMessages, [=](TAVIRPELO_ZOOMINFO& zoom) {
    if (mapSize == nullptr || mapSize[0] < 1 || mapSize[1] < 1) return fail(TAVIRPELO_ERROR_NULL);
    Position source;
    const Position centre = from_map(zoom, {mapSize[0], mapSize[1]}, x, y, source);
    const int result = refresh_view(zoom, centre.x - zoom.viewWidth / 2, centre.y - zoom.viewHeight / 2);
    zoom.mapStepX = static_cast<int32_t>(source.x);
    zoom.mapStepY = static_cast<int32_t>(source.y);
    return result;
  });
}

}  // namespace pelo::zoom
