#include "codec/formats/jpeg/encoder/bit_writer.h"

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

// Room for a stuffed word and what one call adds to it.
using SmallBlock = std::array<uint8_t, 4 * sizeof(BitWord)>;

bool close_writer(ELO_ENCODER& encoder, const BitWriter& writer, const SmallBlock& block) {
  encoder.entropy.pending = writer.pending();
  return append(*encoder.destination, block.data(), static_cast<size_t>(writer.next - block.data()));
}

}  // namespace

int write_bits(ELO_ENCODER* encoder, uint32_t code, int length) {
  if (length < 0 || length > 16) return 0;
  SmallBlock block;
  BitWriter writer(encoder->entropy.pending, block.data());
  writer.put(code & ((1u << length) - 1), length);
  return close_writer(*encoder, writer, block);
}

int flush_bits(ELO_ENCODER* encoder) {
  if (!write_bits(encoder, 0x7F, 7)) return 0;
  SmallBlock block;
  BitWriter writer(encoder->entropy.pending, block.data());
  writer.flush_bytes();
  const bool written = close_writer(*encoder, writer, block);
  encoder->entropy = {};
  return written;
}

}  // namespace pelo::jpeg
