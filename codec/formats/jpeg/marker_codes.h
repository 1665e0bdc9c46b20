// JPEG marker codes (ITU-T T.81 Table B.1), the byte behind 0xFF.
#pragma once

#include <cstdint>

namespace pelo::jpeg {

enum class Marker : uint8_t {
  kSof0 = 0xC0,  // baseline frame
  kSof2 = 0xC2,  // progressive frame
  kDht = 0xC4,
  kRst0 = 0xD0,  // to 0xD7
  kSoi = 0xD8,
  kEoi = 0xD9,
  kSos = 0xDA,
  kDqt = 0xDB,
  kDnl = 0xDC,
  kDri = 0xDD,
  kApp0 = 0xE0,
  kApp1 = 0xE1,
  kApp13 = 0xED,
  kApp14 = 0xEE,
  kApp15 = 0xEF,
  kCom = 0xFE
};

// RSTn of a number counted modulo eight.
constexpr uint8_t restart_code(int n) {
  return static_cast<uint8_t>(static_cast<int>(Marker::kRst0) + (n & 7));
}

}  // namespace pelo::jpeg
