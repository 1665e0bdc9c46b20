// Turning JPEGs without decoding their pixels, and fitting one into a number of bytes.
//
// How to read this room: coefficient_source reads a JPEG's quantised blocks MCU row by MCU row,
// block_transform turns blocks, coding_parameters carries tables and sampling over to the encoder. Turns
// that reverse rows read them again, from a snapshot of each row; sideways ones code a column at a time
// into the streams of stream_encoder, which are joined by restart markers. reencode makes a picture fit
// a number of bytes: coarser steps first (requantise), then fewer pixels.
#pragma once

#include "codec/base/geometry.h"
#include "codec/formats/jpeg/transform/block_transform.h"
#include "codec/formats/jpeg/transform/coefficient_source.h"
#include "codec/formats/jpeg/transform/stream_encoder.h"
#include "tavirpelo/transform.h"

namespace pelo::jpeg {

// ---- turning ----

// Ends a turn at any point: what is coded so far is completed, with an end mark; everything is released.
void abort_turn(void* context);

// ---- fitting: coarser quantisation first, then a smaller picture ----

// The scale (1024 = 1.0) at which a picture of width x height pixels is estimated to take `target`
// bytes.
int scale_for_target(int width, int height, int target);

// Decodes a source to width x height and encodes it at quality 50 behind the APP1 segment. 1, or 0 when
// it cannot be decoded so or memory is short.
int resize_within(void* source, int size, int kind, int width, int height, const TAVIRPELO_APP1* app1,
                  ELO_DESTINATION* destination);

// Encodes the source within `target` bytes to a memory destination, or to a file one whose file is open.
// 1 or 0; the destination's buffer stays the caller's.
int encode_within_target(void* source, int size, int kind, ELO_DESTINATION* destination, int target);

// ---- behind the given names of the public headers, which say what they do ----

int rotate_jpeg(void* source, int size, int width, int height, ELO_DESTINATION* destination, int angle,
                int flip, ELO_TRANSFORMSTATE* state);
int abort_rotation(ELO_TRANSFORMSTATE* state);
int reencode_to_buffer(void* source, int size, int kind, uint8_t** buffer, int* outSize, int target);
int reencode_to_file(void* source, int size, int kind, const char* path, int target);

}  // namespace pelo::jpeg
