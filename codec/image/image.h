// How to read this room: a raw image is made and filled in raw_image.cpp; scale.cpp resizes whole
// pictures by the loops of resample.h, place.cpp into a part of a picture, crop.cpp from a part of one;
// blend.cpp and rotate.cpp are what they say. image_abi.cpp has the given names of all of them.
#pragma once

#include "codec/base/geometry.h"
#include "tavirpelo/raw.h"

namespace pelo {

// ---- raw images ----

TAVIRPELO_RAWINFO* create_raw_image(int width, int height, int format);
void destroy_raw_image(TAVIRPELO_RAWINFO* raw);

// Fills every pixel with a colour: as a word for formats of two bytes, as R, G, B for the others. 1, or
// 0.
int fill(TAVIRPELO_RAWINFO* raw, uint16_t word, uint8_t r, uint8_t g, uint8_t b);

// ---- pixels over pixels ----

// Blends pixels of a format with alpha into a destination at (x, y). 1, or 0 with the codec word set.
int blend(const void* src, void* dst, Size source, Size target, int x, int y, int format);

// Copies the 32-bit pixels whose mask byte is not 0.
void copy_masked(const void* src, void* dst, const uint8_t* mask, int strideBytes, Size size);

// Turns an image about its centre into a buffer of its size.
void rotate(const TAVIRPELO_RAWINFO& raw, void* dst, int degrees);

// ---- scaling into a part of a picture ----

// As TAVIRPELO_CODEC_Scale takes it.
struct ScaleRequest {
  const void* src;
  void* dst;
  int srcWidth, srcHeight, srcStride;
  int dstWidth, dstHeight, dstStride;
  int scaledWidth, scaledHeight;
  int format, anchor, quality;
};
int scale_anchored(const ScaleRequest& request);

}  // namespace pelo
