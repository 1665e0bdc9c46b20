// Decoding in bands: the same pixels as in one piece whatever the bands, and an end on every path that
// gives everything back.
#include "codec/formats/jpeg/strips/strips.h"

#include "tests/support/failures.h"
#include "tests/support/guarded_decode.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

struct Shape {
  int width, height, format;
};

// A heap block of exactly the rows asked for, so that a sanitizer sees every pixel beyond them.
struct Band {
  Bytes planes[3];

  Band(const Shape& shape, int first, int rows) {
    const bool planar = shape.format == TAVIRPELO_YUV420;
    const int bytes = planar ? 1 : pelo::bytes_per_pixel(shape.format);
    planes[0].assign(static_cast<size_t>(shape.width * bytes * rows), kFill);
    const int chroma = (first + rows + 1) / 2 - (first + 1) / 2;
    for (int c = 1; c < 3 && planar; ++c)
      planes[c].assign(static_cast<size_t>((shape.width + 1) / 2 * chroma) + 1, kFill);
  }
  int process(PELOJ_JDINFO* state, int rows) {
    uint8_t* pointers[3] = {planes[0].data(), planes[1].data(), planes[2].data()};
    return __elo_jpeg_dec_line_process(state, pointers, rows);
  }
};

Bytes decode_whole(Bytes jpeg, const Shape& shape, int mode) {
  const DecInfo info =
      open_memory(jpeg, shape.format, TAVIRPELO_FIT_STRETCH | TAVIRPELO_THUMBNAIL_NEVER);
  info->decMode = mode;
  return decode(TAVIRPELO_DecodeJPEG, info.get(), shape.width, shape.height).pixels;
}

// The bands one behind the other, each as high as the next of `heights` in turn; empty on failure.
Bytes decode_bands(Bytes jpeg, const Shape& shape, int mode, const std::vector<int>& heights) {
  const DecInfo source = open_memory(jpeg, 0, TAVIRPELO_ROTATE_90);  // bands are never turned
  source->decMode = mode;
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(source.get(), shape.width, shape.height, shape.format);
  if (state == nullptr) return {};
  Bytes planes[3];
  for (int row = 0, i = 0; row < shape.height; ++i) {
    const int asked = heights[static_cast<size_t>(i) % heights.size()];
    const int rows = std::min(asked, shape.height - row);
    Band band(shape, row, rows);
    if (band.process(state, asked) == 0) return {};
    if (shape.format == TAVIRPELO_YUV420) {
      for (int c = 1; c < 3; ++c) {
        EXPECT_EQ(kFill, band.planes[c].back());
        band.planes[c].pop_back();
      }
    }
    for (int c = 0; c < 3; ++c) append(planes[c], band.planes[c]);
    row += rows;
  }
  Band behind(shape, 0, 1);
  const Bytes untouched = behind.planes[0];
  EXPECT_EQ(1, behind.process(state, 5));
  EXPECT_EQ(untouched, behind.planes[0]);
  __elo_jpeg_dec_line_finish(state);
  EXPECT_EQ(shape.format, source->outFormat);
  EXPECT_EQ(uint32_t{TAVIRPELO_FIT_STRETCH | TAVIRPELO_ROTATE_90}, source->option);
  return ByteWriter().block(planes[0]).block(planes[1]).block(planes[2]);
}

struct Sample {
  const char* name;
  Bytes jpeg;
};

std::vector<Sample> samples() {
  std::vector<Sample> all = {{"baseline", encode_own(67, 53, 80)},
                             {"grey", encode_own(67, 53, 80, true)}};
#ifdef TAVIR_HAVE_LIBJPEG
  for (const auto& [name, style] :
       {std::pair<const char*, JpegStyle>{"progressive", {.progressive = true}},
        {"progressive grey", {.components = 1, .progressive = true}},
        {"separate scans", {.restartInterval = 3, .scans = JpegScans::kSeparate, .optimise = true}},
        {"tall chroma, restarts", {.h = 1, .restartInterval = 3}},
        {"RGB", {.h = 1, .v = 1, .rgb = true}}}) {
    all.push_back({name, encode_libjpeg(67, 53, style)});
  }
#endif
  return all;
}

const std::vector<std::vector<int>> kBands = {{1}, {2}, {7}, {16}, {1000}, {1, 4, 3, 16, 2}};

// Full size, each reduced scale, odd sizes between, enlarged, and stretched one way only.
constexpr int kSizes[][2] = {{67, 53}, {33, 26},   {25, 19},  {16, 13},  {8, 6},   {1, 1},
                             {41, 37}, {150, 211}, {150, 20}, {20, 150}, {67, 54}, {66, 106}};

TEST(StripDecode, BandsOfAnyHeightGiveTheWholePicture) {
  constexpr int kFormats[] = {1, 2, 0, 5, 7, 8, 9};
  for (const Sample& sample : samples()) {
    for (const auto& [width, height] : kSizes) {
      for (const int format : kFormats) {
        const Shape shape{width, height, format};
        const int mode = format == 0 ? 2 : 0;
        const Bytes whole = decode_whole(sample.jpeg, shape, mode);
        for (const auto& bands : kBands) {
          ASSERT_EQ(whole, decode_bands(sample.jpeg, shape, mode, bands))
              << sample.name << " " << width << "x" << height << " format " << format << " bands of "
              << bands[0];
        }
      }
    }
  }
}

TEST(StripDecode, IgnoresEmptyCallsAndRefusesMissingArguments) {
  Bytes jpeg = encode_own(100, 100, 80);
  const DecInfo source = open_memory(jpeg, 0);
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(source.get(), 100, 400, TAVIRPELO_YUV420);
  ASSERT_NE(nullptr, state);
  for (const int rows : {0, -3}) EXPECT_EQ(1, __elo_jpeg_dec_line_process(state, nullptr, rows));
  EXPECT_EQ(0, state->output.emitted);
  __elo_jpeg_dec_line_finish(state);
  __elo_jpeg_dec_line_finish(nullptr);
  EXPECT_EQ(0, __elo_jpeg_dec_line_process(nullptr, nullptr, 1));
  EXPECT_EQ(nullptr, __elo_jpeg_dec_line_init(nullptr, 1, 1, 1));
  EXPECT_EQ(nullptr, __elo_jpeg_dec_line_init(source.get(), 0, 1, 1));
  EXPECT_EQ(nullptr, __elo_jpeg_dec_line_init(source.get(), 1, -1, 1));
}

using HostileStrips = QuietTest;

// Bands of 5 rows of a decode that may end anywhere; the number of bands, -1 when it did not start.
int run(Bytes jpeg, const Shape& shape, int stopAfter = 1000) {
  const DecInfo source = open_memory(jpeg, 0, TAVIRPELO_THUMBNAIL_NEVER);
  if (source == nullptr) return -1;
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(source.get(), shape.width, shape.height, shape.format);
  if (state == nullptr) return -1;
  for (int band = 0;; ++band) {
    if (5 * band >= shape.height || band == stopAfter) {
      __elo_jpeg_dec_line_finish(state);
      return band;
    }
    if (Band(shape, 5 * band, 5).process(state, 5) == 0) return band;
  }
}

TEST_F(HostileStrips, EndedAnywhereOrDamaged) {
  for (const Sample& sample : samples()) {
    for (int bands = 0; bands < 11; ++bands) EXPECT_EQ(bands, run(sample.jpeg, {67, 53, 2}, bands));
    int cutBands = 0;
    const auto cut_run = [&](const Bytes& cut) {
      cutBands += run(cut, {67, 53, 2}) < 11;
      run(cut, {17, 14, 1});
    };
    every_truncation(sample.jpeg, cut_run, 0, 3);
    EXPECT_GT(cutBands, 100) << sample.name;
    for (size_t i = 2; i < sample.jpeg.size(); i += 5) {
      Bytes bad = sample.jpeg;
      bad[i] ^= static_cast<uint8_t>(1 + i % 255);
      run(bad, {40, 33, static_cast<int>(i % 10)});
    }
  }
}

#ifdef TAVIR_HAVE_LIBJPEG
TEST_F(HostileStrips, ADamagedProgressivePictureSetsTheError) {
  const Bytes jpeg = encode_libjpeg(67, 203, {.progressive = true});
  gTAVIRPELO_Error = 0;
  EXPECT_LT(run(prefix(jpeg, jpeg.size() - jpeg.size() / 3), {67, 203, 1}), 41);
  EXPECT_EQ(TAVIRPELO_ERROR_DECODE, gTAVIRPELO_Error);
}
#endif

TEST_F(HostileStrips, MemoryRunsOutAtEveryAllocation) {
  for (const Sample& sample : samples()) {
    // Without memory for a later scan's tables a picture in several shows the scans before it.
    const std::string_view name = sample.name;
    const int spare = name.starts_with("progressive") || name.starts_with("separate") ? 1 : 0;
    for (const Shape& shape : {Shape{67, 53, 1}, Shape{30, 90, 2}}) {
      const int bands = (shape.height + 4) / 5;
      EXPECT_EQ(bands, fail_each_allocation([&] { return run(sample.jpeg, shape); },
                                            [&](int done) { EXPECT_LT(done, bands + spare); }))
          << sample.name;
    }
  }
}

TEST_F(HostileStrips, AbortingReleasesTheState) {
  Bytes jpeg = encode_own(64, 200, 80);
  const DecInfo source = open_memory(jpeg, 0);
  source->CheckFn = [](TAVIRPELO_DECINFO*, int row, int) { return row < 32 ? 1 : 0; };
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(source.get(), 64, 200, TAVIRPELO_RGB888);
  ASSERT_NE(nullptr, state);
  const Shape shape{64, 200, TAVIRPELO_RGB888};
  EXPECT_EQ(1, Band(shape, 0, 32).process(state, 32));
  EXPECT_EQ(0, Band(shape, 32, 1).process(state, 1));
}

}  // namespace
}  // namespace tests
