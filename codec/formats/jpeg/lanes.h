// Vectors of eight: the rows or columns of a block, a lane each. Plain compiler vectors, which become
// whatever the target has.
#pragma once

#include <cstdint>
#include <cstring>

namespace pelo::jpeg {

typedef int32_t Lanes __attribute__((vector_size(32)));
typedef int16_t ShortLanes __attribute__((vector_size(16)));
typedef uint8_t ByteLanes __attribute__((vector_size(8)));

inline Lanes load_lanes(const int32_t* p) {
  Lanes lanes;
  std::memcpy(&lanes, p, sizeof lanes);
  return lanes;
}

// Three rounds of interleaving row i with row i + 4 exchange rows and columns.
template <class Vector>
inline void transpose(Vector (&m)[8]) {
  for (int round = 0; round < 3; ++round) {
    Vector t[8];
    for (int i = 0; i < 4; ++i) {
      t[2 * i] = __builtin_shufflevector(m[i], m[i + 4], 0, 8, 1, 9, 2, 10, 3, 11);
      t[2 * i + 1] = __builtin_shufflevector(m[i], m[i + 4], 4, 12, 5, 13, 6, 14, 7, 15);
    }
    for (int i = 0; i < 8; ++i) m[i] = t[i];
  }
}

}  // namespace pelo::jpeg
