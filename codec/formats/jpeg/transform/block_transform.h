// Turning and mirroring blocks of coefficients: mirroring changes the sign of the odd frequencies along
// its direction, turning exchanges the directions.
#pragma once

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {

struct McuGrid;

using BlockTransform = void (*)(const CoefficientBlock* in, CoefficientBlock* out);

// A clockwise turn by an angle after an optional mirroring from left to right, as what it does to the
// picture: rows upside down, columns left to right, then rows and columns exchanged.
struct Operation {
  int angle;
  bool flip;
  bool mirrorsRows, mirrorsColumns, transposes;
  BlockTransform block;
};

// The operation of an angle; null for one that is none.
const Operation* find_operation(int angle, bool flip);

// Transforms the blocks of one MCU and puts each in its new place.
void transform_mcu(const Operation& operation, const McuGrid& grid, const CoefficientBlock* in,
                   CoefficientBlock* out);

// One block; `in` and `out` are different. ro90_f and ro270_f are the turns with mirroring.
void flip_across(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);
void flip_down(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);
void rotate_block_90(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);
void rotate_block_180(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);
void rotate_block_270(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);
void rotate_block_90_flipped(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);
void rotate_block_270_flipped(const pelo::jpeg::CoefficientBlock* in, pelo::jpeg::CoefficientBlock* out);

}  // namespace pelo::jpeg
