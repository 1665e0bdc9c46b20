// Which format a source has, and one-call decoding: a file or a byte buffer becomes a header record or a
// raw image.
#pragma once

#include "codec/formats/format.h"
#include "tavirpelo/raw.h"

namespace pelo {

// ---- the formats that the library reads ----

// The format with that code, or null.
const Format* format_of(int code);

// Detects the format at the source's start and reads its head: the object's image size, parts of `hinfo`
// (may be null). The format code; 0 when it is none of ours, or its head is cut.
int detect(TAVIRPELO_DECINFO& decInfo, PELOJ_SOURCE& source, TAVIRPELO_HINFO* hinfo);

// The whole of TAVIRPELO_Parser: a reader over the object's source, detection, and the record's sizes.
int parse(TAVIRPELO_DECINFO* decInfo, TAVIRPELO_HINFO* hinfo);

// ---- in one call ----

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

// ---- a part of a JPEG file, within a memory limit ----

// The whole of TAVIRPELO_CropDecoding and TAVIRPELO_CropFromImage.
int decode_small(const char* path, void* outBuffer, int width, int height);
int crop_file(const char* path, TAVIRPELO_CROPRECT* rect, void* dst, int dstWidth, int dstHeight,
              uint32_t option, int memoryLimit);

}  // namespace pelo
