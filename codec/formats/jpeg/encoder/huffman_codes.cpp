#include "codec/formats/jpeg/encoder/huffman_codes.h"

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {

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
