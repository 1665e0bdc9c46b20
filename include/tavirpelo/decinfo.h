/*
 * The decoder information object: one image source bound to the caller's wishes, and what the parser
 * and the decoders learned about it. Every decode takes it as its first argument.
 */
#ifndef TAVIRPELO_DECINFO_H
#define TAVIRPELO_DECINFO_H

#include <stdint.h>

#include "tavirpelo/io.h"

/* Output pixel formats; bytes in memory order. A decoder writes nothing for a code it does not know. */
enum {
  TAVIRPELO_RGB565 = 0,        /* 16-bit word: R bits 15-11, G 10-5, B 4-0 */
  TAVIRPELO_RGB888 = 1,        /* R, G, B */
  TAVIRPELO_YUV420 = 2,        /* planes Y, Cb, Cr; chroma (w+1)/2 x (h+1)/2 */
  TAVIRPELO_GREY8 = 4,         /* encoder input only */
  TAVIRPELO_ARGB8888 = 5,      /* A, R, G, B */
  TAVIRPELO_RGB565A8 = 6,      /* RGB565 low byte first, alpha byte */
  TAVIRPELO_RGBA8888 = 7,      /* R, G, B, A */
  TAVIRPELO_BGRA8888 = 8,      /* B, G, R, A: a little-endian 0xAARRGGBB word */
  TAVIRPELO_RGB565_DITHER = 9, /* RGB565, 4x4 ordered dither, green in 5 bits */
  TAVIRPELO_BGR565 = 10,       /* GIF only: blue in the top bits */
  TAVIRPELO_BGR888 = 11,       /* GIF only: B, G, R */
  TAVIRPELO_PLACED4 = 12       /* GIF only: four bytes a pixel */
};

/* Option word. */
enum {
  TAVIRPELO_THUMBNAIL_MASK = 0x3,
  TAVIRPELO_THUMBNAIL_IF_ENOUGH = 0,  /* embedded thumbnail when at least as large as the request */
  TAVIRPELO_THUMBNAIL_NEVER = 1,      /* always the main image */
  TAVIRPELO_THUMBNAIL_ANY = 2,        /* embedded thumbnail whenever present */
  TAVIRPELO_THUMBNAIL_TURNED = 3,     /* as 0, turned when its orientation differs; no fallback */
  TAVIRPELO_ROTATE_MASK = 0xC,        /* clockwise */
  TAVIRPELO_ROTATE_0 = 0x0,
  TAVIRPELO_ROTATE_90 = 0x4,
  TAVIRPELO_ROTATE_180 = 0x8,
  TAVIRPELO_ROTATE_270 = 0xC,
  TAVIRPELO_FIT_MASK = 0x700,
  TAVIRPELO_FIT_INSIDE = 0x000,       /* keep proportions, never enlarge, centred */
  TAVIRPELO_FIT_TIGHT = 0x100,        /* rows exactly as long as the produced picture, at the origin */
  TAVIRPELO_FIT_FILL = 0x300,         /* cover the box, crop to its centre */
  TAVIRPELO_FIT_STRETCH = 0x700       /* exactly the requested size */
};

/* Image format codes (imageFormat, results of the parser). */
enum {
  TAVIRPELO_FORMAT_UNKNOWN = 0,
  TAVIRPELO_FORMAT_JPEG = 1,
  TAVIRPELO_FORMAT_BMP = 2,
  TAVIRPELO_FORMAT_PNG = 3,
  TAVIRPELO_FORMAT_GIF = 4,
  TAVIRPELO_FORMAT_WBMP = 5,
  TAVIRPELO_FORMAT_ANIMATED_GIF = 6
};

/* Codes of gTAVIRPELO_Error (and 4 and 1 of gTavirError). */
enum {
  TAVIRPELO_ERROR_NONE = 0,
  TAVIRPELO_ERROR_NULL = 1,           /* null handle or bad argument */
  TAVIRPELO_ERROR_DECODE = 2,         /* a stage of JPEG decoding failed */
  TAVIRPELO_ERROR_MEMORY = 4,
  TAVIRPELO_ERROR_HEADER = 5,         /* header unreadable or cut short */
  TAVIRPELO_ERROR_IO_KIND = 11,
  TAVIRPELO_ERROR_EMPTY_MEMORY = 12,
  TAVIRPELO_ERROR_OPEN = 13,
  TAVIRPELO_ERROR_ZOOM_PRESENT = 17,
  TAVIRPELO_ERROR_ZOOM_CONTROL = 18,
  TAVIRPELO_ERROR_CROP = 24
};

/* Codes of debug_PeloCodecError. */
enum {
  TAVIRPELO_CODEC_RAW_FORMAT = 7,     /* unsupported raw image format, replaced by RGB565 */
  TAVIRPELO_CODEC_FORMAT = 9,         /* unsupported image format or parameter */
  TAVIRPELO_CODEC_SIZE = 12,          /* zero size, or a region outside the image */
  TAVIRPELO_CODEC_ARGUMENT = 15       /* missing argument */
};

/* Last errors, process-wide; no operation clears another's word. */
TAVIRPELO_API int gTAVIRPELO_Error;     /* parser, decoders, crop, scale, zoom */
TAVIRPELO_API int gTavirError;          /* create and destroy of this object */
TAVIRPELO_API int debug_PeloCodecError; /* raw images and the one-call functions */

struct TAVIRPELO_DECINFO;
struct TAVIRPELO_ZOOMINFO;

/* Progress and abort: asked before each step of output rows, of which `currentRow` are complete in this picture
 * or frame. 0 ends the decode, which answers 0 and leaves the rows that are written; nothing else of the object
 * may be touched. A null pointer is never asked. A step is
 *   JPEG        a row of MCUs; rowCounter counts rows at the chosen scale, before they are resized
 *   PNG         an output row; of interlaced pictures, each time that a pass adds pixels to one
 *   GIF         the output rows that one image row makes; one by one by lines and when pixels are averaged
 *   animations  the output rows that one row of the screen makes
 *   BMP, WBMP   an output row
 * and rowCounter repeats currentRow in all formats but JPEG. */
typedef int (*TAVIRPELO_CHECKFN)(struct TAVIRPELO_DECINFO* decInfo, int currentRow, int rowCounter);

/* Progress report: the caller's argument and the percentage done. */
typedef void (*TAVIRPELO_PROGRESSFN)(intptr_t argument, int percent);

typedef struct TAVIRPELO_CALLBACK {
  intptr_t argument;
  TAVIRPELO_PROGRESSFN function;
} TAVIRPELO_CALLBACK;

/* Nineteen words on 32-bit targets. */
typedef struct TAVIRPELO_DECINFO {
  TAVIRPELO_IO* pIO;                    /* owned source */
  int outFormat;                        /* output pixel format */
  uint32_t option;                      /* working option word, read by the decoders */
  uint32_t userOption;                  /* as the caller last set it */
  int decMode;                          /* JPEG decode mode, 0..4 */
  uint32_t reserved6;
  int imageWidth;                       /* source size in pixels */
  int imageHeight;
  int outWidth;                         /* picture produced by the last decode, before rotation */
  int outHeight;
  int scaleDenom;                       /* the GIF decoder's sub-sampling divisor */
  int imageFormat;                      /* found by the last TAVIRPELO_Parser */
  TAVIRPELO_CHECKFN CheckFn;
  struct TAVIRPELO_ZOOMINFO* pZoomInfo; /* zoom state while zooming, else null */
  TAVIRPELO_CALLBACK* pCallback;        /* owned progress record, or null */
  uint32_t reserved16;
  void* pFormatInfo;                    /* state of a row-wise or frame-wise PNG, GIF or BMP decode */
  uint32_t reserved18;
  int pngIterFlag;                      /* 1 during an iterative PNG decode */
} TAVIRPELO_DECINFO;

/* Creates an object over a source (see TAVIRPELO_Open_IO for `ioType`, `source`, `size`). Null on
 * failure: gTavirError 4, or gTAVIRPELO_Error as TAVIRPELO_Open_IO set it. */
TAVIRPELO_API TAVIRPELO_DECINFO* TAVIRPELO_CreateDecInfo(int ioType, void* source, int size,
                                                         int outFormat, uint32_t option);

/* The same over a callback stream of `size` bytes. */
TAVIRPELO_API TAVIRPELO_DECINFO* TAVIRPELO_CreateDecInfoWithStream(
    void* context, int size, TAVIRPELO_READFN pfRead, TAVIRPELO_SKIPFN pfSkip,
    TAVIRPELO_RESETFN pfReset, int outFormat, uint32_t option);

/* Closes the source and frees the object, its zoom state and its progress record. 1, or 0 with
 * gTavirError 1 for null. pFormatInfo is not touched: end or abort a row-wise or animated decode first. */
TAVIRPELO_API int TAVIRPELO_DestroyDecInfo(TAVIRPELO_DECINFO* decInfo);

/* Sets option and userOption; 1, or 0 for null. */
TAVIRPELO_API int TAVIRPELO_SetDecOption(TAVIRPELO_DECINFO* decInfo, uint32_t option);

/* Sets the JPEG decode mode, clamped to 0..4: 0 accurate; 1 faster colour, and finely quantised images
 * requantised; 2 one and 3 two scale steps smaller, enlarged; 4 always 1/8. 1, or 0 for null. */
TAVIRPELO_API int TAVIRPELO_SetDecMode(TAVIRPELO_DECINFO* decInfo, int mode);

/* gTavirError. */
TAVIRPELO_API int TAVIRPELO_GetErrorCode(void);

/* The default CheckFn: always 1. */
TAVIRPELO_API int TAVIRPELO_CheckFn(TAVIRPELO_DECINFO* decInfo, int currentRow, int rowCounter);

/* The zoom engine's CheckFn: 0 on an external stop request, else 1; reports progress at its fourth call
 * and at every third one from there. */
TAVIRPELO_API int TAVIRPELO_ZoomCheckFn(TAVIRPELO_DECINFO* decInfo, int row, int rowCounter);

/* The JPEG decoder's version, 35010. */
TAVIRPELO_API int PELOJ_GetVersion(void);

/* Installs a progress record, replacing an earlier one; 0 for null or when memory is short. */
TAVIRPELO_API int PELOJ_SetCallback(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_PROGRESSFN function,
                                    intptr_t argument);

/* Square root of needed / available in 10-bit fixed point (1024 = 1.0, the most); 0 when either makes
 * no sense. Turns a memory budget into a linear scale. */
TAVIRPELO_API int PELO_GetMaxDecRatio(int needed, int available);

#endif
