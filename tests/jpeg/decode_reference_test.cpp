// Full-size decodes against slow formulas: coefficients as libjpeg reads them, the transform member by
// last position, replication, four-point or centre sampling by division, and colour by multiplication.
#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/tables.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

#ifdef TAVIR_HAVE_LIBJPEG
namespace tests {
namespace {

// Full-grid samples of one component.
struct Grid {
  int stride = 0;
  Bytes samples;
  int at(int x, int y) const {
    return samples[static_cast<size_t>(y) * static_cast<size_t>(stride) + static_cast<size_t>(x)];
  }
};

int last_position(const int32_t* block) {
  int last = 0;
  for (int k = 1; k < 64; ++k) {
    if (block[PELOJ_NATURAL_ORDER[k]] != 0) last = k;
  }
  return last;
}

Grid reference_grid(const Plane& plane, int hMax, int vMax, bool progressive) {
  int32_t multiplier[64];
  for (size_t i = 0; i < 64; ++i) multiplier[i] = plane.quant[i] * pelo::jpeg::kAanScale[i] >> 2;
  const int width = plane.blocksWide * 8;
  const int height = plane.blocksHigh * 8;
  Bytes small(static_cast<size_t>(width) * static_cast<size_t>(height));
  for (int b = 0; b < plane.blocksWide * plane.blocksHigh; ++b) {
    int32_t block[64];
    std::copy_n(plane.coefficients.data() + 64 * b, 64, block);
    uint8_t* rows[8];
    for (int r = 0; r < 8; ++r) rows[r] = small.data() + width * (b / plane.blocksWide * 8 + r);
    const auto transform = progressive ? PELOJ_DoIdct : pelo::jpeg::idct_full(last_position(block));
    transform(nullptr, multiplier, block, rows, b % plane.blocksWide * 8);
  }
  Grid grid;
  const int fx = hMax / plane.h;
  const int fy = vMax / plane.v;
  grid.stride = width * fx;
  grid.samples.resize(small.size() * static_cast<size_t>(fx * fy));
  for (int y = 0; y < height * fy; ++y) {
    for (int x = 0; x < grid.stride; ++x) {
      grid.samples[static_cast<size_t>(y * grid.stride + x)] =
          small[static_cast<size_t>(y / fy * width + x / fx)];
    }
  }
  return grid;
}

struct Case {
  Size size;
  JpegStyle style;
  Size out;
};

// One output pixel's samples: the average of the four points, or the centre's.
int sample(const Grid& grid, const Case& c, int x, int y, bool centre) {
  const auto [width, height] = c.size;
  if (width == c.out.width && height == c.out.height) return grid.at(x, y);
  if (centre)
    return grid.at(position(x, width, c.out.width, width / 2),
                   position(y, height, c.out.height, height / 2));
  int sum = 0;
  four_points(c.size, c.out, x, y, [&](int u, int v) { sum += grid.at(u, v); });
  return sum / 4;
}

Bytes reference(const Case& c, const std::vector<Plane>& planes, bool centre) {
  std::vector<Grid> grids;
  for (const Plane& plane : planes)
    grids.push_back(reference_grid(plane, planes[0].h, planes[0].v, c.style.progressive));
  return placed(centred(c.out, c.out), 1, [&](int x, int y) {
    int s[3];
    for (size_t i = 0; i < 3; ++i) s[i] = sample(grids[planes.size() == 1 ? 0 : i], c, x, y, centre);
    if (planes.size() > 1 && !c.style.rgb) {
      const int u = s[1] - 128, v = s[2] - 128;
      s[1] = s[0] - ((u * 22554 + v * 46802) >> 16);
      s[2] = s[0] + (u * 116130 >> 16);
      s[0] += v * 91881 >> 16;
    }
    Bytes pixel;
    for (const int v : s) pixel.push_back(static_cast<uint8_t>(std::clamp(v, 0, 255)));
    return pixel;
  });
}

Bytes run(const Bytes& jpeg, int width, int height) {
  return decode(TAVIRPELO_DecodeJPEG, jpeg, width, height, 1,
                TAVIRPELO_FIT_STRETCH | TAVIRPELO_THUMBNAIL_NEVER)
      .pixels;
}

class FullSize : public testing::TestWithParam<Case> {};

TEST_P(FullSize, EqualsTheFormulas) {
  const Case& c = GetParam();
  const Bytes jpeg = encode_libjpeg(c.size.width, c.size.height, c.style);
  const bool small = c.out.width <= 99 && c.out.height <= 99;
  const bool larger = c.out.width > c.size.width || c.out.height > c.size.height;
  const bool centre = small && !larger && c.style.components == 3 && !c.style.rgb;
  EXPECT_TRUE(run(jpeg, c.out.width, c.out.height) == reference(c, read_coefficients(jpeg), centre));
}

Case same(Size size, const JpegStyle& style) {
  return {size, style, size};
}
constexpr JpegStyle k11{.h = 1, .v = 1}, k21{.h = 2, .v = 1}, k22{}, kGrey{.components = 1},
    kRgb{.h = 1, .v = 1, .rgb = true};

INSTANTIATE_TEST_SUITE_P(Sampling, FullSize,
                         testing::Values(same({131, 67}, k11), same({131, 67}, k21),
                                         same({131, 67}, k22), same({131, 67}, {.h = 1}),
                                         same({131, 67}, {.h = 4, .v = 1}), same({130, 67}, {.h = 4}),
                                         same({97, 35}, {.v = 4}), same({131, 67}, kGrey),
                                         same({131, 67}, kRgb), same({1, 1}, k22), same({3, 200}, k22),
                                         same({200, 5}, {.restartInterval = 1}),
                                         same({131, 67}, {.restartInterval = 3})));
INSTANTIATE_TEST_SUITE_P(Progressive, FullSize,
                         testing::Values(same({131, 67}, {.progressive = true}),
                                         same({300, 200}, {.h = 1, .v = 1, .progressive = true}),
                                         same({131, 167},
                                              {.v = 1, .restartInterval = 4, .progressive = true}),
                                         same({200, 170}, {.components = 1, .progressive = true}),
                                         same({7, 9}, {.progressive = true}),
                                         same({700, 700}, {.h = 1, .progressive = true})));
INSTANTIATE_TEST_SUITE_P(
    Resampling, FullSize,
    testing::Values(Case{{200, 200}, k11, {130, 171}}, Case{{200, 200}, kGrey, {101, 199}},
                    Case{{200, 200}, kRgb, {150, 150}}, Case{{131, 67}, k22, {400, 100}},
                    Case{{131, 67}, kGrey, {131, 300}}, Case{{20, 20}, kRgb, {333, 21}},
                    Case{{150, 90}, k22, {98, 60}}, Case{{60, 40}, k21, {59, 40}}));

// A luma plane in a scan of its own decodes first; the components that no scan delivered stay neutral.
TEST(SeparateScans, ShowTheFirstWithNeutralColour) {
  const JpegStyle s{.separateScans = true};
  const Bytes jpeg = encode_libjpeg(70, 50, s);
  std::vector<Plane> planes = read_coefficients(jpeg);
  for (size_t i = 1; i < 3; ++i)
    std::fill(planes[i].coefficients.begin(), planes[i].coefficients.end(), int16_t{0});
  EXPECT_TRUE(run(jpeg, 70, 50) == reference(same({70, 50}, s), planes, false));
}

// Reduced scales stay close to libjpeg's own at the same scale (which keeps more of subsampled chroma).
TEST(ReducedScales, ResembleLibjpeg) {
  for (const int numerator : {1, 2, 3, 4}) {
    for (const auto& s : {k11, kGrey}) {
      const Bytes jpeg = encode_libjpeg(800, 640, s);
      const Decoded peer = decode_libjpeg(jpeg, numerator);
      Bytes ours = run(jpeg, peer.width, peer.height);
      if (peer.components == 1) {
        for (size_t i = 0; i < peer.pixels.size(); ++i) ours[i] = ours[3 * i];
        ours.resize(peer.pixels.size());
      }
      EXPECT_GT(psnr(ours, peer.pixels), numerator == 1 ? 35 : 24) << numerator;
    }
  }
}

}  // namespace
}  // namespace tests
#endif
