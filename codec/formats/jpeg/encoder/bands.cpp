// Encoding of data that arrives one MCU row at a time.
#include <algorithm>

#include "codec/formats/jpeg/encoder/encoder.h"
#include "codec/formats/jpeg/encoder/input_rows.h"

using namespace pelo::jpeg;

ELO_ENCODER* elo_jpeg_enc_mcu_init(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                                   const TAVIRPELO_ENCOPTION* options,
                                   const CodingParameters* parameters) {
  pelo::OsPtr<ELO_ENCODER> encoder(__elo_jpeg_enc_initiaize(image, destination, options, parameters));
  if (encoder == nullptr) return nullptr;
  if (!__elo_jpeg_enc_make_header(encoder.get())) {
    __elo_jpeg_enc_release_mem(encoder.get());
    return nullptr;
  }
  return encoder.release();
}

int elo_jpeg_enc_muc_process(ELO_ENCODER* encoder, const uint8_t* band, int* position) {
  if (encoder == nullptr || band == nullptr) return 0;
  if (encoder->row >= encoder->height || !takes_planes(*encoder)) return 0;
  const ptrdiff_t lumaBytes = 16 * static_cast<ptrdiff_t>(encoder->width);
  const ptrdiff_t chromaBytes = 8 * static_cast<ptrdiff_t>((encoder->width + 1) / 2);
  const uint8_t* const planes[] = {band, band + lumaBytes, band + lumaBytes + chromaBytes};
  __elo_jpeg_enc_get_raw_data(encoder, planes);
  if (!__elo_jpeg_enc_compress_data(encoder)) return 0;
  if (position != nullptr) *position = std::min(encoder->row, encoder->height);
  return 1;
}

int elo_jpeg_enc_mcu_finish(ELO_ENCODER* encoder, uint8_t** buffer, int* size) {
  if (encoder == nullptr) return 0;
  const pelo::OsPtr<ELO_ENCODER> owner(encoder);
  const bool done = __elo_jpeg_enc_finish_compression(encoder) && __elo_jpeg_enc_make_end_mark(encoder);
  __elo_jpeg_enc_release_mem(encoder);
  if (buffer != nullptr) *buffer = encoder->destination->buffer;
  if (size != nullptr) *size = encoder->destination->total;
  return done;
}
