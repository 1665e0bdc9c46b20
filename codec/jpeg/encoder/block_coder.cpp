// Huffman coding of blocks (ITU-T T.81 F.1.2) and the bit writer below it.
#include <bit>
#include <cstdlib>

#include "codec/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

// A block's longest code: a DC of 22 bits, 63 coefficients of 26 bits, every byte stuffed.
constexpr int kMaxBlockBytes = 512;

inline void emit_byte(ELO_DESTINATION& destination, uint8_t byte) {
  destination.buffer[destination.used++] = byte;
  if (byte == 0xFF) destination.buffer[destination.used++] = 0;
}

// The pending bits in locals while a block is coded; the destination has room for it.
class BitWriter {
 public:
  explicit BitWriter(ELO_ENCODER& encoder)
      : encoder_(encoder), destination_(*encoder.destination), bits_(encoder.bits), count_(encoder.bitCount) {}
  ~BitWriter() {
    encoder_.bits = bits_;
    encoder_.bitCount = count_;
  }
  // Appends the low `length` bits, at most 32.
  void put(uint32_t code, int length) {
    bits_ = bits_ << length | (code & ((uint64_t{1} << length) - 1));
    count_ += length;
    if (count_ >= 32) drain();
  }
  void drain() {
    while (count_ >= 8) {
      count_ -= 8;
      emit_byte(destination_, static_cast<uint8_t>(bits_ >> count_));
    }
  }

 private:
  ELO_ENCODER& encoder_;
  ELO_DESTINATION& destination_;
  uint64_t bits_;
  int count_;
};

// A value's magnitude category, and its extra bits: negative ones are stored less one (T.81 F.1.2.1).
inline int category(int value) {
  return static_cast<int>(std::bit_width(static_cast<uint32_t>(std::abs(value))));
}
inline uint32_t extra_bits(int value) { return static_cast<uint32_t>(value - (value < 0)); }

inline void put_symbol(BitWriter& out, const CodeTable& table, int symbol, int value, int size) {
  const auto index = static_cast<size_t>(symbol);
  const uint32_t mask = (1u << size) - 1;
  out.put(uint32_t{table.code[index]} << size | (extra_bits(value) & mask), table.length[index] + size);
}

}  // namespace
}  // namespace pelo::jpeg

using namespace pelo::jpeg;

void __elo_jpeg_enc_encode_1mcu_blk(ELO_ENCODER* encoder, int component, const int32_t* block) {
  if (!elo_jpeg_enc_reserve(encoder, kMaxBlockBytes)) return;
  const auto index = static_cast<size_t>(component);
  const auto table = static_cast<size_t>(encoder->components[index].table);
  const CodeTable& ac = encoder->ac[table];
  BitWriter out(*encoder);

  const int difference = block[0] - encoder->lastDc[index];
  encoder->lastDc[index] = block[0];
  put_symbol(out, encoder->dc[table], category(difference), difference, category(difference));

  // The last position is never coded: every block ends with an end-of-block code.
  int run = 0;
  for (int k = 1; k < 63; ++k) {
    const int value = block[PELOJ_NATURAL_ORDER[k]];
    if (value == 0) {
      ++run;
      continue;
    }
    for (; run > 15; run -= 16) out.put(ac.code[0xF0], ac.length[0xF0]);
    const int size = category(value);
    put_symbol(out, ac, run << 4 | size, value, size);
    run = 0;
  }
  out.put(ac.code[0], ac.length[0]);
}

void __elo_jpeg_enc_write_bits(ELO_ENCODER* encoder, uint32_t code, int length) {
  if (!elo_jpeg_enc_reserve(encoder, kMaxBlockBytes)) return;
  BitWriter(*encoder).put(code, length);
}

int __elo_jpeg_enc_finish_compression(ELO_ENCODER* encoder) {
  // Seven ones complete the last byte.
  __elo_jpeg_enc_write_bits(encoder, 0x7F, 7);
  if (encoder->failed) return 0;
  BitWriter(*encoder).drain();
  return __elo_jpeg_enc_make_end_mark(encoder);
}
