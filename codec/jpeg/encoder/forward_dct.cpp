// The fast integer forward DCT of Arai, Agui and Nakajima with 8-bit constants, and quantisation by
// reciprocals.
#include "codec/jpeg/encoder/encoder.h"
#include "codec/jpeg/lanes.h"

namespace pelo::jpeg {
namespace {

// One dimension, in place: 98, 139, 181 and 334 are 0.382683433, 0.541196100, 0.707106781 and 1.306562965
// times 256.
inline void forward_butterfly(Lanes (&x)[8]) {
  const Lanes s0 = x[0] + x[7], s7 = x[0] - x[7];
  const Lanes s1 = x[1] + x[6], s6 = x[1] - x[6];
  const Lanes s2 = x[2] + x[5], s5 = x[2] - x[5];
  const Lanes s3 = x[3] + x[4], s4 = x[3] - x[4];

  const Lanes e10 = s0 + s3, e13 = s0 - s3;
  const Lanes e11 = s1 + s2, e12 = s1 - s2;
  x[0] = e10 + e11;
  x[4] = e10 - e11;
  const Lanes z1 = (e12 + e13) * 181 >> 8;
  x[2] = e13 + z1;
  x[6] = e13 - z1;

  const Lanes o10 = s4 + s5, o11 = s5 + s6, o12 = s6 + s7;
  const Lanes z5 = (o10 - o12) * 98 >> 8;
  const Lanes z2 = (o10 * 139 >> 8) + z5;
  const Lanes z4 = (o12 * 334 >> 8) + z5;
  const Lanes z3 = o11 * 181 >> 8;
  const Lanes z11 = s7 + z3, z13 = s7 - z3;
  x[5] = z13 + z2;
  x[3] = z13 - z2;
  x[1] = z11 + z4;
  x[7] = z11 - z4;
}

}  // namespace
}  // namespace pelo::jpeg

using namespace pelo::jpeg;

void __elo_jpeg_enc_do_forward_dct(const EncoderQuant* quant, const uint8_t* samples, int stride,
                                   int32_t* block) {
  ShortLanes rows[8];
  for (int r = 0; r < 8; ++r) {
    ByteLanes bytes;
    std::memcpy(&bytes, samples + static_cast<ptrdiff_t>(stride) * r, sizeof bytes);
    rows[r] = __builtin_convertvector(bytes, ShortLanes);
  }
  transpose(rows);
  Lanes x[8];
  for (int i = 0; i < 8; ++i) x[i] = __builtin_convertvector(rows[i], Lanes);
  forward_butterfly(x);
  x[0] -= 1024;  // the level shift of eight samples
  transpose(x);
  forward_butterfly(x);
  for (int r = 0; r < 8; ++r) {
    // Positive values are truncated, negative ones rounded.
    const Lanes product = x[r] * load_lanes(quant->reciprocal.data() + 8 * r);
    const Lanes quantised = (product + ((x[r] >> 31) & 32768)) >> 16;
    std::memcpy(block + 8 * r, &quantised, sizeof quantised);
  }
}
