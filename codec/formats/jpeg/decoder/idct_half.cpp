// Scale 1/2: 4x4 samples from a 4-point transform of the first four rows and columns.
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

// Positions 3, 6, 9, 11 and 13 are read by a larger member only (see kFullIdct).
constinit const IdctTable kHalfIdct = idct_table(
    {{0, idct4<1, 1>}, {1, idct4<2, 1>}, {3, idct4_corner}, {13, idct4<3, 3>}, {63, idct4<4, 4>}});

}  // namespace pelo::jpeg
