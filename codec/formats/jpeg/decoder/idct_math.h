// Arithmetic that the inverse transforms share. Vector is int32_t or a vector of int32_t: the same
// formulas, a lane each.
#pragma once

#include <cstdint>

namespace pelo::jpeg {

// a x K / 256, as every constant of the transforms is applied.
template <class Vector>
inline Vector scaled(Vector a, int32_t constant) {
  return a * constant >> 8;
}

// A coefficient times its multiplier, 10 fraction bits dropped. Real pictures stay below 16 K; the clamp
// keeps every product and sum of hostile ones within 32 bits. An output of the 8-point butterfly is at
// most 11.4 times its largest input, the sum of the magnitudes of its weights; the largest product of
// the second pass is that of four such outputs (z10 + z12) with 473: 4 * 11.4 * 65536 * 473 = 0.66 *
// 2^31.
constexpr int32_t kDequantisedMax = 65536;
inline int32_t dequantise(int32_t coefficient, int32_t multiplier) {
  const int64_t value = int64_t{coefficient} * multiplier >> 10;
  if (value < -kDequantisedMax) return -kDequantisedMax;
  if (value >= kDequantisedMax) return kDequantisedMax - 1;
  return static_cast<int32_t>(value);
}

inline uint8_t clamp_byte(int32_t value) {
  return static_cast<uint8_t>(value < 0 ? 0 : value > 255 ? 255 : value);
}

// A transform result as a sample: five fraction bits dropped, level shift.
inline uint8_t to_sample(int32_t value) {
  return clamp_byte((value >> 5) + 128);
}

// The last step of the 8-point transforms: even part plus and minus odd part.
template <class Vector>
inline void join_halves(Vector (&x)[8], const Vector& e0, const Vector& e1, const Vector& e2,
                        const Vector& e3, const Vector& o4, const Vector& o5, const Vector& o6,
                        const Vector& o7) {
  x[0] = e0 + o7;
  x[7] = e0 - o7;
  x[1] = e1 + o6;
  x[6] = e1 - o6;
  x[2] = e2 + o5;
  x[5] = e2 - o5;
  x[4] = e3 + o4;
  x[3] = e3 - o4;
}

// The 8-point butterfly of Arai, Agui and Nakajima on x[0..7], in place.
template <class Vector>
inline void butterfly8(Vector (&x)[8]) {
  const Vector t10 = x[0] + x[4];
  const Vector t11 = x[0] - x[4];
  const Vector t13 = x[2] + x[6];
  const Vector t12 = scaled(x[2] - x[6], 362) - t13;
  const Vector e0 = t10 + t13;
  const Vector e3 = t10 - t13;
  const Vector e1 = t11 + t12;
  const Vector e2 = t11 - t12;

  const Vector z13 = x[5] + x[3];
  const Vector z10 = x[5] - x[3];
  const Vector z11 = x[1] + x[7];
  const Vector z12 = x[1] - x[7];
  const Vector o7 = z11 + z13;
  const Vector z5 = scaled(z10 + z12, 473);
  const Vector o6 = scaled(z10, -669) + z5 - o7;
  const Vector o5 = scaled(z11 - z13, 362) - o6;
  const Vector o4 = scaled(z12, 277) - z5 + o5;

  join_halves(x, e0, e1, e2, e3, o4, o5, o6, o7);
}

// The same with x[3..7] zero and the constant chains of x[1] folded: 217 = 473 - 256, 145 = 362 - 217.
// (a x 362 >> 8) - a is a x 106 >> 8 exactly.
template <class Vector>
inline void butterfly3(Vector (&x)[8]) {
  const Vector t12 = scaled(x[2], 106);
  const Vector e0 = x[0] + x[2];
  const Vector e3 = x[0] - x[2];
  const Vector e1 = x[0] + t12;
  const Vector e2 = x[0] - t12;
  const Vector o7 = x[1];
  const Vector o6 = scaled(x[1], 217);
  const Vector o5 = scaled(x[1], 145);
  const Vector o4 = scaled(x[1], 277) - scaled(x[1], 473) + o5;

  join_halves(x, e0, e1, e2, e3, o4, o5, o6, o7);
}

}  // namespace pelo::jpeg
