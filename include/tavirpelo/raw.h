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

/* ---- pixels over pixels ---- */

/* Blends a source with alpha into a destination at pixel (x, y). Format 6: RGB565 and alpha over RGB565;
 * format 5: three colour bytes and alpha over three bytes a pixel. Rows are packed. 1, or 0 with
 * debug_PeloCodecError 15 (null), 9 (format), 12 (a size below 1, or not inside the destination). */
TAVIRPELO_API int TAVIRPELO_CODEC_Blend(const void* src, void* dst, int srcWidth, int srcHeight,
                                        int dstWidth, int dstHeight, int x, int y, int format);

/* Copies the 32-bit pixels whose mask byte is not 0; mask rows are `width` bytes. 1. */
TAVIRPELO_API int Tavir_Clipping(const void* src, void* dst, const uint8_t* mask, int strideBytes, int width,
                                 int height);

/* Rotates an image of format 0, 1 or 7 clockwise about its centre by degrees into a buffer of its size; what
 * comes from outside leaves the buffer's pixels. 1, or 0 with debug_PeloCodecError 15 for a missing
 * argument. elo_codec_rotation does not check. */
TAVIRPELO_API int TAVIRPELO_CODEC_Rotation(const TAVIRPELO_RAWINFO* raw, void* dst, int degrees);
TAVIRPELO_API int elo_codec_rotation(const TAVIRPELO_RAWINFO* raw, void* dst, int degrees);

/* ---- scaling ---- */

/* Scales the source to scaledWidth x scaledHeight and shows that picture in the destination, cropped where
 * it is larger. Strides in bytes. Formats 0, 1 and 5; anchor 0 centre, 1 left top, 2 right top, 3 left
 * bottom, 4 right bottom; quality 0 nearest sample, 1 average of four, which in formats 1 and 5 is added to
 * what the destination holds. 1, or 0 with debug_PeloCodecError 15 (null, a size below 1), 9 (format,
 * anchor, quality), none (a scaled size below 1). */
TAVIRPELO_API int TAVIRPELO_CODEC_Scale(const void* src, void* dst, int srcWidth, int srcHeight,
                                        int srcStride, int dstWidth, int dstHeight, int dstStride,
                                        int scaledWidth, int scaledHeight, int format, int anchor,
                                        int quality);

/* Whole pictures; strides in pixels. Null pointers and sizes below 1 do nothing. */

/* RGB565 averages: PELO_UpScale when a side grows, else PELO_DownScale. */
TAVIRPELO_API void PELO_Scale_ex(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                 int dstWidth, int dstHeight, int dstStride);
/* RGB565 nearest samples: PELO_UpScale_1sample or PELO_DownScale_1sample. */
TAVIRPELO_API void PELO_FastScale_ex(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                     int dstWidth, int dstHeight, int dstStride);
/* RGB888 averages: PELO_RGB888UpScale or PELO_RGB888DownScale. */
TAVIRPELO_API void PELO_RGB888Scale_ex(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                       int dstWidth, int dstHeight, int dstStride);
/* The members these choose. */
TAVIRPELO_API void PELO_UpScale(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                int dstWidth, int dstHeight, int dstStride);
TAVIRPELO_API void PELO_DownScale(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                  int dstWidth, int dstHeight, int dstStride);
TAVIRPELO_API void PELO_RGB888UpScale(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                      int dstWidth, int dstHeight, int dstStride);
TAVIRPELO_API void PELO_RGB888DownScale(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                        int dstWidth, int dstHeight, int dstStride);
TAVIRPELO_API void PELO_UpScale_1sample(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                        int dstWidth, int dstHeight, int dstStride);
TAVIRPELO_API void PELO_DownScale_1sample(const void* src, int srcWidth, int srcHeight, int srcStride, void* dst,
                                          int dstWidth, int dstHeight, int dstStride);

/* ---- cropping of RGB565 pictures ---- */

typedef struct TAVIRPELO_CROPRECT {
  int imageWidth, imageHeight;
  int x, y, width, height;
} TAVIRPELO_CROPRECT;

/* The crop, scaled until it touches the dstWidth x dstHeight destination from inside, or with
 * TAVIRPELO_FIT_STRETCH to exactly its size; centred when the option names no fitting, else at its first
 * pixel. 1, or 0 with gTAVIRPELO_Error 1 (null, a crop not inside the image), none (an empty
 * destination). */
TAVIRPELO_API int TAVIRPELO_Crop(const void* src, const TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth,
                                 int dstHeight, uint32_t option);

/* The same of a whole picture. */
TAVIRPELO_API int TAVIRPELO_Scale(const void* src, int srcWidth, int srcHeight, void* dst, int dstWidth,
                                  int dstHeight, uint32_t option);

/* Decodes a JPEG file into width x height RGB565 pixels, fitted inside. 1 or 0. */
TAVIRPELO_API int TAVIRPELO_CropDecoding(const char* path, void* outBuffer, int width, int height);

/* The crop of a JPEG file, decoded no larger than it takes; the decoded picture and 200000 bytes must be
 * within memoryLimit. An image size of 0 in rect is read from the file and stored. 1, or 0 with
 * gTAVIRPELO_Error 1 (bad argument or file), 4 (memory), 24 (decoding). */
TAVIRPELO_API int TAVIRPELO_CropFromImage(const char* path, TAVIRPELO_CROPRECT* rect, void* dst,
                                          int dstWidth, int dstHeight, uint32_t option, int memoryLimit);

#endif
