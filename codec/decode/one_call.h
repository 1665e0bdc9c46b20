// One-call parsing and decoding: a file or a byte buffer becomes a header record or a raw image.
#pragma once

#include "codec/decode/formats.h"
#include "tavirpelo/raw.h"

namespace pelo {

// A picture's source as create_dec_info takes it.
struct PictureSource {
  int ioType;
  void* address;
  int size;
};
PictureSource picture_file(const char* path);
PictureSource picture_memory(void* buffer, int size);

// The format code of a source; `record` may be null, its source size stays as the caller left it.
int parse(const PictureSource& source, TAVIRPELO_HINFO* record);

// Decodes with the decoder of a format; 1 or 0.
using DecodePicture = int (*)(TAVIRPELO_DECINFO*, void*, int, int);
int decode(DecodePicture decoder, const PictureSource& source, TAVIRPELO_RAWINFO& raw, uint32_t option);

// Decodes with the decoder of what the source turns out to be.
int decode_detected(const PictureSource& source, TAVIRPELO_RAWINFO& raw, uint32_t option);

// The next frame of an animation: 1, 3 with the last one, 0 on failure. *handle is null before the
// first; it goes with the last frame and on failure.
int decode_frame(const PictureSource& source, const TAVIRPELO_RAWINFO& raw, uint32_t option,
                 TAVIRPELO_DECINFO** handle);

}  // namespace pelo
