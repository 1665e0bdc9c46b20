// A turn in progress.
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
