// The checksum of PNG chunks.
#include <array>

#include "codec/base/byte_order.h"
#include "codec/formats/png/png_info.h"

namespace pelo::png {
namespace {

// Table k holds what a byte becomes k bytes further on, so that eight bytes are folded at once.
using CrcTables = std::array<std::array<uint32_t, 256>, 8>;

constexpr CrcTables make_tables() {
  CrcTables tables{};
  for (uint32_t i = 0; i < 256; ++i) {
    uint32_t crc = i;
    for (int bit = 0; bit < 8; ++bit) crc = (crc >> 1) ^ ((crc & 1) != 0 ? 0xEDB88320 : 0);
    tables[0][i] = crc;
  }
  for (size_t k = 1; k < 8; ++k) {
    for (size_t i = 0; i < 256; ++i) {
      const uint32_t before = tables[k - 1][i];
      tables[k][i] = (before >> 8) ^ tables[0][before & 0xFF];
    }
  }
  return tables;
}
constexpr CrcTables kTables = make_tables();
static_assert(kTables[0][1] == 0x77073096);

}  // namespace

uint32_t crc32_update(uint32_t crc, const uint8_t* data, size_t size) {
  for (; size >= 8; data += 8, size -= 8) {
    const uint32_t low = crc ^ load_le32(data);
    const uint32_t high = load_le32(data + 4);
    crc = kTables[7][low & 0xFF] ^ kTables[6][low >> 8 & 0xFF] ^ kTables[5][low >> 16 & 0xFF] ^
          kTables[4][low >> 24] ^ kTables[3][high & 0xFF] ^ kTables[2][high >> 8 & 0xFF] ^
          kTables[1][high >> 16 & 0xFF] ^ kTables[0][high >> 24];
  }
  for (; size > 0; ++data, --size) crc = (crc >> 8) ^ kTables[0][(crc ^ *data) & 0xFF];
  return crc;
}

uint32_t crc32(const uint8_t* data, uint32_t length) {
  return ~pelo::png::crc32_update(pelo::png::kCrcPreset, data, length);
}

}  // namespace pelo::png
