// The inverse DCT family: fixed-point transforms of one block at each output size, with members for
// sparse blocks. All are built on the scaled 8-point transform of Arai, Agui and Nakajima or, at scale
// 1/2, on a 4-point one; dequantisation is part of the multiplier table.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>

namespace pelo::jpeg {

// multiplier: 64 factors, natural order. block: 64 coefficients, natural order, not dequantised. rows,
// column: where the samples go, one pointer for each output row of the block.
using InverseDct = void (*)(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows,
                            int column);

// 8x8 samples of the first Columns x Rows coefficients: 8x8, 4x4, 3x3, 2x2, 2x1, 1x2, 1x1.
template <int Columns, int Rows>
void idct8(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column);

// 4x4 samples from the 4-point transform (scale 1/2): 4x4, 3x3, 2x2, 2x1, 1x2, 1x1.
template <int Columns, int Rows>
void idct4(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column);

// The member of two columns unless they have no horizontal detail.
template <InverseDct OneColumn, InverseDct TwoColumns>
void idct_corner(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column) {
  const bool flatRows = block[1] == 0 && block[9] == 0;
  (flatRows ? OneColumn : TwoColumns)(multiplier, block, rows, column);
}
constexpr InverseDct idct8_corner = idct_corner<idct8<1, 2>, idct8<2, 2>>;
constexpr InverseDct idct4_corner = idct_corner<idct4<1, 2>, idct4<2, 2>>;

// 4x4, 3x3 and 2x2 samples: means or picks of the 8-point transform's outputs.
void idct_reduced4(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column);
void idct_reduced3(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column);
void idct_reduced2(const int32_t* multiplier, const int32_t* block, uint8_t* const* rows, int column);

// The single sample of a block at scale 1/8.
uint8_t idct_dc(int32_t multiplier, int32_t dc);

// Members by the zig-zag position of a block's last non-zero coefficient.
using IdctTable = std::array<InverseDct, 64>;
extern const IdctTable kFullIdct;
extern const IdctTable kHalfIdct;

// `last`: the greatest position that a member serves, ascending.
struct IdctMember {
  size_t last;
  InverseDct transform;
};
template <size_t N>
constexpr IdctTable idct_table(const IdctMember (&members)[N]) {
  IdctTable table{};
  size_t position = 0;
  for (const IdctMember& member : members) {
    while (position <= member.last) table[position++] = member.transform;
  }
  return table;
}

}  // namespace pelo::jpeg
