// Full-size decodes against slow formulas: coefficients as libjpeg reads them, the transform member by
// last position, replication, four-point or centre sampling by division, and colour by multiplication.
#include "codec/formats/jpeg/decoder/idct.h"
#include "codec/formats/jpeg/tables.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_segments.h"

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
    const auto transform = progressive
                               ? pelo::jpeg::idct8<8, 8>
                               : pelo::jpeg::kFullIdct[static_cast<size_t>(last_position(block))];
    transform(multiplier, block, rows, b % plane.blocksWide * 8);
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

// However the same coefficients are spread over scans, they show the same picture at every scale; tables
// defined anew between scans are those of the scans behind them.
TEST(SeparateScans, ShowWhatOneScanShows) {
  const JpegScans scans[] = {JpegScans::kSeparate, JpegScans::kLumaThenChroma, JpegScans::kChromaFirst};
  for (JpegStyle s : {JpegStyle{.quality = 98},
                      {.h = 1, .restartInterval = 3},
                      {.h = 4, .v = 1, .optimise = true},
                      {.quality = 97, .h = 1, .v = 1, .rgb = true, .optimise = true}}) {
    const Bytes whole = encode_libjpeg(141, 93, s);
    for (const JpegScans how : scans) {
      s.scans = how;
      const Bytes jpeg = encode_libjpeg(141, 93, s);
      for (const int eighths : {8, 7, 4, 3, 2, 1}) {
        for (const uint32_t option :
             {TAVIRPELO_THUMBNAIL_NEVER | 0x700, TAVIRPELO_THUMBNAIL_NEVER | 0x300}) {
          for (const int mode : {0, 1, 2}) {
            const auto show = [&](Bytes bytes) {
              const DecInfo info = open_memory(bytes, 1, option);
              info->decMode = mode;
              return decode(TAVIRPELO_DecodeJPEG, info.get(), 141 * eighths / 8, 70 * eighths / 8);
            };
            const Decode want = show(whole), got = show(jpeg);
            ASSERT_TRUE(got.answer == 1 && want.pixels == got.pixels)
                << static_cast<int>(how) << " " << eighths << " " << option << " " << mode;
          }
        }
      }
    }
  }
}

// Between the luma scan and the others: scans of luma again, which are passed over, and in table 0 the
// chroma quantisers, which the luma scan must not see. Without the others colour is neutral.
TEST(SeparateScans, KeepTheTablesOfTheirTime) {
  const JpegStyle s{.quality = 98, .scans = JpegScans::kSeparate};
  const Bytes jpeg = encode_libjpeg(60, 50, s);
  const size_t luma = find_marker(jpeg, 0xDB), frame = find_marker(jpeg, 0xC0);
  const size_t first = find_marker(jpeg, 0xDA), data = first + 10;
  const Bytes scan = prefix(suffix(jpeg, first), data - first);
  const auto second = static_cast<size_t>(std::search(jpeg.begin() + static_cast<ptrdiff_t>(data),
                                                      jpeg.end(), scan.begin(), scan.begin() + 2) -
                                          jpeg.begin());
  Bytes chroma = prefix(suffix(jpeg, luma + 69), 69);
  chroma[4] = 0;
  Bytes late = prefix(jpeg, second);
  for (const size_t component : {1, 2}) late[frame + 12 + 3 * component] = 0;
  for (int i = 0; i < 40; ++i) append(late, scan);
  append(late, chroma);
  append(late, suffix(jpeg, second));
  for (const int mode : {0, 1}) {
    const auto show = [&](Bytes bytes) {
      const DecInfo info = open_memory(bytes, 1, TAVIRPELO_THUMBNAIL_NEVER);
      info->decMode = mode;
      return decode(TAVIRPELO_DecodeJPEG, info.get(), 60, 50).pixels;
    };
    EXPECT_TRUE(show(jpeg) == show(late)) << mode;
  }
  std::vector<Plane> planes = read_coefficients(jpeg);
  for (size_t i = 1; i < 3; ++i)
    std::fill(planes[i].coefficients.begin(), planes[i].coefficients.end(), int16_t{0});
  EXPECT_TRUE(run(prefix(jpeg, second), 60, 50) == reference(same({60, 50}, s), planes, true));
}

// True for a part of a JPEG that ends in entropy-coded data; libjpeg gives up inside a header.
bool ends_in_data(const Bytes& cut) {
  for (size_t at = cut.size() - 2; at > 0; --at) {
    const uint8_t code = cut[at + 1];
    if (cut[at] != 0xFF || code == 0 || code == 0xFF || (code >= 0xD0 && code <= 0xD7)) continue;
    return code == 0xDA && at + 14 < cut.size();
  }
  return false;
}

// Behind the end of the data bits are zeros: all that came before is shown. In the MCU where they begin
// libjpeg may also store what overruns its band.
TEST(CutScans, ShowWhatTheyHave) {
  for (const JpegStyle& s : {JpegStyle{.progressive = true},
                             {.restartInterval = 2, .progressive = true},
                             {.restartInterval = 3, .scans = JpegScans::kLumaThenChroma}}) {
    const Bytes jpeg = encode_libjpeg(121, 103, s);
    int compared = 0;
    const auto compare = [&](const Bytes& cut) {
      const Decode got = decode(TAVIRPELO_DecodeJPEG, cut, 121, 103, 1, TAVIRPELO_THUMBNAIL_NEVER);
      ASSERT_EQ(1, got.answer) << cut.size();
      if (!ends_in_data(cut)) return;
      ++compared;
      const Bytes want = reference(same({121, 103}, s), read_coefficients(cut), false);
      size_t differing = 0;
      for (size_t i = 0; i < want.size(); ++i) differing += got.pixels[i] != want[i];
      ASSERT_LE(differing, 16u * 16 * 3) << cut.size();
    };
    every_truncation(jpeg, compare, find_marker(jpeg, 0xDA) + 15, 41);
    EXPECT_GT(compared, 100);
  }
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
