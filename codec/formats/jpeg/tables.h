// Constant tables of ITU-T T.81 and of the AAN transform that decoder, encoder and transform share.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

#include "tavirpelo/api.h"

// The zig-zag sequence (T.81 Figure A.6) as places in a row-major block. A corrupt run can lead 16
// places beyond it: these are the last one again.
TAVIRPELO_API const uint8_t PELOJ_NATURAL_ORDER[80];

// EXTEND thresholds (T.81 F.12): 0 for size 0, 2^(s-1) for s = 1..15.
TAVIRPELO_API const int32_t PELOJ_HUFF_EXTEND_TEST[16];

namespace pelo::jpeg {

// Zig-zag positions, one bit each, of the coefficients that the nibble i of a row-major block names: bit
// b of the nibble stands for place 4 i + b.
using ZigzagBits = std::array<std::array<uint64_t, 16>, 16>;
extern const ZigzagBits kZigzagBits;

// AAN scale factors with 14 fraction bits, natural order: round(16384 f(r) f(c)), f(0) = 1,
// f(k) = sqrt(2) cos(k pi / 16).
extern const std::array<uint16_t, 64> kAanScale;

// Scale factors of the 4-point transform used at scale 1/2: round(16384 g(r) g(c)) for r, c < 4,
// g = (1, sqrt(2) cos(pi/16) cos(pi/8), cos(pi/8), sqrt(2) cos(3 pi/16) cos(pi/8)); 0 elsewhere.
extern const std::array<uint16_t, 64> kFourPointScale;

// Annex K quantisation tables K.1 (luminance) and K.2 (chrominance), natural order.
extern const std::array<uint8_t, 64> kLuminanceQuant;
extern const std::array<uint8_t, 64> kChrominanceQuant;

// A Huffman table as a DHT segment lists it: codes per length 1..16, then the symbols in code order.
struct HuffmanSpec {
  std::array<uint8_t, 17> counts;  // entry 0 unused
  std::array<uint8_t, 256> symbols;
};

// Annex K Huffman tables K.3 to K.6.
extern const HuffmanSpec kDcLuminance;
extern const HuffmanSpec kDcChrominance;
extern const HuffmanSpec kAcLuminance;
extern const HuffmanSpec kAcChrominance;

}  // namespace pelo::jpeg
