// Owners of what the codec creates.
#pragma once

#include <cstdint>
#include <memory>

#include "tavirpelo/tavirpelo.h"

namespace tool {

struct CodecDeleter {
  void operator()(TAVIRPELO_RAWINFO* raw) const { TAVIRPELO_DestroyRawInfo(raw); }
  void operator()(TAVIRPELO_EXIFINFO* info) const { TAVIRPELO_DestroyJpegExifInfo(info); }
  // Also ends an animation that was not decoded to its last frame.
  void operator()(TAVIRPELO_DECINFO* info) const {
    TAVIRPELOI_AborAGIF(info);
    TAVIRPELO_DestroyDecInfo(info);
  }
};
using RawImage = std::unique_ptr<TAVIRPELO_RAWINFO, CodecDeleter>;
using ExifInfo = std::unique_ptr<TAVIRPELO_EXIFINFO, CodecDeleter>;
using DecInfo = std::unique_ptr<TAVIRPELO_DECINFO, CodecDeleter>;

// A block that the encoder enlarges and may replace. Null when memory is short.
class CodecBuffer {
 public:
  CodecBuffer();
  ~CodecBuffer() { TAVIRPELO_OsFree(bytes); }
  CodecBuffer(const CodecBuffer&) = delete;
  CodecBuffer& operator=(const CodecBuffer&) = delete;

  // Replaces the content by a picture as JPEG; false, with nothing left, when that fails.
  bool encode(const TAVIRPELO_RAWINFO& picture, int quality);

  uint8_t* bytes;
  int size;
};

}  // namespace tool
