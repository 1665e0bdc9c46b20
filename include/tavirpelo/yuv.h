/* Camera frames: YUV 4:2:0 to RGB565. */
#ifndef TAVIRPELO_YUV_H
#define TAVIRPELO_YUV_H

#include <stdint.h>

#include "tavirpelo/api.h"

/* Convert a frame into width x height RGB565 words; every chroma sample serves two by two pixels. A frame
 * one pixel wide and of odd height leaves its last word as it is. 1; nothing is done for null pointers or
 * sides below 1. */

/* Planes: Y, then Cb and Cr of (width + 1) / 2 x (height + 1) / 2 bytes each. */
TAVIRPELO_API int elo_OrbYUV420toRGB565(const uint8_t* source, int width, int height, void* destination);

/* Planes: Y, then (height + 1) / 2 rows of (width + 1) / 2 pairs of Cr and Cb. */
TAVIRPELO_API int elo_OrbPYV0420toRGB565(const uint8_t* source, int width, int height, void* destination);

/* What a chroma byte adds to R and B, and in 16-bit fixed point to G, with the zero point at 127. */
TAVIRPELO_API const int32_t elo_EnCrrTab[256];
TAVIRPELO_API const int32_t elo_EnCbbTab[256];
TAVIRPELO_API const int32_t elo_EnCrgTab[256];
TAVIRPELO_API const int32_t elo_EnCbgTab[256];

/* Values clamped to 0..255: entry 512 + v for v from -512 to 511. */
TAVIRPELO_API const uint8_t elo_EnRangeTalbe[1024];

#endif
