// The given names of cropping and scaling pictures in memory.
#include "codec/base/errors.h"
#include "codec/image/crop.h"

using namespace pelo;

int TAVIRPELO_Crop(const void* src, const TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth,
                   int dstHeight, uint32_t option) {
  begin_operation();
  return crop(src, rect, dst, dstWidth, dstHeight, option);
}

int TAVIRPELO_Scale(const void* src, int srcWidth, int srcHeight, void* dst, int dstWidth, int dstHeight,
                    uint32_t option) {
  const TAVIRPELO_CROPRECT whole{srcWidth, srcHeight, 0, 0, srcWidth, srcHeight};
  return TAVIRPELO_Crop(src, &whole, dst, dstWidth, dstHeight, option);
}
