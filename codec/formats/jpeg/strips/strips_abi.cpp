// The given names of this room; each forwards to the room's own function.
#include "codec/formats/jpeg/strips/strips_abi.h"

#include "tavirpelo/decode.h"

using namespace pelo;
using namespace pelo::jpeg;

PELOJ_JDINFO* __elo_jpeg_dec_line_init(TAVIRPELO_DECINFO* decInfo, int width, int height,
                                       int outFormat) {
  return jpeg::begin_strips(decInfo, width, height, outFormat);
}

int __elo_jpeg_dec_line_init_progressive(PELOJ_JDINFO* state) {
  return jpeg::list_strip_scans(state);
}

int __elo_jpeg_dec_line_process(PELOJ_JDINFO* state, uint8_t* const* planes, int rows) {
  return jpeg::decode_strip(state, planes, rows);
}

void __elo_jpeg_dec_line_finish(PELOJ_JDINFO* state) {
  jpeg::end_strips(state);
}
