// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/png/huffman_table.h"
#include "codec/formats/png/png_context.h"
#include "codec/formats/png/png_driver.h"
#include "codec/formats/png/png_info.h"

// The checksum of a byte array.
TAVIRPELO_API uint32_t __PELOI_PngCrc32(const uint8_t* data, uint32_t length);

// Builds the table of `count` symbols (at most 288) whose code lengths are given (0 to 15; 0 unused) in
// the pool. Alphabet 0 literal/length, 1 distance, 2 code length. Returns its root; null when the
// lengths are over-subscribed or the pool is full. Incomplete sets are accepted: their unassigned codes
// lead to invalid entries.
TAVIRPELO_API const uint32_t* __PELOI_PngBuildHuffmanTable(const uint8_t* lengths, int count,
                                                           int alphabet, PELOI_PNGHUFFMANPOOL* pool);

// Frees a pool and clears its slot.
TAVIRPELO_API void PELOI_FreePNGHuffmanMemory(PELOI_PNGHUFFMANPOOL** pool);

// Undoes one scanline's filter in place; its type stands in the byte before `row`.
TAVIRPELO_API void __PELOI_PngReadFilterRow(PELOI_PNGCONTEXT* context, uint8_t* row,
                                            const uint8_t* previousRow, size_t rowBytes);

// Writes the next output row that the finished scanline gives, if there is one.
TAVIRPELO_API void __PELOI_PngWriteDataToOutputBuffer(PELOI_PNGCONTEXT* context);

// Writes the gathered whole image, rotated, into the output. 1, or 0 when it is cancelled between rows.
TAVIRPELO_API int __PELOI_WriteOutputDataFromINTBuffer(PELOI_PNGCONTEXT* context);

// Sets the pass's size in the information record, and answers the bytes of its rows (0 when it is
// empty).
TAVIRPELO_API uint32_t getPassRowBytes(PELOI_PNGCONTEXT* context, uint32_t fullWidth,
                                       uint32_t fullHeight, int pass);

// Reads the next piece of the image data, at most 4096 bytes and never beyond the chunk of `entryIndex`
// or, when that is used up, the next. 1, or 0 when there is none.
TAVIRPELO_API int __checkbuffer_util1_multiPELOI_IDAT(PELOI_PNGCONTEXT* context,
                                                      PELOI_PNGREADBUFFER* buffer, uint32_t entryIndex);

// Decompress and write until the image ends or the mode says stop: a Result. `total` receives the number
// of bytes decompressed so far.
TAVIRPELO_API int _PELOI_PngInflateZStreamData(PELOI_PNGCONTEXT* context, uint32_t* total);
TAVIRPELO_API int _PELOI_PngInflateZStreamData_streamming(PELOI_PNGCONTEXT* context, uint32_t* total);
TAVIRPELO_API int _PELOI_PngInflateZStreamDataInterlaced(PELOI_PNGCONTEXT* context, uint32_t* total);
TAVIRPELO_API int _PELOI_PngInflateZStreamDataInterlaced_streamming(PELOI_PNGCONTEXT* context,
                                                                    uint32_t* total);

// One call of a decode: whole (lines 0) or the next `lines` output rows, which then are all that
// `output` has room for. A Result; a picture too small to have any pixel is kDone. Only kMore leaves the
// state in place.
TAVIRPELO_API int PELOI_FastImgDecodePng(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                         int lines);

// Releases the object's PNG state, if it holds one; 1.
TAVIRPELO_API int PELOI_DestroyDecodePng(TAVIRPELO_DECINFO* decInfo);

// 1 when the PNG needs alpha: its colour type carries some, or it has a tRNS chunk (as far as it can be
// parsed); 0 otherwise. Releases a PNG state that the object holds.
TAVIRPELO_API int PELOI_GetAlphaTrFlag(TAVIRPELO_DECINFO* decInfo);

// Reads the chunks from the source's start to the first empty chunk; their data are checked, not
// decompressed. A Result: 1, 6 (a checksum differs), 7, 8.
TAVIRPELO_API int __PELOI_PngParserMain(PELOI_PNGINFO* info, PELOI_PNGREADBUFFER* buffer);

// Reads the `length` bytes of a tRNS chunk at the cursor into the palette's alpha or the colour key. 1;
// 3 before any IHDR; 6 for a colour type or length that allows none; 8 when the read fails or there are
// more values than palette entries. The chunk type is not looked at.
TAVIRPELO_API int __PELOI_PngParseTRNSbKGd(PELOI_PNGINFO* info, PELOI_PNGREADBUFFER* buffer,
                                           uint32_t length, uint32_t chunkType,
                                           std::array<uint16_t, 3>* colourKey);

// A big-endian 32-bit value.
TAVIRPELO_API uint32_t __PELOI_PngGetUINT32(const uint8_t* bytes);

// Refills an empty buffer; 1, or 11 when `need` exceeds 4096, the source is memory or has no more.
TAVIRPELO_API int __checkbuffer_util1(PELOI_PNGREADBUFFER* buffer, uint32_t need);

// Moves the unread bytes to the base and fills the rest; 1, or 11 when `need` more bytes exceed 4096,
// the source is memory or has no more.
TAVIRPELO_API int __checkbuffer_util2(PELOI_PNGREADBUFFER* buffer, uint32_t need);

// ---- without a caller in the library ----

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

// The blending of codec/pixel/paint.h.
TAVIRPELO_API uint8_t APPLY_ALPHA_BYTE_TO_BYTE(uint32_t foreground, uint32_t alpha, uint32_t background);
TAVIRPELO_API uint16_t APPLY_ALPHA_RGB_TO_SHORT(uint32_t red, uint32_t green, uint32_t blue,
                                                uint32_t alpha, uint32_t background565);
