/* Why the calling thread's last operation failed: the words of decinfo.h in sentences. */
#ifndef TAVIRPELO_ERROR_H
#define TAVIRPELO_ERROR_H

#include "tavirpelo/api.h"

/* The process-wide word that a failure was written to. */
enum {
  TAVIRPELO_WORD_NONE = 0,     /* the operation has none, or did not fail */
  TAVIRPELO_WORD_DECODING = 1, /* gTAVIRPELO_Error */
  TAVIRPELO_WORD_OBJECT = 2,   /* gTavirError */
  TAVIRPELO_WORD_CODEC = 3     /* debug_PeloCodecError */
};

/* What went wrong, finer than the codes of the words. */
enum {
  TAVIRPELO_REASON_NONE = 0,
  TAVIRPELO_REASON_ARGUMENT = 1, /* a missing object, buffer or result, or a size that makes no sense */
  TAVIRPELO_REASON_NO_MEMORY = 2,
  TAVIRPELO_REASON_NOT_FOUND = 3, /* no file of this name */
  TAVIRPELO_REASON_PERMISSION = 4,
  TAVIRPELO_REASON_NOT_A_FILE = 5,  /* a directory, a pipe or a device */
  TAVIRPELO_REASON_CANNOT_OPEN = 6, /* for another reason of the system */
  TAVIRPELO_REASON_EMPTY = 7,
  TAVIRPELO_REASON_SOURCE = 8, /* a kind of source that the operation does not read */
  TAVIRPELO_REASON_UNKNOWN_FORMAT = 9,
  TAVIRPELO_REASON_FOREIGN_FORMAT = 10, /* recognised, but not read: the text names it */
  TAVIRPELO_REASON_TOO_LARGE = 11,      /* more than 5000 pixels a side: the text has the size */
  TAVIRPELO_REASON_ZERO_SIZE = 12,
  TAVIRPELO_REASON_CMYK = 13, /* a JPEG of four components; of another number: VARIANT */
  TAVIRPELO_REASON_ARITHMETIC = 14,
  TAVIRPELO_REASON_TWELVE_BIT = 15,
  TAVIRPELO_REASON_LOSSLESS = 16,
  TAVIRPELO_REASON_VARIANT = 17,   /* of a format that is read, one that is not */
  TAVIRPELO_REASON_TRUNCATED = 18, /* the data end before the picture begins */
  TAVIRPELO_REASON_DAMAGED = 19,
  TAVIRPELO_REASON_BLOCK_LIMIT = 20,     /* a row or canvas above 256 MiB */
  TAVIRPELO_REASON_CANCELLED = 21,       /* by the caller's progress function */
  TAVIRPELO_REASON_REQUEST_CHANGED = 22, /* a call of several asked for something else than the first */
  TAVIRPELO_REASON_OUTPUT_FORMAT = 23,   /* a pixel format that the operation does not write or read */
  TAVIRPELO_REASON_NOT_WRITABLE = 24,
  TAVIRPELO_REASON_DISK_FULL = 25
};

typedef struct TAVIRPELO_ERROR {
  int word;          /* TAVIRPELO_WORD_... */
  int code;          /* what the word received; 0 for none */
  int reason;        /* TAVIRPELO_REASON_...; NONE when the last operation did not fail */
  const char* stage; /* what was being done, in English; never null, valid for ever */
  char text[160];    /* one English sentence without a full stop; empty without a failure */
} TAVIRPELO_ERROR;

/* Describes the calling thread's last failure. Every public operation of the codec clears it when it
 * starts, but for this one, TAVIRPELO_ErrorText and those that only read or release. 1 when there is a
 * failure to tell, else 0; `out` is filled in both cases, and may be null. */
TAVIRPELO_API int TAVIRPELO_LastError(TAVIRPELO_ERROR* out);

/* The general sentence of a reason; "unknown error" for a number that is none. Never null. */
TAVIRPELO_API const char* TAVIRPELO_ErrorText(int reason);

#endif
