// The inverse transforms below full size: 4x4 samples from a 4-point transform of the first four rows
// and columns (scale 1/2), and reduced outputs of the 8-point one.
#include <cstring>

#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/idct_math.h"

namespace pelo::jpeg {
namespace {

// tan(pi/8), 8 fraction bits.
constexpr int32_t kTan = 106;

// In place. An output is at most 3.415 times the largest input: three of them and one by 106/256, less
// than one for the rounding aside. Inputs are dequantised (at most 2^16), so that the first pass stays
// below 3.42 * 2^16, its products with kTan in the second below 3.42 * 2^16 * 106 = 2^24.6, and the
// results below 3.42^2 * 2^16 = 2^19.6.
inline void transform4(int32_t (&x)[4]) {
  const int32_t t1 = scaled(x[1], kTan);
  const int32_t t3 = scaled(x[3], kTan);
  const int32_t y0 = x[0] + x[1] + x[2] + t3;
  const int32_t y1 = x[0] + t1 - x[2] - x[3];
  const int32_t y2 = x[0] - t1 - x[2] + x[3];
  const int32_t y3 = x[0] - x[1] + x[2] - t3;
  x[0] = y0;
  x[1] = y1;
  x[2] = y2;
  x[3] = y3;
}

// Reduced outputs of the 8-point transform: each keeps or averages some of the eight results. Column
// results stay at full precision; only row results become samples.
//
// Why hostile coefficients do not overflow: a column's inputs are dequantised, at most D = 2^16. With
// the constants written out, the odd part's b is 0.85 d1 - 0.24 d3, its c 0.57 d1 - 1.18 d3, and no
// output of a column is more than the sum of its four inputs, 4 D. In a row the largest product is then
// 473 times a difference of two such, 473 * 8 D = 2^27.9; sums of its terms stay below 64 D = 2^22.

inline uint8_t mean(int32_t a, int32_t b) {
  return static_cast<uint8_t>((to_sample(a) + to_sample(b)) >> 1);
}

// The odd part of inputs 1 and 3.
struct OddPart {
  int32_t q, a, b, c;
};
inline OddPart odd_part(int32_t d1, int32_t d3) {
  const int32_t p = d1 - d3;
  OddPart odd;
  odd.q = d1 + d3;
  odd.a = scaled(p, 473);
  odd.b = scaled(d3, 669) - odd.q + odd.a;
  odd.c = scaled(p, 362) - odd.b;
  return odd;
}

inline void column_2to1(const int32_t (&d)[4], int32_t (&y)[4]) {
  const OddPart odd = odd_part(d[1], d[3]);
  y[0] = d[0] + d[2] + odd.q;
  y[1] = d[0] + d[2] - scaled(d[2], 362) + odd.c;
  y[2] = d[0] - d[2] + scaled(d[1], 277) - odd.a + odd.c;
  y[3] = d[0] + scaled(d[2], 362) - d[2] - odd.b;
}

inline void row_2to1(const int32_t (&x)[4], uint8_t* out) {
  const OddPart odd = odd_part(x[1], x[3]);
  const int32_t e0 = x[0] + x[2];
  const int32_t e1 = x[0] + scaled(x[2], 362) - x[2];
  const int32_t e2 = x[0] - scaled(x[2], 362) + x[2];
  const int32_t e3 = x[0] - x[2];
  const int32_t o4 = scaled(x[1], 277) - odd.a + odd.c;
  out[0] = mean(e0 + odd.q, e1 + odd.b);
  out[1] = mean(e2 + odd.c, e3 - o4);
  out[2] = mean(e3 + o4, e2 - odd.c);
  out[3] = mean(e1 - odd.b, e0 - odd.q);
}

inline void column_8to3(const int32_t (&d)[4], int32_t (&y)[3]) {
  const OddPart odd = odd_part(d[1], d[3]);
  y[0] = odd.q + d[0] + d[2];
  y[1] = scaled(d[1] - d[3], 362) + scaled(d[1], 277) - odd.a - odd.b + (d[0] - d[2]);
  y[2] = d[0] - d[2] - odd.b + scaled(d[2], 362);
}

inline void row_8to3(int32_t r0, int32_t r1, int32_t r2, uint8_t* out) {
  const int32_t s = r0 + r2;
  const int32_t u = r0 - r2 + scaled(r2, 362);
  const int32_t w = scaled(r1, 473) - r1;
  out[0] = mean(u + w, s + r1);
  out[1] = to_sample(r0 - r2);
  out[2] = mean(s - r1, u - w);
}

inline int32_t p_4to1(int32_t x) {
  return scaled(x, 473) - x;
}
inline int32_t q_4to1(int32_t x) {
  return scaled(x, 362) + x - scaled(x, 473);
}

inline void row_4to1(int32_t a, int32_t b, uint8_t* out) {
  out[0] = mean(a - scaled(b, 277) + scaled(b, 473) - q_4to1(b), a + p_4to1(b));
  out[1] = mean(a - q_4to1(b), a - b);
}

}  // namespace

template <int Columns, int Rows>
void idct4(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  if constexpr (Columns == 1 && Rows == 1) {
    const uint8_t sample = idct_dc(multiplier[0], block[0]);
    for (int r = 0; r < 4; ++r) std::memset(rows[r] + column, sample, 4);
    return;
  }
  int32_t work[4][4] = {};  // by column, then row; unread columns stay zero
  for (int c = 0; c < Columns; ++c) {
    for (int r = 0; r < Rows; ++r) work[c][r] = dequantise(block[8 * r + c], multiplier[8 * r + c]);
    transform4(work[c]);
  }
  for (int r = 0; r < 4; ++r) {
    int32_t x[4] = {work[0][r], work[1][r], work[2][r], work[3][r]};
    transform4(x);
    for (int i = 0; i < 4; ++i) rows[r][column + i] = to_sample(x[i]);
  }
}

template void idct4<4, 4>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct4<3, 3>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct4<2, 2>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct4<2, 1>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct4<1, 2>(const int32_t*, const int32_t*, uint8_t* const*, int);
template void idct4<1, 1>(const int32_t*, const int32_t*, uint8_t* const*, int);

// Here 3x3 serves up to the same position as 4x4 at full size, and leaves out 6, 9, 11 and 13.
constinit const IdctTable kHalfIdct = idct_table(
    {{0, idct4<1, 1>}, {1, idct4<2, 1>}, {3, idct4_corner}, {13, idct4<3, 3>}, {63, idct4<4, 4>}});

void idct_reduced4(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  int32_t work[4][4];
  for (int c = 0; c < 4; ++c) {
    int32_t d[4];
    for (int r = 0; r < 4; ++r) d[r] = dequantise(block[8 * r + c], multiplier[8 * r + c]);
    column_2to1(d, work[c]);
  }
  for (int r = 0; r < 4; ++r) {
    row_2to1({work[0][r], work[1][r], work[2][r], work[3][r]}, rows[r] + column);
  }
}

void idct_reduced3(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  int32_t work[3][3];
  for (int c = 0; c < 3; ++c) {
    int32_t d[4];
    for (int r = 0; r < 4; ++r) d[r] = dequantise(block[8 * r + c], multiplier[8 * r + c]);
    column_8to3(d, work[c]);
  }
  for (int r = 0; r < 3; ++r) row_8to3(work[0][r], work[1][r], work[2][r], rows[r] + column);
}

void idct_reduced2(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  int32_t top[2], bottom[2];
  for (int c = 0; c < 2; ++c) {
    const int32_t d0 = dequantise(block[c], multiplier[c]);
    const int32_t d1 = dequantise(block[8 + c], multiplier[8 + c]);
    top[c] = d0 + p_4to1(d1);
    bottom[c] = d0 - q_4to1(d1);
  }
  row_4to1(top[0], top[1], rows[0] + column);
  row_4to1(bottom[0], bottom[1], rows[1] + column);
}

}  // namespace pelo::jpeg
