// Quantisation and Huffman tables of the encoder.
#include <algorithm>

#include "codec/jpeg/encoder/encoder.h"

using namespace pelo::jpeg;

void __elo_jpeg_enc_set_quant_table(ELO_ENCODER* encoder, int number, const uint8_t* values) {
  EncoderQuant& quant = encoder->quant[static_cast<size_t>(number)];
  for (size_t k = 0; k < 64; ++k) {
    quant.value[k] = values[k];
    // The transform's outputs are scaled by its factors: one division undoes both.
    const int32_t divisor = (values[k] * kAanScale[k] + 1024) >> 11;
    quant.reciprocal[k] = divisor == 0 ? 0 : 65536 / divisor;
  }
}

void __elo_jpeg_enc_set_quality(ELO_ENCODER* encoder, int quality) {
  quality = std::clamp(quality, 1, 100);
  encoder->quality = quality;
  const int scale = quality <= 49 ? 5000 / quality : 200 - 2 * quality;
  for (int number = 0; number < 2; ++number) {
    const auto& base = number == 0 ? kLuminanceQuant : kChrominanceQuant;
    std::array<uint8_t, 64> values;
    for (size_t k = 0; k < 64; ++k) {
      values[k] = static_cast<uint8_t>(std::clamp((base[k] * scale + 50) / 100, 1, 255));
    }
    __elo_jpeg_enc_set_quant_table(encoder, number, values.data());
  }
}

void __elo_jpeg_enc_prepare_derived_tbl(const HuffmanSpec* spec, CodeTable* table) {
  *table = {};
  uint32_t code = 0;
  size_t index = 0;
  for (uint8_t length = 1; length <= 16; ++length, code <<= 1) {
    for (int i = 0; i < spec->counts[length]; ++i, ++code) {
      const uint8_t symbol = spec->symbols[index++];
      table->code[symbol] = static_cast<uint16_t>(code);
      table->length[symbol] = length;
    }
  }
}

void __elo_jpeg_enc_prepare_huffman_code(ELO_ENCODER* encoder) {
  encoder->dcSpec = {&kDcLuminance, &kDcChrominance};
  encoder->acSpec = {&kAcLuminance, &kAcChrominance};
  for (size_t i = 0; i < 2; ++i) {
    __elo_jpeg_enc_prepare_derived_tbl(encoder->dcSpec[i], &encoder->dc[i]);
    __elo_jpeg_enc_prepare_derived_tbl(encoder->acSpec[i], &encoder->ac[i]);
  }
}
