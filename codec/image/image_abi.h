// Given names of the image room that no public header has.
#pragma once

#include <cstdint>

#include "tavirpelo/api.h"

// `count` sums of four RGB565 pixels to the average pixels; the lanes stand in codec/image/scale.h.
TAVIRPELO_API void PELO_WriteOutputBuf(const uint32_t* words, void* output, int count);

// The same of RGB888 pixels.
TAVIRPELO_API void PELO_WriteRGB888OutputBuf(const uint32_t* words, void* output, int count);
