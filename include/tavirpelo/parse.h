/* Format detection: what an image source holds, and how large it is. */
#ifndef TAVIRPELO_PARSE_H
#define TAVIRPELO_PARSE_H

#include "tavirpelo/decinfo.h"

/* Header information, nine 32-bit words. */
typedef struct TAVIRPELO_HINFO {
  int width;           /* pixels */
  int height;
  int sourceSize;      /* bytes; 0 in records of the one-call functions */
  int frameCount;      /* images of a GIF, 1 for the other formats */
  int progressive;     /* JPEG: 1 when the frame header is progressive */
  int hasThumbnail;    /* JPEG: 1 when a thumbnail is embedded */
  int thumbnailWidth;  /* JPEG: size of an embedded JPEG thumbnail whose header could be read, else 0 */
  int thumbnailHeight;
  int reserved;
} TAVIRPELO_HINFO;

/* Detects the format and fills `hinfo` (may be null) and the object's image size. Returns the format
 * code, 0 when unreadable or unknown: gTAVIRPELO_Error 1 (null object), 4 (memory), 5 (header
 * unreadable), or none for an unrecognised source. A code says nothing about whether the pixels decode.
 * Films and HEIC pictures pass for wireless bitmaps of no width: TAVIRPELO_LastError then names them. */
TAVIRPELO_API int TAVIRPELO_Parser(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* hinfo);

/* One-call forms. Format code or 0; debug_PeloCodecError 15 for null arguments, 12 for size 0. */
TAVIRPELO_API int TAVIRPELO_ParseFromFile(const char* path, TAVIRPELO_HINFO* record);
TAVIRPELO_API int TAVIRPELO_ParseFromBuffer(void* buffer, int size, TAVIRPELO_HINFO* record);

/* The same without argument checks; `record` may be null, its sourceSize stays as it was. */
TAVIRPELO_API int elo_parse_from_file(const char* path, TAVIRPELO_HINFO* record);
TAVIRPELO_API int elo_parse_from_buffer(void* buffer, int size, TAVIRPELO_HINFO* record);

#endif
