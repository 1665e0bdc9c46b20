// The 8x8 inverse transforms: the whole one and those for sparse blocks.
#include <cstring>

#include "codec/jpeg/decoder/idct.h"
#include "codec/jpeg/decoder/idct_math.h"

namespace pelo::jpeg {
namespace {

// Eight lanes: the columns of pass 1, then the rows of pass 2.
typedef int32_t Lanes __attribute__((vector_size(32)));

inline Lanes load_lanes(const int32_t* p) {
  Lanes lanes;
  std::memcpy(&lanes, p, sizeof lanes);
  return lanes;
}

inline void transpose(Lanes (&m)[8]) {
  Lanes a[8], b[8];
  for (int i = 0; i < 4; ++i) {
    a[2 * i] = __builtin_shuffle(m[i], m[i + 4], Lanes{0, 8, 1, 9, 2, 10, 3, 11});
    a[2 * i + 1] = __builtin_shuffle(m[i], m[i + 4], Lanes{4, 12, 5, 13, 6, 14, 7, 15});
  }
  for (int i = 0; i < 4; ++i) {
    b[2 * i] = __builtin_shuffle(a[i], a[i + 4], Lanes{0, 8, 1, 9, 2, 10, 3, 11});
    b[2 * i + 1] = __builtin_shuffle(a[i], a[i + 4], Lanes{4, 12, 5, 13, 6, 14, 7, 15});
  }
  for (int i = 0; i < 4; ++i) {
    m[2 * i] = __builtin_shuffle(b[i], b[i + 4], Lanes{0, 8, 1, 9, 2, 10, 3, 11});
    m[2 * i + 1] = __builtin_shuffle(b[i], b[i + 4], Lanes{4, 12, 5, 13, 6, 14, 7, 15});
  }
}

// Dequantises eight rows in 32 bits. False when a product or a result leaves the range in which that is
// exact; no real picture does. |coefficient| < 1024 times the largest multiplier (255 x 31521 >> 2) stays
// below 2^31.
inline bool dequantise_lanes(const int32_t* multiplier, const int32_t* block, Lanes (&x)[8]) {
  Lanes coefficients{};
  Lanes results{};
  for (int r = 0; r < 8; ++r) {
    const Lanes c = load_lanes(block + 8 * r);
    coefficients |= c ^ (c >> 31);
    x[r] = c;
  }
  int32_t magnitude = 0;
  for (int i = 0; i < 8; ++i) magnitude |= coefficients[i];
  if (magnitude >= 1024) return false;
  for (int r = 0; r < 8; ++r) {
    x[r] = x[r] * load_lanes(multiplier + 8 * r) >> 10;
    results |= x[r] ^ (x[r] >> 31);
  }
  magnitude = 0;
  for (int i = 0; i < 8; ++i) magnitude |= results[i];
  return magnitude < kDequantisedMax;
}

inline void store_samples(const Lanes (&x)[8], uint8_t* const* rows, int column) {
  for (int r = 0; r < 8; ++r) {
    uint8_t* out = rows[r] + column;
    for (int i = 0; i < 8; ++i) out[i] = to_sample(x[r][i]);
  }
}

void transform_8x8(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  Lanes x[8];
  if (!dequantise_lanes(multiplier, block, x)) {
    for (int i = 0; i < 64; ++i) x[i / 8][i % 8] = dequantise(block[i], multiplier[i]);
  }
  butterfly8(x);
  transpose(x);
  butterfly8(x);
  transpose(x);
  store_samples(x, rows, column);
}

inline void fill_rows(uint8_t sample, uint8_t* const* rows, int column) {
  for (int r = 0; r < 8; ++r) std::memset(rows[r] + column, sample, 8);
}

// Reads the first Rows x Columns coefficients. The 1-D transform of up to three inputs is the folded one.
template <int Rows, int Columns>
void transform_sparse(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  int32_t work[8][8];  // by column, then row
  for (int c = 0; c < Columns; ++c) {
    int32_t x[8] = {};
    for (int r = 0; r < Rows; ++r) x[r] = dequantise(block[8 * r + c], multiplier[8 * r + c]);
    if constexpr (Rows > 3) {
      butterfly8(x);
    } else if constexpr (Rows > 1) {
      butterfly3(x);
    } else {
      for (int32_t& value : x) value = x[0];
    }
    for (int r = 0; r < 8; ++r) work[c][r] = x[r];
  }
  for (int r = 0; r < 8; ++r) {
    if constexpr (Columns == 1) {
      std::memset(rows[r] + column, to_sample(work[0][r]), 8);
    } else {
      int32_t x[8] = {};
      for (int c = 0; c < Columns; ++c) x[c] = work[c][r];
      if constexpr (Columns > 3) {
        butterfly8(x);
      } else {
        butterfly3(x);
      }
      for (int i = 0; i < 8; ++i) rows[r][column + i] = to_sample(x[i]);
    }
  }
}

// One row of samples for every output row: there is no vertical detail.
void transform_row(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  int32_t x[8] = {dequantise(block[0], multiplier[0]), dequantise(block[1], multiplier[1])};
  butterfly3(x);
  uint8_t samples[8];
  for (int i = 0; i < 8; ++i) samples[i] = to_sample(x[i]);
  for (int r = 0; r < 8; ++r) std::memcpy(rows[r] + column, samples, 8);
}

}  // namespace

uint8_t idct_dc(int32_t multiplier, int32_t dc) { return to_sample(dequantise(dc, multiplier)); }

InverseDct idct_full(int lastPosition) {
  if (lastPosition == 0) return PELOJ_DoIdct1By1;
  if (lastPosition == 1) return PELOJ_DoIdct2By1;
  if (lastPosition <= 3) return PELOJ_DoIdct2By2;
  if (lastPosition <= 8) return PELOJ_DoIdct3By3;
  if (lastPosition <= 13) return PELOJ_DoIdct4By4;
  return PELOJ_DoIdct8By8;
}

}  // namespace pelo::jpeg

using namespace pelo::jpeg;

void PELOJ_DoIdct8By8(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  transform_8x8(multiplier, block, rows, column);
}
void PELOJ_DoIdct(const uint8_t*, const int32_t* multiplier, const int32_t* block, uint8_t* const* rows,
                  int column) {
  transform_8x8(multiplier, block, rows, column);
}
void PELOJ_DoIdct4By4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  transform_sparse<4, 4>(multiplier, block, rows, column);
}
void PELOJ_DoIdct3By3(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  transform_sparse<3, 3>(multiplier, block, rows, column);
}
void PELOJ_DoIdct2By2All(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                         uint8_t* const* rows, int column) {
  transform_sparse<2, 2>(multiplier, block, rows, column);
}
void PELOJ_DoIdct1By2(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  transform_sparse<2, 1>(multiplier, block, rows, column);
}
void PELOJ_DoIdct2By2(const uint8_t* range, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  const bool noHorizontal = block[1] == 0 && block[9] == 0;
  (noHorizontal ? PELOJ_DoIdct1By2 : PELOJ_DoIdct2By2All)(range, multiplier, block, rows, column);
}
void PELOJ_DoIdct2By1(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  transform_row(multiplier, block, rows, column);
}
void PELOJ_DoIdct1By1(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                      uint8_t* const* rows, int column) {
  fill_rows(idct_dc(multiplier[0], block[0]), rows, column);
}
