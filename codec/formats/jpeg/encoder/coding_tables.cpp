#include "codec/formats/jpeg/encoder/coding_tables.h"

#include <algorithm>

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

std::array<uint8_t, 64> scaled(const std::array<uint8_t, 64>& base, int percent) {
  std::array<uint8_t, 64> values;
  for (size_t i = 0; i < 64; ++i) {
    values[i] = static_cast<uint8_t>(std::clamp((base[i] * percent + 50) / 100, 1, 255));
  }
  return values;
}

}  // namespace

void set_quality(ELO_ENCODER* encoder, int quality) {
  const int q = std::clamp(quality, 1, 100);
  const int percent = q < 50 ? 5000 / q : 200 - 2 * q;
  set_quant_table(encoder, 0, scaled(kLuminanceQuant, percent).data());
  set_quant_table(encoder, 1, scaled(kChrominanceQuant, percent).data());
}

void set_quant_table(ELO_ENCODER* encoder, int number, const uint8_t* values) {
  if (number < 0 || number >= kQuantTables) return;
  QuantiseTable& table = encoder->quant[static_cast<size_t>(number)];
  for (size_t i = 0; i < 64; ++i) {
    // The transform leaves its outputs kAanScale / 2048 times too large (14 fraction bits against the
    // factor 8 of an unnormalised 8 x 8 transform).
    const uint32_t divisor = (values[i] * uint32_t{kAanScale[i]} + 1024) >> 11;
    const uint32_t reciprocal = divisor == 0 ? 0 : 65536 / divisor;
    table.value[i] = values[i];
    table.reciprocal[i] = reciprocal;
    table.lower[i] = static_cast<int16_t>(reciprocal & 0xFFFF);
    table.upper[i] = reciprocal >= 32768 ? -1 : 0;
  }
}

void derive_codes(const HuffmanSpec* spec, HuffmanCodes* codes) {
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

void prepare_codes(ELO_ENCODER* encoder) {
  encoder->dcSpecs = {&kDcLuminance, &kDcChrominance};
  encoder->acSpecs = {&kAcLuminance, &kAcChrominance};
  for (size_t i = 0; i < 2; ++i) {
    derive_codes(encoder->dcSpecs[i], &encoder->dcCodes[i]);
    derive_codes(encoder->acSpecs[i], &encoder->acCodes[i]);
  }
}

}  // namespace pelo::jpeg
