/*
 * Decoding: one call from a file or a byte buffer into a raw image, and the JPEG decoder on a decoder
 * information object.
 */
#ifndef TAVIRPELO_DECODE_H
#define TAVIRPELO_DECODE_H

#include "tavirpelo/decinfo.h"
#include "tavirpelo/raw.h"

/* ---- one-call decoding ----
 * The picture is placed in `raw` (its size and format) as the option word says. 1, or 0 with
 * debug_PeloCodecError 15 (null source, raw image or pixels), 12 (length 0), 9 (unknown or unsupported
 * format). Pixels may be partly written after a failure. */

/* Detect the format first. */
TAVIRPELO_API int TAVIRPELO_DecodeImageFromFile(const char* path, TAVIRPELO_RAWINFO* raw,
                                                uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeImageFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                  uint32_t option);

/* Of one format. */
TAVIRPELO_API int TAVIRPELO_DecodeJpegFromFile(const char* path, TAVIRPELO_RAWINFO* raw,
                                               uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeJpegFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                 uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodePngFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodePngFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeGifFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeGifFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeBmpFromFile(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeBmpFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeWBmpFromFile(const char* path, TAVIRPELO_RAWINFO* raw,
                                               uint32_t option);
TAVIRPELO_API int TAVIRPELO_DecodeWBmpFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                 uint32_t option);

/* The same without argument checks. */
TAVIRPELO_API int elo_dec_jpeg_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int elo_dec_jpeg_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                           uint32_t option);
TAVIRPELO_API int elo_dec_png_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int elo_dec_png_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                          uint32_t option);
TAVIRPELO_API int elo_dec_gif_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int elo_dec_gif_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                          uint32_t option);
TAVIRPELO_API int elo_dec_bmp_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int elo_dec_bmp_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                          uint32_t option);
TAVIRPELO_API int elo_dec_wbmp_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option);
TAVIRPELO_API int elo_dec_wbmp_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                           uint32_t option);

/* Decode the next frame of an animated GIF, composed. *handle is null before the first frame, and the
 * source, size and format stay the same from frame to frame. 1 when more frames may follow; 3 with the last
 * one; 0 on failure: with 3 and 0 *handle is null again. A caller that stops earlier ends the operation with
 * TAVIRPELOI_AborAGIF and TAVIRPELO_DestroyDecInfo. */
TAVIRPELO_API int TAVIRPELO_DecodeAGifFromFile(const char* path, TAVIRPELO_RAWINFO* raw,
                                               uint32_t option, TAVIRPELO_DECINFO** handle);
TAVIRPELO_API int TAVIRPELO_DecodeAGifFromBuffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                                 uint32_t option, TAVIRPELO_DECINFO** handle);
TAVIRPELO_API int elo_dec_agif_from_file(const char* path, TAVIRPELO_RAWINFO* raw, uint32_t option,
                                         TAVIRPELO_DECINFO** handle);
TAVIRPELO_API int elo_dec_agif_from_buffer(void* buffer, int length, TAVIRPELO_RAWINFO* raw,
                                           uint32_t option, TAVIRPELO_DECINFO** handle);

/* Decodes by the decoder of decInfo->imageFormat, which TAVIRPELO_Parser has found: the whole picture, of an
 * animation its first image, into width x height pixels of decInfo->outFormat. 1, or 0 as that decoder says;
 * also for a null object and for an unknown format. */
TAVIRPELO_API int TAVIRPELO_DecodeParsed(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

/* ---- JPEG in bands ----
 * A picture of any size, stretched to exactly width x height, decoded a band of rows at a time: memory
 * holds one row of blocks and the caller's band. The rows equal those of TAVIRPELO_DecodeJPEG with
 * TAVIRPELO_FIT_STRETCH and TAVIRPELO_THUMBNAIL_NEVER; rotation does not apply. */

struct PELOJ_JDINFO;

/* Starts a decode of the object's source in a pixel format. The object must outlive the state and is not
 * to be used for anything else meanwhile; its outFormat and fitting stay changed. Null on failure, with a
 * line in the log. */
TAVIRPELO_API struct PELOJ_JDINFO* __elo_jpeg_dec_line_init(TAVIRPELO_DECINFO* decInfo, int width,
                                                            int height, int outFormat);

/* Decodes the next `rows` rows (fewer at the picture's end) into planes[0], packed; TAVIRPELO_YUV420 has
 * three planes, and a band then brings the chroma of its even picture rows. 1, also behind the last row,
 * for no rows, and when the data ends within the last 16 rows, which stay as they were; 0 when the data is
 * damaged or CheckFn aborts: the state is gone then, and so is it for null. */
TAVIRPELO_API int __elo_jpeg_dec_line_process(struct PELOJ_JDINFO* state, uint8_t* const* planes, int rows);

/* Ends a decode at any point, and releases the state; null is ignored. */
TAVIRPELO_API void __elo_jpeg_dec_line_finish(struct PELOJ_JDINFO* state);

/* ---- JPEG on a decoder information object ---- */

/* Decodes into a buffer of reqWidth x reqHeight pixels of decInfo->outFormat, fitted and rotated by
 * decInfo->option. With TAVIRPELO_FIT_TIGHT the buffer holds exactly the produced picture. 1, or 0 with
 * gTAVIRPELO_Error 2 or 4 (or none) and a line in the log. Damaged or short data gives 1 with what there is:
 * the rows decoded so far, or of a picture in several scans all rows from the scans that came. */
TAVIRPELO_API int TAVIRPELO_DecodeJPEG(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth,
                                       int reqHeight);

/* Decodes the embedded JPEG thumbnail tightly; it is at most reqWidth x reqHeight, its size is stored in
 * *outWidth and *outHeight. 1, or 0 (no thumbnail, failure). decInfo->option keeps the tight fitting. */
TAVIRPELO_API int PELOJ_DecodeThumbnail(TAVIRPELO_DECINFO* decInfo, void* outBuffer, int reqWidth,
                                        int reqHeight, int* outWidth, int* outHeight);

/* Uncompressed thumbnails are never decoded: does nothing, 1. */
TAVIRPELO_API int PELOJ_DecodeUncompressThumbnail(void);

/* Size of the last produced picture, before rotation; 1. */
TAVIRPELO_API int PELOJ_GetDecSize(const TAVIRPELO_DECINFO* decInfo, int* width, int* height);

/* Turn a packed width x height picture by a quarter, clockwise and back, into its own buffer. 0 when the
 * format is none of 0, 1 and 9 or a copy of the picture finds no memory, otherwise 1. */
TAVIRPELO_API int PELOJ_RotateImage90(void* buffer, int width, int height, int outFormat);
TAVIRPELO_API int PELOJ_RotateImage270(void* buffer, int width, int height, int outFormat);

/* ---- PNG on a decoder information object ----
 *
 * Output formats 0, 1 and 5 to 8; with others the size is found and nothing is written. The picture is
 * written at its own size when it fits the width x height box, else shrunk into it, centred; with
 * TAVIRPELO_FIT_STRETCH it fills the box, with TAVIRPELO_FIT_TIGHT the buffer holds exactly the picture.
 * Formats 0 and 1 show transparent pixels over what the buffer holds; the others store their alpha.
 * Rotation is not applied, except to resampled interlaced pictures whose option bits 12 to 13 are 1: these
 * are gathered whole first. From memory, several IDAT chunks are merged inside the caller's buffer, which
 * therefore must be writable. */

/* Decodes the whole picture. 1, or 0. */
TAVIRPELO_API int TAVIRPELOI_DecodePNG(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

/* Decodes the next `lines` output rows into the first rows of `output` (0: all of them). 1 when the picture
 * is complete, 4 when rows remain, 0 on failure. Interlaced pictures: only with `lines` equal to their
 * height. */
TAVIRPELO_API int TAVIRPELOI_DecodePNGLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                           int lines);

/* Decodes one block of compressed data. 1 when the picture is complete, 4 when data remain, 0 on
 * failure. */
TAVIRPELO_API int TAVIRPELOI_DecodePNGIter(TAVIRPELO_DECINFO* decInfo, void* output, int width,
                                           int height);

/* End a decode by lines or blocks before its picture is complete. 1, or 0 for null or another format's
 * state. */
TAVIRPELO_API int TAVIRPELOI_DestroyPNGInfo(TAVIRPELO_DECINFO* decInfo);
TAVIRPELO_API int TAVIRPELOI_AbortPNGIter(TAVIRPELO_DECINFO* decInfo);

/* ---- GIF on a decoder information object ----
 * `output` is a buffer of width x height pixels of decInfo->outFormat (0, 1, 5, 7, 8, 10 or 11; for
 * others the picture is decoded and nothing written), fitted and rotated by decInfo->option; fill acts
 * as fit inside. Transparent pixels are zero bytes. A picture reduced on both sides is averaged; one
 * that is not turned then fills a box smaller than its reduced size whole. Where the image does not reach, or
 * its data give no row, a picture reduced on both sides is zero bytes, unless it comes by lines; any other
 * keeps the buffer's. decInfo->outWidth and outHeight receive the size before rotation.
 * Operations of several calls hold their state in decInfo->pFormatInfo and want the same width, height,
 * format and option each time: a different request ends them with 0, and another decoder's state is
 * answered with 0. 0 also means: null, negative size, no GIF, damaged data, a screen, row or plane
 * above 256 MiB, short memory. A file cut inside the image is decoded as far as it goes. */

/* Decodes the first image; ends a GIF operation that the object holds. 1 or 0. */
TAVIRPELO_API int TAVIRPELOI_DecodeGIF(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

/* Decodes the next `lines` (at least 1) rows of outHeight to the start of `output`, which holds that
 * many rows of `width` pixels: unrotated, centred from left to right only. 1, with pFormatInfo null once
 * all rows are done (a further call starts over); 0 on failure. */
TAVIRPELO_API int TAVIRPELOI_DecodeGIFLine(TAVIRPELO_DECINFO* decInfo, void* output, int width,
                                           int height, int lines);

/* The first image in steps: the first call prepares, each later one decodes 16 image rows. 4 while
 * there are more, 1 at the end, also when the data turn out damaged; 0 when the first call fails or CheckFn
 * ends the decode. */
TAVIRPELO_API int TAVIRPELOI_DecodeGIFIter(TAVIRPELO_DECINFO* decInfo, void* output, int width,
                                           int height);

/* The next frame of an animation, every row of the screen composed from the frames so far; pixels that
 * none has painted are zero bytes. 1: another frame follows; 3: this was the last one; 0: failure, also
 * a file that ends behind this frame without a trailer. */
TAVIRPELO_API int TAVIRPELOI_DecodeAGIF(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

/* The same in steps of 16 image rows: 4 until the frame is complete. */
TAVIRPELO_API int TAVIRPELOI_DecodeAGIFIter(TAVIRPELO_DECINFO* decInfo, void* output, int width,
                                            int height);

/* End an operation of several calls and release its state. 1, or 0 for null or another decoder's state. */
TAVIRPELO_API int TAVIRPELOI_AbortGIFIter(TAVIRPELO_DECINFO* decInfo);
TAVIRPELO_API int TAVIRPELOI_AborAGIF(TAVIRPELO_DECINFO* decInfo);

/* ---- BMP and WBMP on a decoder information object ----
 *
 * BMP: file and memory sources of 1, 4, 8, 16, 24 and 32 bits a pixel without compression, in output formats
 * 0, 1 and 5 to 8; with others nothing is written. Placed in the width x height buffer like a JPEG, never
 * filled; turned by the option word; larger pictures are averaged down. Rows that the source lacks keep what
 * the buffer held. */

/* Decodes the whole picture. 1, or 0 for headers that are damaged or not supported, and when CheckFn says so. */
TAVIRPELO_API int TAVIRPELOI_DecodeBMP(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

/* Decode the next `lines` (100) output rows; all calls get the same buffer and sizes. 1 for progress, with
 * decInfo->pFormatInfo null when the picture is complete; DecodeBMPIter answers 4 until then. 0 on
 * failure. */
TAVIRPELO_API int TAVIRPELOI_DecodeBMPIterLine(TAVIRPELO_DECINFO* decInfo, void* output, int width,
                                               int height, int lines);
TAVIRPELO_API int TAVIRPELOI_DecodeBMPLine(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height,
                                           int lines);
TAVIRPELO_API int TAVIRPELOI_DecodeBMPIter(TAVIRPELO_DECINFO* decInfo, void* output, int width,
                                           int height);

/* Ends a decode by rows before its picture is complete. 1, or 0 for null or another format's state. */
TAVIRPELO_API int TAVIRPELOI_AbortBMPIter(TAVIRPELO_DECINFO* decInfo);

/* Decodes a wireless bitmap (type 0) of a file or memory source in output format 0 or 1; with others nothing
 * is written. Centred; only the option word TAVIRPELO_FIT_STRETCH matters. 1, or 0 for a damaged header or
 * a source shorter than the picture. */
TAVIRPELO_API int TAVIRPELOI_DecodeWBMP(TAVIRPELO_DECINFO* decInfo, void* output, int width, int height);

#endif
