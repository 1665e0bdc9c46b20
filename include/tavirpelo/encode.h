/* JPEG encoding: one raw image into a growing memory buffer or a file; baseline, 4:2:0 or grey. */
#ifndef TAVIRPELO_ENCODE_H
#define TAVIRPELO_ENCODE_H

#include <stdint.h>
#include <stdio.h>

#include "tavirpelo/raw.h"

/* A complete APP1 segment, marker included, copied behind APP0. */
typedef struct TAVIRPELO_APP1 {
  const uint8_t* data;
  int length; /* bytes */
} TAVIRPELO_APP1;

/* Where encoded bytes go: a memory block that grows, or a file behind a working buffer. Belongs to the
 * caller, who also releases the buffer of a memory destination; an encoder appends to it and replaces the
 * buffer when it must grow. */
enum { ELO_TO_FILE = 0, ELO_TO_MEMORY = 1 };

typedef struct ELO_DESTINATION {
  int kind;
  int capacity;    /* bytes of the working buffer */
  int used;        /* bytes in it */
  int total;       /* bytes produced; memory: known when the image has ended */
  FILE* file;      /* file kind only */
  uint8_t* buffer; /* memory: from TAVIRPELO_OsMalloc; file: made by the encoder */
} ELO_DESTINATION;

typedef struct TAVIRPELO_ENCOPTION {
  int quality;                /* 1 to 100, clamped */
  const TAVIRPELO_APP1* app1; /* null: none */
  uint32_t reserved;
} TAVIRPELO_ENCOPTION;

/* Encodes formats 0, 1, 2 and 4, sides up to 4999. *buffer comes from TAVIRPELO_OsMalloc and holds *size
 * bytes; on success both describe the JPEG (the buffer may have been replaced), free it with
 * TAVIRPELO_OsFree. 1, or 0: with debug_PeloCodecError 15 for a missing argument (nothing released),
 * otherwise the buffer has been released and both are zero. */
TAVIRPELO_API int TAVIRPELO_EncodeJpegToBuffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer,
                                               int* size, int quality);

/* Encodes into a new file; a failure leaves the partial file. 1, or 0. */
TAVIRPELO_API int TAVIRPELO_EncodeJpegToFile(const TAVIRPELO_RAWINFO* image, const char* path,
                                             int quality);

/* The same without argument checks, and with all options. */
TAVIRPELO_API int elo_enc_jpeg_to_buffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                                         int quality);
TAVIRPELO_API int elo_enc_jpeg_to_file(const TAVIRPELO_RAWINFO* image, const char* path, int quality);
TAVIRPELO_API int elo_enc_jpeg_to_buffer_ex(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                                            const TAVIRPELO_ENCOPTION* options);
TAVIRPELO_API int elo_enc_jpeg_to_file_ex(const TAVIRPELO_RAWINFO* image, const char* path,
                                          const TAVIRPELO_ENCOPTION* options);

#endif
