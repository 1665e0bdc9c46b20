// Camera frames against the formulas, for every chroma value and every small size.
#include <gtest/gtest.h>

#include <algorithm>

#include "tavirpelo/tavirpelo.h"
#include "tests/support/pixels.h"

namespace tests {
namespace {

constexpr uint16_t kUntouched = 0x5AA5;

uint16_t formula(int y, int cb, int cr) {
  const auto clamp = [](int v) { return std::clamp(v, 0, 255); };
  const int r = clamp(y + ((91881 * (cr - 127) + 32768) >> 16));
  const int g = clamp(y + ((-46802 * (cr - 127) - 22554 * (cb - 127) + 32768) >> 16));
  const int b = clamp(y + ((116130 * (cb - 127) + 32768) >> 16));
  return static_cast<uint16_t>(word565(r, g, b));
}

struct Frame {
  int width, height;
  Bytes y, cb, cr;

  size_t chroma(int px, int py) const {
    return static_cast<size_t>(py / 2 * ((width + 1) / 2) + px / 2);
  }
  Bytes planar() const { return ByteWriter().block(y).block(cb).block(cr); }
  Bytes paired() const {
    Bytes out = y;
    for (size_t i = 0; i < cb.size(); ++i) out.push_back(cr[i]), out.push_back(cb[i]);
    return out;
  }
};

void expect_converted(const Frame& frame) {
  const size_t count = frame.y.size();
  std::vector<uint16_t> want(count + 8, kUntouched);
  for (int y = 0; y < frame.height; ++y) {
    for (int x = 0; x < frame.width; ++x) {
      if (frame.width == 1 && frame.height % 2 == 1 && y == frame.height - 1) continue;
      const size_t c = frame.chroma(x, y), at = static_cast<size_t>(y * frame.width + x);
      want[at] = formula(frame.y[at], frame.cb[c], frame.cr[c]);
    }
  }
  for (const bool paired : {false, true}) {
    std::vector<uint16_t> got(count + 8, kUntouched);
    const auto convert = paired ? elo_OrbPYV0420toRGB565 : elo_OrbYUV420toRGB565;
    const Bytes bytes = paired ? frame.paired() : frame.planar();
    EXPECT_EQ(1, convert(bytes.data(), frame.width, frame.height, got.data()));
    EXPECT_EQ(want, got) << frame.width << "x" << frame.height << " paired " << paired;
  }
}

void expect_random(int width, int height) {
  const auto seed = static_cast<uint32_t>(width * 1000 + height);
  const auto chroma = static_cast<size_t>((width + 1) / 2 * ((height + 1) / 2));
  expect_converted({width, height, random_bytes(static_cast<size_t>(width * height), seed),
                    random_bytes(chroma, seed + 1), random_bytes(chroma, seed + 2)});
}

TEST(Yuv, EverySmallSize) {
  for (int width = 1; width <= 9; ++width) {
    for (int height = 1; height <= 9; ++height) expect_random(width, height);
  }
  for (const int width : {255, 256, 257, 511, 513}) expect_random(width, 3);
}

TEST(Yuv, EveryChromaPair) {
  Frame frame{512, 512, Bytes(512 * 512), Bytes(256 * 256), Bytes(256 * 256)};
  for (size_t i = 0; i < frame.cb.size(); ++i) {
    frame.cb[i] = static_cast<uint8_t>(i);
    frame.cr[i] = static_cast<uint8_t>(i >> 8);
  }
  for (size_t i = 0; i < frame.y.size(); ++i)
    frame.y[i] = static_cast<uint8_t>((i & 1 ? 0 : 255) ^ (i >> 9 & 1 ? 128 : 0));
  expect_converted(frame);
}

TEST(Yuv, TablesAndMissingArguments) {
  for (int v = -512; v < 512; ++v) EXPECT_EQ(std::clamp(v, 0, 255), elo_EnRangeTalbe[512 + v]);
  EXPECT_EQ(-178, elo_EnCrrTab[0]);
  EXPECT_EQ(-46802 * 128, elo_EnCrgTab[255]);
  EXPECT_EQ(1, elo_OrbYUV420toRGB565(nullptr, 2, 2, nullptr));
}

}  // namespace
}  // namespace tests
