// Exported helpers that nothing in the decoder needs; callers may.
#pragma once

#include <cstdint>

#include "codec/formats/png/png_context.h"

// A list of text blocks.
typedef struct PELOI_PNGTEXT {
  void* text;
  void* key;
  struct PELOI_PNGTEXT* next;
} PELOI_PNGTEXT;

// Frees each entry and its text block, all from the OS layer.
TAVIRPELO_API void __PELOI_PngFreeTextList(PELOI_PNGTEXT* head);

// A record of eleven words, the tenth telling whether the eleventh owns a block.
typedef struct PELOI_PNGTRINFO {
  uint32_t fields[9];
  uint32_t ownsBlock;
  void* block;
} PELOI_PNGTRINFO;

// Zero-filled; null when memory is short.
TAVIRPELO_API PELOI_PNGTRINFO* PELOI_FastImgCreatePngTrInfo(void);
TAVIRPELO_API void PELOI_FastImgDestroyPngTrInfo(PELOI_PNGTRINFO* info);

// `count` bits (at most 32) of a byte array from a bit position (0 the lowest of its byte), first bit
// lowest.
TAVIRPELO_API uint32_t __PELOI_PngReadBits(const uint8_t* bytes, uint32_t bytePosition,
                                           uint32_t bitPosition, uint32_t count);

// Does nothing; 1.
TAVIRPELO_API int __PELOI_NearestInterpolateOutput(PELOI_PNGCONTEXT* context, void* output,
                                                   uint32_t outWidth, uint32_t outHeight);

// Average four samples for each output pixel: those a quarter and three quarters along its span in each
// of two rows, every channel shifted right by two before adding. 32bit: pixels of four channels. 24bit:
// of three. 24bit_TR: samples of the context's colour key take no part, and a pixel of none but these
// stays as it was.
TAVIRPELO_API void __PELOI_PngResize_32bit(const PELOI_PNGCONTEXT* context, const uint8_t* upper,
                                           const uint8_t* lower, uint32_t sourceWidth, uint32_t outWidth,
                                           uint8_t* output);
TAVIRPELO_API void __PELOI_PngResize_24bit(const PELOI_PNGCONTEXT* context, const uint8_t* upper,
                                           const uint8_t* lower, uint32_t sourceWidth, uint32_t outWidth,
                                           uint8_t* output);
TAVIRPELO_API void __PELOI_PngResize_24bit_TR(const PELOI_PNGCONTEXT* context, const uint8_t* upper,
                                              const uint8_t* lower, uint32_t sourceWidth,
                                              uint32_t outWidth, uint8_t* output);

// The blending of codec/pixel/blend.h.
TAVIRPELO_API uint8_t APPLY_ALPHA_BYTE_TO_BYTE(uint32_t foreground, uint32_t alpha, uint32_t background);
TAVIRPELO_API uint16_t APPLY_ALPHA_RGB_TO_SHORT(uint32_t red, uint32_t green, uint32_t blue,
                                                uint32_t alpha, uint32_t background565);
