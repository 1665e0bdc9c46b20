/* Changing JPEG data without going through pixels: turning and mirroring, and fitting into a number of
 * bytes. */
#ifndef TAVIRPELO_TRANSFORM_H
#define TAVIRPELO_TRANSFORM_H

#include "tavirpelo/encode.h"

/* A turn that is done in steps. */
typedef struct ELO_TRANSFORMSTATE {
  int started;   /* 0 before the first call; the rest may be anything then */
  int resume;    /* the next call goes on */
  void* context; /* what is kept between calls */
} ELO_TRANSFORMSTATE;

/* Turns a baseline JPEG of width x height pixels (YCbCr or grey, as its header says) clockwise by angle 90,
 * 180 or 270 and before that, with flip not 0, mirrors it from left to right (also with angle 0). The
 * quantised coefficients are moved, not changed, but for the last one of each block, which is never written;
 * whole MCUs move, the padding at the right and lower edges with them. The output has no APP1 segment.
 *
 * Without a state the picture is done in one call. With one, a call works until the output has reached a
 * multiple of 16 pixels. 1: done (also angle 0 without flip, which does nothing); 4: call again with the same
 * arguments; 0: failure, with the buffer of a memory destination released and nothing kept. */
TAVIRPELO_API int elo_rotate_jpeg(void* source, int size, int width, int height,
                                  ELO_DESTINATION* destination, int angle, int flip,
                                  ELO_TRANSFORMSTATE* state);

/* Ends a turn that answered 4; the destination gets an end mark. 1, also for null or an idle state. */
TAVIRPELO_API int elo_abort_rotate_jpeg(ELO_TRANSFORMSTATE* state);

/* Encode a JPEG again so that it takes at most `target` bytes: by coarser quantisation, and where that does
 * not suffice at a smaller size. Baseline and progressive sources, YCbCr or grey; kind 0: source is a path,
 * 1: a block of size bytes. The output carries an EXIF segment with the source's orientation when that has
 * EXIF. 1, or 0.
 *
 * To a buffer: *buffer comes from TAVIRPELO_OsMalloc and holds *outSize bytes; on success both describe the
 * JPEG, on failure the buffer is released and both are zero. A missing argument: debug_PeloCodecError 15 and
 * nothing is released. To a file, which may be the source: it is opened when the JPEG stands whole in memory,
 * so that no failure but one of writing changes it. */
TAVIRPELO_API int TAVIRPELO_ReEncodeJpegToBuffer(void* source, int size, int kind, uint8_t** buffer,
                                                 int* outSize, int target);
TAVIRPELO_API int TAVIRPELO_ReEncodeJpegToFile(void* source, int size, int kind, const char* path,
                                               int target);

/* The same without argument checks. */
TAVIRPELO_API int elo_re_encode_to_buffer(void* source, int size, int kind, uint8_t** buffer, int* outSize,
                                          int target);
TAVIRPELO_API int elo_re_encode_to_file(void* source, int size, int kind, const char* path, int target);

#endif
