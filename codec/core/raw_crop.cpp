// RGB565 regions brought into a box. Of a JPEG file no more pixels are decoded than the box needs, so
// that a caller can say how much memory there is.
#include <algorithm>
#include <climits>

#include "codec/core/ground/geometry.h"
#include "codec/core/ground/os_memory.h"
#include "tavirpelo/decode.h"
#include "tavirpelo/parse.h"
#include "tavirpelo/raw.h"

using namespace pelo;

namespace {

constexpr int64_t kHeadroom = 200000;  // bytes left to the decoder beside the picture

int fail(int code) {
  gTAVIRPELO_Error = code;
  return 0;
}

bool stretches(uint32_t option) {
  return (option & TAVIRPELO_FIT_MASK) == TAVIRPELO_FIT_STRETCH;
}

// a * b / c, at most a limit.
int scaled(int64_t a, int64_t b, int64_t c, int limit) {
  return static_cast<int>(std::min<int64_t>(a * b / c, limit));
}

// Negative when the crop is relatively taller than the box, positive when wider.
int64_t compare_shape(Size crop, Size box) {
  return int64_t{crop.width} * box.height - int64_t{crop.height} * box.width;
}

// The crop's size when it touches the box from inside, enlarged or reduced.
Size fit_inside(Size crop, Size box, uint32_t option) {
  const int64_t shape = compare_shape(crop, box);
  if (stretches(option) || shape == 0) return box;
  if (shape < 0)
    return {std::max(1, scaled(crop.width, box.height, crop.height, box.width)), box.height};
  return {box.width, std::max(1, scaled(crop.height, box.width, crop.width, box.height))};
}

// The smallest size of the crop that covers the box.
Size fit_outside(Size crop, Size box) {
  const int64_t shape = compare_shape(crop, box);
  if (shape > 0) return {scaled(crop.width, box.height, crop.height, INT_MAX), box.height};
  if (shape < 0) return {box.width, scaled(crop.height, box.width, crop.width, INT_MAX)};
  return box;
}

// Scales a region into the box's buffer, centred when the option names no fitting.
void scale_into(const uint8_t* region, Size size, int stride, void* dst, Size box, uint32_t option,
                Size out) {
  auto* start = static_cast<uint8_t*>(dst);
  if ((option & TAVIRPELO_FIT_MASK) == 0) {
    const ptrdiff_t x = (box.width - out.width) >> 1, y = (box.height - out.height) >> 1;
    start += (x + y * box.width) * 2;
  }
  PELO_Scale_ex(region, size.width, size.height, stride, start, out.width, out.height, box.width);
}

bool inside(const TAVIRPELO_CROPRECT& rect) {
  return rect.x >= 0 && rect.y >= 0 && rect.width > 0 && rect.height > 0 &&
         int64_t{rect.x} + rect.width <= rect.imageWidth &&
         int64_t{rect.y} + rect.height <= rect.imageHeight;
}

bool find_image_size(const char* path, TAVIRPELO_CROPRECT& rect) {
  if (rect.imageWidth != 0 && rect.imageHeight != 0) return true;
  TAVIRPELO_DECINFO* decInfo =
      TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(path), 0, TAVIRPELO_RGB565, 0);
  if (decInfo == nullptr) return false;
  TAVIRPELO_HINFO header{};
  const bool found = TAVIRPELO_Parser(decInfo, &header) != TAVIRPELO_FORMAT_UNKNOWN;
  TAVIRPELO_DestroyDecInfo(decInfo);
  if (!found) return false;
  rect.imageWidth = header.width;
  rect.imageHeight = header.height;
  return true;
}

// The size at which the whole image is decoded so that the crop has the region's size.
struct Plan {
  int64_t width, height;
  Size region;
};
Plan plan_decode(const TAVIRPELO_CROPRECT& rect, Size region) {
  const int64_t width = int64_t{rect.imageWidth} * region.width / rect.width;
  const int64_t height = int64_t{rect.imageHeight} * region.height / rect.height;
  if (width <= rect.imageWidth && height <= rect.imageHeight) return {width, height, region};
  return {rect.imageWidth, rect.imageHeight, {rect.width, rect.height}};
}

}  // namespace

int TAVIRPELO_Crop(const void* src, const TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth,
                   int dstHeight, uint32_t option) {
  gTAVIRPELO_Error = TAVIRPELO_ERROR_NONE;
  if (src == nullptr || dst == nullptr || rect == nullptr) return fail(TAVIRPELO_ERROR_NULL);
  if (dstWidth < 1 || dstHeight < 1) return 0;
  if (!inside(*rect)) return fail(TAVIRPELO_ERROR_NULL);
  const Size crop{rect->width, rect->height}, box{dstWidth, dstHeight};
  const uint8_t* first =
      static_cast<const uint8_t*>(src) + (ptrdiff_t{rect->y} * rect->imageWidth + rect->x) * 2;
  scale_into(first, crop, rect->imageWidth, dst, box, option, fit_inside(crop, box, option));
  return 1;
}

int TAVIRPELO_Scale(const void* src, int srcWidth, int srcHeight, void* dst, int dstWidth, int dstHeight,
                    uint32_t option) {
  const TAVIRPELO_CROPRECT whole{srcWidth, srcHeight, 0, 0, srcWidth, srcHeight};
  return TAVIRPELO_Crop(src, &whole, dst, dstWidth, dstHeight, option);
}

int TAVIRPELO_CropDecoding(const char* path, void* outBuffer, int width, int height) {
  TAVIRPELO_DECINFO* decInfo =
      TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_FILE, const_cast<char*>(path), 0, TAVIRPELO_RGB565, 0);
  if (decInfo == nullptr) return 0;
  const int result = TAVIRPELO_DecodeJPEG(decInfo, outBuffer, width, height);
  TAVIRPELO_DestroyDecInfo(decInfo);
  return result;
}

int TAVIRPELO_CropFromImage(const char* path, TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth,
                            int dstHeight, uint32_t option, int memoryLimit) {
  gTAVIRPELO_Error = TAVIRPELO_ERROR_NONE;
  if (path == nullptr || rect == nullptr || dst == nullptr || dstWidth < 1 || dstHeight < 1) {
    return fail(TAVIRPELO_ERROR_NULL);
  }
  if (!find_image_size(path, *rect) || !inside(*rect)) return fail(TAVIRPELO_ERROR_NULL);

  const Size crop{rect->width, rect->height}, box{dstWidth, dstHeight};
  const Size out = fit_inside(crop, box, option);
  const Plan plan = plan_decode(*rect, stretches(option) ? fit_outside(crop, box) : out);
  if (plan.width < 1 || plan.height < 1) return fail(TAVIRPELO_ERROR_CROP);
  const int64_t bytes = plan.width * plan.height * 2;
  if (bytes + kHeadroom > memoryLimit) return fail(TAVIRPELO_ERROR_MEMORY);
  OsBuffer<uint8_t> picture;
  if (!picture.allocate(static_cast<size_t>(bytes))) return fail(TAVIRPELO_ERROR_MEMORY);
  const auto width = static_cast<int>(plan.width), height = static_cast<int>(plan.height);
  if (TAVIRPELO_CropDecoding(path, picture.data(), width, height) == 0)
    return fail(TAVIRPELO_ERROR_CROP);

  const Size region{std::clamp(plan.region.width, 1, width), std::clamp(plan.region.height, 1, height)};
  const int x = scaled(region.width, rect->x, rect->width, width - region.width);
  const int y = scaled(region.height, rect->y, rect->height, height - region.height);
  scale_into(picture.data() + (ptrdiff_t{y} * width + x) * 2, region, width, dst, box, option, out);
  return 1;
}
