#include "tools/common/codec_objects.h"

namespace tool {
namespace {

constexpr int kFirstBuffer = 64 * 1024;  // bytes

}  // namespace

CodecBuffer::CodecBuffer()
    : bytes(static_cast<uint8_t*>(TAVIRPELO_OsMalloc(kFirstBuffer))),
      size(bytes != nullptr ? kFirstBuffer : 0) {}

bool CodecBuffer::encode(const TAVIRPELO_RAWINFO& picture, int quality) {
  return TAVIRPELO_EncodeJpegToBuffer(&picture, &bytes, &size, quality) == 1;
}

}  // namespace tool
