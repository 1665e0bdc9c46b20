// Huffman codes ready for writing, made from the tables of a DHT segment (ITU-T T.81 Annex C).
#pragma once

#include <array>
#include <cstdint>

#include "codec/formats/jpeg/tables.h"
#include "tavirpelo/api.h"

struct ELO_ENCODER;

namespace pelo::jpeg {

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
void derive_codes(const pelo::jpeg::HuffmanSpec* spec, pelo::jpeg::HuffmanCodes* codes);

}  // namespace pelo::jpeg
