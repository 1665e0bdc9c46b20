#include "codec/formats/jpeg/tables.h"

constexpr uint8_t PELOJ_NATURAL_ORDER[80] = {
    0,  1,  8,  16, 9,  2,  3,  10, 17, 24, 32, 25, 18, 11, 4,  5,   //
    12, 19, 26, 33, 40, 48, 41, 34, 27, 20, 13, 6,  7,  14, 21, 28,  //
    35, 42, 49, 56, 57, 50, 43, 36, 29, 22, 15, 23, 30, 37, 44, 51,  //
    58, 59, 52, 45, 38, 31, 39, 46, 53, 60, 61, 54, 47, 55, 62, 63,  //
    63, 63, 63, 63, 63, 63, 63, 63, 63, 63, 63, 63, 63, 63, 63, 63};

const int32_t PELOJ_HUFF_EXTEND_TEST[16] = {0,       1 << 0,  1 << 1,  1 << 2, 1 << 3, 1 << 4,
                                            1 << 5,  1 << 6,  1 << 7,  1 << 8, 1 << 9, 1 << 10,
                                            1 << 11, 1 << 12, 1 << 13, 1 << 14};

namespace pelo::jpeg {
namespace {

// cos(k pi / 16) for k = 0..8.
constexpr double kCos[9] = {1.0,
                            0.98078528040323044913,
                            0.92387953251128675613,
                            0.83146961230254523708,
                            0.70710678118654752440,
                            0.55557023301960222474,
                            0.38268343236508977173,
                            0.19509032201612826785,
                            0.0};
constexpr double kSqrt2 = 1.41421356237309504880;

constexpr std::array<uint16_t, 64> outer_product(const double (&factor)[8]) {
  std::array<uint16_t, 64> table{};
  for (size_t i = 0; i < 64; ++i) {
    table[i] = static_cast<uint16_t>(16384.0 * factor[i / 8] * factor[i % 8] + 0.5);
  }
  return table;
}

constexpr double kAanFactor[8] = {1.0,
                                  kSqrt2* kCos[1],
                                  kSqrt2* kCos[2],
                                  kSqrt2* kCos[3],
                                  kSqrt2* kCos[4],
                                  kSqrt2* kCos[5],
                                  kSqrt2* kCos[6],
                                  kSqrt2* kCos[7]};
constexpr double kFourPointFactor[8] = {
    1.0, kSqrt2* kCos[1] * kCos[2], kCos[2], kSqrt2* kCos[3] * kCos[2], 0, 0, 0, 0};

// The symbols of an Annex K AC table are every run/size pair in an order of its own; a DC table's are
// its categories.
template <size_t N>
constexpr HuffmanSpec spec(const uint8_t (&counts)[16], const uint8_t (&symbols)[N]) {
  HuffmanSpec table{};
  for (size_t i = 0; i < 16; ++i) table.counts[i + 1] = counts[i];
  for (size_t i = 0; i < N; ++i) table.symbols[i] = symbols[i];
  return table;
}

constexpr uint8_t kDcSymbols[12] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11};

constexpr uint8_t kAcLuminanceSymbols[162] = {
    0x01, 0x02, 0x03, 0x00, 0x04, 0x11, 0x05, 0x12, 0x21, 0x31, 0x41, 0x06, 0x13, 0x51, 0x61, 0x07, 0x22,
    0x71, 0x14, 0x32, 0x81, 0x91, 0xA1, 0x08, 0x23, 0x42, 0xB1, 0xC1, 0x15, 0x52, 0xD1, 0xF0, 0x24, 0x33,
    0x62, 0x72, 0x82, 0x09, 0x0A, 0x16, 0x17, 0x18, 0x19, 0x1A, 0x25, 0x26, 0x27, 0x28, 0x29, 0x2A, 0x34,
    0x35, 0x36, 0x37, 0x38, 0x39, 0x3A, 0x43, 0x44, 0x45, 0x46, 0x47, 0x48, 0x49, 0x4A, 0x53, 0x54, 0x55,
    0x56, 0x57, 0x58, 0x59, 0x5A, 0x63, 0x64, 0x65, 0x66, 0x67, 0x68, 0x69, 0x6A, 0x73, 0x74, 0x75, 0x76,
    0x77, 0x78, 0x79, 0x7A, 0x83, 0x84, 0x85, 0x86, 0x87, 0x88, 0x89, 0x8A, 0x92, 0x93, 0x94, 0x95, 0x96,
    0x97, 0x98, 0x99, 0x9A, 0xA2, 0xA3, 0xA4, 0xA5, 0xA6, 0xA7, 0xA8, 0xA9, 0xAA, 0xB2, 0xB3, 0xB4, 0xB5,
    0xB6, 0xB7, 0xB8, 0xB9, 0xBA, 0xC2, 0xC3, 0xC4, 0xC5, 0xC6, 0xC7, 0xC8, 0xC9, 0xCA, 0xD2, 0xD3, 0xD4,
    0xD5, 0xD6, 0xD7, 0xD8, 0xD9, 0xDA, 0xE1, 0xE2, 0xE3, 0xE4, 0xE5, 0xE6, 0xE7, 0xE8, 0xE9, 0xEA, 0xF1,
    0xF2, 0xF3, 0xF4, 0xF5, 0xF6, 0xF7, 0xF8, 0xF9, 0xFA};

constexpr uint8_t kAcChrominanceSymbols[162] = {
    0x00, 0x01, 0x02, 0x03, 0x11, 0x04, 0x05, 0x21, 0x31, 0x06, 0x12, 0x41, 0x51, 0x07, 0x61, 0x71, 0x13,
    0x22, 0x32, 0x81, 0x08, 0x14, 0x42, 0x91, 0xA1, 0xB1, 0xC1, 0x09, 0x23, 0x33, 0x52, 0xF0, 0x15, 0x62,
    0x72, 0xD1, 0x0A, 0x16, 0x24, 0x34, 0xE1, 0x25, 0xF1, 0x17, 0x18, 0x19, 0x1A, 0x26, 0x27, 0x28, 0x29,
    0x2A, 0x35, 0x36, 0x37, 0x38, 0x39, 0x3A, 0x43, 0x44, 0x45, 0x46, 0x47, 0x48, 0x49, 0x4A, 0x53, 0x54,
    0x55, 0x56, 0x57, 0x58, 0x59, 0x5A, 0x63, 0x64, 0x65, 0x66, 0x67, 0x68, 0x69, 0x6A, 0x73, 0x74, 0x75,
    0x76, 0x77, 0x78, 0x79, 0x7A, 0x82, 0x83, 0x84, 0x85, 0x86, 0x87, 0x88, 0x89, 0x8A, 0x92, 0x93, 0x94,
    0x95, 0x96, 0x97, 0x98, 0x99, 0x9A, 0xA2, 0xA3, 0xA4, 0xA5, 0xA6, 0xA7, 0xA8, 0xA9, 0xAA, 0xB2, 0xB3,
    0xB4, 0xB5, 0xB6, 0xB7, 0xB8, 0xB9, 0xBA, 0xC2, 0xC3, 0xC4, 0xC5, 0xC6, 0xC7, 0xC8, 0xC9, 0xCA, 0xD2,
    0xD3, 0xD4, 0xD5, 0xD6, 0xD7, 0xD8, 0xD9, 0xDA, 0xE2, 0xE3, 0xE4, 0xE5, 0xE6, 0xE7, 0xE8, 0xE9, 0xEA,
    0xF2, 0xF3, 0xF4, 0xF5, 0xF6, 0xF7, 0xF8, 0xF9, 0xFA};

constexpr ZigzagBits zigzag_bits() {
  ZigzagBits table{};
  for (uint32_t k = 0; k < 64; ++k) {
    const uint32_t natural = PELOJ_NATURAL_ORDER[k];
    for (uint32_t set = 0; set < 16; ++set) {
      if ((set >> (natural % 4) & 1) != 0) table[natural / 4][set] |= uint64_t{1} << k;
    }
  }
  return table;
}

constexpr auto kAan = outer_product(kAanFactor);
constexpr auto kFour = outer_product(kFourPointFactor);
static_assert(kAan[1] == 22725 && kAan[7] == 4520 && kAan[9] == 31521);
static_assert(kFour[1] == 20995 && kFour[3] == 17799 && kFour[9] == 26905 && kFour[27] == 19336);

}  // namespace

const std::array<uint16_t, 64> kAanScale = kAan;
const std::array<uint16_t, 64> kFourPointScale = kFour;

constexpr ZigzagBits kZigzagBits = zigzag_bits();

const std::array<uint8_t, 64> kLuminanceQuant = {
    16, 11, 10, 16, 24,  40,  51,  61,  12, 12, 14, 19, 26,  58,  60,  55,  //
    14, 13, 16, 24, 40,  57,  69,  56,  14, 17, 22, 29, 51,  87,  80,  62,  //
    18, 22, 37, 56, 68,  109, 103, 77,  24, 35, 55, 64, 81,  104, 113, 92,  //
    49, 64, 78, 87, 103, 121, 120, 101, 72, 92, 95, 98, 112, 100, 103, 99};

const std::array<uint8_t, 64> kChrominanceQuant = {
    17, 18, 24, 47, 99, 99, 99, 99, 18, 21, 26, 66, 99, 99, 99, 99,  //
    24, 26, 56, 99, 99, 99, 99, 99, 47, 66, 99, 99, 99, 99, 99, 99,  //
    99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99,  //
    99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99, 99};

const HuffmanSpec kDcLuminance = spec({0, 1, 5, 1, 1, 1, 1, 1, 1, 0, 0, 0, 0, 0, 0, 0}, kDcSymbols);
const HuffmanSpec kDcChrominance = spec({0, 3, 1, 1, 1, 1, 1, 1, 1, 1, 1, 0, 0, 0, 0, 0}, kDcSymbols);
const HuffmanSpec kAcLuminance =
    spec({0, 2, 1, 3, 3, 2, 4, 3, 5, 5, 4, 4, 0, 0, 1, 0x7D}, kAcLuminanceSymbols);
const HuffmanSpec kAcChrominance =
    spec({0, 2, 1, 2, 4, 4, 3, 4, 7, 5, 4, 4, 0, 1, 2, 0x77}, kAcChrominanceSymbols);

}  // namespace pelo::jpeg
