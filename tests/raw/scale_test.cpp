// Scaling kernels against slow formulas, for random sizes in both directions, inside guard bytes.
#include <random>

#include "tests/support/guarded_decode.h"

namespace tests {
namespace {

// Channels of a pixel, as wide as the format stores them.
std::vector<int> channels(const uint8_t* p, int format) {
  if (format != TAVIRPELO_RGB565) return std::vector<int>(p, p + pelo::bytes_per_pixel(format));
  const int word = p[0] | p[1] << 8;
  return {word >> 11, word >> 5 & 63, word & 31};
}
Bytes stored(const std::vector<int>& c, int format) {
  if (format != TAVIRPELO_RGB565) return Bytes(c.begin(), c.end());
  return word_bytes(c[0] << 11 | c[1] << 5 | c[2]);
}

// A picture in memory, rows `stride` pixels long.
struct Picture {
  int width, height, stride, format;
  Bytes bytes;

  const uint8_t* pixel(int x, int y) const {
    return bytes.data() + static_cast<size_t>((y * stride + x) * pelo::bytes_per_pixel(format));
  }
};

Picture random_picture(std::mt19937& random, int width, int height, int format) {
  Picture p{width, height, width + static_cast<int>(random() % 5), format, {}};
  p.bytes.resize(static_cast<size_t>(p.stride * height * pelo::bytes_per_pixel(format)));
  for (uint8_t& b : p.bytes) b = static_cast<uint8_t>(random() % 8 == 0 ? 255 : random());
  return p;
}

enum class Method { kNearest, kAverage, kQuarters };

struct Sampling {
  Method method;
  bool truncatedThird = false;  // q3 = 3 * floor(S / 4)
};

// A part of a picture.
struct Span {
  int x, y, width, height;
};

// Output pixel (x, y) of a span scaled to `out`.
Bytes sampled(const Picture& p, const Span& span, int x, int y, Size out, const Sampling& sampling) {
  const auto [x0, y0, w, h] = span;
  const auto pixel = [&](int qx, int qy) {
    return p.pixel(x0 + position(x, w, out.width, qx), y0 + position(y, h, out.height, qy));
  };
  if (sampling.method == Method::kNearest) {
    const uint8_t* from = pixel(w / 2, h / 2);
    return Bytes(from, from + pelo::bytes_per_pixel(p.format));
  }
  const auto third = [&](int side) { return sampling.truncatedThird ? 3 * (side / 4) : 3 * side / 4; };
  const int before = sampling.method == Method::kQuarters ? 2 : 0;
  std::vector<int> sum(4);
  for (const int qy : {h / 4, third(h)}) {
    for (const int qx : {w / 4, third(w)}) {
      const auto c = channels(pixel(qx, qy), p.format);
      sum.resize(c.size());
      for (size_t i = 0; i < c.size(); ++i) sum[i] += c[i] >> before;
    }
  }
  for (int& s : sum) s >>= 2 - before;
  return stored(sum, p.format);
}

using Scaler = void (*)(const void*, int, int, int, void*, int, int, int);

void expect_scaled(Scaler scaler, const Picture& p, Size out, const Sampling& sampling) {
  const int stride = out.width + 3;
  GuardedPixels pixels(stride, out.height, p.format);
  scaler(p.bytes.data(), p.width, p.height, p.stride, pixels.data(), out.width, out.height, stride);
  const Bytes want = placed({{stride, out.height}, out, 0, 0, 0}, p.format, [&](int x, int y) {
    return sampled(p, {0, 0, p.width, p.height}, x, y, out, sampling);
  });
  ASSERT_EQ(want, pixels.content()) << p.width << "x" << p.height << " to " << out.width << "x"
                                    << out.height;
}

TEST(Scaling, FamilyAgainstTheFormulas) {
  std::mt19937 random(3);
  const auto side = [&] { return 1 + static_cast<int>(random() % 64); };
  for (int n = 0; n < 400; ++n) {
    const int width = side(), height = side();
    const Size out = n % 7 ? Size{side(), side()} : Size{width, height};
    const bool grows = out.width > width || out.height > height;
    const Picture words = random_picture(random, width, height, TAVIRPELO_RGB565);
    const Picture bytes = random_picture(random, width, height, TAVIRPELO_RGB888);
    expect_scaled(PELO_Scale_ex, words, out, {Method::kAverage, grows});
    expect_scaled(PELO_FastScale_ex, words, out, {Method::kNearest});
    expect_scaled(PELO_RGB888Scale_ex, bytes, out, {Method::kAverage});
    expect_scaled(PELO_UpScale, words, out, {Method::kAverage, true});
    expect_scaled(PELO_DownScale_1sample, words, out, {Method::kNearest});
  }
  // More columns than are handled at a time.
  expect_scaled(PELO_RGB888Scale_ex, random_picture(random, 700, 4, 1), {600, 3}, {Method::kAverage});
  expect_scaled(PELO_FastScale_ex, random_picture(random, 300, 4, 0), {900, 3}, {Method::kNearest});
}

TEST(Scaling, NothingForMissingOrEmptyPictures) {
  uint8_t pixel[3] = {1, 2, 3};
  for (const Scaler scaler :
       {PELO_Scale_ex, PELO_FastScale_ex, PELO_RGB888Scale_ex, PELO_UpScale, PELO_DownScale}) {
    scaler(nullptr, 1, 1, 1, pixel, 1, 1, 1);
    scaler(pixel, 1, 1, 1, nullptr, 1, 1, 1);
    scaler(pixel, 0, 1, 1, pixel, 1, 1, 1);
    scaler(pixel, 1, 1, 1, pixel, 1, -1, 1);
  }
  EXPECT_EQ(2, pixel[1]);
}

// ---- placement ----

struct Axis {
  int start, count, targetStart, targetCount;
};
Axis span(int64_t s, int64_t d, int64_t t, int edge) {  // edge 0 middle, 1 low, 2 high
  const int64_t rest = std::abs(d - t), shift = edge == 1 ? 0 : edge == 0 ? rest >> 1 : rest;
  if (d >= t) return {0, static_cast<int>(s), static_cast<int>(shift), static_cast<int>(t)};
  const int64_t count = std::max<int64_t>(1, s * d / t);
  return {static_cast<int>(std::min(s * shift / t, s - count)), static_cast<int>(count), 0,
          static_cast<int>(d)};
}

TEST(Placement, AgainstTheFormulas) {
  std::mt19937 random(5);
  const auto side = [&](uint32_t most) { return 1 + static_cast<int>(random() % most); };
  const int edgesX[] = {0, 1, 2, 1, 2}, edgesY[] = {0, 1, 1, 2, 2};
  for (int n = 0; n < 1500; ++n) {
    const int format = std::array{0, 1, 5}[n % 3], anchor = n / 3 % 5, quality = n / 15 % 2;
    const Picture p = random_picture(random, side(40), side(40), format);
    const int width = side(40), height = side(40), stride = width + 2,
              bytes = pelo::bytes_per_pixel(format);
    const int scaledWidth = side(n % 11 ? 90 : 100000), scaledHeight = side(90);
    const uint8_t fill = quality == 1 ? 0 : kFill;  // quarters are added to what is there
    GuardedPixels out(stride, height, format, fill);
    ASSERT_EQ(1, TAVIRPELO_CODEC_Scale(p.bytes.data(), out.data(), p.width, p.height, p.stride * bytes,
                                       width, height, stride * bytes, scaledWidth, scaledHeight, format,
                                       anchor, quality));
    const Axis ax = span(p.width, width, scaledWidth, edgesX[anchor]);
    const Axis ay = span(p.height, height, scaledHeight, edgesY[anchor]);
    const Method method = quality == 0  ? Method::kNearest
                          : format == 0 ? Method::kAverage
                                        : Method::kQuarters;
    const Size target{ax.targetCount, ay.targetCount};
    const auto pixel = [&](int x, int y) {
      return sampled(p, {ax.start, ay.start, ax.count, ay.count}, x, y, target, {method});
    };
    const Placement place{{stride, height}, target, 0, ax.targetStart, ay.targetStart};
    const Bytes want = placed(place, format, pixel, fill);
    ASSERT_EQ(want, out.content()) << "case " << n;
  }
}

TEST(Placement, AveragesAreAddedAndArgumentsChecked) {
  const uint8_t white[12] = {255, 255, 255, 255, 255, 255, 255, 255, 255, 255, 255, 255};
  uint8_t out[3] = {1, 2, 3};
  EXPECT_EQ(1, TAVIRPELO_CODEC_Scale(white, out, 2, 2, 6, 1, 1, 3, 1, 1, 1, 0, 1));
  EXPECT_EQ(253, out[0]);
  EXPECT_EQ(255, out[2]);
  const auto refused = [&](int width, int scaled, int format, int anchor, int quality) {
    debug_PeloCodecError = 0;
    EXPECT_EQ(
        0, TAVIRPELO_CODEC_Scale(white, out, width, 2, 6, 1, 1, 3, scaled, 1, format, anchor, quality));
    return debug_PeloCodecError;
  };
  EXPECT_EQ(TAVIRPELO_CODEC_ARGUMENT, refused(0, 1, 1, 0, 0));
  EXPECT_EQ(TAVIRPELO_CODEC_FORMAT, refused(2, 1, 6, 0, 0));
  EXPECT_EQ(TAVIRPELO_CODEC_FORMAT, refused(2, 1, 1, 5, 0));
  EXPECT_EQ(TAVIRPELO_CODEC_FORMAT, refused(2, 1, 1, 0, 2));
  EXPECT_EQ(0, refused(2, 0, 1, 0, 0));
  EXPECT_EQ(0, TAVIRPELO_CODEC_Scale(nullptr, out, 2, 2, 6, 1, 1, 3, 1, 1, 1, 0, 0));
}

}  // namespace
}  // namespace tests
