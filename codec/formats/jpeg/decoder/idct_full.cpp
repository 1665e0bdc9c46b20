// The 8x8 inverse transforms: the whole one and those for sparse blocks.
#include <cstring>

#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/idct_math.h"
#include "codec/formats/jpeg/lanes.h"

namespace pelo::jpeg {
namespace {

inline int32_t any_bit(const Lanes& lanes) {
  int32_t bits = 0;
  for (int i = 0; i < 8; ++i) bits |= lanes[i];
  return bits;
}

// Dequantises the first N rows and columns, the others are zero, in 32 bits. False when a product or a
// result leaves the range in which that is exact; no real picture does. A |coefficient| below 1024 times
// the largest multiplier (255 x 31521 >> 2) stays below 2^31.
template <int N>
inline bool dequantise_lanes(const int32_t* multiplier, const int32_t* block, Lanes (&x)[8]) {
  constexpr Lanes kColumns{-1, -(N > 1), -(N > 2), -(N > 3), -(N > 4), -(N > 5), -(N > 6), -(N > 7)};
  Lanes magnitude{};
  for (int r = 0; r < N; ++r) {
    x[r] = load_lanes(block + 8 * r) & kColumns;
    magnitude |= x[r] ^ (x[r] >> 31);
  }
  if (any_bit(magnitude) >= 1024) return false;
  magnitude = Lanes{};
  for (int r = 0; r < N; ++r) {
    x[r] = x[r] * load_lanes(multiplier + 8 * r) >> 10;
    magnitude |= x[r] ^ (x[r] >> 31);
  }
  return any_bit(magnitude) < kDequantisedMax;
}

// The one-dimensional transform of N inputs; up to three take the folded form.
template <int N>
inline void transform_lanes(Lanes (&x)[8]) {
  for (int i = N; i < 8; ++i) x[i] = Lanes{};
  if constexpr (N > 3) {
    butterfly8(x);
  } else {
    butterfly3(x);
  }
}

inline void store_samples(const Lanes (&x)[8], uint8_t* const* rows, int column) {
  ShortLanes samples[8];
  for (int i = 0; i < 8; ++i) {
    Lanes v = (x[i] >> 5) + 128;
    v &= ~(v >> 31);                 // below 0
    v |= (Lanes{} + 255 - v) >> 31;  // above 255: all bits of the byte
    samples[i] = __builtin_convertvector(v & 255, ShortLanes);
  }
  transpose(samples);
  for (int r = 0; r < 8; ++r) {
    const ByteLanes bytes = __builtin_convertvector(samples[r], ByteLanes);
    std::memcpy(rows[r] + column, &bytes, sizeof bytes);
  }
}

// Reads the first N x N coefficients.
template <int N>
void transform_square(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows,
                      int column) {
  Lanes x[8];
  if (!dequantise_lanes<N>(multiplier, block, x)) {
    for (int r = 0; r < N; ++r) {
      x[r] = Lanes{};
      for (int c = 0; c < N; ++c) x[r][c] = dequantise(block[8 * r + c], multiplier[8 * r + c]);
    }
  }
  transform_lanes<N>(x);
  transpose(x);
  transform_lanes<N>(x);
  store_samples(x, rows, column);
}

// Rows that are flat each: there is no horizontal detail.
void transform_column(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows,
                      int column) {
  int32_t x[8] = {dequantise(block[0], multiplier[0]), dequantise(block[8], multiplier[8])};
  butterfly3(x);
  for (int r = 0; r < 8; ++r) std::memset(rows[r] + column, to_sample(x[r]), 8);
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

uint8_t idct_dc(int32_t multiplier, int32_t dc) {
  return to_sample(dequantise(dc, multiplier));
}

template <int Columns, int Rows>
void idct8(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  if constexpr (Columns > 1 && Rows > 1) {
    static_assert(Columns == Rows);
    transform_square<Rows>(multiplier, block, rows, column);
  } else if constexpr (Rows > 1) {
    transform_column(multiplier, block, rows, column);
  } else if constexpr (Columns > 1) {
    transform_row(multiplier, block, rows, column);
  } else {
    const uint8_t sample = idct_dc(multiplier[0], block[0]);
    for (int r = 0; r < 8; ++r) std::memset(rows[r] + column, sample, 8);
  }
}

template void idct8<8, 8>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct8<4, 4>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct8<3, 3>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct8<2, 2>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct8<2, 1>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct8<1, 2>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct8<1, 1>(const int32_t*, const int32_t*, uint8_t* const*, int);

// One coefficient of a square member's share lies outside its square and is left out: position 3 (row 2,
// column 0) of 2x2, 6 (row 0, column 3) of 3x3 and 10 (row 4, column 0) of 4x4.
constinit const IdctTable kFullIdct = idct_table({{0, idct8<1, 1>},
                                                  {1, idct8<2, 1>},
                                                  {3, idct8_corner},
                                                  {8, idct8<3, 3>},
                                                  {13, idct8<4, 4>},
                                                  {63, idct8<8, 8>}});

}  // namespace pelo::jpeg
