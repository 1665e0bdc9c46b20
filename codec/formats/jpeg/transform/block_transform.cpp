#include "codec/formats/jpeg/transform/block_transform.h"

#include "codec/formats/jpeg/transform/coefficient_source.h"

namespace pelo::jpeg {
namespace {

// Written through unsigned arithmetic: a hostile coefficient may be the least integer.
constexpr int32_t signed_by(int32_t value, bool negate) {
  return negate ? static_cast<int32_t>(0u - static_cast<uint32_t>(value)) : value;
}

template <bool MirrorsRows, bool MirrorsColumns, bool Transposes>
void transform_block(const CoefficientBlock* __restrict in, CoefficientBlock* __restrict out) {
  for (size_t r = 0; r < 8; ++r) {
    for (size_t c = 0; c < 8; ++c) {
      const bool negate = (MirrorsRows && r % 2 != 0) != (MirrorsColumns && c % 2 != 0);
      (*out)[Transposes ? 8 * c + r : 8 * r + c] = signed_by((*in)[8 * r + c], negate);
    }
  }
}

constexpr Operation kOperations[] = {{0, true, false, true, false, flip_across},
                                     {180, true, true, false, false, flip_down},
                                     {180, false, true, true, false, rotate_block_180},
                                     {90, false, true, false, true, rotate_block_90},
                                     {90, true, true, true, true, rotate_block_90_flipped},
                                     {270, false, false, true, true, rotate_block_270},
                                     {270, true, false, false, true, rotate_block_270_flipped}};

}  // namespace

const Operation* find_operation(int angle, bool flip) {
  for (const Operation& operation : kOperations) {
    if (operation.angle == angle && operation.flip == flip) return &operation;
  }
  return nullptr;
}

void transform_mcu(const Operation& operation, const McuGrid& grid, const CoefficientBlock* in,
                   CoefficientBlock* out) {
  for (size_t component = 0; component < static_cast<size_t>(grid.componentCount); ++component) {
    const int h = grid.h[component], v = grid.v[component];
    for (int i = 0; i < v; ++i) {
      for (int j = 0; j < h; ++j, ++in) {
        const int row = operation.mirrorsRows ? v - 1 - i : i;
        const int column = operation.mirrorsColumns ? h - 1 - j : j;
        operation.block(in, out + (operation.transposes ? column * v + row : row * h + column));
      }
    }
    out += h * v;
  }
}

void flip_across(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<false, true, false>(in, out);
}
void flip_down(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<true, false, false>(in, out);
}
void rotate_block_180(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<true, true, false>(in, out);
}
void rotate_block_90(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<true, false, true>(in, out);
}
void rotate_block_270(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<false, true, true>(in, out);
}
void rotate_block_90_flipped(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<true, true, true>(in, out);
}
void rotate_block_270_flipped(const CoefficientBlock* in, CoefficientBlock* out) {
  transform_block<false, false, true>(in, out);
}

}  // namespace pelo::jpeg
