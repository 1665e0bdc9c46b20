// The blocks of one MCU row: transformed, padded with dummies at the picture's edges, coded.
#include "codec/jpeg/encoder/encoder.h"

using namespace pelo::jpeg;

namespace {

// Blocks of one component in one MCU: inside the picture they are transformed; a dummy at the right
// repeats the DC of the block to its left, one below that of the block above.
void code_component(ELO_ENCODER& encoder, int index, int mcu) {
  const EncoderComponent& component = encoder.components[static_cast<size_t>(index)];
  int32_t blocks[4][64];
  for (int y = 0; y < component.v; ++y) {
    for (int x = 0; x < component.h; ++x) {
      int32_t(&block)[64] = blocks[2 * y + x];
      const int column = mcu * component.h + x;
      if (encoder.mcuRow * component.v + y >= component.blocksHigh) {
        for (int32_t& value : block) value = 0;
        block[0] = blocks[2 * (y - 1) + x][0];
      } else if (column >= component.blocksWide) {
        for (int32_t& value : block) value = 0;
        block[0] = blocks[2 * y + x - 1][0];
      } else {
        const ptrdiff_t offset = static_cast<ptrdiff_t>(component.stride) * 8 * y + 8 * column;
        __elo_jpeg_enc_do_forward_dct(&encoder.quant[static_cast<size_t>(component.table)],
                                      component.samples.data() + offset, component.stride, block);
      }
      __elo_jpeg_enc_encode_1mcu_blk(&encoder, index, block);
    }
  }
}

}  // namespace

int __elo_jpeg_enc_compress_data(ELO_ENCODER* encoder) {
  for (int mcu = 0; mcu < encoder->mcusWide && !encoder->failed; ++mcu) {
    for (int c = 0; c < encoder->componentCount; ++c) code_component(*encoder, c, mcu);
  }
  ++encoder->mcuRow;
  return !encoder->failed;
}
