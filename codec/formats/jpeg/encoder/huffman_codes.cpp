#include "codec/formats/jpeg/encoder/huffman_codes.h"

#include "codec/formats/jpeg/encoder/encoder.h"

using namespace pelo::jpeg;

void __elo_jpeg_enc_prepare_derived_tbl(const HuffmanSpec* spec, HuffmanCodes* codes) {
  *codes = {};
  uint32_t code = 0;
  size_t next = 0;
  for (int length = 1; length <= 16; ++length, code <<= 1) {
    for (int i = 0; i < spec->counts[static_cast<size_t>(length)]; ++i, ++code) {
      const uint8_t symbol = spec->symbols[next++ & 0xFF];
      const int extra = symbol & 15;
      (*codes)[symbol] = {(code & 0xFFFF) << extra, length + extra};
    }
  }
}

void __elo_jpeg_enc_prepare_huffman_code(ELO_ENCODER* encoder) {
  encoder->dcSpecs = {&kDcLuminance, &kDcChrominance};
  encoder->acSpecs = {&kAcLuminance, &kAcChrominance};
  for (size_t i = 0; i < 2; ++i) {
    __elo_jpeg_enc_prepare_derived_tbl(encoder->dcSpecs[i], &encoder->dcCodes[i]);
    __elo_jpeg_enc_prepare_derived_tbl(encoder->acSpecs[i], &encoder->acCodes[i]);
  }
}
