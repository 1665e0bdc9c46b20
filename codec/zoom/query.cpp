// Questions about a zoom, and its settings.
#include "codec/base/errors.h"
#include "codec/pixel/row_stores.h"
#include "codec/zoom/layout.h"
#include "codec/zoom/session.h"
#include "codec/zoom/view.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {
namespace {

constexpr int kStepsAround = 40;  // zoom steps that a memory requirement adds to the display's width

// Stores what value(zoom) says.
template <class Value>
int answer(TAVIRPELO_DECINFO* decInfo, int* result, Value value) {
  const TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kControlMessages);
  if (zoom == nullptr) return 0;
  if (result == nullptr) return fail(TAVIRPELO_ERROR_NULL);
  *result = value(*zoom);
  return 1;
}

}  // namespace

int map_area(TAVIRPELO_DECINFO* decInfo, int mapWidth, int mapHeight, int area[6]) {
  const TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kControlMessages);
  if (zoom == nullptr) return 0;
  if (area == nullptr || mapWidth < 1 || mapHeight < 1) return fail(TAVIRPELO_ERROR_NULL);
  const Area view = view_in_map(*zoom, {mapWidth, mapHeight});
  area[0] = mapWidth;
  area[1] = mapHeight;
  area[2] = view.x;
  area[3] = view.y;
  area[4] = view.width;
  area[5] = view.height;
  return 1;
}

int status(TAVIRPELO_DECINFO* decInfo, int* x, int* y, int* ratio) {
  const TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kControlMessages);
  if (zoom == nullptr) return 0;
  if (x != nullptr) *x = zoom->viewX;
  if (y != nullptr) *y = zoom->viewY;
  if (ratio != nullptr) *ratio = zoom->zoomRatio;
  return 1;
}

int top_level(TAVIRPELO_DECINFO* decInfo, int* level) {
  return answer(decInfo, level, max_level);
}

int top_ratio(TAVIRPELO_DECINFO* decInfo, int* ratio) {
  return answer(decInfo, ratio, max_ratio);
}

void* buffer(TAVIRPELO_DECINFO* decInfo) {
  const TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kControlMessages);
  return zoom == nullptr ? nullptr : zoom->pZoomImage;
}

int set_scale(TAVIRPELO_DECINFO* decInfo, int scale) {
  TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kControlMessages);
  if (zoom == nullptr) return 0;
  if (scale < 1) return fail("TAVIRPELO_SetZoomScale : invalid set!");
  zoom->zoomScale = scale;
  return 1;
}

// A picture that lies on its side takes the same part of a square, so the display's height, and with it
// the rotation, does not matter. While a zoom is active its task may be reading the source.
int needed_memory(TAVIRPELO_DECINFO* decInfo, int displayWidth, int) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (decInfo == nullptr) return fail(kControlMessages.noObject, TAVIRPELO_ERROR_NULL);
  if (!zoomable(decInfo->outFormat)) return -1;
  int step = step_of(displayWidth);
  Size picture{};
  if (const TAVIRPELO_ZOOMINFO* zoom = decInfo->pZoomInfo; zoom != nullptr) {
    step = zoom->zoomStep;
    picture = {zoom->sourceWidth, zoom->sourceHeight};
  } else if (!read_size(*decInfo, picture)) {
    return -1;
  }
  const int64_t side = displayWidth + kStepsAround * int64_t{step};
  return static_cast<int>(memory_requirement(picture, side, bytes_per_pixel(decInfo->outFormat)));
}

}  // namespace pelo::zoom
