// Cropping straight from a JPEG file within a memory limit.
#include <algorithm>

#include "codec/base/dec_info.h"
#include "codec/base/errors.h"
#include "codec/base/os_memory.h"
#include "codec/decode/decode.h"
#include "codec/formats/jpeg/decoder/driver.h"
#include "codec/image/crop.h"
#include "tavirpelo/decode.h"

namespace pelo {
namespace {

constexpr int64_t kHeadroom = 200000;  // bytes left to the decoder beside the picture

int fail(int code) {
  record_error(ErrorWord::kDecoding, code);
  return 0;
}

bool find_image_size(const char* path, TAVIRPELO_CROPRECT& rect) {
  if (rect.imageWidth != 0 && rect.imageHeight != 0) return true;
  TAVIRPELO_DECINFO* decInfo =
      create_dec_info(TAVIRPELO_IO_FILE, const_cast<char*>(path), 0, TAVIRPELO_RGB565, 0);
  if (decInfo == nullptr) return false;
  TAVIRPELO_HINFO header{};
  const bool found = TAVIRPELO_Parser(decInfo, &header) != TAVIRPELO_FORMAT_UNKNOWN;
  destroy_dec_info(decInfo);
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

int decode_small(const char* path, void* outBuffer, int width, int height) {
  TAVIRPELO_DECINFO* decInfo =
      create_dec_info(TAVIRPELO_IO_FILE, const_cast<char*>(path), 0, TAVIRPELO_RGB565, 0);
  if (decInfo == nullptr) return 0;
  const int result = jpeg::decode(decInfo, outBuffer, width, height);
  destroy_dec_info(decInfo);
  return result;
}

int crop_file(const char* path, TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth, int dstHeight,
              uint32_t option, int memoryLimit) {
  record_error(ErrorWord::kDecoding, TAVIRPELO_ERROR_NONE);
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
  if (decode_small(path, picture.data(), width, height) == 0) return fail(TAVIRPELO_ERROR_CROP);

  const Size region{std::clamp(plan.region.width, 1, width), std::clamp(plan.region.height, 1, height)};
  const int x = scaled(region.width, rect->x, rect->width, width - region.width);
  const int y = scaled(region.height, rect->y, rect->height, height - region.height);
  scale_into(picture.data() + (ptrdiff_t{y} * width + x) * 2, region, width, dst, box, option, out);
  return 1;
}

}  // namespace pelo
