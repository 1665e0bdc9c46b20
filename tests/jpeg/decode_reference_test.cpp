// Full-size decodes against slow formulas: coefficients as libjpeg reads them, the transform member by
// last position, replication, four-point or centre sampling by division, and colour by multiplication.
#include <gtest/gtest.h>

#include <algorithm>

#include "codec/jpeg/decoder/idct.h"
#include "codec/jpeg/tables.h"
#include "tavirpelo/tavirpelo.h"
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

int clamp255(int v) { return std::clamp(v, 0, 255); }

struct Case {
  int width, height;
  JpegStyle style;
  int outWidth, outHeight;
};

// One output pixel's samples: the average of the four points, or the centre's.
int sample(const Grid& grid, const Case& c, int x, int y, bool centre) {
  const auto at = [](int64_t i, int64_t in, int64_t out, int64_t q) { return static_cast<int>((i * in + q) / out); };
  if (c.width == c.outWidth && c.height == c.outHeight) return grid.at(x, y);
  if (centre) return grid.at(at(x, c.width, c.outWidth, c.width / 2), at(y, c.height, c.outHeight, c.height / 2));
  int sum = 0;
  for (const int qx : {c.width / 4, 3 * c.width / 4}) {
    for (const int qy : {c.height / 4, 3 * c.height / 4}) {
      sum += grid.at(at(x, c.width, c.outWidth, qx), at(y, c.height, c.outHeight, qy));
    }
  }
  return sum / 4;
}

Bytes reference(const Case& c, const std::vector<Plane>& planes, bool centre) {
  std::vector<Grid> grids;
  for (const Plane& plane : planes) grids.push_back(reference_grid(plane, planes[0].h, planes[0].v, c.style.progressive));
  Bytes out;
  for (int y = 0; y < c.outHeight; ++y) {
    for (int x = 0; x < c.outWidth; ++x) {
      int s[3];
      for (size_t i = 0; i < 3; ++i) s[i] = sample(grids[planes.size() == 1 ? 0 : i], c, x, y, centre);
      if (planes.size() == 1 || c.style.rgb) {
        for (const int v : s) out.push_back(static_cast<uint8_t>(v));
        continue;
      }
      const int u = s[1] - 128;
      const int v = s[2] - 128;
      out.push_back(static_cast<uint8_t>(clamp255(s[0] + (v * 91881 >> 16))));
      out.push_back(static_cast<uint8_t>(clamp255(s[0] - ((u * 22554 + v * 46802) >> 16))));
      out.push_back(static_cast<uint8_t>(clamp255(s[0] + (u * 116130 >> 16))));
    }
  }
  return out;
}

Bytes decode(Bytes jpeg, int width, int height) {
  TAVIRPELO_RAWINFO* raw = TAVIRPELO_CreateRawInfo(width, height, TAVIRPELO_RGB888);
  EXPECT_EQ(1, TAVIRPELO_DecodeJpegFromBuffer(jpeg.data(), static_cast<int>(jpeg.size()), raw,
                                              TAVIRPELO_FIT_STRETCH | TAVIRPELO_THUMBNAIL_NEVER));
  const auto* bytes = static_cast<const uint8_t*>(raw->pData);
  Bytes out(bytes, bytes + static_cast<size_t>(3 * width) * static_cast<size_t>(height));
  TAVIRPELO_DestroyRawInfo(raw);
  return out;
}

JpegStyle style(int h, int v, int restart = 0, bool separate = false) {
  JpegStyle s;
  s.h = h;
  s.v = v;
  s.restartInterval = restart;
  s.separateScans = separate;
  return s;
}
JpegStyle grey() {
  JpegStyle s;
  s.components = 1;
  return s;
}
JpegStyle rgb() {
  JpegStyle s = style(1, 1);
  s.rgb = true;
  return s;
}

JpegStyle progressive(JpegStyle s) {
  s.progressive = true;
  return s;
}

class FullSize : public testing::TestWithParam<Case> {};

TEST_P(FullSize, EqualsTheFormulas) {
  const Case& c = GetParam();
  const Bytes jpeg = encode_libjpeg(c.width, c.height, c.style);
  const bool small = c.outWidth <= 99 && c.outHeight <= 99;
  const bool larger = c.outWidth > c.width || c.outHeight > c.height;
  const bool centre = small && !larger && c.style.components == 3 && !c.style.rgb;
  EXPECT_TRUE(decode(jpeg, c.outWidth, c.outHeight) == reference(c, read_coefficients(jpeg), centre));
}

INSTANTIATE_TEST_SUITE_P(
    Sampling, FullSize,
    testing::Values(Case{131, 67, style(1, 1), 131, 67}, Case{131, 67, style(2, 1), 131, 67},
                    Case{131, 67, style(2, 2), 131, 67}, Case{131, 67, style(1, 2), 131, 67},
                    Case{131, 67, style(4, 1), 131, 67}, Case{130, 67, style(4, 2), 130, 67},
                    Case{97, 35, style(2, 4), 97, 35}, Case{131, 67, grey(), 131, 67},
                    Case{131, 67, rgb(), 131, 67}, Case{1, 1, style(2, 2), 1, 1},
                    Case{3, 200, style(2, 2), 3, 200}, Case{200, 5, style(2, 2, 1), 200, 5},
                    Case{131, 67, style(2, 2, 3), 131, 67}));
INSTANTIATE_TEST_SUITE_P(
    Progressive, FullSize,
    testing::Values(Case{131, 67, progressive(style(2, 2)), 131, 67},
                    Case{300, 200, progressive(style(1, 1)), 300, 200},
                    Case{131, 167, progressive(style(2, 1, 4)), 131, 167},
                    Case{200, 170, progressive(grey()), 200, 170},
                    Case{7, 9, progressive(style(2, 2)), 7, 9},
                    Case{700, 700, progressive(style(1, 2)), 700, 700}));
INSTANTIATE_TEST_SUITE_P(
    Resampling, FullSize,
    testing::Values(Case{200, 200, style(1, 1), 130, 171}, Case{200, 200, grey(), 101, 199},
                    Case{200, 200, rgb(), 150, 150}, Case{131, 67, style(2, 2), 400, 100},
                    Case{131, 67, grey(), 131, 300}, Case{20, 20, rgb(), 333, 21},
                    Case{150, 90, style(2, 2), 98, 60}, Case{60, 40, style(2, 1), 59, 40}));

// A luma plane in a scan of its own decodes first; the components that no scan delivered stay neutral.
TEST(SeparateScans, ShowTheFirstWithNeutralColour) {
  const JpegStyle s = style(2, 2, 0, true);
  const Bytes jpeg = encode_libjpeg(70, 50, s);
  std::vector<Plane> planes = read_coefficients(jpeg);
  for (size_t i = 1; i < 3; ++i) std::fill(planes[i].coefficients.begin(), planes[i].coefficients.end(), int16_t{0});
  EXPECT_TRUE(decode(jpeg, 70, 50) == reference({70, 50, s, 70, 50}, planes, false));
}

// Reduced scales stay close to libjpeg's own at the same scale (which keeps more of subsampled chroma).
TEST(ReducedScales, ResembleLibjpeg) {
  for (const int numerator : {1, 2, 3, 4}) {
    for (const auto& s : {style(1, 1), grey()}) {
      const Bytes jpeg = encode_libjpeg(800, 640, s);
      const Decoded peer = decode_libjpeg(jpeg, numerator);
      Bytes ours = decode(jpeg, peer.width, peer.height);
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
