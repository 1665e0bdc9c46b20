// Cropping and scaling of RGB565 pictures.
#include "codec/image/crop.h"

#include <algorithm>
#include <climits>

#include "codec/base/errors.h"
#include "codec/image/scale.h"

namespace pelo {
namespace {

// Negative when the crop is relatively taller than the box, positive when wider.
int64_t compare_shape(Size crop, Size box) {
  return int64_t{crop.width} * box.height - int64_t{crop.height} * box.width;
}

}  // namespace

int scaled(int64_t a, int64_t b, int64_t c, int limit) {
  return static_cast<int>(std::min<int64_t>(a * b / c, limit));
}

Size fit_inside(Size crop, Size box, uint32_t option) {
  const int64_t shape = compare_shape(crop, box);
  if (stretches(option) || shape == 0) return box;
  if (shape < 0)
    return {std::max(1, scaled(crop.width, box.height, crop.height, box.width)), box.height};
  return {box.width, std::max(1, scaled(crop.height, box.width, crop.width, box.height))};
}

Size fit_outside(Size crop, Size box) {
  const int64_t shape = compare_shape(crop, box);
  if (shape > 0) return {scaled(crop.width, box.height, crop.height, INT_MAX), box.height};
  if (shape < 0) return {box.width, scaled(crop.height, box.width, crop.width, INT_MAX)};
  return box;
}

void scale_into(const uint8_t* region, Size size, int stride, void* dst, Size box, uint32_t option,
                Size out) {
  auto* start = static_cast<uint8_t*>(dst);
  if ((option & TAVIRPELO_FIT_MASK) == 0) {
    const ptrdiff_t x = (box.width - out.width) >> 1, y = (box.height - out.height) >> 1;
    start += (x + y * box.width) * 2;
  }
  scale565({{region, size.width, size.height, ptrdiff_t{stride} * 2},
            {start, out.width, out.height, ptrdiff_t{box.width} * 2}});
}

bool inside(const TAVIRPELO_CROPRECT& rect) {
  return rect.x >= 0 && rect.y >= 0 && rect.width > 0 && rect.height > 0 &&
         int64_t{rect.x} + rect.width <= rect.imageWidth &&
         int64_t{rect.y} + rect.height <= rect.imageHeight;
}

namespace {

int fail() {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NULL);
  return 0;
}

}  // namespace

int crop(const void* src, const TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth, int dstHeight,
         uint32_t option) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
  if (src == nullptr || dst == nullptr || rect == nullptr) return fail();
  if (dstWidth < 1 || dstHeight < 1) return 0;
  if (!inside(*rect)) return fail();
  const Size crop{rect->width, rect->height}, box{dstWidth, dstHeight};
  const uint8_t* first =
      static_cast<const uint8_t*>(src) + (ptrdiff_t{rect->y} * rect->imageWidth + rect->x) * 2;
  scale_into(first, crop, rect->imageWidth, dst, box, option, fit_inside(crop, box, option));
  return 1;
}

}  // namespace pelo
