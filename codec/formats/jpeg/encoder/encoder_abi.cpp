// The given names of this room; each forwards to the room's own function.
#include "codec/formats/jpeg/encoder/encoder_abi.h"

#include <algorithm>

#include "codec/base/errors.h"

using namespace pelo;
using namespace pelo::jpeg;

namespace {

bool missing_argument() {
  record_error(ErrorWord::kCodec, TAVIRPELO_CODEC_ARGUMENT);
  return false;
}

bool has_pixels(const TAVIRPELO_RAWINFO* image) {
  return image != nullptr && image->pData != nullptr;
}

}  // namespace

uint8_t* elo_jpeg_enc_realloc(uint8_t* old, int oldSize, int extra) {
  return jpeg::grow_block(old, oldSize, extra);
}

ELO_ENCODER* __elo_jpeg_enc_initiaize(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                                      const TAVIRPELO_ENCOPTION* options,
                                      const CodingParameters* parameters) {
  return jpeg::make_encoder(image, destination, options, parameters);
}

int __elo_jpeg_enc_make_header(ELO_ENCODER* encoder) {
  return jpeg::write_headers(encoder);
}

int __elo_jpeg_enc_process_image_data(ELO_ENCODER* encoder) {
  return jpeg::encode_next_row(encoder);
}

void __elo_jpeg_enc_get_raw_data(ELO_ENCODER* encoder, const uint8_t* const* planes) {
  jpeg::take_planes(encoder, planes);
}

int __elo_jpeg_enc_compress_data(ELO_ENCODER* encoder) {
  return jpeg::code_row(encoder);
}

void __elo_jpeg_enc_do_forward_dct(const uint8_t* samples, ptrdiff_t stride, const QuantiseTable* table,
                                   int32_t* coefficients) {
  jpeg::transform_and_quantise(samples, stride, table, coefficients);
}

int __elo_jpeg_enc_encode_1mcu_blk(ELO_ENCODER* encoder, const CoefficientBlock* blocks) {
  return jpeg::code_mcu(encoder, blocks);
}

int __elo_jpeg_enc_make_end_mark(ELO_ENCODER* encoder) {
  return jpeg::write_end_mark(encoder);
}

void __elo_jpeg_enc_release_mem(ELO_ENCODER* encoder) {
  jpeg::release_buffers(encoder);
}

ELO_ENCODER* elo_jpeg_enc_mcu_init(const TAVIRPELO_RAWINFO* image, ELO_DESTINATION* destination,
                                   const TAVIRPELO_ENCOPTION* options,
                                   const CodingParameters* parameters) {
  return jpeg::begin_bands(image, destination, options, parameters);
}

int elo_jpeg_enc_muc_process(ELO_ENCODER* encoder, const uint8_t* band, int* position) {
  return jpeg::encode_band(encoder, band, position);
}

int elo_jpeg_enc_mcu_finish(ELO_ENCODER* encoder, uint8_t** buffer, int* size) {
  return jpeg::finish_bands(encoder, buffer, size);
}

void __elo_jpeg_enc_prepare_huffman_code(ELO_ENCODER* encoder) {
  jpeg::prepare_codes(encoder);
}

void __elo_jpeg_enc_prepare_derived_tbl(const HuffmanSpec* spec, HuffmanCodes* codes) {
  jpeg::derive_codes(spec, codes);
}

void __elo_jpeg_enc_set_quality(ELO_ENCODER* encoder, int quality) {
  jpeg::set_quality(encoder, quality);
}

void __elo_jpeg_enc_set_quant_table(ELO_ENCODER* encoder, int number, const uint8_t* values) {
  jpeg::set_quant_table(encoder, number, values);
}

int __elo_jpeg_enc_write_bits(ELO_ENCODER* encoder, uint32_t code, int length) {
  return jpeg::write_bits(encoder, code, length);
}

int __elo_jpeg_enc_finish_compression(ELO_ENCODER* encoder) {
  return jpeg::flush_bits(encoder);
}

int elo_enc_jpeg_to_buffer_ex(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                              const TAVIRPELO_ENCOPTION* options) {
  return jpeg::encode_to_buffer(image, buffer, size, options);
}

int elo_enc_jpeg_to_file_ex(const TAVIRPELO_RAWINFO* image, const char* path,
                            const TAVIRPELO_ENCOPTION* options) {
  return jpeg::encode_to_file(image, path, options);
}

int elo_enc_jpeg_to_buffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size, int quality) {
  const TAVIRPELO_ENCOPTION options{quality, nullptr, 0};
  return jpeg::encode_to_buffer(image, buffer, size, &options);
}

int elo_enc_jpeg_to_file(const TAVIRPELO_RAWINFO* image, const char* path, int quality) {
  const TAVIRPELO_ENCOPTION options{quality, nullptr, 0};
  return jpeg::encode_to_file(image, path, &options);
}

int TAVIRPELO_EncodeJpegToBuffer(const TAVIRPELO_RAWINFO* image, uint8_t** buffer, int* size,
                                 int quality) {
  begin_operation();
  if (!has_pixels(image) || buffer == nullptr || *buffer == nullptr || size == nullptr) {
    return missing_argument();
  }
  return elo_enc_jpeg_to_buffer(image, buffer, size, std::clamp(quality, 1, 100));
}

int TAVIRPELO_EncodeJpegToFile(const TAVIRPELO_RAWINFO* image, const char* path, int quality) {
  begin_operation();
  if (!has_pixels(image) || path == nullptr) return missing_argument();
  return elo_enc_jpeg_to_file(image, path, std::clamp(quality, 1, 100));
}

// Takes the reason of a failure; keeps none.
void elo_SetError(int) {}
