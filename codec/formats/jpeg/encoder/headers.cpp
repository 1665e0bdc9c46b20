// The marker segments of the output (ITU-T T.81 Annex B), each built whole and appended.
#include <cstring>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/encoder/encoder.h"
#include "codec/formats/jpeg/marker_codes.h"

namespace pelo::jpeg {
namespace {

using enum Marker;

// One segment under construction; the largest is a DHT of 256 symbols.
class Segment {
 public:
  explicit Segment(Marker marker) {
    u8(0xFF);
    u8(static_cast<uint8_t>(marker));
    u16(0);
  }
  void u8(int value) { bytes_[size_++] = static_cast<uint8_t>(value); }
  void u16(int value) {
    u8(value >> 8);
    u8(value);
  }
  void copy(const void* data, size_t count) {
    std::memcpy(bytes_.data() + size_, data, count);
    size_ += count;
  }
  // The length counts itself but not the marker.
  bool write(ELO_ENCODER& encoder) {
    pelo::store_be16(bytes_.data() + 2, static_cast<uint32_t>(size_ - 2));
    return append(*encoder.destination, bytes_.data(), size_);
  }

 private:
  std::array<uint8_t, 2 + 2 + 1 + 16 + 256> bytes_;
  size_t size_ = 0;
};

bool write_bare(ELO_ENCODER& encoder, Marker marker) {
  const uint8_t bytes[2] = {0xFF, static_cast<uint8_t>(marker)};
  return append(*encoder.destination, bytes, sizeof bytes);
}

bool write_app0(ELO_ENCODER& encoder) {
  Segment app0(kApp0);
  app0.copy("JFIF", 5);
  app0.u16(0x0101);  // version 1.1
  app0.u8(0);        // densities are an aspect ratio: 1 to 1
  app0.u16(1);
  app0.u16(1);
  app0.u16(0);  // no thumbnail
  return app0.write(encoder);
}

bool write_app1(ELO_ENCODER& encoder) {
  const TAVIRPELO_APP1* app1 = encoder.app1;
  if (app1 == nullptr || app1->data == nullptr || app1->length < 1) return true;
  return append(*encoder.destination, app1->data, static_cast<size_t>(app1->length));
}

bool write_dqt(ELO_ENCODER& encoder, uint8_t number) {
  Segment dqt(kDqt);
  dqt.u8(number);  // precision 0: eight bits
  for (int k = 0; k < 64; ++k) dqt.u8(encoder.quant[number].value[PELOJ_NATURAL_ORDER[k]]);
  return dqt.write(encoder);
}

// Each table in use once, in the order of first use.
bool write_quant_tables(ELO_ENCODER& encoder) {
  uint32_t written = 0;
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) {
    const uint8_t number = encoder.components[i].quantTable;
    if ((written >> number & 1) != 0) continue;
    written |= 1u << number;
    if (!write_dqt(encoder, number)) return false;
  }
  return true;
}

bool write_sof0(ELO_ENCODER& encoder) {
  Segment sof(kSof0);
  sof.u8(8);  // bits a sample
  sof.u16(encoder.height);
  sof.u16(encoder.width);
  sof.u8(encoder.componentCount);
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) {
    const EncoderComponent& component = encoder.components[i];
    sof.u8(component.id);
    sof.u8(component.h << 4 | component.v);
    sof.u8(component.quantTable);
  }
  return sof.write(encoder);
}

bool write_dht(ELO_ENCODER& encoder, const HuffmanSpec& spec, int classAndNumber) {
  size_t symbols = 0;
  for (size_t length = 1; length <= 16; ++length) symbols += spec.counts[length];
  Segment dht(kDht);
  dht.u8(classAndNumber);
  dht.copy(spec.counts.data() + 1, 16);
  dht.copy(spec.symbols.data(), symbols);
  return dht.write(encoder);
}

bool write_huffman_tables(ELO_ENCODER& encoder) {
  const int tables = encoder.componentCount > 1 ? 2 : 1;
  for (int i = 0; i < tables; ++i) {
    if (!write_dht(encoder, *encoder.dcSpecs[static_cast<size_t>(i)], i)) return false;
    if (!write_dht(encoder, *encoder.acSpecs[static_cast<size_t>(i)], 0x10 | i)) return false;
  }
  return true;
}

bool write_dri(ELO_ENCODER& encoder) {
  if (!encoder.restartPerRow) return true;
  Segment dri(kDri);
  dri.u16(encoder.mcusAcross);
  return dri.write(encoder);
}

bool write_sos(ELO_ENCODER& encoder) {
  Segment sos(kSos);
  sos.u8(encoder.componentCount);
  for (size_t i = 0; i < static_cast<size_t>(encoder.componentCount); ++i) {
    const EncoderComponent& component = encoder.components[i];
    sos.u8(component.id);
    sos.u8(component.dcTable << 4 | component.acTable);
  }
  sos.u8(0);  // the whole spectrum,
  sos.u8(63);
  sos.u8(0);  // without approximation
  return sos.write(encoder);
}

}  // namespace

int write_headers(ELO_ENCODER* encoder) {
  return write_bare(*encoder, kSoi) && write_app0(*encoder) && write_app1(*encoder) &&
         write_quant_tables(*encoder) && write_sof0(*encoder) && write_huffman_tables(*encoder) &&
         write_dri(*encoder) && write_sos(*encoder);
}

int write_end_mark(ELO_ENCODER* encoder) {
  return keep_margin(*encoder->destination, 10, 10) && write_bare(*encoder, kEoi) &&
         finish(*encoder->destination);
}

}  // namespace pelo::jpeg
