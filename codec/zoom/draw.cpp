#include "codec/zoom/draw.h"

#include <algorithm>

#include "codec/base/byte_order.h"
#include "codec/image/scale.h"
#include "codec/pixel/paint.h"
#include "codec/pixel/row_stores.h"
#include "codec/zoom/view.h"
#include "codec/zoom/zoom.h"

namespace pelo::zoom {
namespace {

bool has_image(const TAVIRPELO_ZOOMINFO& zoom) {
  return zoom.imageWidth > 0 && zoom.imageHeight > 0;
}

int draw_view(const TAVIRPELO_ZOOMINFO* zoom, const Display& display, int format, Quality quality) {
  if (zoom == nullptr || zoom->format != format || !display.usable()) return 0;
  if (zoom->pZoomImage == nullptr || !has_image(*zoom)) {
    TAVIRPELO_PrintMessage("PELO_MakeDisplay : zoom image is null!");
    return 0;
  }
  const Shown shown = prepare(*zoom, display);
  const Area region = visible_region(*zoom, shown.size);
  const auto* first = static_cast<const uint8_t*>(zoom->pZoomImage) +
                      (ptrdiff_t{region.y} * zoom->imageWidth + region.x) * bytes_per_pixel(format);
  scale_to({first, {region.width, region.height}, zoom->imageWidth}, shown.first, shown.size,
           display.size.width, format, quality);
  return 1;
}

void fill_display(void* display, int width, int height, const uint8_t* pixel, size_t bytes) {
  if (display == nullptr || width < 1 || height < 1) return;
  fill_pixels(display, static_cast<size_t>(width) * static_cast<size_t>(height), pixel, bytes);
}

}  // namespace

void scale_to(const Pixels& source, void* target, Size size, int stride, int format, Quality quality) {
  const ptrdiff_t bytes = bytes_per_pixel(format);
  const Scaling scaling{{static_cast<const uint8_t*>(source.first), source.size.width,
                         source.size.height, source.stride * bytes},
                        {static_cast<uint8_t*>(target), size.width, size.height, stride * bytes}};
  const auto scale = format == TAVIRPELO_RGB888     ? scale888
                     : quality == Quality::kNearest ? pick565
                                                    : scale565;
  scale(scaling);
}

void fill(const Display& display, int format, uint32_t colour) {
  const auto filler = format == TAVIRPELO_RGB888 ? PELO_SetRGB888OutBuff : PELO_SetOutBuff;
  filler(display.pixels, display.size.width, display.size.height, colour);
}

Shown prepare(const TAVIRPELO_ZOOMINFO& zoom, const Display& display) {
  const Size shown{std::min(zoom.viewWidth, display.size.width),
                   std::min(zoom.viewHeight, display.size.height)};
  if (shown != display.size) fill(display, zoom.format, zoom.background);
  const ptrdiff_t x = (display.size.width - shown.width) / 2;
  const ptrdiff_t y = (display.size.height - shown.height) / 2;
  return {static_cast<uint8_t*>(display.pixels) +
              (y * display.size.width + x) * bytes_per_pixel(zoom.format),
          shown};
}

void draw(const TAVIRPELO_ZOOMINFO& zoom, const Display& display, Quality quality) {
  if (has_image(zoom)) {
    draw_view(&zoom, display, zoom.format, quality);
  } else {
    fill(display, zoom.format, zoom.background);
  }
}

int make_display(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height, int fast) {
  return draw_view(zoom, {display, {width, height}}, TAVIRPELO_RGB565,
                   fast != 0 ? Quality::kNearest : Quality::kAverage);
}

int make_rgb888_display(const TAVIRPELO_ZOOMINFO* zoom, void* display, int width, int height) {
  return draw_view(zoom, {display, {width, height}}, TAVIRPELO_RGB888, Quality::kAverage);
}

void fill565(void* display, int width, int height, uint32_t colour) {
  uint8_t pixel[2];
  pelo::store_le16(pixel, colour);
  fill_display(display, width, height, pixel, sizeof pixel);
}

void fill888(void* display, int width, int height, uint32_t colour) {
  const uint8_t pixel[3] = {static_cast<uint8_t>(colour >> 16), static_cast<uint8_t>(colour >> 8),
                            static_cast<uint8_t>(colour)};
  fill_display(display, width, height, pixel, sizeof pixel);
}

}  // namespace pelo::zoom
