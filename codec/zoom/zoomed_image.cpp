// The whole picture rendered at the current zoom, and views copied from it.
#include "codec/base/os.h"
#include "codec/pixel/row_stores.h"
#include "codec/zoom/draw.h"
#include "codec/zoom/session.h"
#include "codec/zoom/view.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {
namespace {

// choose(zoom) picks the quality.
template <class Choose>
int render(TAVIRPELO_DECINFO* decInfo, Choose choose) {
  TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kJumpMessages);
  if (zoom == nullptr || zoom->pZoomedImage == nullptr || zoom->pZoomImage == nullptr) return 0;
  const Size image{zoom->imageWidth, zoom->imageHeight}, zoomed{zoom->zoomedWidth, zoom->zoomedHeight};
  scale_to({zoom->pZoomImage, image, image.width}, zoom->pZoomedImage, zoomed, zoomed.width,
           zoom->format, choose(*zoom));
  zoom->renderedWidth = zoomed.width;
  zoom->renderedHeight = zoomed.height;
  return 1;
}

bool is_rendered(const TAVIRPELO_ZOOMINFO& zoom) {
  return zoom.pZoomedImage != nullptr && zoom.renderedWidth == zoom.zoomedWidth &&
         zoom.renderedHeight == zoom.zoomedHeight;
}

void copy_view(const TAVIRPELO_ZOOMINFO& zoom, const Display& display) {
  const Shown shown = prepare(zoom, display);
  const ptrdiff_t bytes = bytes_per_pixel(zoom.format);
  const auto* from = static_cast<const uint8_t*>(zoom.pZoomedImage) +
                     (ptrdiff_t{zoom.viewY} * zoom.zoomedWidth + zoom.viewX) * bytes;
  for (ptrdiff_t y = 0; y < shown.size.height; ++y) {
    os_memcpy(shown.first + y * display.size.width * bytes, from + y * zoom.zoomedWidth * bytes,
              static_cast<size_t>(shown.size.width * bytes));
  }
}

}  // namespace

int render_low(TAVIRPELO_DECINFO* decInfo) {
  return render(decInfo, [](const TAVIRPELO_ZOOMINFO&) { return Quality::kNearest; });
}

int render_medium(TAVIRPELO_DECINFO* decInfo) {
  return render(decInfo, [](const TAVIRPELO_ZOOMINFO& zoom) {
    const bool muchSmaller = int64_t{3} * zoom.zoomedWidth < int64_t{2} * zoom.imageWidth;
    return muchSmaller ? Quality::kAverage : Quality::kNearest;
  });
}

int render_high(TAVIRPELO_DECINFO* decInfo) {
  return render(decInfo, [](const TAVIRPELO_ZOOMINFO&) { return Quality::kAverage; });
}

int pan_rendered(TAVIRPELO_DECINFO* decInfo, void* display, int width, int height, int x, int y) {
  TAVIRPELO_ZOOMINFO* zoom = begin(decInfo, kJumpMessages);
  if (zoom == nullptr) return 0;
  const Display target{display, {width, height}};
  if (!target.usable()) return fail(TAVIRPELO_ERROR_NULL);
  if (!is_rendered(*zoom)) return 0;
  place_view(*zoom, x, y);
  copy_view(*zoom, target);
  return 1;
}

}  // namespace pelo::zoom
