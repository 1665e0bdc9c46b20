// Cropping straight from a JPEG file within a memory limit.
#pragma once

#include "tavirpelo/raw.h"

namespace pelo {

// The whole of TAVIRPELO_CropDecoding and TAVIRPELO_CropFromImage.
int decode_small(const char* path, void* outBuffer, int width, int height);
int crop_file(const char* path, TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth, int dstHeight,
              uint32_t option, int memoryLimit);

}  // namespace pelo
