// The library's decoders as the jobs call them.
#pragma once

#include "bench/peer.h"
#include "tavirpelo/tavirpelo.h"

namespace bench {

using Decode = int (*)(TAVIRPELO_DECINFO*, void*, int, int);

// A new object for a picture in memory; the caller destroys it.
TAVIRPELO_DECINFO* open(const Bytes& picture, int format, uint32_t option = 0);

// Decodes a picture into packed pixels of a size, which `out` holds.
bool decode(Decode decoder, const Bytes& picture, int format, uint32_t option, peer::Size size,
            uint8_t* out);

// The photograph stretched to a size, as packed pixels of a format; planes for YUV420.
Bytes pixels_of(const Bytes& photograph, peer::Size size, int format);

}  // namespace bench
