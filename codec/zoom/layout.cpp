#include "codec/zoom/layout.h"

#include <algorithm>
#include <climits>
#include <cstdlib>

#include "codec/base/geometry.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {
namespace {

constexpr int kRatioBits = 10;  // 1024 = 1.0

// Bytes of the picture enlarged by the factor, saturated.
int64_t enlarged_bytes(Size picture, int64_t factor, int bytes) {
  factor = std::abs(factor);
  const int64_t once = int64_t{picture.width} * picture.height * bytes * factor;
  return factor != 0 && once > INT64_MAX / factor ? INT64_MAX : once * factor;
}

int scaled_side(int side, int64_t factor, int ratio) {
  const int64_t scaled = std::max<int64_t>(0, ratio * factor * side);
  return static_cast<int>(std::clamp<int64_t>(ceil_div(scaled, 1 << kRatioBits), 1, INT_MAX));
}

}  // namespace

uint32_t zoom_rotation(uint32_t option, Size picture, Size display) {
  const uint32_t rotation = (option & TAVIRPELO_ZOOM_ROTATE_MASK) >> 2;
  if ((option & TAVIRPELO_ZOOM_ROTATE_AUTO) == 0 || !sideways(rotation)) return rotation;
  const bool portraitDisplay = display.width <= display.height;
  const bool improves =
      portraitDisplay ? picture.width > picture.height : picture.width < picture.height;
  return improves ? rotation : 0;
}

Size fit_floor(Size picture, Size box) {
  const Size fitted = fit_by_width(picture.width, picture.height, box);
  return {std::max(1, fitted.width), std::max(1, fitted.height)};
}

Size fit_ceil(Size picture, Size box) {
  Size fitted = picture;
  if (fitted.width > box.width) {
    fitted = {box.width, static_cast<int>(ceil_div(int64_t{box.width} * picture.height, picture.width))};
  }
  if (fitted.height > box.height) {
    fitted = {static_cast<int>(ceil_div(int64_t{box.height} * picture.width, picture.height)),
              box.height};
  }
  return {std::max(1, fitted.width), std::max(1, fitted.height)};
}

int step_of(int side) {
  return static_cast<int>((int64_t{side} * 102 + 512) >> 10);
}

bool lay_out(TAVIRPELO_ZOOMINFO& zoom, Size picture, Size display, int64_t budget, int zoomFactor,
             int bytes) {
  const int ratio = max_dec_ratio(budget - kDecoderBytes, enlarged_bytes(picture, zoomFactor, bytes));
  if (ratio == 0) return false;

  zoom.sourceWidth = picture.width;
  zoom.sourceHeight = picture.height;
  const Size fit = fit_floor(picture, display);
  zoom.minWidth = zoom.zoomedWidth = zoom.viewWidth = fit.width;
  zoom.minHeight = zoom.zoomedHeight = zoom.viewHeight = fit.height;
  zoom.maxWidth = scaled_side(picture.width, zoomFactor, ratio);
  zoom.maxHeight = scaled_side(picture.height, zoomFactor, ratio);
  const Size image = fit_ceil(
      picture, {std::min(zoom.maxWidth, picture.width), std::min(zoom.maxHeight, picture.height)});
  zoom.imageWidth = image.width;
  zoom.imageHeight = image.height;
  zoom.zoomStep = zoom.mapStepX = step_of(display.width);
  zoom.mapStepY = step_of(display.height);
  zoom.zoomScale = 1;
  zoom.zoomRatio = 100;
  return true;
}

Size largest_zoomed(const TAVIRPELO_ZOOMINFO& zoom) {
  return {std::max(zoom.maxWidth, zoom.minWidth), std::max(zoom.maxHeight, zoom.minHeight)};
}

int64_t memory_requirement(Size picture, int64_t side, int bytes) {
  const auto square = static_cast<int>(std::clamp<int64_t>(side, 1, INT_MAX));
  const Size fitted = fit_ceil(picture, {square, square});
  return int64_t{fitted.width} * fitted.height * bytes + kDecoderBytes;
}

void raise_empty_sides(TAVIRPELO_ZOOMINFO* zoom) {
  if (zoom == nullptr) return;
  for (int32_t* side : {&zoom->imageWidth, &zoom->imageHeight, &zoom->zoomedWidth, &zoom->zoomedHeight,
                        &zoom->viewWidth, &zoom->viewHeight}) {
    if (*side == 0) *side = 1;
  }
}

}  // namespace pelo::zoom
