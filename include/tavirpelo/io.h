/*
 * The codec's input sources and its OS layer.
 *
 * A decoder reads a file, a memory block or a caller's stream through one TAVIRPELO_IO. Sizes and
 * positions are bytes in signed 32 bits, so a source holds at most 2 GiB - 1.
 */
#ifndef TAVIRPELO_IO_H
#define TAVIRPELO_IO_H

#include <stddef.h>
#include <stdio.h>

#include "tavirpelo/api.h"

/* Source kinds (TAVIRPELO_IO.ioType). */
enum {
  TAVIRPELO_IO_FILE = 0,   /* a file named by a path, opened and closed here */
  TAVIRPELO_IO_MEMORY = 1, /* a memory block, borrowed from the caller */
  TAVIRPELO_IO_HANDLE = 2, /* a FILE* opened by the caller: seeking and telling only */
  TAVIRPELO_IO_STREAM = 4  /* a caller's stream behind three callbacks */
};

/* Delivers up to `length` bytes into `destination`; returns the number delivered. Any number above 0
 * will do, however much was asked for: readers ask again for the rest. 0 or less ends the data. */
typedef int (*TAVIRPELO_READFN)(void* context, void* destination, int length);
/* Advances the stream by `count` bytes (`unused` is 0); returns the new position. */
typedef int (*TAVIRPELO_SKIPFN)(void* context, int unused, int count);
/* Returns the stream to its start (both integers are 0); the result is ignored. */
typedef int (*TAVIRPELO_RESETFN)(void* context, int unused1, int unused2);

/* An input source. Created by TAVIRPELO_Open_IO or TAVIRPELO_Open_Stream, closed by
 * TAVIRPELO_Close_IO; belongs to one decoder information object. */
typedef struct TAVIRPELO_IO {
  int ioType;      /* source kind */
  void* pSource;   /* memory: the caller's block; stream: its context; others: a decoder's scratch */
  FILE* hFile;     /* file and handle kinds */
  int size;        /* bytes in the source */
  int position;    /* read position; absolute in the stream for the handle kind */
  int base;        /* handle kind: stream position at opening; 0 otherwise */
  int readSize;    /* preferred chunk of decoders that read in chunks; 4096 after opening */
  TAVIRPELO_READFN pfRead;
  TAVIRPELO_SKIPFN pfSkip;
  TAVIRPELO_RESETFN pfReset;
} TAVIRPELO_IO;

struct TAVIRPELO_DECINFO;

/* Opens a source: a path (kind 0, `size` 0 measures the file), a block of `size` bytes (kind 1) or a
 * FILE* at its current position (kind 2, `size` bytes). Null on failure, with gTAVIRPELO_Error 4 (no
 * memory), 11 (unknown kind), 12 (memory block of size 0), 13 (file cannot be opened, bad handle), 1
 * (null memory block), or without a code for a file that is empty or cannot be measured. */
TAVIRPELO_API TAVIRPELO_IO* TAVIRPELO_Open_IO(int ioType, void* source, int size);

/* Opens a callback stream of `size` bytes; null and error 4 when memory is short. */
TAVIRPELO_API TAVIRPELO_IO* TAVIRPELO_Open_Stream(void* context, TAVIRPELO_READFN pfRead,
                                                  TAVIRPELO_SKIPFN pfSkip, TAVIRPELO_RESETFN pfReset,
                                                  int size);

/* Reads up to `length` bytes; returns the count (0 at the end), -1 for a kind that cannot be read or a
 * null object. */
TAVIRPELO_API int TAVIRPELO_Read_IO(TAVIRPELO_IO* io, void* destination, int length);

/* Moves the read position as fseek does (`whence` 0 start, 1 current, 2 end). Returns the new position
 * or -1. Memory sources clamp to their size; a file's refused seek returns the position it kept. */
TAVIRPELO_API int TAVIRPELO_Seek_IO(TAVIRPELO_IO* io, int offset, int whence);

/* Position relative to the source's start; -1 for null. */
TAVIRPELO_API int TAVIRPELO_Tell_IO(const TAVIRPELO_IO* io);

/* Releases the object, and the file of kind 0. Returns 1, or 0 (nothing released) for an unknown kind
 * or null. */
TAVIRPELO_API int TAVIRPELO_Close_IO(TAVIRPELO_IO* io);

/* Sets the preferred chunk size of the object's source; 0 when either object is missing, else 1. */
TAVIRPELO_API int TAVIRPELO_SetStreamReadSize(struct TAVIRPELO_DECINFO* decInfo, int readSize);

/* Discards the text. */
TAVIRPELO_API void TAVIRPELO_PrintMessage(const char* text);

/* ---- OS layer: memory ---- */

/* malloc, but null for size 0. */
TAVIRPELO_API void* TAVIRPELO_OsMalloc(size_t size);
TAVIRPELO_API void TAVIRPELO_OsFree(void* pointer);
TAVIRPELO_API void* TAVIRPELO_OsRealloc(void* pointer, size_t size);
TAVIRPELO_API void* TAVIRPELO_OsMemcpy(void* destination, const void* source, size_t size);
TAVIRPELO_API void* TAVIRPELO_OsMemset(void* destination, int value, size_t size);

/* ---- OS layer: files ---- */

/* fopen, but null for a null path, and for reading alone from regular files only: directories, pipes and
 * devices are refused at once, behind links too. */
TAVIRPELO_API FILE* TAVIRPELO_OsFopen(const char* path, const char* mode);
TAVIRPELO_API size_t TAVIRPELO_OsFread(void* buffer, size_t size, size_t count, FILE* stream);
TAVIRPELO_API size_t TAVIRPELO_OsFwrite(const void* buffer, size_t size, size_t count, FILE* stream);
TAVIRPELO_API int TAVIRPELO_OsFseek(FILE* stream, long offset, int whence);
TAVIRPELO_API long TAVIRPELO_OsFtell(FILE* stream);
TAVIRPELO_API int TAVIRPELO_OsFclose(FILE* stream);

/* The value TAVIRPELO_OpenFile returns instead of null. */
#ifdef __cplusplus
#define TAVIRPELO_INVALID_FILE (reinterpret_cast<FILE*>(static_cast<ptrdiff_t>(-1)))
#else
#define TAVIRPELO_INVALID_FILE ((FILE*)(ptrdiff_t)-1)
#endif

/* Opens for reading; TAVIRPELO_INVALID_FILE on failure. */
TAVIRPELO_API FILE* TAVIRPELO_OpenFile(const char* path);
/* Bytes read; 0 for a null or invalid stream or a length below 1. */
TAVIRPELO_API int TAVIRPELO_ReadFile(FILE* stream, void* buffer, int length);
/* Seeks, and returns where the stream then stands; -1 for a null or invalid stream or a position beyond
 * 31 bits. */
TAVIRPELO_API int TAVIRPELO_SeekFile(FILE* stream, int offset, int whence);
TAVIRPELO_API int TAVIRPELO_CloseFile(FILE* stream);

/* ---- OS layer: tasks ---- */

/* Starts a thread with default attributes; its identifier, or 0 on failure. */
TAVIRPELO_API unsigned long TAVIRPELO_OsThreadCreate(void* (*routine)(void*), void* argument);
/* Does nothing: hosts that can wait replace it. */
TAVIRPELO_API void TAVIRPELO_OsSleep(int time);
/* Stores 0 in *status: no external request to stop (negative) or to pause (positive). */
TAVIRPELO_API void TAVIRPELO_CheckExStatus(int* status);

#endif
