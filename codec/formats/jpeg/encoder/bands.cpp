// Encoding of data that arrives one MCU row at a time.
#include <algorithm>

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {

ELO_ENCODER* begin_bands(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                         const TAVIRPELO_ENCOPTION* options, const CodingParameters* parameters) {
  pelo::OsPtr<ELO_ENCODER> encoder(make_encoder(image, destination, options, parameters));
  if (encoder == nullptr) return nullptr;
  if (!write_headers(encoder.get())) {
    release_buffers(encoder.get());
    return nullptr;
  }
  return encoder.release();
}

int encode_band(ELO_ENCODER* encoder, const uint8_t* band, int* position) {
  if (encoder == nullptr || band == nullptr) return 0;
  if (encoder->row >= encoder->height || !takes_planes(*encoder)) return 0;
  const ptrdiff_t lumaBytes = 16 * static_cast<ptrdiff_t>(encoder->width);
  const ptrdiff_t chromaBytes = 8 * static_cast<ptrdiff_t>((encoder->width + 1) / 2);
  const uint8_t* const planes[] = {band, band + lumaBytes, band + lumaBytes + chromaBytes};
  take_planes(encoder, planes);
  if (!code_row(encoder)) return 0;
  if (position != nullptr) *position = std::min(encoder->row, encoder->height);
  return 1;
}

int finish_bands(ELO_ENCODER* encoder, uint8_t** buffer, int* size) {
  if (encoder == nullptr) return 0;
  const pelo::OsPtr<ELO_ENCODER> owner(encoder);
  const bool done = flush_bits(encoder) && write_end_mark(encoder);
  release_buffers(encoder);
  if (buffer != nullptr) *buffer = encoder->destination->buffer;
  if (size != nullptr) *size = encoder->destination->total;
  return done;
}

}  // namespace pelo::jpeg
