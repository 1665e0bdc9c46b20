// The marker segments around the entropy-coded data (ITU-T T.81 Annex B).
#include <cstring>

#include "codec/core/ground/byte_order.h"
#include "codec/jpeg/encoder/encoder.h"

using namespace pelo;
using namespace pelo::jpeg;

namespace {

// Appends whole pieces, each after making room for it.
class Appender {
 public:
  explicit Appender(ELO_ENCODER& encoder) : encoder_(encoder) {}

  void bytes(const uint8_t* data, int count) {
    if (!elo_jpeg_enc_reserve(&encoder_, count)) return;
    ELO_DESTINATION& destination = *encoder_.destination;
    std::memcpy(destination.buffer + destination.used, data, static_cast<size_t>(count));
    destination.used += count;
  }
  void byte(int value) {
    const auto b = static_cast<uint8_t>(value);
    bytes(&b, 1);
  }
  void word(int value) {
    uint8_t b[2];
    store_be16(b, static_cast<uint32_t>(value));
    bytes(b, 2);
  }

 private:
  ELO_ENCODER& encoder_;
};

constexpr uint8_t kStart[] = {0xFF, 0xD8, 0xFF, 0xE0, 0x00, 0x10, 'J', 'F', 'I', 'F', 0,
                              1,    1,    0,    0,    1,    0,    1,   0,   0};

void quant_table(Appender& out, const EncoderQuant& quant, int number) {
  out.word(0xFFDB);
  out.word(67);
  out.byte(number);
  for (size_t i = 0; i < 64; ++i) out.byte(quant.value[PELOJ_NATURAL_ORDER[i]]);
}

void frame(Appender& out, const ELO_ENCODER& encoder) {
  out.word(0xFFC0);
  out.word(8 + 3 * encoder.componentCount);
  out.byte(8);
  out.word(encoder.height);
  out.word(encoder.width);
  out.byte(encoder.componentCount);
  for (int c = 0; c < encoder.componentCount; ++c) {
    const EncoderComponent& component = encoder.components[static_cast<size_t>(c)];
    out.byte(component.id);
    out.byte(component.h << 4 | component.v);
    out.byte(component.table);
  }
}

void huffman_table(Appender& out, const HuffmanSpec& spec, int classAndNumber) {
  int symbols = 0;
  for (const uint8_t count : spec.counts) symbols += count;
  out.word(0xFFC4);
  out.word(19 + symbols);
  out.byte(classAndNumber);
  out.bytes(spec.counts.data() + 1, 16);
  out.bytes(spec.symbols.data(), symbols);
}

void scan(Appender& out, const ELO_ENCODER& encoder) {
  out.word(0xFFDA);
  out.word(6 + 2 * encoder.componentCount);
  out.byte(encoder.componentCount);
  for (int c = 0; c < encoder.componentCount; ++c) {
    const EncoderComponent& component = encoder.components[static_cast<size_t>(c)];
    out.byte(component.id);
    out.byte(component.table << 4 | component.table);
  }
  out.byte(0);
  out.byte(63);
  out.byte(0);
}

}  // namespace

int __elo_jpeg_enc_make_header(ELO_ENCODER* encoder) {
  Appender out(*encoder);
  out.bytes(kStart, sizeof kStart);
  const TAVIRPELO_APP1* app1 = encoder->app1;
  if (app1 != nullptr && app1->data != nullptr && app1->length > 0) out.bytes(app1->data, app1->length);
  const int tables = encoder->componentCount > 1 ? 2 : 1;
  for (int i = 0; i < tables; ++i) quant_table(out, encoder->quant[static_cast<size_t>(i)], i);
  frame(out, *encoder);
  for (int i = 0; i < tables; ++i) {
    huffman_table(out, *encoder->dcSpec[static_cast<size_t>(i)], i);
    huffman_table(out, *encoder->acSpec[static_cast<size_t>(i)], 0x10 + i);
  }
  scan(out, *encoder);
  return !encoder->failed;
}

int __elo_jpeg_enc_make_end_mark(ELO_ENCODER* encoder) {
  Appender(*encoder).word(0xFFD9);
  return !encoder->failed;
}
