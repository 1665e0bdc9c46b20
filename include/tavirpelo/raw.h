/* Raw images: a decoded picture in memory. */
#ifndef TAVIRPELO_RAW_H
#define TAVIRPELO_RAW_H

#include <stdint.h>

#include "tavirpelo/decinfo.h"

/* Rows are packed without padding. */
typedef struct TAVIRPELO_RAWINFO {
  uint32_t width;  /* pixels, 1 to 5000 */
  uint32_t height;
  void* pData;     /* owned pixel block */
  uint32_t format; /* pixel format code: 0, 1, 2, 5 or 6 */
} TAVIRPELO_RAWINFO;

/* A zero-filled image; another format code gives format 0 and debug_PeloCodecError 7. Null on failure:
 * 12 (a side below 1), 15 (no memory for the record), none (a side above 5000, no memory for pixels). */
TAVIRPELO_API TAVIRPELO_RAWINFO* TAVIRPELO_CreateRawInfo(int width, int height, int format);

/* Frees pixels and record; null is ignored. */
TAVIRPELO_API void TAVIRPELO_DestroyRawInfo(TAVIRPELO_RAWINFO* raw);

/* Fill every pixel. YUV images turn black whatever the colour; formats 5 and 6 receive the colour with
 * full alpha. 1, or 0 with debug_PeloCodecError 15 for a null image. */
TAVIRPELO_API int TAVIRPELO_FillRawImageWithRgb565(TAVIRPELO_RAWINFO* raw, uint16_t colour565);
TAVIRPELO_API int TAVIRPELO_FillRawImageWithRgb888(TAVIRPELO_RAWINFO* raw, uint8_t r, uint8_t g,
                                                   uint8_t b);

#endif
