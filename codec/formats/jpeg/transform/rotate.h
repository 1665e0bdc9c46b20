// A turn in progress.
//
// How to read this room: coefficient_source reads a JPEG's quantised blocks MCU row by MCU row,
// block_transform turns blocks, coding_parameters carries tables and sampling over to the encoder. Turns
// that reverse rows read them again from row_snapshots; sideways ones code a column at a time into the
// streams of stream_encoder, which are joined by restart markers. reencode makes a picture fit a number
// of bytes: coarser steps first (requantise), then fewer pixels.
#pragma once

#include "codec/base/geometry.h"
#include "codec/formats/jpeg/transform/block_transform.h"
#include "codec/formats/jpeg/transform/row_snapshots.h"
#include "codec/formats/jpeg/transform/stream_encoder.h"
#include "tavirpelo/transform.h"

namespace pelo::jpeg {

// Ends a turn at any point: what is coded so far is completed, with an end mark; everything is released.
void abort_turn(void* context);

}  // namespace pelo::jpeg
