// One MCU row: samples in, blocks transformed and completed by dummies, MCUs coded.
#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

// A block outside the image: no detail, and the DC of a neighbour, which costs the fewest bits.
void make_dummy(CoefficientBlock& block, const CoefficientBlock& neighbour) {
  const int32_t dc = neighbour[0];
  block = {};
  block[0] = dc;
}

// The blocks of one component in the MCU at column `mcu` of the current row. Returns the next free
// block.
CoefficientBlock* make_blocks(ELO_ENCODER& encoder, EncoderComponent& component, int mcu,
                              CoefficientBlock* out) {
  const QuantiseTable& table = encoder.quant[component.quantTable];
  const int top = encoder.row / encoder.mcu_height() * component.v;
  for (int y = 0; y < component.v; ++y) {
    for (int x = 0; x < component.h; ++x, ++out) {
      const int column = mcu * component.h + x;
      if (top + y >= component.blocksHigh) {
        make_dummy(*out, *(out - component.h));
      } else if (column >= component.blocksWide) {
        make_dummy(*out, *(out - 1));
      } else {
        transform_and_quantise(component.row(8 * y) + 8 * column, component.stride(), &table,
                               out->data());
      }
    }
  }
  return out;
}

}  // namespace

int code_row(ELO_ENCODER* encoder) {
  alignas(16) std::array<CoefficientBlock, kEncoderMcuBlocks> blocks;
  for (int mcu = 0; mcu < encoder->mcusAcross; ++mcu) {
    CoefficientBlock* next = blocks.data();
    for (size_t i = 0; i < static_cast<size_t>(encoder->componentCount); ++i) {
      next = make_blocks(*encoder, encoder->components[i], mcu, next);
    }
    if (!code_mcu(encoder, blocks.data())) return 0;
  }
  encoder->row += encoder->mcu_height();
  return 1;
}

int encode_next_row(ELO_ENCODER* encoder) {
  return encoder->row < encoder->height && read_input_rows(*encoder) && code_row(encoder);
}

}  // namespace pelo::jpeg
