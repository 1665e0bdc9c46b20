// The encoder's single steps on blocks and parameters that pixels alone do not reach.
#include <gtest/gtest.h>

#include <algorithm>

#include "codec/base/byte_order.h"
#include "codec/formats/jpeg/encoder/encoder.h"
#include "codec/formats/jpeg/encoder/encoder_abi.h"
#include "tests/support/jpeg_segments.h"

namespace tests {
namespace {

using namespace pelo::jpeg;

// An encoder without pixels that takes blocks; its stream is read when it ends.
class BlockEncoder {
 public:
  BlockEncoder(uint32_t width, uint32_t height, uint32_t format, const CodingParameters* parameters) {
    const TAVIRPELO_RAWINFO image{width, height, nullptr, format};
    const TAVIRPELO_ENCOPTION options{100, nullptr, 0};
    encoder_ = elo_jpeg_enc_mcu_init(&image, &destination_, &options, parameters);
  }
  ~BlockEncoder() {
    if (encoder_ != nullptr) elo_jpeg_enc_mcu_finish(encoder_, nullptr, nullptr);
    TAVIRPELO_OsFree(destination_.buffer);
  }
  ELO_ENCODER* get() { return encoder_; }
  Bytes finish() {
    uint8_t* buffer = nullptr;
    int size = 0;
    const int done = elo_jpeg_enc_mcu_finish(std::exchange(encoder_, nullptr), &buffer, &size);
    return done ? Bytes(buffer, buffer + size) : Bytes();
  }

 private:
  ELO_DESTINATION destination_{ELO_TO_MEMORY, 0, 0, 0, nullptr, nullptr};
  ELO_ENCODER* encoder_ = nullptr;
};

// One dimension of the transform, step by step, with the level shift in its first output.
void reference_1d(int* d, int s, int shift) {
  const int t0 = d[0] + d[7 * s], t7 = d[0] - d[7 * s], t1 = d[s] + d[6 * s], t6 = d[s] - d[6 * s];
  const int t2 = d[2 * s] + d[5 * s], t5 = d[2 * s] - d[5 * s];
  const int t3 = d[3 * s] + d[4 * s], t4 = d[3 * s] - d[4 * s];
  const int a = t0 + t3, b = t0 - t3, c = t1 + t2, e = t1 - t2;
  const int z1 = (e + b) * 181 >> 8, p = t4 + t5, q = t5 + t6, r = t6 + t7, z5 = (p - r) * 98 >> 8;
  const int z2 = (p * 139 >> 8) + z5, z4 = (r * 334 >> 8) + z5, z3 = q * 181 >> 8;
  d[0] = a + c - shift, d[4 * s] = a - c, d[2 * s] = b + z1, d[6 * s] = b - z1;
  d[5 * s] = t7 - z3 + z2, d[3 * s] = t7 - z3 - z2, d[s] = t7 + z3 + z4, d[7 * s] = t7 + z3 - z4;
}

TEST(ForwardDct, EqualsTheFormulasAtEveryQuality) {
  ELO_ENCODER encoder{};
  for (int quality = 1; quality <= 100; ++quality) {
    __elo_jpeg_enc_set_quality(&encoder, quality);
    Bytes samples = random_bytes(64, static_cast<uint32_t>(quality));
    for (uint8_t& s : samples) s = quality % 2 ? s : s % 2 * 255;
    std::array<int, 64> raw;
    std::copy(samples.begin(), samples.end(), raw.begin());
    for (int i = 0; i < 8; ++i) reference_1d(&raw[8 * i], 1, 1024);
    for (int i = 0; i < 8; ++i) reference_1d(&raw[i], 8, 0);
    for (const QuantiseTable& table : {encoder.quant[0], encoder.quant[1]}) {
      CoefficientBlock quantised;
      __elo_jpeg_enc_do_forward_dct(samples.data(), 8, &table, quantised.data());
      for (size_t i = 0; i < 64; ++i) {
        const int64_t divisor = (table.value[i] * int64_t{kAanScale[i]} + 1024) / 2048;
        const int64_t product = raw[i] * (65536 / divisor);
        ASSERT_EQ((product + (raw[i] < 0 ? 32768 : 0)) >> 16, quantised[i]) << quality << " " << i;
      }
    }
  }
}

TEST(ForwardDct, ZeroQuantiserGivesZeroCoefficients) {
  ELO_ENCODER encoder{};
  const std::array<uint8_t, 64> none{};
  __elo_jpeg_enc_set_quant_table(&encoder, 3, none.data());
  CoefficientBlock block;
  __elo_jpeg_enc_do_forward_dct(sample_pixels(8, 8).data(), 8, &encoder.quant[3], block.data());
  EXPECT_TRUE(std::all_of(block.begin(), block.end(), [](int32_t c) { return c == 0; }));
}

// Ten blocks of the costliest values fill several times the margin that is kept free.
TEST(Blocks, CostliestMcusNeverOverrunTheBuffer) {
  constexpr CodingParameters kTenBlocks{3, {{{0, 2, 2}, {1, 2, 2}, {1, 1, 2}}}, {}, false};
  BlockEncoder encoder(4999, 16, TAVIRPELO_YUV420, &kTenBlocks);
  ASSERT_NE(nullptr, encoder.get());
  ASSERT_EQ(10, encoder.get()->mcuBlocks);
  std::array<CoefficientBlock, kEncoderMcuBlocks> blocks;
  for (int mcu = 0; mcu < 200; ++mcu) {
    for (CoefficientBlock& block : blocks) block.fill(mcu % 2 == 0 ? 1023 : -1023);
    ASSERT_EQ(1, __elo_jpeg_enc_encode_1mcu_blk(encoder.get(), blocks.data()));
  }
  EXPECT_GT(encoder.finish().size(), 200u * 10 * 190);
}

// Partly covered blocks code as those of a picture whose last column and row are drawn on.
TEST(Edges, RepeatTheLastColumnAndRow) {
  for (const auto& [format, bytes, scan] : {std::tuple(TAVIRPELO_RGB565, 2, 623u),
                                            {TAVIRPELO_RGB888, 3, 623u},
                                            {TAVIRPELO_GREY8, 1, 328u}}) {
    const int width = 17, height = 9;
    const Bytes small = sample_pixels(width, height);
    Bytes large;
    for (int y = 0; y < 16; ++y) {
      for (int x = 0; x < 24; ++x) {
        const int at = (std::min(y, height - 1) * width + std::min(x, width - 1)) * bytes;
        large.insert(large.end(), small.begin() + at, small.begin() + at + bytes);
      }
    }
    const Bytes whole = encode_pixels(large, 24, 16, format, {95, nullptr, 0});
    const Bytes covered = encode_pixels(small, width, height, format, {95, nullptr, 0});
    EXPECT_EQ(suffix(whole, scan), suffix(covered, scan)) << format;
  }
}

TEST(Parameters, BeyondBaselineAreRefused) {
  const auto refused = [](const CodingParameters& parameters) {
    return BlockEncoder(8, 8, TAVIRPELO_YUV420, &parameters).get() == nullptr;
  };
  EXPECT_TRUE(refused({4, {}, {}, false}));
  EXPECT_TRUE(refused({0, {}, {}, false}));
  EXPECT_TRUE(refused({3, {{{0, 3, 1}, {1, 1, 1}, {1, 1, 1}}}, {}, false}));
  EXPECT_TRUE(refused({3, {{{0, 2, 0}, {1, 1, 1}, {1, 1, 1}}}, {}, false}));
  EXPECT_TRUE(refused({3, {{{4, 2, 2}, {1, 1, 1}, {1, 1, 1}}}, {}, false}));
  EXPECT_TRUE(refused({3, {{{0, 2, 2}, {1, 2, 2}, {1, 2, 2}}}, {}, false}));  // 12 blocks
}

#ifdef TAVIR_HAVE_LIBJPEG
// Values beyond the tables are clamped; the last position is never coded, and the block stays as it was.
TEST(Blocks, AnyValueIsCodedAsFarAsItCanBe) {
  BlockEncoder encoder(24, 8, TAVIRPELO_GREY8, nullptr);
  std::array<CoefficientBlock, 3> blocks{};
  blocks[0][0] = INT32_MAX;
  blocks[1][0] = INT32_MIN;
  for (size_t i = 1; i < 63; ++i) {
    blocks[0][i] = i % 2 ? INT32_MAX : INT32_MIN;
    blocks[1][i] = i % 3 ? 0 : 1024;
    blocks[2][i] = static_cast<int32_t>(i) - 31;
  }
  for (const size_t b : {0, 2}) blocks[b][63] = 77;
  const auto before = blocks;
  for (const CoefficientBlock& block : blocks)
    ASSERT_EQ(1, __elo_jpeg_enc_encode_1mcu_blk(encoder.get(), &block));
  EXPECT_EQ(before, blocks);
  const auto planes = read_coefficients(encoder.finish());
  for (size_t b = 0; b < 3; ++b) {
    for (size_t i = 0; i < 64; ++i) {
      const int32_t low = i == 0 ? -1024 : -1023;
      const int32_t want = i == 63 ? 0 : std::clamp(blocks[b][i], low, 1023);
      ASSERT_EQ(want, planes[0].coefficients[64 * b + i]) << b << " " << i;
    }
  }
}

// Where the picture ends inside an MCU, the missing blocks hold no detail and a neighbour's DC. A frame
// header that claims whole MCUs makes them visible.
TEST(Blocks, DummiesTakeTheDcOfTheirOwnNeighbour) {
  Bytes jpeg = encode_own(40, 24, 90);
  const size_t frame = find_marker(jpeg, 0xC0);
  pelo::store_be16(&jpeg[frame + 5], 32);
  pelo::store_be16(&jpeg[frame + 7], 48);
  const Plane luma = read_coefficients(jpeg)[0];
  ASSERT_TRUE(luma.blocksWide == 6 && luma.blocksHigh == 4);
  const auto block = [&](int x, int y) { return luma.coefficients.begin() + 64 * (6 * y + x); };
  const auto expect_dummy = [&](int x, int y, int dc) {
    EXPECT_EQ(dc, *block(x, y)) << x << " " << y;
    EXPECT_TRUE(std::all_of(block(x, y) + 1, block(x, y) + 64, [](int c) { return c == 0; }));
  };
  for (int y = 0; y < 3; ++y) expect_dummy(5, y, *block(4, y));
  for (int x = 0; x < 6; ++x) expect_dummy(x, 3, *block(x, 2));
  EXPECT_NE(*block(0, 2), *block(1, 2));  // a coder that repeats one neighbour would be seen
}
#endif

}  // namespace
}  // namespace tests
