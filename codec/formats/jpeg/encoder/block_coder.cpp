// Huffman coding of the blocks of one MCU (ITU-T T.81 F.1.2).
#include <algorithm>
#include <bit>

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

constexpr uint32_t kEndOfBlock = 0x00;
constexpr uint32_t kZeroRun = 0xF0;  // sixteen zeros
constexpr int32_t kMaxAc = 1023;     // category 10
constexpr int32_t kMaxDc = 1023, kMinDc = -1024;

// A block codes its DC difference in 27 bits at most (a 16-bit code, 11 extra), 62 coefficients in 26
// (16 and 10) and an end of block in 16, whatever the tables; stuffing may double its bytes. The pending
// word comes on top.
constexpr size_t kMaxBlockBits = 27 + 62 * 26 + 16;
constexpr size_t kMaxMcuBytes = (kEncoderMcuBlocks * kMaxBlockBits + 2 * kBitWordSize) / 8 * 2;

// One bit for each of the coefficients that are not zero, by zig-zag position.
inline uint64_t nonzero_positions(const CoefficientBlock& block) {
  alignas(16) std::array<uint8_t, 64> flags;
  for (size_t i = 0; i < 64; ++i) flags[i] = block[i] != 0 ? 1 : 0;
  uint64_t positions = 0;
  for (size_t i = 0; i < 16; ++i) {
    const uint8_t* f = flags.data() + 4 * i;
    positions |=
        kZigzagBits[i][size_t{f[0]} | size_t{f[1]} << 1 | size_t{f[2]} << 2 | size_t{f[3]} << 3];
  }
  return positions;
}

// The code of a run and a value, with the value's extra bits: its low bits, less one when negative.
inline void put_value(BitWriter& writer, const HuffmanCodes& codes, uint32_t run, int32_t value) {
  const int32_t sign = value >> 31;
  const auto magnitude = static_cast<uint32_t>((value ^ sign) - sign);
  const auto size = static_cast<uint32_t>(std::bit_width(magnitude));
  const SymbolCode& code = codes[run << 4 | size];
  const uint32_t extra = static_cast<uint32_t>(value + sign) & ((1u << size) - 1);
  writer.put(code.bits | extra, code.length);
}

inline void put_symbol(BitWriter& writer, const HuffmanCodes& codes, uint32_t symbol) {
  writer.put(codes[symbol].bits, codes[symbol].length);
}

void code_block(BitWriter& writer, const CoefficientBlock& block, int32_t& lastDc,
                const HuffmanCodes& dcCodes, const HuffmanCodes& acCodes) {
  const int32_t dc = std::clamp(block[0], kMinDc, kMaxDc);
  put_value(writer, dcCodes, 0, dc - lastDc);
  lastDc = dc;

  // Position 63 acts as the end of the scan, so every block closes with an end of block.
  uint64_t positions = nonzero_positions(block) & ~(uint64_t{1} << 63 | 1);
  int previous = 0;
  while (positions != 0) {
    const int position = std::countr_zero(positions);
    positions &= positions - 1;
    auto run = static_cast<uint32_t>(position - previous - 1);
    previous = position;
    for (; run > 15; run -= 16) put_symbol(writer, acCodes, kZeroRun);
    int32_t value = block[PELOJ_NATURAL_ORDER[position]];
    if (static_cast<uint32_t>(value) + kMaxAc > 2u * kMaxAc) [[unlikely]] {
      value = std::clamp(value, -kMaxAc, kMaxAc);
    }
    put_value(writer, acCodes, run, value);
  }
  put_symbol(writer, acCodes, kEndOfBlock);
}

}  // namespace

int code_mcu(ELO_ENCODER* encoder, const CoefficientBlock* blocks) {
  if (!keep_margin(*encoder->destination, 128 * encoder->mcuBlocks, kDestinationStep)) return 0;
  std::array<uint8_t, kMaxMcuBytes> bytes;
  BitWriter writer(encoder->entropy.pending, bytes.data());
  for (size_t i = 0; i < static_cast<size_t>(encoder->mcuBlocks); ++i) {
    const size_t index = encoder->blockComponent[i];
    const EncoderComponent& component = encoder->components[index];
    code_block(writer, blocks[i], encoder->entropy.lastDc[index], encoder->dcCodes[component.dcTable],
               encoder->acCodes[component.acTable]);
  }
  encoder->entropy.pending = writer.pending();
  return append(*encoder->destination, bytes.data(), static_cast<size_t>(writer.next - bytes.data()));
}

}  // namespace pelo::jpeg
