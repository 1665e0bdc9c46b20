#include "bench/ours.h"

#include "codec/pixel/row_stores.h"

namespace bench {

TAVIRPELO_DECINFO* open(const Bytes& picture, int format, uint32_t option) {
  return TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, const_cast<uint8_t*>(picture.data()),
                                 static_cast<int>(picture.size()), format, option);
}

bool decode(Decode decoder, const Bytes& picture, int format, uint32_t option, peer::Size size,
            uint8_t* out) {
  TAVIRPELO_DECINFO* info = open(picture, format, option);
  if (info == nullptr) return false;
  const int done = decoder(info, out, size.width, size.height);
  TAVIRPELO_DestroyDecInfo(info);
  return done == 1;
}

Bytes pixels_of(const Bytes& photograph, peer::Size size, int format) {
  const int bytes = format == TAVIRPELO_YUV420 ? 2 : pelo::bytes_per_pixel(format);
  Bytes pixels(size.pixels() * static_cast<size_t>(bytes));
  decode(TAVIRPELO_DecodeJPEG, photograph, format, TAVIRPELO_FIT_STRETCH, size, pixels.data());
  return pixels;
}

}  // namespace bench
