// The forward transform of Arai, Agui and Nakajima with 8-bit constants, and quantisation. Both work in
// 16 bits on eight lanes, in loops that compilers turn into vector code: samples of 8 bits keep every
// intermediate within 12870 and a few units of rounding.
#include <utility>

#include "codec/formats/jpeg/encoder/encoder.h"

namespace pelo::jpeg {
namespace {

using Plane = std::array<int16_t, 64>;

constexpr int16_t s16(int value) {
  return static_cast<int16_t>(value);
}

// value * k / 256, rounded down, with k in 0..383. Written over 65536, the factor may exceed 16 signed
// bits; taking 65536 off it and adding the value once leaves a high half of a 16-bit product.
template <int k>
constexpr int16_t times(int16_t value) {
  constexpr int kFactor = k * 256;
  if constexpr (kFactor < 32768) {
    return s16(value * kFactor >> 16);
  } else {
    return s16((value * (kFactor - 65536) >> 16) + value);
  }
}
constexpr int kC6 = 98;          // cos(6 pi/16) * 256
constexpr int kC2MinusC6 = 139;  // (cos(2 pi/16) - cos(6 pi/16)) * 256
constexpr int kC4 = 181;         // cos(4 pi/16) * 256
constexpr int kC2PlusC6 = 334;   // (cos(2 pi/16) + cos(6 pi/16)) * 256

// One-dimensional transform down the columns, eight columns side by side. `dcOffset` is taken off the
// sum.
inline void transform_columns(Plane& plane, int dcOffset) {
  int16_t* p = plane.data();
  for (int i = 0; i < 8; ++i) {
    const int16_t sum07 = s16(p[i] + p[i + 56]), diff07 = s16(p[i] - p[i + 56]);
    const int16_t sum16 = s16(p[i + 8] + p[i + 48]), diff16 = s16(p[i + 8] - p[i + 48]);
    const int16_t sum25 = s16(p[i + 16] + p[i + 40]), diff25 = s16(p[i + 16] - p[i + 40]);
    const int16_t sum34 = s16(p[i + 24] + p[i + 32]), diff34 = s16(p[i + 24] - p[i + 32]);

    const int16_t even0 = s16(sum07 + sum34), even3 = s16(sum07 - sum34);
    const int16_t even1 = s16(sum16 + sum25), even2 = s16(sum16 - sum25);
    const int16_t rotated = times<kC4>(s16(even2 + even3));

    const int16_t odd0 = s16(diff34 + diff25), odd1 = s16(diff25 + diff16);
    const int16_t odd2 = s16(diff16 + diff07);
    const int16_t shared = times<kC6>(s16(odd0 - odd2));
    const int16_t low = s16(times<kC2MinusC6>(odd0) + shared);
    const int16_t high = s16(times<kC2PlusC6>(odd2) + shared);
    const int16_t middle = times<kC4>(odd1);
    const int16_t outer = s16(diff07 + middle), inner = s16(diff07 - middle);

    p[i] = s16(even0 + even1 - dcOffset);
    p[i + 8] = s16(outer + high);
    p[i + 16] = s16(even3 + rotated);
    p[i + 24] = s16(inner - low);
    p[i + 32] = s16(even0 - even1);
    p[i + 40] = s16(inner + low);
    p[i + 48] = s16(even3 - rotated);
    p[i + 56] = s16(outer - high);
  }
}

inline void transpose(Plane& plane) {
  for (size_t y = 0; y < 8; ++y) {
    for (size_t x = 0; x < y; ++x) std::swap(plane[y * 8 + x], plane[x * 8 + y]);
  }
}

// (x * reciprocal) >> 16, with 32768 added to the product of a negative x: positive values are
// truncated, negative ones rounded. `lower` and `upper` are the parts of the reciprocal; the addition
// carries into the upper half exactly when bit 15 of the product is set.
inline void quantise(const Plane& plane, const QuantiseTable& table, int32_t* __restrict out) {
  for (size_t i = 0; i < 64; ++i) {
    const int16_t x = plane[i];
    const int16_t whole = s16((x * table.lower[i] >> 16) + (x & table.upper[i]));
    const auto product = static_cast<uint16_t>(
        static_cast<uint16_t>(x) * static_cast<uint32_t>(static_cast<uint16_t>(table.lower[i])));
    const auto carry = static_cast<uint16_t>(static_cast<uint16_t>(product & x) >> 15);
    out[i] = s16(whole + carry);
  }
}

}  // namespace

void transform_and_quantise(const uint8_t* samples, ptrdiff_t stride, const QuantiseTable* table,
                            int32_t* coefficients) {
  alignas(16) Plane plane;
  for (size_t y = 0; y < 8; ++y, samples += stride) {
    for (size_t x = 0; x < 8; ++x) plane[x * 8 + y] = samples[x];
  }
  transform_columns(plane, 8 * 128);  // rows of the block; 128 a sample is the level shift
  transpose(plane);
  transform_columns(plane, 0);
  quantise(plane, *table, coefficients);
}

}  // namespace pelo::jpeg
