// YCbCr to R, G, B as JPEG files mean it (JFIF, ITU-R BT.601 full range), in 16-bit fixed point without
// rounding: 91881, 22554, 46802 and 116130 are 1.402, 0.34414, 0.71414 and 1.772 times 65536.
#pragma once

#include <cstdint>

namespace pelo {

// What Cb and Cr (less 128) add to Y. The constants are split at multiples of 65536, which leaves
// products of 16-bit factors: exact, and one instruction a lane where the compiler vectorises.
struct ChromaOffsets {
  int32_t r, g, b;
};
constexpr ChromaOffsets chroma_offsets(int cb, int cr) {
  const auto u = static_cast<int16_t>(cb - 128);
  const auto v = static_cast<int16_t>(cr - 128);
  ChromaOffsets offsets{};
  offsets.r = v + (v * 26345 >> 16);                    // 91881 = 65536 + 26345
  offsets.g = -(v + ((u * 22554 + v * -18734) >> 16));  // 46802 = 65536 - 18734
  offsets.b = 2 * u + (u * -14942 >> 16);               // 116130 = 131072 - 14942
  return offsets;
}
static_assert(chroma_offsets(255, 0).r == (-128 * 91881 >> 16) &&
              chroma_offsets(37, 201).g == -((-91 * 22554 + 73 * 46802) >> 16) &&
              chroma_offsets(3, 9).b == (-125 * 116130 >> 16));

constexpr uint8_t clamp_channel(int32_t value) {
  return static_cast<uint8_t>(value < 0 ? 0 : value > 255 ? 255 : value);
}

}  // namespace pelo
