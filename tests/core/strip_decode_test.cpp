// Decoding in bands: the same pixels as in one piece whatever the bands, and an end on every path that
// gives everything back.
#include "codec/core/strip_decode.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string_view>

#include "codec/pixel/packers.h"
#include "platform/android_log.h"
#include "platform/fault_injection.h"
#include "tavirpelo/tavirpelo.h"
#include "tests/support/jpeg_samples.h"

namespace tests {
namespace {

struct Shape {
  int width, height, format;
};

size_t pixel_size(int format) {
  return format == TAVIRPELO_YUV420          ? 1
         : format == TAVIRPELO_RGB565_DITHER ? 2
                                             : pelo::bytes_per_pixel(format);
}

// A heap block of exactly the rows asked for, so that a sanitizer sees every pixel beyond them.
struct Band {
  Bytes planes[3];

  Band(const Shape& shape, int first, int rows) {
    const auto chroma = static_cast<size_t>((first + rows + 1) / 2 - (first + 1) / 2);
    planes[0].assign(
        static_cast<size_t>(shape.width) * pixel_size(shape.format) * static_cast<size_t>(rows), 0x5A);
    if (shape.format != TAVIRPELO_YUV420) return;
    for (int c = 1; c < 3; ++c)
      planes[c].assign(static_cast<size_t>((shape.width + 1) / 2) * chroma + 1, 0x5A);
  }
  int process(PELOJ_JDINFO* state, int rows) {
    uint8_t* pointers[3] = {planes[0].data(), planes[1].data(), planes[2].data()};
    return __elo_jpeg_dec_line_process(state, pointers, rows);
  }
};

class Source {
 public:
  explicit Source(Bytes jpeg, uint32_t option = TAVIRPELO_THUMBNAIL_NEVER) : jpeg_(std::move(jpeg)) {
    jpeg_.shrink_to_fit();
    info_ = TAVIRPELO_CreateDecInfo(TAVIRPELO_IO_MEMORY, jpeg_.data(), static_cast<int>(jpeg_.size()), 0,
                                    option);
  }
  ~Source() { TAVIRPELO_DestroyDecInfo(info_); }
  Source(const Source&) = delete;
  TAVIRPELO_DECINFO* operator->() const { return info_; }
  TAVIRPELO_DECINFO* get() const { return info_; }

 private:
  Bytes jpeg_;
  TAVIRPELO_DECINFO* info_;
};

Bytes decode_whole(const Bytes& jpeg, const Shape& shape, int mode) {
  const Source source(jpeg, TAVIRPELO_FIT_STRETCH | TAVIRPELO_THUMBNAIL_NEVER);
  source->outFormat = shape.format;
  source->decMode = mode;
  const auto pixels = static_cast<size_t>(shape.width) * static_cast<size_t>(shape.height);
  const size_t chroma =
      static_cast<size_t>((shape.width + 1) / 2) * static_cast<size_t>((shape.height + 1) / 2);
  Bytes out(pixels * pixel_size(shape.format) + (shape.format == TAVIRPELO_YUV420 ? 2 * chroma : 0),
            0x5A);
  EXPECT_EQ(1, TAVIRPELO_DecodeJPEG(source.get(), out.data(), shape.width, shape.height));
  return out;
}

// The bands one behind the other, each as high as the next of `heights` in turn; empty on failure.
Bytes decode_bands(const Bytes& jpeg, const Shape& shape, int mode, std::vector<int> heights) {
  const Source source(jpeg, TAVIRPELO_ROTATE_90);  // bands are never turned
  if (source.get() == nullptr) return {};
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
        EXPECT_EQ(0x5A, band.planes[c].back());
        band.planes[c].pop_back();
      }
    }
    for (int c = 0; c < 3; ++c)
      planes[c].insert(planes[c].end(), band.planes[c].begin(), band.planes[c].end());
    row += rows;
  }
  Band behind(shape, 0, 1);
  const Bytes untouched = behind.planes[0];
  EXPECT_EQ(1, behind.process(state, 5));
  EXPECT_EQ(untouched, behind.planes[0]);
  __elo_jpeg_dec_line_finish(state);
  EXPECT_EQ(shape.format, source->outFormat);
  EXPECT_EQ(uint32_t{TAVIRPELO_FIT_STRETCH | TAVIRPELO_ROTATE_90}, source->option);
  planes[0].insert(planes[0].end(), planes[1].begin(), planes[1].end());
  planes[0].insert(planes[0].end(), planes[2].begin(), planes[2].end());
  return planes[0];
}

struct Sample {
  const char* name;
  Bytes jpeg;
};

std::vector<Sample> samples() {
  std::vector<Sample> all = {{"baseline", encode_own(67, 53, 80)},
                             {"grey", encode_own(67, 53, 80, true)}};
#ifdef TAVIR_HAVE_LIBJPEG
  JpegStyle style;
  style.progressive = true;
  all.push_back({"progressive", encode_libjpeg(67, 53, style)});
  style.components = 1;
  all.push_back({"progressive grey", encode_libjpeg(67, 53, style)});
  style = {};
  style.h = 1;
  style.restartInterval = 3;
  all.push_back({"tall chroma, restarts", encode_libjpeg(67, 53, style)});
  style = {};
  style.h = style.v = 1;
  style.rgb = true;
  all.push_back({"RGB", encode_libjpeg(67, 53, style)});
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

TEST(StripDecode, CountsCallsAndIgnoresEmptyOnes) {
  const Source source(encode_own(100, 100, 80));
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(source.get(), 100, 400, TAVIRPELO_YUV420);
  ASSERT_NE(nullptr, state);
  const Shape shape{100, 400, TAVIRPELO_YUV420};
  EXPECT_EQ(1, __elo_jpeg_dec_line_process(state, nullptr, 0));
  EXPECT_EQ(1, __elo_jpeg_dec_line_process(state, nullptr, -3));
  EXPECT_EQ(0, state->output.emitted);
  for (int call = 1; call <= 25; ++call) {
    EXPECT_EQ(1, Band(shape, 0, 16).process(state, 16));
    EXPECT_EQ(16 * call, state->output.emitted);
  }
  EXPECT_EQ(1, __elo_jpeg_dec_line_process(state, nullptr, 16));
  EXPECT_EQ(400, state->output.emitted);
  __elo_jpeg_dec_line_finish(state);
  __elo_jpeg_dec_line_finish(nullptr);
  EXPECT_EQ(0, __elo_jpeg_dec_line_process(nullptr, nullptr, 1));
  EXPECT_EQ(nullptr, __elo_jpeg_dec_line_init(nullptr, 1, 1, 1));
  EXPECT_EQ(nullptr, __elo_jpeg_dec_line_init(source.get(), 0, 1, 1));
  EXPECT_EQ(nullptr, __elo_jpeg_dec_line_init(source.get(), 1, -1, 1));
}

class HostileStrips : public testing::Test {
 protected:
  void SetUp() override {
    pelo::platform::set_log_sink([](const char*) {});
  }
  void TearDown() override {
    pelo::platform::set_log_sink(nullptr);
    pelo::faults::allocations.arm(0);
  }

  // Bands of 5 rows of a decode that may end anywhere; the number of bands, -1 when it did not start.
  static int run(const Bytes& jpeg, const Shape& shape, int stopAfter = 1000) {
    const Source source(jpeg);
    if (source.get() == nullptr) return -1;
    PELOJ_JDINFO* state =
        __elo_jpeg_dec_line_init(source.get(), shape.width, shape.height, shape.format);
    if (state == nullptr) return -1;
    for (int band = 0;; ++band) {
      if (5 * band >= shape.height || band == stopAfter) {
        __elo_jpeg_dec_line_finish(state);
        return band;
      }
      if (Band(shape, 5 * band, 5).process(state, 5) == 0) return band;
    }
  }
};

TEST_F(HostileStrips, EndedAnywhereOrDamaged) {
  for (const Sample& sample : samples()) {
    for (int bands = 0; bands < 11; ++bands) EXPECT_EQ(bands, run(sample.jpeg, {67, 53, 2}, bands));
    int cutBands = 0;
    for (size_t length = 0; length < sample.jpeg.size(); length += 3) {
      const Bytes cut(sample.jpeg.begin(), sample.jpeg.begin() + static_cast<ptrdiff_t>(length));
      cutBands += run(cut, {67, 53, 2}) < 11;
      run(cut, {17, 14, 1});
    }
    EXPECT_GT(cutBands, 100) << sample.name;
    for (size_t i = 2; i < sample.jpeg.size(); i += 5) {
      Bytes bad = sample.jpeg;
      bad[i] ^= static_cast<uint8_t>(1 + i % 255);
      run(bad, {40, 33, static_cast<int>(i % 10)});
    }
  }
}

TEST_F(HostileStrips, ADamagedProgressivePictureSetsTheError) {
#ifdef TAVIR_HAVE_LIBJPEG
  JpegStyle style;
  style.progressive = true;
  const Bytes jpeg = encode_libjpeg(67, 203, style);
  const Bytes cut(jpeg.begin(), jpeg.end() - static_cast<ptrdiff_t>(jpeg.size() / 3));
  gTAVIRPELO_Error = 0;
  EXPECT_LT(run(cut, {67, 203, 1}), 41);
  EXPECT_EQ(TAVIRPELO_ERROR_DECODE, gTAVIRPELO_Error);
#endif
}

TEST_F(HostileStrips, MemoryRunsOutAtEveryAllocation) {
  for (const Sample& sample : samples()) {
    for (const Shape& shape : {Shape{67, 53, 1}, Shape{30, 90, 2}}) {
      const int bands = (shape.height + 4) / 5;
      for (long k = 1;; ++k) {
        ASSERT_LT(k, 500);
        pelo::faults::allocations.arm(k);
        const int result = run(sample.jpeg, shape);
        const bool spent = pelo::faults::allocations.calls >= k;
        pelo::faults::allocations.arm(0);
        if (spent) {
          // Without memory for a later scan's tables a progressive picture shows the scans before it.
          const bool progressive = std::string_view(sample.name).starts_with("progressive");
          EXPECT_LT(result, progressive ? bands + 1 : bands) << sample.name << " " << k;
          continue;
        }
        EXPECT_EQ(bands, result);
        break;
      }
    }
  }
}

TEST_F(HostileStrips, AbortingReleasesTheState) {
  const Source source(encode_own(64, 200, 80));
  source->CheckFn = [](TAVIRPELO_DECINFO*, int row, int) { return row < 32 ? 1 : 0; };
  PELOJ_JDINFO* state = __elo_jpeg_dec_line_init(source.get(), 64, 200, TAVIRPELO_RGB888);
  ASSERT_NE(nullptr, state);
  const Shape shape{64, 200, TAVIRPELO_RGB888};
  EXPECT_EQ(1, Band(shape, 0, 32).process(state, 32));
  EXPECT_EQ(0, Band(shape, 32, 1).process(state, 1));
}

}  // namespace
}  // namespace tests
