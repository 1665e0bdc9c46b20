// What the encoder codes with: quantisation tables, with the reciprocals by which coefficients are
// divided, and Huffman codes (ITU-T T.81 Annex C).
#pragma once

#include <array>
#include <cstdint>

#include "codec/formats/jpeg/tables.h"
#include "tavirpelo/api.h"

struct ELO_ENCODER;

namespace pelo::jpeg {

struct QuantiseTable {
  std::array<uint8_t, 64> value;        // natural order, as the DQT segment carries it
  std::array<uint32_t, 64> reciprocal;  // 65536 / divisor of the scaled transform; 0 for a zero value
  // The reciprocal in two parts for 16-bit arithmetic: reciprocal = 65536 * (upper & 1) + lower, with
  // lower read as signed and upper 0 or -1. Divisors 1 and 2 are those that need the upper part.
  alignas(16) std::array<int16_t, 64> lower;
  alignas(16) std::array<int16_t, 64> upper;
};

// Installs tables 0 and 1 for a quality, clamped to 1..100: the Annex K tables scaled to
// 5000 / quality percent below 50, 200 - 2 * quality from there.
void set_quality(ELO_ENCODER* encoder, int quality);

// Installs the 64 values (natural order) of table `number` (0 to 3).
void set_quant_table(ELO_ENCODER* encoder, int number, const uint8_t* values);

// The code of a symbol with room below it for the symbol's extra bits: the low nibble of a DC or AC
// symbol says how many.
struct SymbolCode {
  uint32_t bits;
  int32_t length;  // code and extra bits; 0: the table has no such symbol
};
using HuffmanCodes = std::array<SymbolCode, 256>;

// Installs the Annex K tables and derives their codes.
void prepare_codes(ELO_ENCODER* encoder);

// Derives the codes of one table.
void derive_codes(const HuffmanSpec* spec, HuffmanCodes* codes);

}  // namespace pelo::jpeg
