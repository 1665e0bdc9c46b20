// Scale 1/2: 4x4 samples from a 4-point transform of the first four rows and columns.
#include <cstring>

#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/decoder/idct_math.h"

namespace pelo::jpeg {
namespace {

// tan(pi/8), 8 fraction bits.
constexpr int32_t kTan = 106;

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

template <int Rows, int Columns>
void transform_half(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
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

}  // namespace

InverseDct idct_half(int lastPosition) {
  if (lastPosition == 0) return PELOJ_DoIdct1x1For4x4;
  if (lastPosition == 1) return PELOJ_DoIdct2x1For4x4;
  if (lastPosition <= 3) return PELOJ_DoIdct2x2For4x4;
  if (lastPosition <= 13) return PELOJ_DoIdct3x3For4x4;
  return PELOJ_DoIdct4x4For4x4;
}

}  // namespace pelo::jpeg

using namespace pelo::jpeg;

void PELOJ_DoIdct4x4For4x4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                           uint8_t* const* rows, int column) {
  transform_half<4, 4>(multiplier, block, rows, column);
}
void PELOJ_DoIdct3x3For4x4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                           uint8_t* const* rows, int column) {
  transform_half<3, 3>(multiplier, block, rows, column);
}
void PELOJ_DoIdct2x2AllFor4x4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                              uint8_t* const* rows, int column) {
  transform_half<2, 2>(multiplier, block, rows, column);
}
void PELOJ_DoIdct2x1For4x4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                           uint8_t* const* rows, int column) {
  transform_half<1, 2>(multiplier, block, rows, column);
}
void PELOJ_DoIdct1x2For4x4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                           uint8_t* const* rows, int column) {
  transform_half<2, 1>(multiplier, block, rows, column);
}
void PELOJ_DoIdct2x2For4x4(const uint8_t* range, const int32_t* multiplier, const int32_t* block,
                           uint8_t* const* rows, int column) {
  const bool noHorizontal = block[1] == 0 && block[9] == 0;
  (noHorizontal ? PELOJ_DoIdct1x2For4x4 : PELOJ_DoIdct2x2AllFor4x4)(range, multiplier, block, rows,
                                                                    column);
}
void PELOJ_DoIdct1x1For4x4(const uint8_t*, const int32_t* multiplier, const int32_t* block,
                           uint8_t* const* rows, int column) {
  const uint8_t sample = idct_dc(multiplier[0], block[0]);
  for (int r = 0; r < 4; ++r) std::memset(rows[r] + column, sample, 4);
}
