// Given names of this room that no public header has; each is what the room's own function says.
#pragma once

#include "codec/formats/gif/driver.h"
#include "codec/formats/gif/lzw.h"
#include "codec/formats/gif/output.h"
#include "codec/formats/gif/record.h"
#include "codec/formats/gif/rows.h"
#include "codec/formats/gif/stream.h"

// Composes the image row in the line buffer onto the current screen row, and points the row source at
// what is to be shown. 1.
TAVIRPELO_API int PELOI_MakeFrameLineBuffer(pelo::gif::Record* record);

// A record for the object's source with header read and output geometry computed; null for null
// arguments, negative sizes, a source that is no GIF, a canvas that is too large, or short memory.
TAVIRPELO_API pelo::gif::Record* PELOI_InitializeGIF(TAVIRPELO_DECINFO* decInfo, int width, int height,
                                                     int animated, void* output);

// Each decodes the image that PELOI_SeekImageData found. 1 when its rows are done or its data end early
// (the rest keeps what the output holds), 0 for damaged data, a minimum code size above 11, data that
// end before the source does, or when memory is short.
TAVIRPELO_API int PELOI_DecodeGIFImage(TAVIRPELO_IO* source, pelo::gif::Record* record, void* output);

// Decodes 16 more image rows, 4 while there are more; with `start` 1 only prepares, and answers 4.
TAVIRPELO_API int PELOI_DecodeGIFImageIter(TAVIRPELO_IO* source, pelo::gif::Record* record, void* output,
                                           int start);

// Writes the next `lines` output rows to the start of `output`, 4 while there are more; `start` 1
// prepares first. An interlaced image is decoded whole then, into a plane of its indices.
TAVIRPELO_API int PELOI_DecodeGIFImageLine(TAVIRPELO_IO* source, pelo::gif::Record* record, void* output,
                                           int lines, int start);

// Each writes the current row of an image (its indices stand in the line buffer) or of an animation's
// screen; rows below the screen are ignored. 1.
TAVIRPELO_API int PELOI_WriteGIFOneToOneRow(pelo::gif::Record* record, void* output);
TAVIRPELO_API int PELOI_DownsizeGIFRow(pelo::gif::Record* record, void* output);
TAVIRPELO_API int PELOI_WriteAGIFOneToOneRow(pelo::gif::Record* record, void* output);
TAVIRPELO_API int PELOI_DownsizeAGIFRow(pelo::gif::Record* record, void* output);

// Writes the current row where the record's mode wants it and moves on to the next image row. 1, or 0
// when the caller ends the decode or there is no such interlace pass.
TAVIRPELO_API int PELOI_WriteTheLine(pelo::gif::Record* record, void* output);

// Line mode: writes the next output row, unrotated, when it is made of the current image row. *consumed
// becomes 1 when no further output row is; the current row has then moved on. Answers as the one above.
TAVIRPELO_API int PELOI_GIFMakeOut1Row(pelo::gif::Record* record, void* output, int* consumed);

// Packs `count` (up to 256) R, G, B triples into table entries.
TAVIRPELO_API void PELOI_MakeColorTable(const uint8_t* rgbBytes, int count, uint32_t* table);

// Reads the signature, the logical screen descriptor and the global colour table from the source's
// start. 1, or 0 when it is no GIF or ends before.
TAVIRPELO_API int PELOI_ParseGIFHeader(TAVIRPELO_IO* source, pelo::gif::Record* record);

// Goes on to the next image's data: 1 with its descriptor, tables and minimum code size read, 3 at the
// trailer, 0 for a malformed graphic control extension or the source's end.
TAVIRPELO_API int PELOI_SeekImageData(TAVIRPELO_IO* source, pelo::gif::Record* record);

// Makes `need` bytes stand at *cursor, moving unread ones to the buffer's start and reading behind them.
// 1, or 0 when the source ends before.
TAVIRPELO_API int PELOI_CheckBuffer(int need, TAVIRPELO_IO* source, uint8_t* buffer, int* remaining,
                                    uint8_t** cursor);

// An empty record; null when memory is short.
TAVIRPELO_API pelo::gif::Record* PELOI_CreateGIFDecoderInfo(void);

// Frees a record and all it owns; null is ignored.
TAVIRPELO_API void PELOI_DelGIFDecoderInfo(pelo::gif::Record* record);

// Writes one index.
TAVIRPELO_API void PELOI_WriteCharacter(uint32_t character, int position, uint8_t* lineBuffer);

// Writes the string of a code from `position` on, and up to kStringSlack bytes of anything behind it;
// returns its first index. *errorFlag becomes 1 for a code that cannot exist.
TAVIRPELO_API uint8_t PELOI_TranslateCode(uint32_t code, const pelo::gif::TranslationTable* table,
                                          int position, uint8_t* lineBuffer, int* errorFlag);

// Makes `code` stand for the string of `prefix` (an existing code) with one more index.
TAVIRPELO_API void PELOI_AddToTranslationTable(uint32_t prefix, uint8_t character, uint32_t code,
                                               pelo::gif::TranslationTable* table);

// Fills in the codes 0 to 2^minimumCodeSize + 1, each of one index. 1, or 0 for a size above 11.
TAVIRPELO_API int PELOI_InitializeTransTBL(int minimumCodeSize, pelo::gif::TranslationTable* table);

// Returns its argument.
TAVIRPELO_API uint32_t PELOI_DecoderBufferToOutBit(uint32_t value);

// The R, G, B value between four neighbouring pixels (left, right of the upper row, then of the lower),
// `x` and `y` 256ths of the way right and down (0 to 256), rounded to the nearest.
TAVIRPELO_API void _interpolate_rgb888(const uint8_t* upperLeft, const uint8_t* upperRight,
                                       const uint8_t* lowerLeft, const uint8_t* lowerRight, uint32_t x,
                                       uint32_t y, uint8_t* result);
